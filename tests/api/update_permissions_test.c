/* A file that may not be read or written, or can't be backed up, stays what it is. */

#include <errno.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
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
    };
    is_root = geteuid() == 0;
    return cmocka_run_group_tests_name("update_permissions", tests, NULL, NULL);
}
