#include <stdio.h>
#include <stdlib.h>
#include <unistd.h>

#include "fixture.h"

/* Calls cfg_perror with standard output and standard error going to a file. */
static void print_into(const char *path, CfgHandle *handle, const char *prefix) {
    FILE *file = fopen(path, "wb");
    assert_non_null(file);
    fflush(stdout);
    fflush(stderr);
    const int out = dup(1);
    const int err = dup(2);
    dup2(fileno(file), 1);
    dup2(fileno(file), 2);
    cfg_perror(handle, prefix);
    fflush(stdout);
    fflush(stderr);
    dup2(out, 1);
    dup2(err, 2);
    close(out);
    close(err);
    fclose(file);
}

static void it_prints_nothing_and_changes_nothing(void **state) {
    static const char *const prefixes[] = {NULL, "", "prefix", "%s%n"};
    struct fixture *f = *state;
    char *path = path_of(f, "output");
    cfg_bind_s(f->handle, NULL, NULL, 0);
    const char *report = cfg_dump_exception(f->handle);
    for (size_t i = 0; i < LENGTH(prefixes); ++i) {
        print_into(path, f->handle, prefixes[i]);
        char *text = read_file(path);
        assert_string_equal(text, "");
        free(text);
        assert_int_equal(cfg_get_errno(f->handle), CFG_AUTH_UNKNOWN);
        assert_ptr_equal(cfg_dump_exception(f->handle), report);
    }
    free(path);
}

static void it_takes_a_null_handle(void **state) {
    struct fixture *f = *state;
    char *path = path_of(f, "output");
    print_into(path, NULL, "prefix");
    char *text = read_file(path);
    assert_string_equal(text, "");
    free(text);
    free(path);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(it_prints_nothing_and_changes_nothing),
        CREATED(it_takes_a_null_handle),
    };
    return cmocka_run_group_tests_name("cfg_perror", tests, NULL, NULL);
}
