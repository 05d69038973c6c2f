#include <stdlib.h>
#include <string.h>

#include "cfg32_platform.h"
#include "fixture.h"

static const int booleans[] = {CFG_OPT_FLAG_A, CFG_OPT_FLAG_B, CFG_OPT_SHOW_SOURCE,
                               CFG_OPT_SHOW_STACK, CFG_OPT_DELETE_NON_LEAVES};
static const int names[] = {CFG_OPT_CONFIG_FILE, CFG_OPT_BACKUP_FILE};

static int is_on(CfgHandle *handle, int option) {
    int value = -1;
    assert_int_equal(cfg_get_option(handle, option, &value), CFG_SUCCESS);
    return value;
}

static void assert_name(CfgHandle *handle, int option, const char *expected) {
    char *name = NULL;
    assert_int_equal(cfg_get_option(handle, option, &name), CFG_SUCCESS);
    assert_non_null(name);
    assert_string_equal(name, expected);
    cfg_memfree(name);
}

/* A text of this many bytes, to be freed. */
static char *name_of_length(size_t length) {
    char *name = malloc(length + 1);
    assert_non_null(name);
    memset(name, 'n', length);
    name[length] = '\0';
    return name;
}

static void a_null_handle_gives_89(void **state) {
    (void)state;
    for (int option = 999; option <= 1008; ++option) {
        assert_int_equal(cfg_set_option(NULL, option, NULL), CFG_PARAM_ERROR);
    }
}

static void an_unknown_option_gives_0_and_changes_nothing(void **state) {
    static const int numbers[] = {999, 1008, 0, -1, 1 << 30};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(numbers); ++i) {
        assert_int_equal(cfg_set_option(f->handle, numbers[i], CFG_OPT_ON), CFG_SUCCESS);
    }
    assert_int_equal(is_on(f->handle, CFG_OPT_FLAG_A), 1);
    assert_int_equal(is_on(f->handle, CFG_OPT_FLAG_B), 0);
    assert_int_equal(is_on(f->handle, CFG_OPT_SHOW_SOURCE), 0);
    assert_int_equal(is_on(f->handle, CFG_OPT_SHOW_STACK), 1);
    assert_int_equal(is_on(f->handle, CFG_OPT_DELETE_NON_LEAVES), 0);
    assert_name(f->handle, CFG_OPT_CONFIG_FILE, f->config);
}

static void a_boolean_changes_no_other_option(void **state) {
    struct fixture *f = *state;
    for (size_t set = 0; set < LENGTH(booleans); ++set) {
        for (size_t i = 0; i < LENGTH(booleans); ++i) {
            cfg_set_option(f->handle, booleans[i], CFG_OPT_OFF);
        }
        assert_int_equal(cfg_set_option(f->handle, booleans[set], CFG_OPT_ON), CFG_SUCCESS);
        for (size_t i = 0; i < LENGTH(booleans); ++i) {
            assert_int_equal(is_on(f->handle, booleans[i]), i == set);
        }
        for (size_t i = 0; i < LENGTH(booleans); ++i) {
            cfg_set_option(f->handle, booleans[i], CFG_OPT_ON);
        }
        assert_int_equal(cfg_set_option(f->handle, booleans[set], CFG_OPT_OFF), CFG_SUCCESS);
        for (size_t i = 0; i < LENGTH(booleans); ++i) {
            assert_int_equal(is_on(f->handle, booleans[i]), i != set);
        }
    }
}

static void every_value_but_null_turns_a_boolean_on(void **state) {
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(booleans); ++i) {
        cfg_set_option(f->handle, booleans[i], CFG_OPT_OFF);
        assert_int_equal(cfg_set_option(f->handle, booleans[i], f), CFG_SUCCESS);
        assert_int_equal(is_on(f->handle, booleans[i]), 1);
        cfg_set_option(f->handle, booleans[i], CFG_OPT_OFF);
        /* Only bits above those of an int. */
        cfg_set_option(f->handle, booleans[i], (const void *)((uintptr_t)1 << 40));
        assert_int_equal(is_on(f->handle, booleans[i]), 1);
    }
}

static void show_source_and_show_stack_belong_to_all_handles(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    cfg_set_option(f->handle, CFG_OPT_SHOW_SOURCE, CFG_OPT_ON);
    cfg_set_option(f->handle, CFG_OPT_SHOW_STACK, CFG_OPT_OFF);
    assert_int_equal(is_on(other, CFG_OPT_SHOW_SOURCE), 1);
    assert_int_equal(is_on(other, CFG_OPT_SHOW_STACK), 0);
    cfg_unbind(other);
}

static void the_other_options_belong_to_one_handle(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    char *name = f->folder;
    void *key = f;
    cfg_set_option(f->handle, CFG_OPT_FLAG_A, CFG_OPT_OFF);
    cfg_set_option(f->handle, CFG_OPT_FLAG_B, CFG_OPT_ON);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, f);
    assert_int_equal(is_on(other, CFG_OPT_FLAG_A), 1);
    assert_int_equal(is_on(other, CFG_OPT_FLAG_B), 0);
    assert_int_equal(is_on(other, CFG_OPT_DELETE_NON_LEAVES), 0);
    cfg_get_option(other, CFG_OPT_CONFIG_FILE, &name);
    assert_null(name);
    cfg_get_option(other, CFG_OPT_KEY_DATA, &key);
    assert_null(key);
    cfg_unbind(other);
}

