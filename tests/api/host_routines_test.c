/*
 * A routine that the host program defines takes the place of the platform library's, and is called
 * with what the server's routines expect.
 */

#include "host_routines.h"

#include <dlfcn.h>
#include <grp.h>
#include <locale.h>
#include <pthread.h>
#include <pwd.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>

#include "cfg32_platform.h"
#include "fixture.h"

#define BASE "cn=Configuration"

/* ---- the locale ---- */

static struct {
    int calls;
    int category;
    char name[16];
    int mutex_was_locked;
    int mutex_was_initialised;
} locale_record;

/* Stands before the C library's. */
char *setlocale(int category, const char *name) {
    static char *(*real)(int, const char *);
    if (!real) {
        void *symbol = dlsym(RTLD_NEXT, "setlocale");
        memcpy(&real, &symbol, sizeof real);
    }
    ++locale_record.calls;
    locale_record.category = category;
    snprintf(locale_record.name, sizeof locale_record.name, "%s", name ? name : "(null)");
    locale_record.mutex_was_initialised = host.initialised_locale > 0;
    locale_record.mutex_was_locked = pthread_mutex_trylock(&set_locale_mutex) != 0;
    if (!locale_record.mutex_was_locked) {
        pthread_mutex_unlock(&set_locale_mutex);
    }
    return real(category, name);
}

static void init_sets_the_locale_once_under_the_hosts_lock(void **state) {
    (void)state;
    reset_host();
    memset(&locale_record, 0, sizeof locale_record);
    CfgHandle *handle = cfg_init();
    assert_int_equal(locale_record.calls, 1);
    assert_int_equal(locale_record.category, LC_ALL);
    assert_string_equal(locale_record.name, "");
    assert_true(locale_record.mutex_was_initialised);
    assert_true(locale_record.mutex_was_locked);
    assert_int_equal(pthread_mutex_trylock(&set_locale_mutex), 0);
    pthread_mutex_unlock(&set_locale_mutex);
    cfg_unbind(handle);
}

/* ---- the installation directory ---- */

static void the_default_file_is_below_the_hosts_directory(void **state) {
    char *name = NULL;
    (void)state;
    reset_host();
    host.install_path = "/host/directory";
    CfgHandle *handle = cfg_init();
    assert_int_equal(cfg_bind_s(handle, NULL, NULL, CFG_AUTH_SIMPLE), 91);
    cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &name);
    assert_string_equal(name, "/host/directory/etc/oruslapd.conf");
    cfg_memfree(name);
    cfg_unbind(handle);
}

static void without_a_directory_bind_gives_80(void **state) {
    static const int methods[] = {CFG_AUTH_SIMPLE, 0};
    (void)state;
    for (size_t i = 0; i < LENGTH(methods); ++i) {
        char *name = (char *)&name;
        reset_host();
        host.install_path = NULL;
        CfgHandle *handle = cfg_init();
        assert_int_equal(cfg_bind_s(handle, NULL, NULL, methods[i]), CFG_OTHER);
        assert_int_equal(cfg_get_exterror(handle), 1000);
        char *report = report_without_lines(handle);
        assert_string_equal(report,
                            "[src/libraries/cfg32stl/bind:#]\n"
                            "msg     Unable to get default config filename. Either out of memory "
                            "or ldaphome not in registry\n"
                            "ldapErr 80: Unknown error\n"
                            "extErr 1000: Unexpected error in cfg32 API\n");
        free(report);
        cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &name);
        assert_null(name);
        cfg_unbind(handle);
    }
}

static void a_directory_of_up_to_493_bytes_fits(void **state) {
    static const struct {
        size_t length;
        int code;
    } rows[] = {{492, 91}, {493, 91}, {494, 80}, {512, 80}, {4000, 80}};
    (void)state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char path[4096];
        memset(path, 'd', sizeof path);
        path[0] = '/';
        path[rows[i].length] = '\0';
        reset_host();
        host.install_path = path;
        CfgHandle *handle = cfg_init();
        assert_int_equal(cfg_bind_s(handle, NULL, NULL, CFG_AUTH_SIMPLE), rows[i].code);
        if (rows[i].code == 91) {
            char *name = NULL;
            cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &name);
            assert_int_equal(strlen(name), rows[i].length + strlen("/etc/oruslapd.conf"));
            cfg_memfree(name);
        }
        cfg_unbind(handle);
    }
}

