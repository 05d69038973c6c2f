/* Passwords are stored encoded, whoever brings them. */

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "cfg32_platform.h"
#include "changes.h"

static int bind_with_password(CfgHandle *handle, const char *password) {
    return cfg_bind_s(handle, ADMINISTRATOR, password, CFG_AUTH_SIMPLE);
}

static char *repeated(char letter, size_t count) {
    char *text = calloc(1, count + 1);
    assert_non_null(text);
    memset(text, letter, count);
    return text;
}

/* The first value of an attribute as the file has it, to be freed. */
static char *stored(const struct fixture *f, const char *attribute) {
    char *text = read_file(f->config);
    char label[64] = "\n";
    strcat(strcat(label, attribute), ": ");
    const char *found = strstr(text, label);
    assert_non_null(found);
    found += strlen(label);
    char *value = strndup(found, strcspn(found, "\n"));
    free(text);
    return value;
}

static void assert_stored_as(const struct fixture *f, const char *attribute, const char *tag) {
    char *value = stored(f, attribute);
    assert_int_equal(strncmp(value, tag, strlen(tag)), 0);
    free(value);
}

static void assert_nowhere_in_clear(const struct fixture *f, const char *clear) {
    char *text = read_file(f->config);
    assert_null(strstr(text, clear));
    free(text);
}

static void the_administrators_new_password_is_stored_encoded_and_lets_in(void **state) {
    struct fixture *f = *state;
    load_entries(f, "");
    must_modify(f->handle, TOP, "replace oru-slapdAdminPW=staple battery");
    assert_stored_as(f, "oru-slapdAdminPW", "{iMASK}>");
    assert_nowhere_in_clear(f, "staple battery");
    assert_int_equal(bind_with_password(f->handle, "staple battery"), CFG_SUCCESS);
    assert_int_equal(bind_administrator(f->handle), CFG_INVALID_CREDENTIALS);
    /* The failed bind left the handle bound. */
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_int_equal(bind_with_password(f->handle, "staple battery"), CFG_SUCCESS);
}

static void with_a_key_passwords_are_encrypted(void **state) {
    static const unsigned char bytes[32] = {7};
    struct fixture *f = *state;
    struct aes_key_data *key = aes_key_data_from_bytes(bytes, sizeof bytes);
    write_entries(f, "");
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, key);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    must_modify(f->handle, TOP, "replace oru-slapdAdminPW=staple battery");
    assert_stored_as(f, "oru-slapdAdminPW", "{AES256}");
    assert_nowhere_in_clear(f, "staple battery");
    assert_int_equal(bind_with_password(f->handle, "staple battery"), CFG_SUCCESS);
    assert_int_equal(bind_administrator(f->handle), CFG_INVALID_CREDENTIALS);
    cfg_unbind(f->handle);
    f->handle = NULL;
    aes_key_data_free(key);
}

static void an_encoded_password_is_stored_as_it_comes(void **state) {
    static const char *const rows[] = {"{SSHA}c2VjcmV0", "{AES256}AAAA", "{iMASK}>whatever"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(modify_one(f->handle, A, LDAP_MOD_REPLACE, "oru-slapdPeerPW", rows[i]),
                         CFG_SUCCESS);
        char *value = stored(f, "oru-slapdPeerPW");
        assert_string_equal(value, rows[i]);
        free(value);
    }
}

static void the_same_password_again_is_no_second_value(void **state) {
    static const struct refusal expected = {19, 1006, "Attribute may not have multiple values.",
                                            "oru-slapdPeerPW", NULL};
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    must_modify(f->handle, A, "add oru-slapdPeerPW=secret");
    char *before = read_file(f->config);
    must_modify(f->handle, A, "add oru-slapdPeerPW=secret");
    assert_file(f->config, before);
    assert_int_equal(modify(f->handle, A, "add oru-slapdPeerPW=Secret"), CFG_CONSTRAINT_VIOLATION);
    assert_int_equal(cfg_get_exterror(f->handle), expected.extended);
    assert_report_has(f->handle, expected.code, expected.message);
    assert_string_equal(cfg_get_attribute(f->handle), expected.attribute);
    assert_file(f->config, before);
    free(before);
}

