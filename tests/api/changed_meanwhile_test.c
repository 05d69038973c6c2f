/*
 * Programs that ask nobody, and change the file in the middle of a call. The middle is where the
 * backup is made: this program brings the routine for it, which takes the platform library's place.
 */

#include <stdio.h>
#include <stdlib.h>

#include "cfg32_platform.h"
#include "changes.h"

static const struct fixture *current;
static void (*in_the_middle)(void);

bool copyFile(const char *source, const char *target, const char *owner, const char *group,
              mode_t mode) {
    (void)source, (void)target, (void)owner, (void)group, (void)mode;
    if (in_the_middle) {
        in_the_middle();
    }
    return true;
}

static const char theirs[] = A_LINES("cn: A\nnote: theirs\n") ENTRY("cn=B", "cn: B\n");

static void overwrite(void) { write_entries(current, theirs); }

static void replace(void) {
    char *draft = path_of(current, "draft.conf");
    char *text = configuration_of(theirs);
    write_file(draft, text);
    assert_int_equal(rename(draft, current->config), 0);
    free(text);
    free(draft);
}

static void take_away(void) { assert_int_equal(remove(current->config), 0); }

static int call_with(const struct update_call *call, CfgHandle *handle, void (*change)(void)) {
    in_the_middle = change;
    const int code = call->run(handle);
    in_the_middle = NULL;
    return code;
}

static int set_up_with_backup(void **state) {
    if (set_up(state) != 0) {
        return -1;
    }
    current = *state;
    return cfg_set_option(current->handle, CFG_OPT_BACKUP_FILE, "/never/made");
}

static void what_they_wrote_stays_and_the_call_gives_51(void **state) {
    static void (*const changes[])(void) = {overwrite, replace};
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        for (size_t i = 0; i < LENGTH(changes); ++i) {
            load_entries(f, update_entries);
            assert_int_equal(call_with(call, f->handle, changes[i]), CFG_BUSY);
            assert_int_equal(cfg_get_exterror(f->handle), CFG_BUSY);
            assert_report_has(f->handle, CFG_BUSY,
                              "\nmsg     Configuration file was changed meanwhile\n");
            assert_string_equal(cfg_get_file_name(f->handle), f->config);
            assert_entries(f, theirs);
            /* The next call begins with what they wrote. */
            assert_lines_in_memory(f->handle, A, "cn: A\nnote: theirs\n");
            must_succeed(f->handle, call);
        }
    }
}

static void a_file_that_they_took_away_is_not_made_again(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(call_with(call, f->handle, take_away), CFG_INSUFFICIENT_ACCESS);
        assert_int_equal(cfg_get_exterror(f->handle), 1004);
        assert_report_has(f->handle, CFG_INSUFFICIENT_ACCESS, "\nmsg     Unable to open: ");
        assert_report_has(f->handle, CFG_INSUFFICIENT_ACCESS, "\nerrno 2: ");
        assert_false(file_exists(f->config));
    }
}

int main(void) {
#define MEANWHILE(test) cmocka_unit_test_setup_teardown(test, set_up_with_backup, tear_down)
    const struct CMUnitTest tests[] = {
        MEANWHILE(what_they_wrote_stays_and_the_call_gives_51),
        MEANWHILE(a_file_that_they_took_away_is_not_made_again),
    };
    return cmocka_run_group_tests_name("changed_meanwhile", tests, NULL, NULL);
}
