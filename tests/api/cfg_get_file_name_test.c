/* The installation directory, which the default name begins with, is the host program's. */

#include <pthread.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fixture.h"
#include "host_routines.h"

#define BASE "cn=Configuration"

static void a_null_handle_gives_null(void **state) {
    (void)state;
    assert_null(cfg_get_file_name(NULL));
}

/* ---- before a bind ---- */

static void before_a_bind_it_is_the_name_that_was_set(void **state) {
    struct fixture *f = *state;
    assert_text(cfg_get_file_name(f->handle), f->config);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/another.conf"), CFG_SUCCESS);
    assert_text(cfg_get_file_name(f->handle), "/another.conf");
}

static void without_a_name_it_is_the_default_one(void **state) {
    struct fixture *f = *state;
    CfgHandle *fresh = cfg_init();
    host.install_path = "/the host's directory";
    assert_text(cfg_get_file_name(fresh), "/the host's directory/etc/oruslapd.conf");
    cfg_unbind(fresh);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL), CFG_SUCCESS);
    assert_text(cfg_get_file_name(f->handle), "/the host's directory/etc/oruslapd.conf");
}

static void the_default_name_follows_the_directory_until_a_bind_keeps_it(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_text(cfg_get_file_name(f->handle), "/host/etc/oruslapd.conf");
    host.install_path = "/moved";
    assert_text(cfg_get_file_name(f->handle), "/moved/etc/oruslapd.conf");
    /* Refused before a file is looked for. */
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    host.install_path = "/moved/again";
    assert_text(cfg_get_file_name(f->handle), "/moved/etc/oruslapd.conf");
}

static void without_a_directory_there_is_no_name(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    host.install_path = NULL;
    assert_null(cfg_get_file_name(f->handle));
    /* Nor does a failure know it that comes from just that. */
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_OTHER);
    assert_null(cfg_get_file_name(f->handle));
}

static void a_directory_that_is_too_long_gives_no_name(void **state) {
    static const struct {
        size_t length;
        int has_name;
    } rows[] = {{493, 1}, {494, 0}, {4000, 0}};
    struct fixture *f = *state;
    char path[4096];
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        memset(path, 'd', sizeof path);
        path[rows[i].length] = '\0';
        host.install_path = path;
        const char *name = cfg_get_file_name(f->handle);
        assert_int_equal(name != NULL, rows[i].has_name);
        assert_true(!name || strncmp(name, path, rows[i].length) == 0);
    }
}

static void *ask_for_the_default_name(void *handle) {
    host.install_path = "/elsewhere";
    const char *name = cfg_get_file_name(handle);
    return name && strcmp(name, "/elsewhere/etc/oruslapd.conf") == 0 ? handle : NULL;
}

static void the_default_name_stays_whatever_other_threads_ask(void **state) {
    (void)state;
    pthread_t thread;
    void *answer = NULL;
    CfgHandle *one = cfg_init();
    CfgHandle *other = cfg_init();
    const char *name = cfg_get_file_name(one);
    assert_int_equal(pthread_create(&thread, NULL, ask_for_the_default_name, other), 0);
    assert_int_equal(pthread_join(thread, &answer), 0);
    assert_ptr_equal(answer, other);
    assert_text(name, "/host/etc/oruslapd.conf");
    cfg_unbind(one);
    cfg_unbind(other);
}

/* ---- bound ---- */

static void a_bound_handle_names_the_file_that_it_has(void **state) {
    struct fixture *f = *state;
    assert_text(cfg_get_file_name(f->handle), f->config);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_text(cfg_get_file_name(f->handle), f->config);
    /* The new name is for the next bind. */
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/another.conf");
    assert_text(cfg_get_file_name(f->handle), f->config);
}

static void while_the_name_is_null_a_bound_handle_is_not_bound(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_text(cfg_get_file_name(f->handle), "/host/etc/oruslapd.conf");
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    assert_text(cfg_get_file_name(f->handle), "/host/etc/oruslapd.conf");
    /* Any name makes it what it was. */
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/another.conf");
    assert_text(cfg_get_file_name(f->handle), f->config);
}

static void a_relative_name_stays_relative(void **state) {
    struct fixture *f = *state;
    CfgHandle *handle = cfg_init();
    char name[256];
    /* From the root folder. */
    snprintf(name, sizeof name, "../../../../../../../../../../%.190s", f->config + 1);
    cfg_set_option(handle, CFG_OPT_CONFIG_FILE, name);
    assert_int_equal(bind_administrator(handle), CFG_SUCCESS);
    assert_text(cfg_get_file_name(handle), name);
    cfg_unbind(handle);
}

