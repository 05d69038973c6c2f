/* cfg_flush_s writes the file as it is; see update_calls_test.c for what it shares with others. */

#include <stdio.h>
#include <stdlib.h>
#include <sys/stat.h>

#include "changes.h"

static void a_file_is_rewritten_in_its_canonical_form(void **state) {
    static const struct {
        const char *before;
        const char *after;
    } rows[] = {
        {"", ""},
        {ENTRY("cn=A", ""), ENTRY("cn=A", "")},
        {"dn:CN=a;cn=Configuration\nzeta: 1\nalpha: 2\nZETA: 3\n",
         "dn: CN=a, cn=Configuration\nalpha: 2\nzeta: 1\nzeta: 3\n\n"},
        {ENTRY("cn=A", "note: a\nnote: a\n"), ENTRY("cn=A", "note: a\n")},
        {ENTRY("cn=B, cn=A", "") ENTRY("cn=A", ""), ENTRY("cn=A", "") ENTRY("cn=B, cn=A", "")},
        {ENTRY("cn=A", "note: a\n") ENTRY("cn=A", "note: b\n"),
         ENTRY("cn=A", "note: a\nnote: b\n")},
        {"# a\n\n" ENTRY("cn=A", "# n\nnote:a") "\n\n# z\n",
         "# a\n\n" ENTRY("cn=A", "# n\nnote: a\n") "\n# z\n"},
        {ENTRY("cn=A", "") "\n\n\n", ENTRY("cn=A", "")},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_entries(f, rows[i].before);
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_no_report(f->handle, CFG_SUCCESS);
        assert_entries(f, rows[i].after);
    }
}

static void a_flush_without_changes_writes_the_file_nevertheless(void **state) {
    struct fixture *f = *state;
    struct stat before;
    struct stat after;
    load_entries(f, update_entries);
    assert_int_equal(stat(f->config, &before), 0);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_int_equal(stat(f->config, &after), 0);
    assert_entries(f, update_entries);
    assert_true(after.st_mtim.tv_sec > before.st_mtim.tv_sec ||
                (after.st_mtim.tv_sec == before.st_mtim.tv_sec &&
                 after.st_mtim.tv_nsec > before.st_mtim.tv_nsec));
}

static void an_empty_file_gets_no_entries(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "");
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_file(f->config, "");
}

static void a_flush_writes_what_a_refused_change_left_in_memory(void **state) {
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    assert_int_equal(modify(f->handle, A, "add note=b; delete none"), CFG_NO_SUCH_ATTRIBUTE);
    assert_lines(f, "note: a\n");
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_lines(f, "note: a\nnote: b\n");
}

static void what_can_not_be_written_as_text_is_reported_with_its_entry(void **state) {
    static const struct {
        const char *entry;
        int code;
        int extended;
        const char *dn;
    } rows[] = {
        {ENTRY("cn=\"\"", "note: n\n"), CFG_INVALID_DN_SYNTAX, 1013, "cn=, " TOP},
        {ENTRY("cn=#", "note: n\n"), CFG_INVALID_DN_SYNTAX, 1013, "cn=, " TOP},
        {ENTRY("cn=a\\0Ab", "note: n\n"), CFG_INVALID_SYNTAX, 1005, "cn=a\nb, " TOP},
        {ENTRY("cn=a\\0Db", "note: n\n"), CFG_INVALID_SYNTAX, 1005, "cn=a\rb, " TOP},
        /* Each comment keeps the line below it apart; together the two would be one. */
        {ENTRY("cn=X", "# c\n foo: a\n# d\n foo: b\n"), CFG_INVALID_SYNTAX, 1005, "cn=X, " TOP},
    };
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_entries(f, rows[i].entry);
        /* What was loaded stays what it is, however often. */
        for (int attempt = 0; attempt < 2; ++attempt) {
            assert_int_equal(cfg_flush_s(f->handle), rows[i].code);
            assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
            assert_string_equal(cfg_get_entry(f->handle), rows[i].dn);
            assert_report_has(f->handle, rows[i].code, "\nentry dn: ");
            assert_report_has(f->handle, rows[i].code, rows[i].dn);
            assert_string_equal(cfg_get_file_name(f->handle), f->config);
            assert_entries(f, rows[i].entry);
            assert_false(file_exists(backup));
        }
    }
    free(backup);
}

static void a_large_file_is_written_whole_and_may_shrink_again(void **state) {
    enum { values = 20000 };
    struct fixture *f = *state;
    char *lines = malloc(values * 16 + 1);
    char *line = lines;
    assert_non_null(lines);
    for (int i = 0; i < values; ++i) {
        line += sprintf(line, "note: %08d\n", i);
    }
    load_lines(f, lines);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_lines(f, lines);
    must_modify(f->handle, A, "replace note=a");
    assert_lines(f, "note: a\n");
    free(lines);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(a_file_is_rewritten_in_its_canonical_form),
        CREATED(a_flush_without_changes_writes_the_file_nevertheless),
        CREATED(an_empty_file_gets_no_entries),
        CREATED(a_flush_writes_what_a_refused_change_left_in_memory),
        CREATED(what_can_not_be_written_as_text_is_reported_with_its_entry),
        CREATED(a_large_file_is_written_whole_and_may_shrink_again),
    };
    return cmocka_run_group_tests_name("cfg_flush_s", tests, NULL, NULL);
}