static void a_password_is_deleted_by_its_clear_text(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    must_modify(f->handle, A, "add oru-slapdPeerPW=secret");
    must_modify(f->handle, A, "delete oru-slapdPeerPW=wrong");
    assert_stored_as(f, "oru-slapdPeerPW", "{iMASK}>");
    must_modify(f->handle, A, "delete oru-slapdPeerPW=secret");
    assert_lines(f, "cn: A\n");
}

static void a_stored_password_that_can_not_be_decoded_can_only_be_replaced(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\noru-slapdPeerPW: {SSHA}c2VjcmV0\n");
    assert_int_equal(modify(f->handle, A, "add oru-slapdPeerPW=secret"), CFG_DECODING_ERROR);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "unformat_password(left);");
    assert_int_equal(modify(f->handle, A, "delete oru-slapdPeerPW=secret"), CFG_DECODING_ERROR);
    assert_lines(f, "cn: A\noru-slapdPeerPW: {SSHA}c2VjcmV0\n");
    must_modify(f->handle, A, "replace oru-slapdPeerPW=secret");
    assert_stored_as(f, "oru-slapdPeerPW", "{iMASK}>");
    must_modify(f->handle, A, "delete oru-slapdPeerPW");
    assert_lines(f, "cn: A\n");
}

static void a_comparison_that_fails_is_reported_with_attribute_type_and_new_value(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\noru-slapdPeerPW: {SSHA}c2VjcmV0\n");
    assert_int_equal(modify(f->handle, A, "add oru-slapdPeerPW=secret"), CFG_DECODING_ERROR);
    assert_string_equal(cfg_get_entry(f->handle), A);
    assert_string_equal(cfg_get_attribute(f->handle), "oru-slapdPeerPW");
    assert_int_equal(cfg_get_is_single(f->handle), 1);
    assert_int_equal(cfg_get_minimum(f->handle), 1);
    assert_int_equal(cfg_get_maximum(f->handle), 1024);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "\nConstraints for oru-slapdPeerPW\n");
    assert_int_equal(strncmp(cfg_get_value(f->handle), "{iMASK}>", 8), 0);
}

static void the_length_of_a_password_is_bounded(void **state) {
    struct fixture *f = *state;
    char *longest = repeated('x', 1024);
    char *too_long = repeated('x', 1025);
    load_lines(f, "cn: A\n");
    assert_int_equal(modify_one(f->handle, A, LDAP_MOD_ADD, "oru-slapdPeerPW", too_long),
                     CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1018);
    assert_report_has(f->handle, 21, "Password length must be 1 to 1024 characters");
    assert_string_equal(cfg_get_value(f->handle), too_long);
    assert_int_equal(modify_one(f->handle, A, LDAP_MOD_ADD, "oru-slapdPeerPW", ""),
                     CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1018);
    assert_lines(f, "cn: A\n");
    assert_int_equal(modify_one(f->handle, A, LDAP_MOD_ADD, "oru-slapdPeerPW", longest),
                     CFG_SUCCESS);
    assert_int_equal(modify_one(f->handle, A, LDAP_MOD_DELETE, "oru-slapdPeerPW", longest),
                     CFG_SUCCESS);
    assert_lines(f, "cn: A\n");
    free(longest);
    free(too_long);
}

/* Text without repetitions, which can't be compressed. */
static char *random_letters(size_t count) {
    char *text = repeated('x', count);
    uint32_t number = 1;
    for (size_t i = 0; i < count; ++i) {
        number = number * 1664525 + 1013904223;
        text[i] = (char)('!' + (number >> 16) % 94);
    }
    /* No tag of an encoding. */
    text[0] = 'x';
    return text;
}

static void a_password_that_is_too_long_when_encoded_gives_83(void **state) {
    struct fixture *f = *state;
    char *clear = random_letters(1020);
    load_lines(f, "cn: A\n");
    assert_int_equal(modify_one(f->handle, A, LDAP_MOD_ADD, "oru-slapdPeerPW", clear), 83);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, 83, "format_password();");
    assert_lines(f, "cn: A\n");
    free(clear);
}

static void clear_passwords_of_the_file_are_encoded_by_the_first_change(void **state) {
    struct fixture *f = *state;
    load(f, standard_configuration);
    assert_file(f->config, standard_configuration);
    must_modify(f->handle, TOP, "add note=n");
    assert_stored_as(f, "oru-slapdAdminPW", "{iMASK}>");
    assert_nowhere_in_clear(f, PASSWORD);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
}

