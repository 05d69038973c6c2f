#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include "cfg32_platform.h"
#include "fixture.h"

/* The administrator's entry with these lines in place of the name and the password. */
#define ADMINISTRATOR_LINES(lines)   \
    "version: 1\ncharset: UTF-8\n\n" \
    "dn: cn=Configuration\ncn: Configuration\nobjectclass: top\n" lines "\n"

static int bind_with(const struct fixture *f, const char *dn, const char *password) {
    return cfg_bind_s(f->handle, dn, password, CFG_AUTH_SIMPLE);
}

/* ---- success ---- */

static void the_administrator_is_let_in(void **state) {
    struct fixture *f = *state;
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void names_are_compared_as_dns(void **state) {
    static const char *const rows[] = {"cn=root",     "CN=ROOT",    " cn = root",
                                       "cn=\"root\"", "cn=\\72oot", "cn=#726F6F74"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        if (bind_with(f, rows[i], PASSWORD) != CFG_SUCCESS) {
            fail_msg("not let in as %s", rows[i]);
        }
    }
}

static void no_credentials_make_an_anonymous_bind(void **state) {
    struct fixture *f = *state;
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void an_anonymous_bind_needs_no_administrator(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: o=Elsewhere\nobjectclass: top\n");
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
}

static void an_empty_file_can_be_bound_anonymously(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "");
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
}

static void without_an_administrators_name_any_name_is_let_in(void **state) {
    struct fixture *f = *state;
    write_configuration(f, ADMINISTRATOR_LINES("oru-slapdAdminPW: secret"));
    assert_int_equal(bind_with(f, "cn=whoever", "secret"), CFG_SUCCESS);
    assert_int_equal(bind_with(f, "not even a name", "secret"), CFG_SUCCESS);
    assert_int_equal(bind_with(f, "cn=whoever", "wrong"), CFG_INVALID_CREDENTIALS);
}

static void only_the_first_name_and_the_first_password_count(void **state) {
    struct fixture *f = *state;
    write_configuration(f, ADMINISTRATOR_LINES("oru-slapdAdminDN: cn=one\n"
                                               "oru-slapdAdminDN: cn=two\n"
                                               "oru-slapdAdminPW: first\n"
                                               "oru-slapdAdminPW: second"));
    assert_int_equal(bind_with(f, "cn=one", "first"), CFG_SUCCESS);
    assert_int_equal(bind_with(f, "cn=two", "first"), CFG_INVALID_CREDENTIALS);
    assert_int_equal(bind_with(f, "cn=one", "second"), CFG_INVALID_CREDENTIALS);
}

static void a_bound_handle_can_be_bound_again(void **state) {
    struct fixture *f = *state;
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void a_failed_second_bind_leaves_the_handle_bound(void **state) {
    struct fixture *f = *state;
    assert_int_equal(bind_with(f, ADMINISTRATOR, "wrong"), CFG_INVALID_CREDENTIALS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void success_clears_the_failure_of_before(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
}

/* ---- refused ---- */

static void a_null_handle_gives_89(void **state) {
    (void)state;
    assert_int_equal(cfg_bind_s(NULL, NULL, NULL, CFG_AUTH_SIMPLE), CFG_PARAM_ERROR);
    assert_int_equal(cfg_bind_s(NULL, NULL, NULL, 0), CFG_PARAM_ERROR);
}

static void every_other_method_gives_86(void **state) {
    static const int methods[] = {0, 1, 127, 129, 130, 163, -1, 128 + 256, -128};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(methods); ++i) {
        assert_int_equal(cfg_bind_s(f->handle, ADMINISTRATOR, PASSWORD, methods[i]),
                         CFG_AUTH_UNKNOWN);
        assert_int_equal(cfg_get_exterror(f->handle), 86);
        assert_report_has(f->handle, CFG_AUTH_UNKNOWN,
                          "Bind method must be one of { LDAP_AUTH_SIMPLE }");
    }
}

static void the_method_is_judged_before_the_file_is_opened(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, "/none/such");
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
}

static void wrong_credentials_give_49_without_a_report(void **state) {
    static const struct {
        const char *dn;
        const char *password;
    } rows[] = {
        {"cn=root", "wrong"},
        {"cn=root", "correct horse "},
        {"cn=root", "Correct horse"},
        {"cn=root", "correct"},
        {"cn=other", PASSWORD},
        {"cn=root, o=x", PASSWORD},
        {"cn=root", ""},
        {"", PASSWORD},
        {"", ""},
        {"cn=root", NULL},
        {NULL, PASSWORD},
        {"", NULL},
        {NULL, ""},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        if (bind_with(f, rows[i].dn, rows[i].password) != CFG_INVALID_CREDENTIALS) {
            fail_msg("row %d: %d", (int)i, cfg_get_errno(f->handle));
        }
        assert_no_report(f->handle, CFG_INVALID_CREDENTIALS);
        assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    }
}

static void an_empty_name_is_refused_without_looking_for_the_administrator(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: o=Elsewhere\nobjectclass: top\n");
    assert_int_equal(bind_with(f, "", "secret"), CFG_INVALID_CREDENTIALS);
    assert_no_report(f->handle, CFG_INVALID_CREDENTIALS);
}

static void an_administrator_without_a_password_is_never_let_in(void **state) {
    struct fixture *f = *state;
    write_configuration(f, ADMINISTRATOR_LINES("oru-slapdAdminDN: cn=root"));
    assert_int_equal(bind_with(f, "cn=root", "any"), CFG_INVALID_CREDENTIALS);
}

static void an_administrators_entry_without_an_objectclass_is_not_found(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: cn=Configuration\noru-slapdAdminPW: secret\n");
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_INVALID_CREDENTIALS);
}

static void an_entry_without_name_and_password_lets_nobody_in(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: cn=Configuration\nobjectclass: top\n");
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_INVALID_CREDENTIALS);
}