/* ---- the backup ---- */

static const char unusable_line[] = "dn: cn=Configuration\nobjectclass: top\ngarbage\n";

static void a_backup_is_copied_with_owner_group_and_mode(void **state) {
    struct fixture *f = *state;
    struct stat status;
    reset_host();
    write_configuration(f, unusable_line);
    assert_int_equal(chmod(f->config, 0640), 0);
    assert_int_equal(stat(f->config, &status), 0);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "/the/backup");
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    assert_int_equal(host.copied, 1);
    assert_string_equal(host.copy_source, f->config);
    assert_string_equal(host.copy_target, "/the/backup");
    const struct passwd *owner = getpwuid(status.st_uid);
    assert_string_equal(host.copy_owner, owner ? owner->pw_name : "(null)");
    const struct group *group = getgrgid(status.st_gid);
    assert_string_equal(host.copy_group, group ? group->gr_name : "(null)");
    assert_int_equal(host.copy_mode & 07777, 0640);
}

static void a_copy_that_fails_gives_50_and_the_file_is_not_written(void **state) {
    struct fixture *f = *state;
    reset_host();
    host.copy_succeeds = 0;
    write_configuration(f, unusable_line);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "/the/backup");
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), 50);
    assert_report_has(f->handle, 50, "msg     Unable to backup the configuration file: \"");
    char *text = read_file(f->config);
    assert_string_equal(text, unusable_line);
    free(text);
}

static void without_a_backup_name_nothing_is_copied(void **state) {
    struct fixture *f = *state;
    reset_host();
    write_configuration(f, unusable_line);
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    assert_int_equal(host.copied, 0);
}

/* ---- passwords ---- */

static void load_password(const struct fixture *f, const char *value) {
    char text[3000];
    snprintf(text, sizeof text, "dn: " BASE "\nobjectclass: top\noru-slapdMasterPW: %s\n", value);
    write_configuration(f, text);
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
}

static int search_password(const struct fixture *f, CfgMessage **result) {
    char name[] = "oru-slapdMasterPW";
    char *attrs[] = {name, NULL};
    return cfg_search_s(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs, 0, result);
}

static void a_clear_password_is_encoded_by_the_host(void **state) {
    struct fixture *f = *state;
    char key = 0;
    reset_host();
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, &key);
    load_password(f, "open sesame");
    assert_true(host.encoded > 0);
    assert_int_equal(host.encode_selector, 133);
    assert_int_equal(host.encode_flag, 0);
    assert_ptr_equal(host.encode_key, &key);
    assert_string_equal(host.encode_text, "open sesame");
    assert_int_equal(host.encode_length, 11);
    assert_int_equal(host.encode_size, 1024);
    assert_true(host.encode_buffer_was_zero);
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    assert_values(f->handle, result, "oru-slapdMasterPW", "{HOST}open sesame");
    cfg_msgfree(result);
}

static void a_stored_password_is_decoded_by_the_host(void **state) {
    static const struct {
        const char *stored;
        const char *input;
        const char *clear;
    } rows[] = {
        {"{HOST}open sesame", "{HOST}open sesame", "open sesame"},
        {">open sesame", "{iMASK}>open sesame", "open sesame"},
        {">>x", "{iMASK}>>x", ">x"},
        {"{HOST}", "{HOST}", ""},
    };
    struct fixture *f = *state;
    char key = 0;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = NULL;
        cfg_set_option(f->handle, CFG_OPT_KEY_DATA, &key);
        load_password(f, rows[i].stored);
        reset_host();
        assert_int_equal(search_password(f, &result), CFG_SUCCESS);
        assert_int_equal(host.decoded, 1);
        assert_string_equal(host.decode_text, rows[i].input);
        assert_ptr_equal(host.decode_key, &key);
        assert_int_equal(host.decode_flag, 0);
        assert_true(host.decode_result_was_null);
        char **values = cfg_get_values(f->handle, result, "oru-slapdMasterPW");
        assert_string_equal(values[0], rows[i].clear);
        cfg_value_free(values);
        /* The result keeps the host's text, which is released with free. */
        assert_int_equal(host.freed, 0);
        cfg_msgfree(result);
        assert_int_equal(host.freed, 0);
    }
}

