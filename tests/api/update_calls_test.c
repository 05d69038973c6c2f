/* What the four calls that change the configuration have in common. */

#include <dirent.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>

#include "changes.h"

static void must_give(const struct fixture *f, const struct update_call *call, int code) {
    const int given = call->run(f->handle);
    if (given != code) {
        fail_msg("%s: %d instead of %d", call->name, given, code);
    }
    assert_int_equal(cfg_get_errno(f->handle), code);
}

/* ---- arguments ---- */

static void a_null_handle_gives_89(void **state) {
    (void)state;
    FOR_EACH_UPDATE_CALL(call) { assert_int_equal(call->run(NULL), CFG_PARAM_ERROR); }
}

static void a_handle_that_is_not_bound_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        must_give(f, call, CFG_PARAM_ERROR);
        assert_no_report(f->handle, CFG_PARAM_ERROR);
    }
    assert_file(f->config, standard_configuration);
}

static void a_bound_handle_without_a_file_name_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    load_entries(f, update_entries);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    FOR_EACH_UPDATE_CALL(call) {
        must_give(f, call, CFG_PARAM_ERROR);
        assert_no_report(f->handle, CFG_PARAM_ERROR);
    }
    assert_entries(f, update_entries);
}

/* ---- what is on the disk ---- */

static void when_a_call_returns_the_new_file_is_on_the_disk(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_succeed(f->handle, call);
        assert_entries(f, call->after);
    }
}

static void the_rest_of_the_file_becomes_canonical_and_keeps_its_comments(void **state) {
    static const struct {
        const char *before;
        const char *after;
    } rows[] = {
        {"\n# front end\ndn: CN=Web;cn=Configuration\nnote: n\n# of the port\nOru-SlapdPort:  "
         "+0389\ncn: Web\n\n",
         "\n# front end\ndn: CN=Web, cn=Configuration\ncn: Web\nnote: n\n# of the port\n"
         "Oru-SlapdPort: 389\n\n"},
        {ENTRY("cn=X", "note: x\n") "\n# the end\n\n\n", "\n# the end\n"},
        {ENTRY("cn=X", "note: folded\n  over\n   lines\n"),
         ENTRY("cn=X", "note: folded over  lines\n")},
        {ENTRY("cn=X", "note: one\r\nnote:: two\nnote:one  \n"),
         ENTRY("cn=X", "note: one\nnote: two\n")},
    };
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            char text[1024];
            snprintf(text, sizeof text, "%s%s", update_entries, rows[i].before);
            load_entries(f, text);
            must_succeed(f->handle, call);
            char *file = read_file(f->config);
            if (!strstr(file, rows[i].after)) {
                fail_msg("%s, row %d:\n%s", call->name, (int)i, file);
            }
            free(file);
        }
    }
}

static void a_second_rewrite_changes_nothing(void **state) {
    struct fixture *f = *state;
    load(f, standard_configuration);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    char *once = read_file(f->config);
    assert_string_not_equal(once, standard_configuration);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_file(f->config, once);
    free(once);
}

static int files_in(const char *folder) {
    DIR *stream = opendir(folder);
    const struct dirent *entry;
    int count = 0;
    assert_non_null(stream);
    while ((entry = readdir(stream))) {
        count += strcmp(entry->d_name, ".") != 0 && strcmp(entry->d_name, "..") != 0;
    }
    closedir(stream);
    return count;
}

static void no_other_file_is_left_behind(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_succeed(f->handle, call);
        assert_int_equal(files_in(f->folder), 1);
    }
}

/* ---- the backup ---- */

static void the_backup_is_the_file_of_before(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    FOR_EACH_UPDATE_CALL(call) {
        struct stat status;
        load_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0640), 0);
        char *before = read_file(f->config);
        must_succeed(f->handle, call);
        assert_file(backup, before);
        assert_entries(f, call->after);
        assert_int_equal(stat(backup, &status), 0);
        assert_int_equal(status.st_mode & 07777, 0640);
        assert_int_equal(files_in(f->folder), 2);
        free(before);
        assert_int_equal(remove(backup), 0);
    }
    free(backup);
}

static void each_call_backs_up_what_the_one_before_wrote(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    write_file(backup, "of another day\n");
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    load_entries(f, update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        char *before = read_file(f->config);
        must_succeed(f->handle, call);
        assert_file(backup, before);
        free(before);
    }
    free(backup);
}

static void the_backup_name_counts_from_the_next_bind_on(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    load_entries(f, update_entries);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_false(file_exists(backup));
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_true(file_exists(backup));
    free(backup);
}

/* ---- the file behind it ---- */