static void a_file_without_an_administrators_entry_gives_32(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: o=Elsewhere\nobjectclass: top\n");
    assert_int_equal(bind_with(f, "cn=root", "secret"), 32);
    assert_int_equal(cfg_get_exterror(f->handle), 32);
    assert_report_has(f->handle, 32, "Base entry not found");
    assert_report_has(f->handle, 32, "\nentry dn: cn=Configuration\n");
    assert_report_has(f->handle, 32, f->config);
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
}

static void a_malformed_name_gives_34(void **state) {
    struct fixture *f = *state;
    assert_int_equal(bind_with(f, "=root", PASSWORD), 34);
    assert_int_equal(cfg_get_exterror(f->handle), 1012);
    assert_report_has(f->handle, 34, "Invalid attribute sytax: ");
    assert_report_has(f->handle, 34, "\nentry dn: cn=Configuration\n");
    assert_report_has(f->handle, 34, f->config);
    assert_report_has(f->handle, 34, "\nvalue: =root\n");
}

static void a_password_that_could_not_be_stored_gives_21(void **state) {
    struct fixture *f = *state;
    char *password = malloc(1026);
    memset(password, 'p', 1025);
    password[1025] = '\0';
    assert_int_equal(bind_with(f, ADMINISTRATOR, password), 21);
    assert_int_equal(cfg_get_exterror(f->handle), 1018);
    assert_report_has(f->handle, 21, "Password length must be 1 to 1024 characters");
    password[1024] = '\0';
    assert_int_equal(bind_with(f, ADMINISTRATOR, password), CFG_INVALID_CREDENTIALS);
    free(password);
}

/* ---- stored passwords ---- */

static void encoded(char *out, size_t size, struct aes_key_data *key, const char *clear) {
    assert_int_equal(format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, clear,
                                     (int)strlen(clear), out, (int)size),
                     1);
}

static void write_password(const struct fixture *f, const char *stored) {
    char text[2048];
    strcpy(text, "dn: cn=Configuration\nobjectclass: top\noru-slapdAdminPW: ");
    strcat(text, stored);
    strcat(text, "\n");
    write_configuration(f, text);
}

static void a_masked_password_is_compared_in_clear(void **state) {
    struct fixture *f = *state;
    char stored[1024];
    encoded(stored, sizeof stored, NULL, "secret");
    write_password(f, stored);
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_SUCCESS);
    assert_int_equal(bind_with(f, "cn=root", "Secret"), CFG_INVALID_CREDENTIALS);
}

static void a_masked_password_may_lack_its_tag(void **state) {
    struct fixture *f = *state;
    char stored[1024];
    encoded(stored, sizeof stored, NULL, "secret");
    assert_int_equal(strncmp(stored, "{iMASK}>", 8), 0);
    write_password(f, stored + 7);
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_SUCCESS);
}