/* ---- after a failure ---- */

static void a_failure_names_the_file_that_it_was_in(void **state) {
    struct fixture *f = *state;
    char *other = path_of(f, "other.conf");
    write_file(other, "version: 1\n\ncn: stray\n");
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, other);
    assert_int_equal(bind_administrator(f->handle), 65);
    assert_text(cfg_get_file_name(f->handle), other);
    assert_int_equal(cfg_get_file_line(f->handle), 3);
    /* It does so whatever is set meanwhile... */
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_text(cfg_get_file_name(f->handle), other);
    /* ... and until it is forgotten: the handle is still bound to the file of before. */
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, other);
    cfg_reset(f->handle);
    assert_text(cfg_get_file_name(f->handle), f->config);
    free(other);
}

static void a_missing_file_is_named(void **state) {
    struct fixture *f = *state;
    remove(f->config);
    assert_int_equal(bind_administrator(f->handle), CFG_CONNECT_ERROR);
    assert_text(cfg_get_file_name(f->handle), f->config);
    assert_int_equal(cfg_get_file_line(f->handle), 0);
}

static void a_failure_that_names_no_file_was_in_the_bound_one(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/another.conf");
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_null(strstr(cfg_dump_exception(f->handle), f->config));
    assert_text(cfg_get_file_name(f->handle), f->config);
}

static void before_a_bind_a_failure_that_names_no_file_has_the_one_that_was_set(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_text(cfg_get_file_name(f->handle), f->config);
}

static void a_refused_change_names_the_file(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/another.conf");
    assert_int_equal(modify_one(f->handle, BASE, LDAP_MOD_ADD, "oru-slapdPort", "0"),
                     CFG_INVALID_SYNTAX);
    assert_report_has(f->handle, CFG_INVALID_SYNTAX, f->config);
    assert_text(cfg_get_file_name(f->handle), f->config);
}

/* ---- asking ---- */

static void asking_resets_nothing_and_gives_the_same_text_again(void **state) {
    struct fixture *f = *state;
    const char *bound_name = cfg_get_file_name(f->handle);
    assert_ptr_equal(cfg_get_file_name(f->handle), bound_name);
    assert_int_equal(modify_one(f->handle, BASE, LDAP_MOD_ADD, "oru-slapdPort", "0"),
                     CFG_INVALID_SYNTAX);
    const char *report = cfg_dump_exception(f->handle);
    const char *name = cfg_get_file_name(f->handle);
    assert_ptr_equal(cfg_get_file_name(f->handle), name);
    assert_int_equal(cfg_get_errno(f->handle), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1015);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
    cfg_reset(f->handle);
    assert_ptr_equal(cfg_get_file_name(f->handle), bound_name);
}

static int set_up_with_host(void **state) {
    reset_host();
    return set_up(state);
}

static int set_up_bound_with_host(void **state) {
    reset_host();
    return set_up_bound(state);
}

#define CREATED_WITH_HOST(test) cmocka_unit_test_setup_teardown(test, set_up_with_host, tear_down)
#define BOUND_WITH_HOST(test) \
    cmocka_unit_test_setup_teardown(test, set_up_bound_with_host, tear_down)

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_null),
        CREATED_WITH_HOST(before_a_bind_it_is_the_name_that_was_set),
        CREATED_WITH_HOST(without_a_name_it_is_the_default_one),
        CREATED_WITH_HOST(the_default_name_follows_the_directory_until_a_bind_keeps_it),
        CREATED_WITH_HOST(without_a_directory_there_is_no_name),
        CREATED_WITH_HOST(a_directory_that_is_too_long_gives_no_name),
        CREATED_WITH_HOST(the_default_name_stays_whatever_other_threads_ask),
        BOUND_WITH_HOST(a_bound_handle_names_the_file_that_it_has),
        BOUND_WITH_HOST(while_the_name_is_null_a_bound_handle_is_not_bound),
        CREATED_WITH_HOST(a_relative_name_stays_relative),
        BOUND_WITH_HOST(a_failure_names_the_file_that_it_was_in),
        CREATED_WITH_HOST(a_missing_file_is_named),
        BOUND_WITH_HOST(a_failure_that_names_no_file_was_in_the_bound_one),
        CREATED_WITH_HOST(before_a_bind_a_failure_that_names_no_file_has_the_one_that_was_set),
        BOUND_WITH_HOST(a_refused_change_names_the_file),
        BOUND_WITH_HOST(asking_resets_nothing_and_gives_the_same_text_again),
    };
    return cmocka_run_group_tests_name("cfg_get_file_name", tests, NULL, NULL);
}
