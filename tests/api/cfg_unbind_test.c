#include <stdio.h>
#include <stdlib.h>
#include <sys/stat.h>

#include "cfg32_platform.h"
#include "fixture.h"

static void a_null_handle_gives_89(void **state) {
    (void)state;
    assert_int_equal(cfg_unbind(NULL), CFG_PARAM_ERROR);
}

static void it_releases_a_created_handle(void **state) {
    (void)state;
    assert_int_equal(cfg_unbind(cfg_init()), CFG_SUCCESS);
}

static void it_releases_the_names_the_file_and_the_report(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "/backup");
    cfg_search_s(f->handle, "=x", 0, NULL, NULL, 0, &result);
    assert_non_null(cfg_dump_exception(f->handle));
    /* A sanitizer sees what is left. */
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
}

static void it_releases_a_handle_whose_bind_failed(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/none/such");
    assert_int_equal(bind_administrator(f->handle), 91);
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
}

static void it_writes_nothing(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    struct stat before;
    struct stat after;
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(stat(f->config, &before), 0);
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
    assert_int_equal(stat(f->config, &after), 0);
    assert_int_equal(before.st_mtim.tv_sec, after.st_mtim.tv_sec);
    assert_int_equal(before.st_ino, after.st_ino);
    char *text = read_file(f->config);
    assert_string_equal(text, standard_configuration);
    assert_false(file_exists(backup));
    free(text);
    free(backup);
}

static void it_needs_no_file_on_disk_any_more(void **state) {
    struct fixture *f = *state;
    assert_int_equal(remove(f->config), 0);
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
    assert_false(file_exists(f->config));
}

static void results_stay_valid(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_SUBTREE, NULL, NULL);
    cfg_unbind(f->handle);
    f->handle = cfg_init();
    assert_int_equal(cfg_count_entries(f->handle, result), 4);
    assert_values(f->handle, result, "cn", "Configuration");
    cfg_msgfree(result);
}

static void the_key_is_not_freed(void **state) {
    static const unsigned char bytes[32] = {7};
    struct fixture *f = *state;
    char encoded[1024];
    struct aes_key_data *key = aes_key_data_from_bytes(bytes, sizeof bytes);
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, key);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    cfg_unbind(f->handle);
    f->handle = NULL;
    assert_int_equal(format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, "text", 4,
                                     encoded, sizeof encoded),
                     1);
    aes_key_data_free(key);
}

static void other_handles_go_on(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    cfg_set_option(other, CFG_OPT_CONFIG_FILE, f->config);
    assert_int_equal(bind_administrator(other), CFG_SUCCESS);
    cfg_unbind(f->handle);
    f->handle = other;
    assert_int_equal(search_all(other), CFG_SUCCESS);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        cmocka_unit_test(it_releases_a_created_handle),
        BOUND(it_releases_the_names_the_file_and_the_report),
        CREATED(it_releases_a_handle_whose_bind_failed),
        CREATED(it_writes_nothing),
        BOUND(it_needs_no_file_on_disk_any_more),
        BOUND(results_stay_valid),
        CREATED(the_key_is_not_freed),
        BOUND(other_handles_go_on),
    };
    return cmocka_run_group_tests_name("cfg_unbind", tests, NULL, NULL);
}
