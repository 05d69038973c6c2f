/*
 * The calls when memory is exhausted: the 1st, 2nd, ... allocation fails until none does. The
 * server's routines are the host's, which keep nothing of a failure.
 */

#include <errno.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "allocator.h"
#include "fixture.h"
#include "host_routines.h"

#define BASE "cn=Configuration"
#define LONG_NAME "/a/name/that/does/not/fit/into/a/short/text"

static void assert_nothing_is_left(long before) { assert_int_equal(live_blocks(), before); }

static void assert_name(CfgHandle *handle, const char *expected) {
    char *name = NULL;
    cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &name);
    assert_string_equal(name, expected);
    cfg_memfree(name);
}

static void init_gives_null(void **state) {
    (void)state;
    cfg_unbind(cfg_init());
    const long before = live_blocks();
    fail_all_calls(call_malloc | call_calloc);
    CfgHandle *handle = cfg_init();
    stop_failing();
    assert_null(handle);
    assert_nothing_is_left(before);
}

static void init_gives_null_or_a_handle_that_can_be_used(void **state) {
    (void)state;
    for (long n = 1;; ++n) {
        fail_call(call_any, n);
        CfgHandle *handle = cfg_init();
        if (stop_failing() == 0) {
            assert_non_null(handle);
            cfg_unbind(handle);
            break;
        }
        if (handle) {
            assert_no_report(handle, CFG_SUCCESS);
            cfg_unbind(handle);
        }
    }
}

static void set_option_gives_90_and_keeps_the_old_name(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, LONG_NAME);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/old");
    const long before = live_blocks();
    fail_call(call_strdup, 1);
    const int code = cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, LONG_NAME);
    assert_int_equal(stop_failing(), 1);
    assert_int_equal(code, CFG_NO_MEMORY);
    assert_nothing_is_left(before);
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_name(f->handle, "/old");
}

static void set_option_lets_no_exception_out(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, LONG_NAME);
    for (long n = 1;; ++n) {
        cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/old");
        const long before = live_blocks();
        fail_call(call_malloc, n);
        const int code = cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, LONG_NAME);
        if (stop_failing() == 0) {
            assert_int_equal(code, CFG_SUCCESS);
            assert_true(n > 1);
            break;
        }
        assert_int_equal(code, CFG_NO_MEMORY);
        assert_nothing_is_left(before);
        assert_no_report(f->handle, CFG_SUCCESS);
        assert_name(f->handle, "/old");
    }
}

static void get_option_gives_a_null_name_and_0(void **state) {
    struct fixture *f = *state;
    char *name = f->config;
    fail_call(call_strdup, 1);
    const int code = cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    assert_int_equal(stop_failing(), 1);
    assert_int_equal(code, CFG_SUCCESS);
    assert_null(name);
}

static void bind_gives_90_when_the_default_name_can_not_be_copied(void **state) {
    struct fixture *f = *state;
    char *name = f->config;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    fail_call(call_strdup, 1);
    const int code = cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE);
    assert_int_equal(stop_failing(), 1);
    assert_int_equal(code, CFG_NO_MEMORY);
    char *report = report_without_lines(f->handle);
    assert_string_equal(report,
                        "[src/libraries/cfg32stl/bind:#]\n"
                        "msg     strdup()\n"
                        "ldapErr 90: Out of memory\n");
    free(report);
    cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    assert_null(name);
}

/* Exhausted memory is no fault of the file's: not a byte of it may change. */
static void assert_file_is_unchanged(const char *path) {
    char *text = read_file(path);
    assert_string_equal(text, standard_configuration);
    free(text);
}

