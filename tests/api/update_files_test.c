/* The calls that change the configuration, and files as they come in life. */

#include <errno.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "changes.h"

enum { nobody = 65534 };

static int is_root;

/* Permissions mean nothing to root: from here on the process is nobody, and owns the files. Skips
 * the test where that is not possible. */
static void become_nobody(const struct fixture *f) {
    if (!is_root) {
        return;
    }
    if (chown(f->folder, nobody, nobody) != 0 || chown(f->config, nobody, nobody) != 0 ||
        setegid(nobody) != 0 || seteuid(nobody) != 0 || access(f->folder, X_OK) != 0) {
        skip();
    }
}

static void become_root(void) {
    if (is_root) {
        assert_int_equal(seteuid(0), 0);
        assert_int_equal(setegid(0), 0);
    }
}

static int tear_down_as_root(void **state) {
    const struct fixture *f = *state;
    become_root();
    chmod(f->folder, 0700);
    return tear_down(state);
}

#define AS_NOBODY(test) cmocka_unit_test_setup_teardown(test, set_up, tear_down_as_root)

/* ---- expectations ---- */

static void must_change(const struct fixture *f, const struct update_call *call) {
    must_succeed(f->handle, call);
    assert_entries(f, call->after);
}

/* The call fails like this: the message is followed by the file's name in quotes, if it is one of
 * those. */
static void must_fail(const struct fixture *f, const struct update_call *call, int code,
                      int extended, const char *message, int error) {
    char expected[512];
    if (call->run(f->handle) != code) {
        fail_msg("%s: %d %s", call->name, cfg_get_errno(f->handle), cfg_dump_exception(f->handle));
    }
    assert_int_equal(cfg_get_exterror(f->handle), extended);
    assert_string_equal(cfg_get_file_name(f->handle), f->config);
    snprintf(expected, sizeof expected, "\nmsg     %s", message);
    assert_report_has(f->handle, code, expected);
    snprintf(expected, sizeof expected, "\nerrno %d: ", error);
    assert_report_has(f->handle, code, expected);
}

static char *quoted_message(const struct fixture *f, const char *text, const char *end) {
    const size_t size = strlen(text) + strlen(f->config) + strlen(end) + 3;
    char *message = malloc(size);
    assert_non_null(message);
    snprintf(message, size, "%s\"%s\"%s", text, f->config, end);
    return message;
}

static void must_not_be_backed_up(const struct fixture *f, const struct update_call *call,
                                  int error) {
    char *message = quoted_message(f, "Unable to backup the configuration file: ", " \n");
    must_fail(f, call, CFG_INSUFFICIENT_ACCESS, 1004, message, error);
    assert_entries(f, update_entries);
    free(message);
}

static void must_not_be_opened(const struct fixture *f, const struct update_call *call) {
    char *message = quoted_message(f, "Unable to open: ", "\n");
    must_fail(f, call, CFG_INSUFFICIENT_ACCESS, 1004, message, EACCES);
    free(message);
}

/* The failed change is still in the handle; once the obstacle is gone, the next call writes it. */
static void must_be_written_now(const struct fixture *f, const struct update_call *call) {
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_entries(f, call->after);
}

static char *set_backup(const struct fixture *f, const char *name) {
    char *backup = path_of(f, name);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup), CFG_SUCCESS);
    return backup;
}

/* ---- permissions ---- */

static void a_file_that_may_not_be_written_gives_50_and_stays(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0444), 0);
        must_not_be_opened(f, call);
        assert_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0644), 0);
        must_be_written_now(f, call);
    }
}

static void its_backup_is_made_nevertheless(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    char *backup = set_backup(f, "backup.conf");
    char *expected = configuration_of(update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0444), 0);
        must_not_be_opened(f, call);
        assert_entries(f, update_entries);
        assert_file(backup, expected);
        assert_int_equal(remove(backup), 0);
        assert_int_equal(chmod(f->config, 0644), 0);
    }
    free(expected);
    free(backup);
}

static void a_file_without_any_permission_gives_50_and_stays(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0), 0);
        must_not_be_opened(f, call);
        assert_int_equal(chmod(f->config, 0644), 0);
        assert_entries(f, update_entries);
        must_be_written_now(f, call);
    }
}

static void a_changed_file_that_may_not_be_read_gives_91_and_stays(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, "");
        write_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0200), 0);
        must_fail(f, call, CFG_CONNECT_ERROR, 1004, "ifstream()\n", EACCES);
        assert_int_equal(chmod(f->config, 0600), 0);
        assert_entries(f, update_entries);
        must_change(f, call);
    }
}

static void a_folder_that_may_not_be_written_is_no_obstacle_without_a_backup(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    assert_int_equal(chmod(f->folder, 0555), 0);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_change(f, call);
    }
}

