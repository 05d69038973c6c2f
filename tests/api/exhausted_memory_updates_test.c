/*
 * The calls that change the configuration when memory is exhausted: the 1st, 2nd, ... allocation
 * fails until none does. A call that fails leaves the file as it was, and no memory behind.
 */

#include <stdlib.h>
#include <string.h>

#include "allocator.h"
#include "changes.h"
#include "host_routines.h"

/* The changes of update_calls, by records that are not allocated. */

static int run_modify(CfgHandle *handle) {
    return modify_one(handle, A, LDAP_MOD_REPLACE, "note", "new");
}

static int run_add(CfgHandle *handle) {
    char cn[] = "cn";
    char note[] = "note";
    char name[] = "C";
    char text[] = "c";
    char *names[] = {name, NULL};
    char *texts[] = {text, NULL};
    LDAPMod first = {LDAP_MOD_ADD, cn, {names}};
    LDAPMod second = {LDAP_MOD_ADD, note, {texts}};
    LDAPMod *mods[] = {&first, &second, NULL};
    return cfg_add_s(handle, "cn=C, " TOP, mods);
}

static int run_delete(CfgHandle *handle) { return cfg_delete_s(handle, "cn=B, " TOP); }

/* In their order, each with a report that only some allocations give. A flush allocates nothing but
 * in the store, which reports it as its own. */
static const struct exhausted_call {
    int (*run)(CfgHandle *handle);
    const char *report;
} calls[] = {
    {run_modify, "msg     System error in cfg_modify_s()\n"},
    {run_add, "msg     System error in cfg_add_s()\n"},
    {run_delete, "msg     System error in cfg_delete_s()\n"},
    {cfg_flush_s, "msg     System error writing file\n"},
};

/* What the calls change, not in its canonical form: every write would show. */
static const char entries_before[] =
    ENTRY("cn=A", "cn:A\nnote:old\n") ENTRY("cn=B", "cn:B\nnote:b\n");

/* What a call meets. */
struct circumstances {
    int is_read_again; /* another program has written the file since the bind */
    int has_backup;
};

/* A handle that meets them. */
static CfgHandle *bound_handle(const struct fixture *f, const struct circumstances *meeting) {
    CfgHandle *handle = cfg_init();
    assert_non_null(handle);
    write_entries(f, entries_before);
    assert_int_equal(cfg_set_option(handle, CFG_OPT_CONFIG_FILE, f->config), CFG_SUCCESS);
    if (meeting->has_backup) {
        assert_int_equal(cfg_set_option(handle, CFG_OPT_BACKUP_FILE, "/a/backup"), CFG_SUCCESS);
    }
    assert_int_equal(bind_administrator(handle), CFG_SUCCESS);
    if (meeting->is_read_again) {
        write_entries(f, entries_before);
    }
    return handle;
}

/* The code, and the report if there was memory for one. Returns whether it has the text. */
static int assert_exhausted(CfgHandle *handle, int code, const char *text) {
    assert_true(code == CFG_OTHER || code == CFG_NO_MEMORY);
    assert_int_equal(cfg_get_errno(handle), code);
    const char *report = cfg_dump_exception(handle);
    if (code == CFG_NO_MEMORY) {
        assert_true(!report || strstr(report, "msg     Allocation failed\n"));
        return 0;
    }
    assert_report_has(handle, CFG_OTHER, "msg     System error ");
    assert_int_equal(cfg_get_exterror(handle), 1000);
    return strstr(report, text) != NULL;
}

static int file_has(const struct fixture *f, const char *entries) {
    char *file = read_file(f->config);
    char *expected = configuration_of(entries);
    const int is_equal = strcmp(file, expected) == 0;
    free(expected);
    free(file);
    return is_equal;
}

/* The change may have been made in memory: then the next call writes it, and an entry can't be
 * deleted once more. */
static void assert_next_call_works(const struct fixture *f, CfgHandle *handle, size_t call) {
    assert_int_equal(cfg_flush_s(handle), CFG_SUCCESS);
    if (!file_has(f, update_calls[call].after)) {
        assert_entries(f, update_entries);
        assert_int_equal(calls[call].run(handle), CFG_SUCCESS);
        assert_entries(f, update_calls[call].after);
    }
}

/* Makes one call with its nth allocation failing. Returns 0 when it has fewer, and else 1; 2 for
 * the report that only some give. */
static int run_with_failing_allocation(const struct fixture *f, size_t call, long n,
                                       const struct circumstances *meeting) {
    int result = 1;
    CfgHandle *handle = bound_handle(f, meeting);
    fail_call(call_any, n);
    const int code = calls[call].run(handle);
    if (stop_failing() == 0) {
        result = 0;
    }
    if (code == CFG_SUCCESS) {
        assert_entries(f, update_calls[call].after);
    } else {
        assert_int_equal(result, 1);
        assert_entries(f, entries_before);
        result += assert_exhausted(handle, code, calls[call].report);
        assert_next_call_works(f, handle, call);
    }
    assert_int_equal(cfg_unbind(handle), CFG_SUCCESS);
    return result;
}

static void assert_survived(const struct fixture *f, size_t call,
                            const struct circumstances *meeting) {
    int was_reported = 0;
    /* What is made once and kept is made in the first round. */
    for (int round = 0; round < 2; ++round) {
        int result = 1;
        for (long n = 1; result != 0; ++n) {
            const long before = live_blocks();
            result = run_with_failing_allocation(f, call, n, meeting);
            was_reported = was_reported || result == 2;
            if (round > 0) {
                assert_int_equal(live_blocks(), before);
            }
        }
    }
    if (!was_reported) {
        fail_msg("%s: never %s", update_calls[call].name, calls[call].report);
    }
}

static void each_failing_allocation_leaves_the_file_and_the_next_call_works(void **state) {
    static const struct circumstances rows[] = {{0, 0}, {0, 1}, {1, 0}, {1, 1}};
    struct fixture *f = *state;
    for (size_t call = 0; call < LENGTH(calls); ++call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            assert_survived(f, call, &rows[i]);
        }
    }
}

static void without_any_memory_the_calls_give_80_or_90_and_leave_the_file(void **state) {
    static const struct circumstances rows[] = {{0, 0}, {1, 1}};
    struct fixture *f = *state;
    for (size_t call = 0; call < LENGTH(calls); ++call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            CfgHandle *handle = bound_handle(f, &rows[i]);
            fail_all_calls(call_any);
            const int code = calls[call].run(handle);
            stop_failing();
            assert_true(code == CFG_OTHER || code == CFG_NO_MEMORY);
            assert_entries(f, entries_before);
            assert_next_call_works(f, handle, call);
            cfg_unbind(handle);
        }
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(each_failing_allocation_leaves_the_file_and_the_next_call_works),
        CREATED(without_any_memory_the_calls_give_80_or_90_and_leave_the_file),
    };
    reset_host();
    return cmocka_run_group_tests_name("exhausted_memory_updates", tests, NULL, NULL);
}
