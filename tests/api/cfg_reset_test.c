#include "fixture.h"

static void a_null_handle_gives_89(void **state) {
    (void)state;
    assert_int_equal(cfg_reset(NULL), CFG_PARAM_ERROR);
}

static void it_clears_the_error_and_the_report(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_non_null(cfg_dump_exception(f->handle));
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
}

static void it_clears_an_error_that_has_no_report(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
}

static void it_can_be_repeated(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
}

static void it_keeps_the_options_and_the_binding(void **state) {
    struct fixture *f = *state;
    char *name = NULL;
    int flag = 0;
    cfg_set_option(f->handle, CFG_OPT_FLAG_B, CFG_OPT_ON);
    cfg_reset(f->handle);
    cfg_get_option(f->handle, CFG_OPT_FLAG_B, &flag);
    assert_int_equal(flag, 1);
    cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    assert_string_equal(name, f->config);
    cfg_memfree(name);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

/* Leaves the error and the report of a failed search in the handle. */
static void provoke_a_failure(CfgHandle *handle) {
    CfgMessage *result = NULL;
    assert_int_equal(cfg_search_s(handle, "=x", 0, NULL, NULL, 0, &result), 34);
    assert_non_null(cfg_dump_exception(handle));
}

static void every_traversal_call_forgets_the_last_failure(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);

    provoke_a_failure(f->handle);
    cfg_first_entry(f->handle, entry);
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_next_entry(f->handle, entry);
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_count_entries(f->handle, entry);
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_count_attributes(f->handle, entry);
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_memfree(cfg_first_attribute(f->handle, entry, &cursor));
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_memfree(cfg_next_attribute(f->handle, entry, cursor));
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_value_free(cfg_get_values(f->handle, entry, "cn"));
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    cfg_memfree(cfg_get_dn(f->handle, entry));
    assert_no_report(f->handle, CFG_SUCCESS);

    provoke_a_failure(f->handle);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);

    cfg_ber_free(cursor);
    cfg_msgfree(entry);
}

static void the_calls_that_need_no_handle_and_the_reporting_ones_keep_it(void **state) {
    struct fixture *f = *state;
    int flag = 0;
    provoke_a_failure(f->handle);
    const char *report = cfg_dump_exception(f->handle);
    cfg_get_option(f->handle, CFG_OPT_FLAG_A, &flag);
    cfg_set_option(f->handle, CFG_OPT_FLAG_A, CFG_OPT_OFF);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "");
    cfg_set_option(f->handle, 999, NULL);
    cfg_perror(f->handle, "test");
    cfg_err2string(0);
    cfg_msgfree(NULL);
    cfg_value_free(NULL);
    cfg_ber_free(NULL);
    cfg_memfree(NULL);
    cfg_count_values(NULL);
    assert_int_equal(cfg_get_errno(f->handle), 34);
    assert_int_equal(cfg_get_exterror(f->handle), 1012);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        CREATED(it_clears_the_error_and_the_report),
        CREATED(it_clears_an_error_that_has_no_report),
        CREATED(it_can_be_repeated),
        BOUND(it_keeps_the_options_and_the_binding),
        BOUND(every_traversal_call_forgets_the_last_failure),
        BOUND(the_calls_that_need_no_handle_and_the_reporting_ones_keep_it),
    };
    return cmocka_run_group_tests_name("cfg_reset", tests, NULL, NULL);
}