static void the_stored_form_is_a_password_too(void **state) {
    struct fixture *f = *state;
    char stored[1024];
    encoded(stored, sizeof stored, NULL, "secret");
    write_password(f, "secret");
    assert_int_equal(bind_with(f, "cn=root", stored), CFG_SUCCESS);
}

static void an_encrypted_password_needs_its_key(void **state) {
    static const unsigned char bytes[2][32] = {{1}, {2}};
    struct fixture *f = *state;
    char stored[1024];
    struct aes_key_data *key = aes_key_data_from_bytes(bytes[0], sizeof bytes[0]);
    struct aes_key_data *other = aes_key_data_from_bytes(bytes[1], sizeof bytes[1]);
    encoded(stored, sizeof stored, key, "secret");
    write_password(f, stored);

    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_DECODING_ERROR);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "unformat_password(left);");
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, other);
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_DECODING_ERROR);
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, key);
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_SUCCESS);
    assert_int_equal(bind_with(f, "cn=root", "wrong"), CFG_INVALID_CREDENTIALS);

    cfg_unbind(f->handle);
    f->handle = NULL;
    aes_key_data_free(key);
    aes_key_data_free(other);
}

static void a_hashed_password_gives_84(void **state) {
    struct fixture *f = *state;
    write_password(f, "{SSHA}c2VjcmV0c2VjcmV0c2VjcmV0");
    assert_int_equal(bind_with(f, "cn=root", "secret"), CFG_DECODING_ERROR);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "unformat_password(left);");
}

/* ---- the file ---- */

static void a_file_that_can_not_be_loaded_gives_the_loaders_code(void **state) {
    static const struct {
        const char *text;
        int code;
        int extended;
        const char *message;
    } rows[] = {
        {"dn: =x\n", 34, 1012, "Invalid attribute sytax: "},
        {"dn: cn\n", 34, 1013, "Missing RDN value: cn"},
        {"dn: cn=a\\\n", 34, 1014, "Invalid escape sequence: \\"},
        {"dn: cn=a=b\n", 34, 1014, "Invalid character in RDN value: ="},
        {"cn: x\n", 65, 1007, "\"cn\" attribute not allowed in <root> object"},
        {"garbage\n", 65, 1007, "\"oru-slapdInvalidLine\" attribute not allowed in <root> object"},
        {"version: 1\nversion: 1\n", 65, 1007,
         "\"oru-slapdInvalidLine\" attribute not allowed in <root> object"},
        {"charset: a\ncharset: b\n", 65, 1007,
         "\"oru-slapdInvalidLine\" attribute not allowed in <root> object"},
        {"dn: cn=x\nobjectclass: top\n\ncn: stray\n", 65, 1007,
         "\"cn\" attribute not allowed in <root> object"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        write_configuration(f, rows[i].text);
        if (bind_with(f, NULL, NULL) != rows[i].code) {
            fail_msg("row %d: %d %s", (int)i, cfg_get_errno(f->handle),
                     cfg_dump_exception(f->handle));
        }
        assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
        assert_report_has(f->handle, rows[i].code, rows[i].message);
        assert_report_has(f->handle, rows[i].code, f->config);
        assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
        char *text = read_file(f->config);
        assert_string_equal(text, rows[i].text);
        free(text);
    }
}

static void the_report_tells_the_line_of_the_file(void **state) {
    struct fixture *f = *state;
    char expected[256];
    write_configuration(f,
                        "version: 1\ncharset: UTF-8\n\n"
                        "dn: cn=x\nobjectclass: top\n\ncn: stray\n");
    assert_int_equal(bind_with(f, NULL, NULL), 65);
    strcpy(expected, "\nLine 7 of ");
    strcat(expected, f->config);
    assert_report_has(f->handle, 65, expected);
    assert_report_has(f->handle, 65, "\nentry dn: <root>\nattribute: cn\nvalue: stray\n");
}

static void text_of_another_character_set_gives_162(void **state) {
    /* A line that is read ahead, to see whether it goes on, still counts as the one before. */
    static const struct {
        const char *text;
        const char *place;
    } rows[] = {
        {"\xff\n", "\nLine 1 of "},
        {"version: 1\n\ncharset: \xff\n", "\nLine 3 of "},
        {"dn: cn=Configuration\n\n# \xc3\n", "\nLine 3 of "},
        {"dn: cn=Configuration\nobjectclass: top\ncn: \xff\n", "\nLine 2 of "},
    };
    REQUIRE_UTF8();
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        write_configuration(f, rows[i].text);
        assert_int_equal(bind_with(f, NULL, NULL), 162);
        assert_int_equal(cfg_get_exterror(f->handle), 162);
        assert_report_has(f->handle, 162, rows[i].place);
    }
}