/* Binds once per allocation, each time with another one failing. */
static void assert_bind_survives(struct fixture *f, const char *dn, const char *password) {
    assert_int_equal(cfg_bind_s(f->handle, dn, password, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    for (long n = 1;; ++n) {
        CfgHandle *handle = cfg_init();
        CfgMessage *result = NULL;
        write_configuration(f, standard_configuration);
        cfg_set_option(handle, CFG_OPT_CONFIG_FILE, f->config);
        const long before = live_blocks();
        fail_call(call_any, n);
        const int code = cfg_bind_s(handle, dn, password, CFG_AUTH_SIMPLE);
        const long failed = stop_failing();
        assert_int_equal(cfg_get_errno(handle), code);
        assert_file_is_unchanged(f->config);
        if (failed == 0) {
            assert_int_equal(code, CFG_SUCCESS);
            cfg_unbind(handle);
            break;
        }
        if (code != CFG_SUCCESS) {
            assert_int_equal(cfg_search_s(handle, BASE, 0, NULL, NULL, 0, &result),
                             CFG_PARAM_ERROR);
            cfg_reset(handle);
            assert_nothing_is_left(before);
            write_configuration(f, standard_configuration);
            assert_int_equal(cfg_bind_s(handle, dn, password, CFG_AUTH_SIMPLE), CFG_SUCCESS);
        }
        cfg_unbind(handle);
    }
}

static void an_anonymous_bind_fails_cleanly_and_loses_no_line(void **state) {
    assert_bind_survives(*state, NULL, NULL);
}

static void the_administrators_bind_fails_cleanly_and_loses_no_line(void **state) {
    assert_bind_survives(*state, ADMINISTRATOR, PASSWORD);
}

static int search(struct fixture *f, CfgMessage **result) {
    return cfg_search_s(f->handle, BASE, CFG_SCOPE_SUBTREE, "objectclass=*", NULL, 0, result);
}

static void search_gives_90_and_releases_what_it_built(void **state) {
    /* The nodes, and their texts; before those, malloc serves the search itself. */
    static const unsigned kinds[] = {call_calloc, call_malloc};
    struct fixture *f = *state;
    search_all(f->handle);
    (void)strerror(ENOMEM);
    for (size_t i = 0; i < LENGTH(kinds); ++i) {
        int built = 0;
        for (long n = 1;; ++n) {
            CfgMessage *result = (CfgMessage *)f;
            const long before = live_blocks();
            fail_call(kinds[i], n);
            const int code = search(f, &result);
            if (stop_failing() == 0) {
                assert_int_equal(code, CFG_SUCCESS);
                assert_int_equal(cfg_count_entries(f->handle, result), 4);
                cfg_msgfree(result);
                assert_true(built > 20);
                break;
            }
            assert_null(result);
            const int has_report = cfg_dump_exception(f->handle) != NULL;
            if (kinds[i] == call_calloc || built > 0 || !has_report) {
                assert_int_equal(code, CFG_NO_MEMORY);
                assert_no_report(f->handle, CFG_NO_MEMORY);
                ++built;
            }
            cfg_reset(f->handle);
            assert_nothing_is_left(before);
        }
    }
}

static void search_gives_80_or_90_whichever_allocation_fails(void **state) {
    struct fixture *f = *state;
    search_all(f->handle);
    /* The C library keeps what it loads for the first message in a locale. */
    (void)strerror(ENOMEM);
    for (long n = 1;; ++n) {
        CfgMessage *result = (CfgMessage *)f;
        const long before = live_blocks();
        fail_call(call_any, n);
        const int code = search(f, &result);
        if (stop_failing() == 0) {
            assert_int_equal(code, CFG_SUCCESS);
            cfg_msgfree(result);
            break;
        }
        if (code != CFG_SUCCESS) {
            assert_null(result);
            if (code == CFG_NO_MEMORY && cfg_dump_exception(f->handle)) {
                assert_report_has(f->handle, CFG_NO_MEMORY, "msg     Allocation failed\n");
            } else if (code != CFG_NO_MEMORY) {
                assert_report_has(f->handle, CFG_OTHER, "msg     System error ");
                assert_int_equal(cfg_get_exterror(f->handle), 1000);
            }
        }
        cfg_msgfree(result);
        cfg_reset(f->handle);
        assert_nothing_is_left(before);
    }
}

static void a_search_without_any_memory_gives_90_or_80(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    search_all(f->handle);
    const long before = live_blocks();
    fail_all_calls(call_any);
    const int code = search(f, &result);
    stop_failing();
    assert_true(code == CFG_NO_MEMORY || code == CFG_OTHER);
    assert_null(result);
    cfg_reset(f->handle);
    assert_nothing_is_left(before);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void get_values_gives_90_and_releases_the_copies(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, "cn=Front End, " BASE, 0, NULL, NULL);
    /* The array, then each of the two values. */
    for (long n = 1; n <= 4; ++n) {
        const long before = live_blocks();
        fail_call(call_any, n);
        char **values = cfg_get_values(f->handle, entry, "oru-slapdSetenv");
        assert_int_equal(stop_failing(), n <= 3);
        if (n <= 3) {
            assert_null(values);
            assert_no_report(f->handle, CFG_NO_MEMORY);
            assert_nothing_is_left(before);
        }
        cfg_value_free(values);
    }
    cfg_msgfree(entry);
}

static void get_dn_gives_90(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    fail_call(call_any, 1);
    char *dn = cfg_get_dn(f->handle, entry);
    assert_int_equal(stop_failing(), 1);
    assert_null(dn);
    assert_no_report(f->handle, CFG_NO_MEMORY);
    cfg_msgfree(entry);
}

static void first_attribute_gives_90_and_a_null_cursor(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    /* The cursor, then the name. */
    for (long n = 1; n <= 2; ++n) {
        CfgCursor *cursor = NULL;
        const long before = live_blocks();
        fail_call(call_any, n);
        char *name = cfg_first_attribute(f->handle, entry, &cursor);
        assert_int_equal(stop_failing(), 1);
        assert_null(name);
        assert_null(cursor);
        assert_no_report(f->handle, CFG_NO_MEMORY);
        assert_nothing_is_left(before);
    }
    cfg_msgfree(entry);
}

static void next_attribute_gives_90_and_goes_on(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    cfg_memfree(cfg_first_attribute(f->handle, entry, &cursor));
    fail_call(call_any, 1);
    char *name = cfg_next_attribute(f->handle, entry, cursor);
    assert_int_equal(stop_failing(), 1);
    assert_null(name);
    assert_no_report(f->handle, CFG_NO_MEMORY);
    name = cfg_next_attribute(f->handle, entry, cursor);
    assert_string_equal(name, "oru-slapdAdminDN");
    cfg_memfree(name);
    cfg_ber_free(cursor);
    cfg_msgfree(entry);
}

static void dump_exception_gives_null_and_later_the_report(void **state) {
    struct fixture *f = *state;
    cfg_bind_s(f->handle, NULL, NULL, 0);
    for (long n = 1;; ++n) {
        const long before = live_blocks();
        fail_call(call_any, n);
        const char *report = cfg_dump_exception(f->handle);
        if (stop_failing() == 0) {
            assert_non_null(report);
            assert_true(n > 1);
            break;
        }
        assert_null(report);
        assert_nothing_is_left(before);
        assert_int_equal(cfg_get_errno(f->handle), CFG_AUTH_UNKNOWN);
    }
}

/* Frees the drawing, and sees that it was the handle's. */
static void assert_reset_frees(CfgHandle *handle, const char *tree, long before) {
    watch_block(tree, strlen(tree) + 1);
    cfg_reset(handle);
    assert_non_null(freed_bytes());
    assert_nothing_is_left(before);
}

static void tree_view_gives_null_and_later_the_drawing(void **state) {
    struct fixture *f = *state;
    for (int style = CFG_TREE_ASCII; style <= CFG_TREE_CP437; ++style) {
        const long before = live_blocks();
        for (long n = 1;; ++n) {
            fail_call(call_any, n);
            const char *tree = cfg_tree_view(f->handle, style);
            if (stop_failing() == 0) {
                assert_non_null(tree);
                assert_true(n > 2);
                assert_reset_frees(f->handle, tree, before);
                break;
            }
            assert_null(tree);
            cfg_reset(f->handle);
            assert_nothing_is_left(before);
        }
    }
}

static void a_failure_that_can_not_be_recorded_still_has_a_code(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    search_all(f->handle);
    const long before = live_blocks();
    for (long n = 1;; ++n) {
        fail_call(call_any, n);
        const int code = cfg_search_s(f->handle, "cn=none", 0, NULL, NULL, 0, &result);
        if (stop_failing() == 0) {
            assert_int_equal(code, 32);
            break;
        }
        assert_null(result);
        assert_true(code == 32 || code == CFG_OTHER || code == CFG_NO_MEMORY);
        assert_int_equal(cfg_get_errno(f->handle), code);
        cfg_reset(f->handle);
        assert_nothing_is_left(before);
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(init_gives_null),
        cmocka_unit_test(init_gives_null_or_a_handle_that_can_be_used),
        CREATED(set_option_gives_90_and_keeps_the_old_name),
        CREATED(set_option_lets_no_exception_out),
        CREATED(get_option_gives_a_null_name_and_0),
        CREATED(bind_gives_90_when_the_default_name_can_not_be_copied),
        CREATED(an_anonymous_bind_fails_cleanly_and_loses_no_line),
        CREATED(the_administrators_bind_fails_cleanly_and_loses_no_line),
        BOUND(search_gives_90_and_releases_what_it_built),
        BOUND(search_gives_80_or_90_whichever_allocation_fails),
        BOUND(a_search_without_any_memory_gives_90_or_80),
        BOUND(get_values_gives_90_and_releases_the_copies),
        BOUND(get_dn_gives_90),
        BOUND(first_attribute_gives_90_and_a_null_cursor),
        BOUND(next_attribute_gives_90_and_goes_on),
        CREATED(dump_exception_gives_null_and_later_the_report),
        BOUND(tree_view_gives_null_and_later_the_drawing),
        BOUND(a_failure_that_can_not_be_recorded_still_has_a_code),
    };
    reset_host();
    return cmocka_run_group_tests_name("exhausted_memory", tests, NULL, NULL);
}
