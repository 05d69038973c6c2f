#include "fixture.h"

static const int every_option[] = {
    CFG_OPT_FLAG_A,
    CFG_OPT_FLAG_B,
    CFG_OPT_SHOW_SOURCE,
    CFG_OPT_SHOW_STACK,
    CFG_OPT_DELETE_NON_LEAVES,
    CFG_OPT_CONFIG_FILE,
    CFG_OPT_BACKUP_FILE,
    CFG_OPT_KEY_DATA,
};

static void the_options_are_numbered_from_1000_to_1007(void **state) {
    (void)state;
    for (size_t i = 0; i < LENGTH(every_option); ++i) {
        assert_int_equal(every_option[i], 1000 + i);
    }
}

static void a_null_handle_gives_89_and_writes_nothing(void **state) {
    (void)state;
    for (size_t i = 0; i < LENGTH(every_option); ++i) {
        void *value = &value;
        assert_int_equal(cfg_get_option(NULL, every_option[i], &value), CFG_PARAM_ERROR);
        assert_ptr_equal(value, &value);
    }
}

static void a_null_result_gives_89_and_records_nothing(void **state) {
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(every_option); ++i) {
        assert_int_equal(cfg_get_option(f->handle, every_option[i], NULL), CFG_PARAM_ERROR);
    }
    assert_int_equal(cfg_get_option(f->handle, 999, NULL), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_SUCCESS);
}

static void an_unknown_option_gives_0_and_writes_nothing(void **state) {
    static const int numbers[] = {999, 1008, 0, -1, 1 << 30};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(numbers); ++i) {
        void *value = &value;
        assert_int_equal(cfg_get_option(f->handle, numbers[i], &value), CFG_SUCCESS);
        assert_ptr_equal(value, &value);
    }
}

static void a_boolean_is_written_as_one_int(void **state) {
    static const int booleans[] = {CFG_OPT_FLAG_A, CFG_OPT_FLAG_B, CFG_OPT_SHOW_SOURCE,
                                   CFG_OPT_SHOW_STACK, CFG_OPT_DELETE_NON_LEAVES};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(booleans); ++i) {
        int value[2] = {-7, -7};
        cfg_set_option(f->handle, booleans[i], CFG_OPT_ON);
        assert_int_equal(cfg_get_option(f->handle, booleans[i], value), CFG_SUCCESS);
        assert_int_equal(value[0], 1);
        cfg_set_option(f->handle, booleans[i], CFG_OPT_OFF);
        assert_int_equal(cfg_get_option(f->handle, booleans[i], value), CFG_SUCCESS);
        assert_int_equal(value[0], 0);
        assert_int_equal(value[1], -7);
    }
}

static void a_file_name_is_a_fresh_copy_of_the_callers(void **state) {
    static const int names[] = {CFG_OPT_CONFIG_FILE, CFG_OPT_BACKUP_FILE};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        char *one = NULL;
        char *other = NULL;
        cfg_set_option(f->handle, names[i], "/a/name");
        assert_int_equal(cfg_get_option(f->handle, names[i], &one), CFG_SUCCESS);
        one[1] = 'X';
        assert_int_equal(cfg_get_option(f->handle, names[i], &other), CFG_SUCCESS);
        assert_string_equal(other, "/a/name");
        cfg_memfree(one);
        cfg_memfree(other);
    }
}

static void a_copied_file_name_outlives_the_handle(void **state) {
    struct fixture *f = *state;
    char *name = NULL;
    cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    cfg_unbind(f->handle);
    f->handle = NULL;
    assert_string_equal(name, f->config);
    cfg_memfree(name);
}

static void a_name_that_is_not_set_is_null(void **state) {
    struct fixture *f = *state;
    char *name = f->folder;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_int_equal(cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name), CFG_SUCCESS);
    assert_null(name);
    name = f->folder;
    assert_int_equal(cfg_get_option(f->handle, CFG_OPT_BACKUP_FILE, &name), CFG_SUCCESS);
    assert_null(name);
}

static void the_key_is_the_pointer_that_was_set(void **state) {
    struct fixture *f = *state;
    char anything = 0;
    struct aes_key_data *key = NULL;
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, &anything);
    assert_int_equal(cfg_get_option(f->handle, CFG_OPT_KEY_DATA, &key), CFG_SUCCESS);
    assert_ptr_equal(key, &anything);
}

static void it_keeps_the_last_failure(void **state) {
    struct fixture *f = *state;
    void *value = NULL;
    cfg_bind_s(f->handle, NULL, NULL, 0);
    const char *report = cfg_dump_exception(f->handle);
    for (size_t i = 0; i < LENGTH(every_option); ++i) {
        cfg_get_option(f->handle, every_option[i], &value);
        if (every_option[i] == CFG_OPT_CONFIG_FILE) {
            cfg_memfree(value);
        }
    }
    cfg_get_option(f->handle, 999, &value);
    assert_int_equal(cfg_get_errno(f->handle), CFG_AUTH_UNKNOWN);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(the_options_are_numbered_from_1000_to_1007),
        cmocka_unit_test(a_null_handle_gives_89_and_writes_nothing),
        CREATED(a_null_result_gives_89_and_records_nothing),
        CREATED(an_unknown_option_gives_0_and_writes_nothing),
        CREATED(a_boolean_is_written_as_one_int),
        CREATED(a_file_name_is_a_fresh_copy_of_the_callers),
        CREATED(a_copied_file_name_outlives_the_handle),
        CREATED(a_name_that_is_not_set_is_null),
        CREATED(the_key_is_the_pointer_that_was_set),
        CREATED(it_keeps_the_last_failure),
    };
    return cmocka_run_group_tests_name("cfg_get_option", tests, NULL, NULL);
}
