/* cfg_delete_s takes an entry away, and only what goes with it; see update_calls_test.c. */

#include <stdlib.h>

#include "changes.h"

#define NOT_A_LEAF "Use CFG_OPT_DELETE_NON_LEAVES to enable subtree delete"

static void an_entry_goes_with_the_comment_before_it(void **state) {
    static const struct {
        const char *before;
        const char *dn;
        const char *after;
    } rows[] = {
        {ENTRY("cn=A", "note: a\n"), A, ""},
        {ENTRY("cn=A", "") ENTRY("cn=B", "") ENTRY("cn=C", ""), "cn=B, " TOP,
         ENTRY("cn=A", "") ENTRY("cn=C", "")},
        {ENTRY("cn=A", "") "# why\n" ENTRY("cn=B", "") "# other\n" ENTRY("cn=C", ""), "cn=B, " TOP,
         ENTRY("cn=A", "") "# other\n" ENTRY("cn=C", "")},
        {ENTRY("cn=A", "") ENTRY("cn=B, cn=A", "note: b\n"), "cn=B, " A, ENTRY("cn=A", "")},
        {ENTRY("cn=A", "") "# the end\n", A, "# the end\n"},
        {"dn: o=Elsewhere\n\n", "O=ELSEWHERE", ""},
        /* What is missing above it does not matter. */
        {ENTRY("cn=D, cn=C, cn=B", ""), "cn=D, cn=C, cn=B, " TOP, ""},
        {"dn: cn=x, o=None\n\n", "cn=x,o=none", ""},
        {ENTRY("cn=A", "") ENTRY("cn=D, cn=C, cn=A", ""), "cn=D, cn=C, " A, ENTRY("cn=A", "")},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_entries(f, rows[i].before);
        if (cfg_delete_s(f->handle, rows[i].dn) != CFG_SUCCESS) {
            fail_msg("%s: %s", rows[i].dn, cfg_dump_exception(f->handle));
        }
        assert_no_report(f->handle, CFG_SUCCESS);
        assert_entries(f, rows[i].after);
    }
}

static void a_deleted_entry_is_not_found_any_more(void **state) {
    static const struct refusal expected = {32, 32, "Entry not found", NULL, ""};
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_SUCCESS);
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_NO_SUCH_OBJECT);
    assert_refused(f, A, &expected);
    assert_int_equal(add(f->handle, A, "add note=again"), CFG_SUCCESS);
    assert_lines(f, "note: again\n");
}

static void an_entry_that_is_not_there_gives_32(void **state) {
    /* The empty name is that of the lines above all entries. */
    static const char *const rows[] = {
        "",     "cn=None",    "cn=None, " A, A ", o=x",
        "cn=A", "cn=C, " TOP, "cn=B, " TOP,  "cn=E, cn=D, cn=C, " TOP};
    static const struct refusal expected = {32, 32, "Entry not found", NULL, ""};
    static const char entries[] = ENTRY("cn=A", "") ENTRY("cn=D, cn=C", "") ENTRY("cn=B, cn=A", "");
    struct fixture *f = *state;
    load_entries(f, entries);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    char *before = read_file(f->config);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(cfg_delete_s(f->handle, rows[i]), CFG_NO_SUCH_OBJECT);
        assert_refused(f, rows[i], &expected);
        assert_file(f->config, before);
    }
    free(before);
}

/* ---- entries below it ---- */

#define FAMILY \
    ENTRY("cn=A", "note: a\n") ENTRY("cn=B, cn=A", "note: b\n") ENTRY("cn=C, cn=B, cn=A", "")

static void an_entry_with_others_below_it_stays_while_the_option_is_off(void **state) {
    static const struct refusal expected = {66, 66, NOT_A_LEAF, NULL, ""};
    static const char *const rows[] = {A, "cn=B, " A, TOP};
    struct fixture *f = *state;
    load_entries(f, FAMILY);
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(cfg_delete_s(f->handle, rows[i]), CFG_NOT_ALLOWED_ON_NONLEAF);
        assert_refused(f, rows[i], &expected);
        assert_entries(f, FAMILY);
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_entries(f, FAMILY);
    }
}

static void with_the_option_everything_below_an_entry_goes_with_it(void **state) {
    struct fixture *f = *state;
    load_entries(f, FAMILY ENTRY("cn=Z", "note: z\n"));
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    assert_int_equal(cfg_delete_s(f->handle, "cn=B, " A), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=A", "note: a\n") ENTRY("cn=Z", "note: z\n"));
    load_entries(f, FAMILY ENTRY("cn=Z", "note: z\n"));
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=Z", "note: z\n"));
}

static void the_option_counts_at_once_and_can_be_taken_back(void **state) {
    struct fixture *f = *state;
    load_entries(f, FAMILY);
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_NOT_ALLOWED_ON_NONLEAF);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_OFF);
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_NOT_ALLOWED_ON_NONLEAF);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_entries(f, "");
}

static void a_leaf_never_needs_the_option(void **state) {
    struct fixture *f = *state;
    load_entries(f, FAMILY);
    assert_int_equal(cfg_delete_s(f->handle, "cn=C, cn=B, " A), CFG_SUCCESS);
    assert_int_equal(cfg_delete_s(f->handle, "cn=B, " A), CFG_SUCCESS);
    assert_int_equal(cfg_delete_s(f->handle, A), CFG_SUCCESS);
    assert_entries(f, "");
}

static void the_administrators_entry_can_be_deleted_too(void **state) {
    static const char left[] = "charset: UTF-8\nversion: 1\n";
    struct fixture *f = *state;
    load_entries(f, FAMILY);
    cfg_set_option(f->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
    assert_int_equal(cfg_delete_s(f->handle, TOP), CFG_SUCCESS);
    assert_file(f->config, left);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_file(f->config, left);
    assert_int_equal(bind_administrator(f->handle), CFG_NO_SUCH_OBJECT);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(an_entry_goes_with_the_comment_before_it),
        CREATED(a_deleted_entry_is_not_found_any_more),
        CREATED(an_entry_that_is_not_there_gives_32),
        CREATED(an_entry_with_others_below_it_stays_while_the_option_is_off),
        CREATED(with_the_option_everything_below_an_entry_goes_with_it),
        CREATED(the_option_counts_at_once_and_can_be_taken_back),
        CREATED(a_leaf_never_needs_the_option),
        CREATED(the_administrators_entry_can_be_deleted_too),
    };
    return cmocka_run_group_tests_name("cfg_delete_s", tests, NULL, NULL);
}
