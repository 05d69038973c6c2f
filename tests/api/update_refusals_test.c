/* What a change that is refused leaves behind: on the disk, in the backup and in memory. */

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "changes.h"

/* ---- the file and its backup ---- */

static void a_refused_change_makes_no_backup(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    load_entries(f, update_entries);
    assert_int_equal(modify(f->handle, A, "delete none"), CFG_NO_SUCH_ATTRIBUTE);
    assert_int_equal(add(f->handle, "cn=New, " TOP, "add cn=a|b"), CFG_CONSTRAINT_VIOLATION);
    assert_int_equal(cfg_delete_s(f->handle, "cn=None"), CFG_NO_SUCH_OBJECT);
    assert_false(file_exists(backup));
    assert_entries(f, update_entries);
    free(backup);
}

/* Changes that are refused whatever the file holds. */
static int delete_no_attribute(CfgHandle *handle) { return modify(handle, A, "delete none"); }
static int modify_no_entry(CfgHandle *handle) { return modify(handle, "cn=None", "add note=x"); }
static int modify_no_name(CfgHandle *handle) { return modify(handle, "=x", "add note=x"); }
static int add_two_names(CfgHandle *handle) { return add(handle, "cn=New, " TOP, "add cn=a|b"); }
static int delete_no_entry(CfgHandle *handle) { return cfg_delete_s(handle, "cn=None"); }

/* An editor leaves a line that can't be used; the library keeps it as an attribute. */
#define UNUSABLE ENTRY("cn=0", "oru-slapdPort: many\n")
#define REPAIRED ENTRY("cn=0", "oru-slapdInvalidLine: oru-slapdPort: many\n")

/* The standard entries, behind what an editor left. */
static char *with_entry(const char *entry, const char *entries) {
    char *text = malloc(strlen(entry) + strlen(entries) + 1);
    assert_non_null(text);
    return strcat(strcpy(text, entry), entries);
}

static void a_refused_change_repairs_the_file_and_backs_up_what_the_editor_left(void **state) {
    static const struct {
        int (*run)(CfgHandle *handle);
        int code;
    } rows[] = {
        {delete_no_attribute, CFG_NO_SUCH_ATTRIBUTE}, {modify_no_entry, CFG_NO_SUCH_OBJECT},
        {modify_no_name, CFG_INVALID_DN_SYNTAX},      {add_two_names, CFG_CONSTRAINT_VIOLATION},
        {delete_no_entry, CFG_NO_SUCH_OBJECT},
    };
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    char *edited = with_entry(UNUSABLE, update_entries);
    char *repaired = with_entry(REPAIRED, update_entries);
    char *expected = configuration_of(edited);
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_entries(f, update_entries);
        write_entries(f, edited);
        assert_int_equal(rows[i].run(f->handle), rows[i].code);
        assert_entries(f, repaired);
        assert_file(backup, expected);
        assert_int_equal(remove(backup), 0);
    }
    free(expected);
    free(repaired);
    free(edited);
    free(backup);
}

static void a_change_that_succeeds_backs_up_the_repaired_file(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    char *edited = with_entry(UNUSABLE, update_entries);
    char *repaired = with_entry(REPAIRED, update_entries);
    char *expected = configuration_of(repaired);
    FOR_EACH_UPDATE_CALL(call) {
        char *after = with_entry(REPAIRED, call->after);
        load_entries(f, update_entries);
        write_entries(f, edited);
        must_succeed(f->handle, call);
        assert_entries(f, after);
        assert_file(backup, expected);
        assert_int_equal(remove(backup), 0);
        free(after);
    }
    free(expected);
    free(repaired);
    free(edited);
    free(backup);
}

/* ---- memory ---- */

static void what_was_pending_is_dropped_with_a_change_that_can_not_be_written_as_text(
    void **state) {
    static const struct {
        const char *dn;
        int code;
        int extended;
    } rows[] = {
        {"cn=a\\0Ab, " TOP, CFG_INVALID_SYNTAX, 1005},
        {"cn=\"\", " TOP, CFG_INVALID_DN_SYNTAX, 1013},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "cn: A\nnote: a\n");
        assert_int_equal(modify(f->handle, A, "add note=pending; delete none"),
                         CFG_NO_SUCH_ATTRIBUTE);
        assert_lines_in_memory(f->handle, A, "cn: A\nnote: a\nnote: pending\n");
        assert_int_equal(add(f->handle, rows[i].dn, "add note=n"), rows[i].code);
        assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
        assert_lines(f, "cn: A\nnote: a\n");
        assert_lines_in_memory(f->handle, A, "cn: A\nnote: a\n");
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, "cn: A\nnote: a\n");
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(a_refused_change_makes_no_backup),
        CREATED(a_refused_change_repairs_the_file_and_backs_up_what_the_editor_left),
        CREATED(a_change_that_succeeds_backs_up_the_repaired_file),
        CREATED(what_was_pending_is_dropped_with_a_change_that_can_not_be_written_as_text),
    };
    return cmocka_run_group_tests_name("update_refusals", tests, NULL, NULL);
}