static void what_another_handle_wrote_is_taken_in(void **state) {
    struct fixture *f = *state;
    char expected[1024];
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        CfgHandle *other = second_handle(f);
        assert_int_equal(add(other, "cn=0, " TOP, "add note=theirs"), CFG_SUCCESS);
        must_succeed(f->handle, call);
        char *file = read_file(f->config);
        snprintf(expected, sizeof expected, "%s", ENTRY("cn=0", "note: theirs\n"));
        assert_non_null(strstr(file, expected));
        free(file);
        /* And the other way round. */
        assert_int_equal(search_all(other), CFG_SUCCESS);
        assert_int_equal(cfg_delete_s(other, "cn=0, " TOP), CFG_SUCCESS);
        assert_entries(f, call->after);
        cfg_unbind(other);
    }
}

static void what_an_editor_wrote_is_taken_in(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, ENTRY("cn=Old", "note: o\n"));
        write_entries(f, update_entries);
        must_succeed(f->handle, call);
        assert_entries(f, call->after);
    }
}

static void what_a_call_wrote_is_not_read_again(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        struct stat status;
        load_entries(f, update_entries);
        must_succeed(f->handle, call);
        assert_int_equal(stat(f->config, &status), 0);
        char *text = read_file(f->config);
        /* Changed behind the library's back: the same file with the same modification time. */
        write_file(f->config, "dn: =x\n");
        const struct timespec times[2] = {status.st_atim, status.st_mtim};
        assert_int_equal(utimensat(AT_FDCWD, f->config, times, 0), 0);
        assert_int_equal(search_all(f->handle), CFG_SUCCESS);
        free(text);
    }
}

static void unusable_lines_that_came_in_are_kept_as_attributes(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        char text[1024];
        load_entries(f, update_entries);
        snprintf(text, sizeof text, "%s%s", update_entries, ENTRY("cn=X", "oru-slapdPort: many\n"));
        write_entries(f, text);
        must_succeed(f->handle, call);
        char *file = read_file(f->config);
        assert_non_null(strstr(file, ENTRY("cn=X", "oru-slapdInvalidLine: oru-slapdPort: many\n")));
        free(file);
    }
}

static void a_file_that_can_not_be_read_again_gives_the_loaders_code(void **state) {
    static const struct {
        const char *text;
        int code;
        int extended;
        const char *message;
    } rows[] = {
        {"dn: =x\n", 34, 1012, "Invalid attribute sytax: "},
        {"dn: cn=x\n\ncn: stray\n", 65, 1007, "\"cn\" attribute not allowed in <root> object"},
    };
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            load_entries(f, update_entries);
            write_configuration(f, rows[i].text);
            must_give(f, call, rows[i].code);
            assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
            assert_report_has(f->handle, rows[i].code, rows[i].message);
            assert_file(f->config, rows[i].text);
            write_entries(f, update_entries);
            must_succeed(f->handle, call);
            assert_entries(f, call->after);
        }
    }
}

/* ---- reports ---- */

static void a_success_clears_the_failure_of_before(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(modify(f->handle, "cn=None", "add cn=x"), CFG_NO_SUCH_OBJECT);
        assert_non_null(cfg_dump_exception(f->handle));
        must_succeed(f->handle, call);
        assert_null(cfg_get_attribute(f->handle));
    }
}

static void an_anonymous_bind_may_change_the_file_too(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        write_entries(f, update_entries);
        assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
        must_succeed(f->handle, call);
        assert_entries(f, call->after);
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        CREATED(a_handle_that_is_not_bound_gives_89_without_a_report),
        CREATED(a_bound_handle_without_a_file_name_gives_89_without_a_report),
        CREATED(when_a_call_returns_the_new_file_is_on_the_disk),
        CREATED(the_rest_of_the_file_becomes_canonical_and_keeps_its_comments),
        CREATED(a_second_rewrite_changes_nothing),
        CREATED(no_other_file_is_left_behind),
        CREATED(the_backup_is_the_file_of_before),
        CREATED(each_call_backs_up_what_the_one_before_wrote),
        CREATED(the_backup_name_counts_from_the_next_bind_on),
        CREATED(what_another_handle_wrote_is_taken_in),
        CREATED(what_an_editor_wrote_is_taken_in),
        CREATED(what_a_call_wrote_is_not_read_again),
        CREATED(unusable_lines_that_came_in_are_kept_as_attributes),
        CREATED(a_file_that_can_not_be_read_again_gives_the_loaders_code),
        CREATED(a_success_clears_the_failure_of_before),
        CREATED(an_anonymous_bind_may_change_the_file_too),
    };
    return cmocka_run_group_tests_name("update_calls", tests, NULL, NULL);
}