static void a_missing_file_gives_91(void **state) {
    struct fixture *f = *state;
    assert_int_equal(remove(f->config), 0);
    assert_int_equal(bind_administrator(f->handle), 91);
    assert_int_equal(cfg_get_exterror(f->handle), 1003);
    assert_report_has(f->handle, 91, "msg     _stat()\n");
    assert_report_has(f->handle, 91, "\nerrno 2: ");
    assert_report_has(f->handle, 91, f->config);
}

static void a_file_that_can_not_be_opened_gives_91(void **state) {
    struct fixture *f = *state;
    /* A socket has a status, but nobody can open it, not even root. */
    struct sockaddr_un address = {AF_UNIX, ""};
    const int listener = socket(AF_UNIX, SOCK_STREAM, 0);
    assert_int_equal(remove(f->config), 0);
    assert_true(strlen(f->config) < sizeof address.sun_path);
    strcpy(address.sun_path, f->config);
    assert_int_equal(bind(listener, (const struct sockaddr *)&address, sizeof address), 0);
    assert_int_equal(bind_administrator(f->handle), 91);
    assert_int_equal(cfg_get_exterror(f->handle), 1004);
    assert_report_has(f->handle, 91, "msg     ifstream()\n");
    assert_report_has(f->handle, 91, f->config);
    close(listener);
}

static void a_folder_is_no_configuration_file(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, f->folder);
    assert_int_not_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
}

static void a_fifo_does_not_block(void **state) {
    struct fixture *f = *state;
    assert_int_equal(remove(f->config), 0);
    assert_int_equal(mkfifo(f->config, 0600), 0);
    assert_int_not_equal(bind_administrator(f->handle), CFG_SUCCESS);
}

static void after_a_failure_the_handle_can_be_bound(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: =x\n");
    assert_int_equal(bind_administrator(f->handle), 34);
    write_configuration(f, standard_configuration);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void a_good_file_is_not_written(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    char *text = read_file(f->config);
    assert_string_equal(text, standard_configuration);
    assert_false(file_exists(backup));
    free(text);
    free(backup);
}

static const char unusable_lines[] =
    "version: 1\ncharset: UTF-8\n\n"
    "dn: cn=Configuration\n"
    "objectclass: top\n"
    "oru-slapdPort: many\n"
    "garbage\n";

static void unusable_lines_are_kept_and_the_file_is_rewritten(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    write_configuration(f, unusable_lines);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
    assert_attributes(f->handle, result, "objectclass oru-slapdInvalidLine");
    cfg_msgfree(result);
    char *before = read_file(backup);
    assert_string_equal(before, unusable_lines);
    free(before);
    free(backup);
}

static void without_a_backup_name_no_copy_is_made(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    write_configuration(f, unusable_lines);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, NULL);
    assert_int_equal(bind_with(f, NULL, NULL), CFG_SUCCESS);
    char *text = read_file(f->config);
    assert_string_not_equal(text, unusable_lines);
    assert_non_null(strstr(text, "oru-slapdInvalidLine: oru-slapdPort: many\n"));
    assert_non_null(strstr(text, "oru-slapdInvalidLine: garbage:"));
    assert_false(file_exists(backup));
    free(text);
    free(backup);
}

static void a_backup_that_fails_gives_50_and_leaves_the_file_alone(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "none/such/backup.conf");
    char expected[256];
    write_configuration(f, unusable_lines);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(bind_with(f, NULL, NULL), 50);
    assert_int_equal(cfg_get_exterror(f->handle), 1004);
    strcpy(expected, "Unable to backup the configuration file: \"");
    strcat(expected, f->config);
    strcat(expected, "\" \n");
    assert_report_has(f->handle, 50, expected);
    char *text = read_file(f->config);
    assert_string_equal(text, unusable_lines);
    free(text);
    free(backup);
}

/* ---- the default file ---- */

static void without_a_name_the_default_file_is_loaded(void **state) {
    struct fixture *f = *state;
    char *folder = path_of(f, "etc");
    char *file = path_of(f, "etc/oruslapd.conf");
    char *name = NULL;
    assert_int_equal(mkdir(folder, 0700), 0);
    write_file(file, standard_configuration);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    setenv("NUV_INSTALL_PATH", f->folder, 1);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    unsetenv("NUV_INSTALL_PATH");
    cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    assert_string_equal(name, file);
    cfg_memfree(name);
    free(file);
    free(folder);
}