static void the_backup_has_the_password_of_before(void **state) {
    struct fixture *f = *state;
    char *backup = path_of(f, "backup.conf");
    write_entries(f, "");
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    must_modify(f->handle, TOP, "replace oru-slapdAdminPW=new");
    CfgHandle *other = cfg_init();
    cfg_set_option(other, CFG_OPT_CONFIG_FILE, backup);
    assert_int_equal(bind_administrator(other), CFG_SUCCESS);
    cfg_unbind(other);
    free(backup);
}

/* ---- a key that is set after the bind ---- */

static void encode(char *out, size_t size, struct aes_key_data *key, const char *clear) {
    assert_int_equal(format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, clear,
                                     (int)strlen(clear), out, (int)size),
                     1);
}

/* What a search that asks for the supplier's password gives. */
static int search_password(CfgHandle *handle, CfgMessage **result) {
    char name[] = "oru-slapdMasterPW";
    char *wanted[] = {name, NULL};
    return cfg_search_s(handle, A, CFG_SCOPE_BASE, "cn=*", wanted, 0, result);
}

static void assert_decodable(CfgHandle *handle, int is_decodable) {
    CfgMessage *result = NULL;
    assert_int_equal(search_password(handle, &result),
                     is_decodable ? CFG_SUCCESS : CFG_DECODING_ERROR);
    if (is_decodable) {
        assert_values(handle, result, "oru-slapdMasterPW", "open sesame");
    }
    cfg_msgfree(result);
}

static void searches_use_a_new_key_at_once_and_changes_from_the_next_bind_on(void **state) {
    static const unsigned char bytes[32] = {7};
    struct fixture *f = *state;
    struct aes_key_data *key = aes_key_data_from_bytes(bytes, sizeof bytes);
    char stored_password[512];
    char lines[1024];
    encode(stored_password, sizeof stored_password, key, "open sesame");
    snprintf(lines, sizeof lines, "cn: A\noru-slapdMasterPW: %s\n", stored_password);
    for (int is_bound_with_key = 0; is_bound_with_key <= 1; ++is_bound_with_key) {
        struct aes_key_data *const bound = is_bound_with_key ? key : NULL;
        struct aes_key_data *const later = is_bound_with_key ? NULL : key;
        cfg_set_option(f->handle, CFG_OPT_KEY_DATA, bound);
        load_lines(f, lines);
        assert_decodable(f->handle, bound != NULL);
        cfg_set_option(f->handle, CFG_OPT_KEY_DATA, later);
        assert_decodable(f->handle, later != NULL);
        must_modify(f->handle, A, "replace oru-slapdPeerPW=secret");
        assert_stored_as(f, "oru-slapdPeerPW", bound ? "{AES256}" : "{iMASK}>");
        assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
        must_modify(f->handle, A, "replace oru-slapdPeerPW=secret");
        assert_stored_as(f, "oru-slapdPeerPW", later ? "{AES256}" : "{iMASK}>");
    }
    cfg_unbind(f->handle);
    f->handle = NULL;
    aes_key_data_free(key);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(the_administrators_new_password_is_stored_encoded_and_lets_in),
        CREATED(with_a_key_passwords_are_encrypted),
        CREATED(an_encoded_password_is_stored_as_it_comes),
        CREATED(the_same_password_again_is_no_second_value),
        CREATED(a_password_is_deleted_by_its_clear_text),
        CREATED(a_stored_password_that_can_not_be_decoded_can_only_be_replaced),
        CREATED(a_comparison_that_fails_is_reported_with_attribute_type_and_new_value),
        CREATED(the_length_of_a_password_is_bounded),
        CREATED(a_password_that_is_too_long_when_encoded_gives_83),
        CREATED(clear_passwords_of_the_file_are_encoded_by_the_first_change),
        CREATED(the_backup_has_the_password_of_before),
        CREATED(searches_use_a_new_key_at_once_and_changes_from_the_next_bind_on),
    };
    return cmocka_run_group_tests_name("cfg_modify_s_passwords", tests, NULL, NULL);
}
