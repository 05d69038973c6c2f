/* cfg_first_entry, cfg_next_entry and cfg_count_entries. */

#include "fixture.h"

static CfgMessage *whole(const struct fixture *f) {
    return found(f->handle, "cn=Configuration", CFG_SCOPE_SUBTREE, NULL, NULL);
}

static void the_first_entry_is_the_result_itself(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = whole(f);
    assert_ptr_equal(cfg_first_entry(f->handle, result), result);
    assert_ptr_equal(cfg_first_entry(NULL, result), result);
    assert_null(cfg_first_entry(f->handle, NULL));
    assert_null(cfg_first_entry(NULL, NULL));
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(result);
}

static void the_next_entries_follow_to_the_end(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = whole(f);
    int count = 0;
    for (CfgMessage *entry = result; entry; entry = cfg_next_entry(f->handle, entry)) {
        ++count;
    }
    assert_int_equal(count, 4);
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(result);
}

static void a_null_entry_has_no_next_one_and_is_no_error(void **state) {
    struct fixture *f = *state;
    assert_null(cfg_next_entry(f->handle, NULL));
    assert_null(cfg_next_entry(NULL, NULL));
    assert_no_report(f->handle, CFG_SUCCESS);
}

static void a_walk_needs_no_handle(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = whole(f);
    CfgMessage *second = cfg_next_entry(NULL, result);
    assert_non_null(second);
    assert_ptr_equal(second, cfg_next_entry(f->handle, result));
    cfg_msgfree(result);
}

static void entries_are_counted_from_the_given_one_on(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = whole(f);
    int expected = 4;
    for (CfgMessage *entry = result; entry; entry = cfg_next_entry(f->handle, entry)) {
        assert_int_equal(cfg_count_entries(f->handle, entry), expected--);
    }
    assert_int_equal(expected, 0);
    assert_int_equal(cfg_count_entries(f->handle, NULL), 0);
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(result);
}

static void counting_without_a_handle_gives_89_whatever_there_is(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = whole(f);
    assert_int_equal(cfg_count_entries(NULL, result), CFG_PARAM_ERROR);
    assert_int_equal(cfg_count_entries(NULL, NULL), CFG_PARAM_ERROR);
    cfg_msgfree(result);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        BOUND(the_first_entry_is_the_result_itself),
        BOUND(the_next_entries_follow_to_the_end),
        BOUND(a_null_entry_has_no_next_one_and_is_no_error),
        BOUND(a_walk_needs_no_handle),
        BOUND(entries_are_counted_from_the_given_one_on),
        BOUND(counting_without_a_handle_gives_89_whatever_there_is),
    };
    return cmocka_run_group_tests_name("cfg_first_entry", tests, NULL, NULL);
}