static void the_default_name_is_kept_even_for_a_refused_method(void **state) {
    static const int methods[] = {0, 163};
    for (size_t i = 0; i < LENGTH(methods); ++i) {
        char *name = NULL;
        (void)state;
        CfgHandle *handle = cfg_init();
        setenv("NUV_INSTALL_PATH", "/none/such", 1);
        assert_int_equal(cfg_bind_s(handle, NULL, NULL, methods[i]), CFG_AUTH_UNKNOWN);
        setenv("NUV_INSTALL_PATH", "/another", 1);
        cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &name);
        assert_string_equal(name, "/none/such/etc/oruslapd.conf");
        cfg_memfree(name);
        /* The name that was kept serves the next bind. */
        assert_int_equal(cfg_bind_s(handle, NULL, NULL, CFG_AUTH_SIMPLE), 91);
        assert_report_has(handle, 91, "/none/such/etc/oruslapd.conf");
        unsetenv("NUV_INSTALL_PATH");
        cfg_unbind(handle);
    }
}

static void a_name_that_is_set_is_not_replaced_by_the_default(void **state) {
    struct fixture *f = *state;
    char *name = NULL;
    setenv("NUV_INSTALL_PATH", "/none/such", 1);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    unsetenv("NUV_INSTALL_PATH");
    cfg_get_option(f->handle, CFG_OPT_CONFIG_FILE, &name);
    assert_string_equal(name, f->config);
    cfg_memfree(name);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(the_administrator_is_let_in),
        CREATED(names_are_compared_as_dns),
        CREATED(no_credentials_make_an_anonymous_bind),
        CREATED(an_anonymous_bind_needs_no_administrator),
        CREATED(an_empty_file_can_be_bound_anonymously),
        CREATED(without_an_administrators_name_any_name_is_let_in),
        CREATED(only_the_first_name_and_the_first_password_count),
        CREATED(a_bound_handle_can_be_bound_again),
        BOUND(a_failed_second_bind_leaves_the_handle_bound),
        CREATED(success_clears_the_failure_of_before),
        cmocka_unit_test(a_null_handle_gives_89),
        CREATED(every_other_method_gives_86),
        CREATED(the_method_is_judged_before_the_file_is_opened),
        CREATED(wrong_credentials_give_49_without_a_report),
        CREATED(an_empty_name_is_refused_without_looking_for_the_administrator),
        CREATED(an_administrator_without_a_password_is_never_let_in),
        CREATED(an_administrators_entry_without_an_objectclass_is_not_found),
        CREATED(an_entry_without_name_and_password_lets_nobody_in),
        CREATED(a_file_without_an_administrators_entry_gives_32),
        CREATED(a_malformed_name_gives_34),
        CREATED(a_password_that_could_not_be_stored_gives_21),
        CREATED(a_masked_password_is_compared_in_clear),
        CREATED(a_masked_password_may_lack_its_tag),
        CREATED(the_stored_form_is_a_password_too),
        CREATED(an_encrypted_password_needs_its_key),
        CREATED(a_hashed_password_gives_84),
        CREATED(a_file_that_can_not_be_loaded_gives_the_loaders_code),
        CREATED(the_report_tells_the_line_of_the_file),
        CREATED(text_of_another_character_set_gives_162),
        CREATED(a_missing_file_gives_91),
        CREATED(a_file_that_can_not_be_opened_gives_91),
        CREATED(a_folder_is_no_configuration_file),
        CREATED(a_fifo_does_not_block),
        CREATED(after_a_failure_the_handle_can_be_bound),
        CREATED(a_good_file_is_not_written),
        CREATED(unusable_lines_are_kept_and_the_file_is_rewritten),
        CREATED(without_a_backup_name_no_copy_is_made),
        CREATED(a_backup_that_fails_gives_50_and_leaves_the_file_alone),
        CREATED(without_a_name_the_default_file_is_loaded),
        cmocka_unit_test(the_default_name_is_kept_even_for_a_refused_method),
        CREATED(a_name_that_is_set_is_not_replaced_by_the_default),
    };
    return cmocka_run_group_tests_name("cfg_bind_s", tests, NULL, NULL);
}