static void a_folder_that_may_not_be_written_refuses_the_backup(void **state) {
    struct fixture *f = *state;
    become_nobody(f);
    char *backup = set_backup(f, "backup.conf");
    assert_int_equal(chmod(f->folder, 0555), 0);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_not_be_backed_up(f, call, EACCES);
        assert_false(file_exists(backup));
        assert_int_equal(chmod(f->folder, 0755), 0);
        must_be_written_now(f, call);
        assert_int_equal(remove(backup), 0);
        assert_int_equal(chmod(f->folder, 0555), 0);
    }
    free(backup);
}

/* ---- backups ---- */

static void a_backup_in_a_missing_folder_gives_50_and_the_file_stays(void **state) {
    struct fixture *f = *state;
    char *folder = path_of(f, "none");
    char *backup = set_backup(f, "none/backup.conf");
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_not_be_backed_up(f, call, ENOENT);
        assert_int_equal(mkdir(folder, 0700), 0);
        must_be_written_now(f, call);
        assert_int_equal(remove(backup), 0);
        assert_int_equal(rmdir(folder), 0);
    }
    free(backup);
    free(folder);
}

static void a_folder_in_the_place_of_the_backup_gives_50_and_the_file_stays(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    assert_int_equal(mkdir(backup, 0700), 0);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_not_be_backed_up(f, call, EISDIR);
    }
    free(backup);
}

static void the_file_is_not_its_own_backup(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "oruslapd.conf");
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        must_not_be_backed_up(f, call, EINVAL);
    }
    free(backup);
}

/* ---- links ---- */

static void a_symbolic_link_stays_and_its_file_is_changed(void **state) {
    struct fixture *f = *state;
    char *target = path_of(f, "target.conf");
    char *backup = set_backup(f, "backup.conf");
    char *before = configuration_of(update_entries);
    assert_int_equal(rename(f->config, target), 0);
    assert_int_equal(symlink("target.conf", f->config), 0);
    FOR_EACH_UPDATE_CALL(call) {
        struct stat status;
        char *after = configuration_of(call->after);
        load_entries(f, update_entries);
        must_change(f, call);
        assert_file(target, after);
        assert_file(backup, before);
        assert_int_equal(lstat(f->config, &status), 0);
        assert_true(S_ISLNK(status.st_mode));
        assert_int_equal(lstat(target, &status), 0);
        assert_true(S_ISREG(status.st_mode));
        assert_int_equal(lstat(backup, &status), 0);
        assert_true(S_ISREG(status.st_mode));
        free(after);
    }
    free(before);
    free(backup);
    free(target);
}

static void a_link_to_another_file_is_followed_at_the_next_call(void **state) {
    struct fixture *f = *state;
    char *first = path_of(f, "first.conf");
    char *second = path_of(f, "second.conf");
    char *expected = configuration_of(ENTRY("cn=Old", "note: o\n"));
    char *text = configuration_of(update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        write_file(first, expected);
        write_file(second, text);
        remove(f->config);
        assert_int_equal(symlink("first.conf", f->config), 0);
        assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
        assert_int_equal(remove(f->config), 0);
        assert_int_equal(symlink("second.conf", f->config), 0);
        must_change(f, call);
        assert_file(first, expected);
    }
    free(text);
    free(expected);
    free(second);
    free(first);
}

static void hard_links_owner_and_mode_stay(void **state) {
    struct fixture *f = *state;
    char *other_name = path_of(f, "other.conf");
    assert_int_equal(link(f->config, other_name), 0);
    FOR_EACH_UPDATE_CALL(call) {
        struct stat before;
        struct stat after;
        char *text = configuration_of(call->after);
        load_entries(f, update_entries);
        assert_int_equal(chmod(f->config, 0664), 0);
        assert_true(!is_root || chown(f->config, nobody, 0) == 0);
        assert_int_equal(stat(f->config, &before), 0);
        must_change(f, call);
        assert_int_equal(stat(f->config, &after), 0);
        assert_int_equal(after.st_ino, before.st_ino);
        assert_int_equal(after.st_nlink, 2);
        assert_int_equal(after.st_mode, before.st_mode);
        assert_int_equal(after.st_uid, before.st_uid);
        assert_int_equal(after.st_gid, before.st_gid);
        assert_file(other_name, text);
        free(text);
    }
    free(other_name);
}

/* ---- another file in its place ---- */

static void a_file_that_was_replaced_by_rename_is_read_before_it_is_changed(void **state) {
    struct fixture *f = *state;
    char *draft = path_of(f, "draft.conf");
    char *text = configuration_of(update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, ENTRY("cn=Old", "note: o\n"));
        write_file(draft, text);
        assert_int_equal(rename(draft, f->config), 0);
        must_change(f, call);
        assert_false(file_exists(draft));
    }
    free(text);
    free(draft);
}

static void a_replacement_with_the_same_time_is_noticed(void **state) {
    struct fixture *f = *state;
    char *draft = path_of(f, "draft.conf");
    char *text = configuration_of(update_entries);
    FOR_EACH_UPDATE_CALL(call) {
        struct stat status;
        load_entries(f, ENTRY("cn=Old", "note: o\n"));
        assert_int_equal(stat(f->config, &status), 0);
        write_file(draft, text);
        const struct timespec times[2] = {status.st_atim, status.st_mtim};
        assert_int_equal(utimensat(AT_FDCWD, draft, times, 0), 0);
        assert_int_equal(rename(draft, f->config), 0);
        must_change(f, call);
    }
    free(text);
    free(draft);
}