static void a_file_name_is_copied(void **state) {
    struct fixture *f = *state;
    char name[] = "/some/where";
    for (size_t i = 0; i < LENGTH(names); ++i) {
        strcpy(name, "/some/where");
        assert_int_equal(cfg_set_option(f->handle, names[i], name), CFG_SUCCESS);
        strcpy(name, "/else/where");
        assert_name(f->handle, names[i], "/some/where");
    }
}

static void the_two_file_names_are_apart(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/one");
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "/two");
    assert_name(f->handle, CFG_OPT_CONFIG_FILE, "/one");
    assert_name(f->handle, CFG_OPT_BACKUP_FILE, "/two");
}

static void null_unsets_a_file_name_and_may_be_repeated(void **state) {
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        char *name = f->folder;
        cfg_set_option(f->handle, names[i], "/name");
        assert_int_equal(cfg_set_option(f->handle, names[i], NULL), CFG_SUCCESS);
        assert_int_equal(cfg_set_option(f->handle, names[i], NULL), CFG_SUCCESS);
        cfg_get_option(f->handle, names[i], &name);
        assert_null(name);
    }
}

static void file_names_have_1_to_4096_bytes(void **state) {
    static const struct {
        size_t length;
        int code;
    } rows[] = {{0, 21}, {1, 0}, {2, 0}, {4095, 0}, {4096, 0}, {4097, 21}, {100000, 21}};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        for (size_t row = 0; row < LENGTH(rows); ++row) {
            char *name = name_of_length(rows[row].length);
            assert_int_equal(cfg_set_option(f->handle, names[i], "/old"), CFG_SUCCESS);
            assert_int_equal(cfg_set_option(f->handle, names[i], name), rows[row].code);
            assert_name(f->handle, names[i], rows[row].code == 0 ? name : "/old");
            free(name);
        }
    }
}

static void a_file_name_is_kept_as_it_is_given(void **state) {
    static const char *const rows[] = {
        " ", " /a b ", "relative", "./x/../y//z", "tab\there", "\"q\"", "/none/such/folder/file"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        for (size_t row = 0; row < LENGTH(rows); ++row) {
            assert_int_equal(cfg_set_option(f->handle, names[i], rows[row]), CFG_SUCCESS);
            assert_name(f->handle, names[i], rows[row]);
        }
    }
}

static void a_refused_name_is_not_recorded(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, ""), 21);
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_bind_s(f->handle, NULL, NULL, 0);
    const char *report = cfg_dump_exception(f->handle);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, ""), 21);
    assert_int_equal(cfg_get_errno(f->handle), CFG_AUTH_UNKNOWN);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

static void setting_an_option_keeps_the_last_failure(void **state) {
    struct fixture *f = *state;
    cfg_bind_s(f->handle, NULL, NULL, 0);
    const char *report = cfg_dump_exception(f->handle);
    for (int option = 999; option <= 1008; ++option) {
        assert_int_equal(cfg_set_option(f->handle, option, NULL), CFG_SUCCESS);
    }
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/name"), CFG_SUCCESS);
    assert_int_equal(cfg_get_errno(f->handle), CFG_AUTH_UNKNOWN);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

static void a_new_name_does_not_touch_the_loaded_file(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/none/such");
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void a_new_name_takes_effect_at_the_next_bind(void **state) {
    struct fixture *f = *state;
    char *other = path_of(f, "other.conf");
    write_file(other, CONFIGURATION_HEAD "\ndn: cn=Other, cn=Configuration\nobjectclass: top\n");
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, other);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_ONELEVEL, NULL, NULL);
    assert_dns(f->handle, result, "cn=Other, cn=Configuration\n");
    cfg_msgfree(result);
    free(other);
}

static void a_bound_handle_without_a_file_name_counts_as_not_bound(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, f->config);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void the_key_stays_the_callers(void **state) {
    static const unsigned char bytes[16] = {1};
    struct fixture *f = *state;
    struct aes_key_data *key = aes_key_data_from_bytes(bytes, sizeof bytes);
    struct aes_key_data *read = NULL;
    assert_non_null(key);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_KEY_DATA, key), CFG_SUCCESS);
    cfg_get_option(f->handle, CFG_OPT_KEY_DATA, &read);
    assert_ptr_equal(read, key);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_KEY_DATA, NULL), CFG_SUCCESS);
    cfg_get_option(f->handle, CFG_OPT_KEY_DATA, &read);
    assert_null(read);
    aes_key_data_free(key);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        CREATED(an_unknown_option_gives_0_and_changes_nothing),
        CREATED(a_boolean_changes_no_other_option),
        CREATED(every_value_but_null_turns_a_boolean_on),
        CREATED(show_source_and_show_stack_belong_to_all_handles),
        CREATED(the_other_options_belong_to_one_handle),
        CREATED(a_file_name_is_copied),
        CREATED(the_two_file_names_are_apart),
        CREATED(null_unsets_a_file_name_and_may_be_repeated),
        CREATED(file_names_have_1_to_4096_bytes),
        CREATED(a_file_name_is_kept_as_it_is_given),
        CREATED(a_refused_name_is_not_recorded),
        CREATED(setting_an_option_keeps_the_last_failure),
        BOUND(a_new_name_does_not_touch_the_loaded_file),
        BOUND(a_new_name_takes_effect_at_the_next_bind),
        BOUND(a_bound_handle_without_a_file_name_counts_as_not_bound),
        CREATED(the_key_stays_the_callers),
    };
    return cmocka_run_group_tests_name("cfg_set_option", tests, NULL, NULL);
}
