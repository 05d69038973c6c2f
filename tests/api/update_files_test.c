/* The calls that change the configuration, and files as they come in life: links, other files in
 * the place of the one that was bound, and no room for more. */

#include <errno.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "changes.h"

enum { nobody = 65534 };

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
        assert_true(geteuid() != 0 || chown(f->config, nobody, 0) == 0);
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

/* Adds an entry while the file may not become longer than it is, which must fail. */
static void add_without_room(const struct fixture *f) {
    struct rlimit unlimited;
    struct stat status;
    load_entries(f, update_entries);
    assert_int_equal(stat(f->config, &status), 0);
    assert_int_equal(getrlimit(RLIMIT_FSIZE, &unlimited), 0);
    const struct rlimit limit = {(rlim_t)status.st_size, unlimited.rlim_max};
    assert_int_equal(setrlimit(RLIMIT_FSIZE, &limit), 0);
    const int code = add(f->handle, "cn=C, " TOP, "add cn=C; add note=c");
    assert_int_equal(setrlimit(RLIMIT_FSIZE, &unlimited), 0);
    assert_int_equal(code, CFG_OTHER);
}

static void a_file_that_may_not_grow_gives_80_and_stays(void **state) {
    struct fixture *f = *state;
    add_without_room(f);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, CFG_OTHER, "\nmsg     System error writing file\nerrno 27: ");
    assert_string_equal(cfg_get_file_name(f->handle), f->config);
    assert_entries(f, update_entries);
}

static const char with_the_entry[] = ENTRY("cn=A", "cn: A\nnote: old\n")
    ENTRY("cn=B", "cn: B\nnote: b\n") ENTRY("cn=C", "cn: C\nnote: c\n");

static void what_there_was_no_room_for_stays_in_memory_and_is_written_by_the_next_flush(
    void **state) {
    struct fixture *f = *state;
    add_without_room(f);
    assert_lines_in_memory(f->handle, "cn=C, " TOP, "cn: C\nnote: c\n");
    assert_entries(f, update_entries);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_entries(f, with_the_entry);
}

static void what_there_was_no_room_for_is_written_by_the_next_change(void **state) {
    struct fixture *f = *state;
    add_without_room(f);
    must_modify(f->handle, A, "replace note=old");
    assert_entries(f, with_the_entry);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(a_symbolic_link_stays_and_its_file_is_changed),
        CREATED(a_link_to_another_file_is_followed_at_the_next_call),
        CREATED(hard_links_owner_and_mode_stay),
        CREATED(a_file_that_was_replaced_by_rename_is_read_before_it_is_changed),
        CREATED(a_replacement_with_the_same_time_is_noticed),
        CREATED(a_file_that_was_removed_gives_91_and_none_is_made),
        CREATED(a_link_that_leads_nowhere_gives_91_and_no_file_is_made),
        CREATED(a_folder_or_fifo_in_its_place_gives_91_without_waiting),
        CREATED(a_file_that_may_not_grow_gives_80_and_stays),
        CREATED(what_there_was_no_room_for_stays_in_memory_and_is_written_by_the_next_flush),
        CREATED(what_there_was_no_room_for_is_written_by_the_next_change),
    };
    return cmocka_run_group_tests_name("update_files", tests, NULL, NULL);
}