static void every_result_but_0_is_a_success(void **state) {
    static const int results[] = {1, 2, -1};
    struct fixture *f = *state;
    reset_host();
    load_password(f, "open sesame");
    for (size_t i = 0; i < LENGTH(results); ++i) {
        CfgMessage *result = NULL;
        host.decode_result = results[i];
        assert_int_equal(search_password(f, &result), CFG_SUCCESS);
        assert_values(f->handle, result, "oru-slapdMasterPW", "open sesame");
        cfg_msgfree(result);
    }
}

static void a_result_of_0_gives_84(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    reset_host();
    load_password(f, "open sesame");
    host.decode_result = 0;
    assert_int_equal(search_password(f, &result), CFG_DECODING_ERROR);
    assert_null(result);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "\nvalue: {HOST}open sesame\n");
}

static void the_decoder_gets_up_to_1023_bytes_with_the_tag(void **state) {
    static const struct {
        const char *begin;
        size_t length;
        int code;
    } rows[] = {
        {"{HOST}", 1023, 0}, {"{HOST}", 1024, 84}, {"{HOST}", 2000, 84},
        {">", 1016, 0},      {">", 1017, 84},      {">", 1023, 84},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char stored[2100];
        CfgMessage *result = NULL;
        memset(stored, 'p', sizeof stored);
        memcpy(stored, rows[i].begin, strlen(rows[i].begin));
        stored[rows[i].length] = '\0';
        reset_host();
        load_password(f, stored);
        assert_int_equal(search_password(f, &result), rows[i].code);
        assert_int_equal(host.decoded, rows[i].code == 0);
        cfg_msgfree(result);
    }
}

static void bind_compares_in_clear_and_gives_both_texts_back(void **state) {
    struct fixture *f = *state;
    reset_host();
    write_configuration(f, standard_configuration);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(host.decoded, 2);
    assert_int_equal(host.freed, 2);
    assert_int_equal(cfg_bind_s(f->handle, ADMINISTRATOR, "wrong", CFG_AUTH_SIMPLE),
                     CFG_INVALID_CREDENTIALS);
    assert_int_equal(host.decoded, 4);
    assert_int_equal(host.freed, 4);
}

static void an_empty_stored_password_admits_nobody_and_is_not_decoded(void **state) {
    struct fixture *f = *state;
    reset_host();
    write_configuration(f, "dn: " BASE "\nobjectclass: top\noru-slapdAdminPW:\n");
    assert_int_equal(cfg_bind_s(f->handle, "cn=x", "any", CFG_AUTH_SIMPLE),
                     CFG_INVALID_CREDENTIALS);
    assert_int_equal(host.decoded, 1);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(init_sets_the_locale_once_under_the_hosts_lock),
        cmocka_unit_test(the_default_file_is_below_the_hosts_directory),
        cmocka_unit_test(without_a_directory_bind_gives_80),
        cmocka_unit_test(a_directory_of_up_to_493_bytes_fits),
        CREATED(a_backup_is_copied_with_owner_group_and_mode),
        CREATED(a_copy_that_fails_gives_50_and_the_file_is_not_written),
        CREATED(without_a_backup_name_nothing_is_copied),
        CREATED(a_clear_password_is_encoded_by_the_host),
        CREATED(a_stored_password_is_decoded_by_the_host),
        CREATED(every_result_but_0_is_a_success),
        CREATED(a_result_of_0_gives_84),
        CREATED(the_decoder_gets_up_to_1023_bytes_with_the_tag),
        CREATED(bind_compares_in_clear_and_gives_both_texts_back),
        CREATED(an_empty_stored_password_admits_nobody_and_is_not_decoded),
    };
    reset_host();
    return cmocka_run_group_tests_name("host_routines", tests, NULL, NULL);
}