static void a_file_that_was_removed_gives_91_and_none_is_made(void **state) {
    struct fixture *f = *state;
    char *backup = set_backup(f, "backup.conf");
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(remove(f->config), 0);
        must_fail(f, call, CFG_CONNECT_ERROR, 1003, "_stat()\n", ENOENT);
        assert_false(file_exists(f->config));
        assert_false(file_exists(backup));
        write_entries(f, update_entries);
        must_change(f, call);
        assert_int_equal(remove(backup), 0);
    }
    free(backup);
}

static void a_link_that_leads_nowhere_gives_91_and_no_file_is_made(void **state) {
    struct fixture *f = *state;
    char *target = path_of(f, "none.conf");
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(remove(f->config), 0);
        assert_int_equal(symlink("none.conf", f->config), 0);
        must_fail(f, call, CFG_CONNECT_ERROR, 1003, "_stat()\n", ENOENT);
        assert_false(file_exists(target));
        assert_int_equal(remove(f->config), 0);
    }
    free(target);
}

static void a_folder_or_fifo_in_its_place_gives_91_without_waiting(void **state) {
    struct fixture *f = *state;
    FOR_EACH_UPDATE_CALL(call) {
        load_entries(f, update_entries);
        assert_int_equal(remove(f->config), 0);
        assert_int_equal(mkdir(f->config, 0700), 0);
        must_fail(f, call, CFG_CONNECT_ERROR, 1004, "ifstream()\n", EISDIR);
        assert_int_equal(rmdir(f->config), 0);
        assert_int_equal(mkfifo(f->config, 0600), 0);
        must_fail(f, call, CFG_CONNECT_ERROR, 1004, "ifstream()\n", EINVAL);
        assert_int_equal(remove(f->config), 0);
    }
}

/* ---- no room ---- */

static void a_file_that_may_not_grow_gives_80_and_stays(void **state) {
    struct fixture *f = *state;
    struct rlimit unlimited;
    struct stat status;
    load_entries(f, update_entries);
    assert_int_equal(stat(f->config, &status), 0);
    assert_int_equal(getrlimit(RLIMIT_FSIZE, &unlimited), 0);
    const struct rlimit limit = {(rlim_t)status.st_size, unlimited.rlim_max};
    assert_int_equal(setrlimit(RLIMIT_FSIZE, &limit), 0);
    const int code = add(f->handle, "cn=C, " TOP, "add note=c");
    assert_int_equal(setrlimit(RLIMIT_FSIZE, &unlimited), 0);
    assert_int_equal(code, CFG_OTHER);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, CFG_OTHER, "\nmsg     System error writing file\nerrno 27: ");
    assert_string_equal(cfg_get_file_name(f->handle), f->config);
    assert_entries(f, update_entries);
    must_modify(f->handle, A, "replace note=new");
    assert_entries(f, ENTRY("cn=A", "cn: A\nnote: new\n") ENTRY("cn=B", "cn: B\nnote: b\n")
                          ENTRY("cn=C", "note: c\n"));
}

int main(void) {
    const struct CMUnitTest tests[] = {
        AS_NOBODY(a_file_that_may_not_be_written_gives_50_and_stays),
        AS_NOBODY(its_backup_is_made_nevertheless),
        AS_NOBODY(a_file_without_any_permission_gives_50_and_stays),
        AS_NOBODY(a_changed_file_that_may_not_be_read_gives_91_and_stays),
        AS_NOBODY(a_folder_that_may_not_be_written_is_no_obstacle_without_a_backup),
        AS_NOBODY(a_folder_that_may_not_be_written_refuses_the_backup),
        CREATED(a_backup_in_a_missing_folder_gives_50_and_the_file_stays),
        CREATED(a_folder_in_the_place_of_the_backup_gives_50_and_the_file_stays),
        CREATED(the_file_is_not_its_own_backup),
        CREATED(a_symbolic_link_stays_and_its_file_is_changed),
        CREATED(a_link_to_another_file_is_followed_at_the_next_call),
        CREATED(hard_links_owner_and_mode_stay),
        CREATED(a_file_that_was_replaced_by_rename_is_read_before_it_is_changed),
        CREATED(a_replacement_with_the_same_time_is_noticed),
        CREATED(a_file_that_was_removed_gives_91_and_none_is_made),
        CREATED(a_link_that_leads_nowhere_gives_91_and_no_file_is_made),
        CREATED(a_folder_or_fifo_in_its_place_gives_91_without_waiting),
        CREATED(a_file_that_may_not_grow_gives_80_and_stays),
    };
    is_root = geteuid() == 0;
    return cmocka_run_group_tests_name("update_files", tests, NULL, NULL);
}
