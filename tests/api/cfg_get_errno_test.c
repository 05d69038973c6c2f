/* cfg_get_errno and cfg_get_exterror. */

#include "fixture.h"

static void a_null_handle_gives_89(void **state) {
    (void)state;
    assert_int_equal(cfg_get_errno(NULL), CFG_PARAM_ERROR);
    assert_int_equal(cfg_get_exterror(NULL), CFG_PARAM_ERROR);
}

static void after_a_success_both_are_0(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_get_errno(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_get_exterror(f->handle), CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_get_errno(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_get_exterror(f->handle), CFG_SUCCESS);
}

static void after_a_failure_with_a_report_the_extended_code_is_the_finer_one(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    cfg_search_s(f->handle, "cn", 0, NULL, NULL, 0, &result);
    assert_int_equal(cfg_get_errno(f->handle), 34);
    assert_int_equal(cfg_get_exterror(f->handle), 1013);
}

static void without_a_finer_code_both_are_the_same(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    cfg_search_s(f->handle, "cn=none", 0, NULL, NULL, 0, &result);
    assert_int_equal(cfg_get_errno(f->handle), 32);
    assert_int_equal(cfg_get_exterror(f->handle), 32);
}

static void after_a_failure_without_a_report_both_are_the_same(void **state) {
    struct fixture *f = *state;
    cfg_bind_s(f->handle, ADMINISTRATOR, "wrong", CFG_AUTH_SIMPLE);
    assert_int_equal(cfg_get_errno(f->handle), CFG_INVALID_CREDENTIALS);
    assert_int_equal(cfg_get_exterror(f->handle), CFG_INVALID_CREDENTIALS);
}

static void asking_does_not_reset(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    cfg_search_s(f->handle, "cn", 0, NULL, NULL, 0, &result);
    for (int i = 0; i < 3; ++i) {
        assert_int_equal(cfg_get_errno(f->handle), 34);
        assert_int_equal(cfg_get_exterror(f->handle), 1013);
        assert_non_null(cfg_dump_exception(f->handle));
    }
}

static void the_error_of_one_handle_is_not_that_of_another(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    cfg_bind_s(other, NULL, NULL, 0);
    assert_int_equal(cfg_get_errno(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_get_errno(other), CFG_AUTH_UNKNOWN);
    cfg_unbind(other);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        BOUND(after_a_success_both_are_0),
        BOUND(after_a_failure_with_a_report_the_extended_code_is_the_finer_one),
        BOUND(without_a_finer_code_both_are_the_same),
        BOUND(after_a_failure_without_a_report_both_are_the_same),
        BOUND(asking_does_not_reset),
        BOUND(the_error_of_one_handle_is_not_that_of_another),
    };
    return cmocka_run_group_tests_name("cfg_get_errno", tests, NULL, NULL);
}
