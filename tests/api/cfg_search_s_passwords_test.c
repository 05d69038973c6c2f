/* Which passwords cfg_search_s returns in clear. */

#include <stdio.h>
#include <string.h>

#include "cfg32_platform.h"
#include "fixture.h"

#define BASE "cn=Configuration"

static const unsigned char key_bytes[32] = {42};

static void encode(char *out, size_t size, struct aes_key_data *key, const char *clear) {
    assert_int_equal(format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, clear,
                                     (int)strlen(clear), out, (int)size),
                     1);
}

/* Writes the administrator's entry with one more line, and binds with the key. */
static void load_line(const struct fixture *f, struct aes_key_data *key, const char *name,
                      const char *value) {
    char text[4096];
    snprintf(text, sizeof text, "%s%s: %s\n", CONFIGURATION_HEAD, name, value);
    cfg_set_option(f->handle, CFG_OPT_KEY_DATA, key);
    load(f, text);
}

static int search(const struct fixture *f, const char *name, CfgMessage **result) {
    char wanted[64];
    char *attrs[] = {wanted, NULL};
    strcpy(wanted, name);
    return cfg_search_s(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs, 0, result);
}

static void assert_found(const struct fixture *f, const char *wanted, const char *attribute,
                         const char *value) {
    CfgMessage *result = NULL;
    assert_int_equal(search(f, wanted, &result), CFG_SUCCESS);
    assert_values(f->handle, result, attribute, value);
    cfg_msgfree(result);
}

static void three_passwords_come_in_clear_when_they_are_asked_for(void **state) {
    static const char *const names[] = {"oru-slapdSslKeyDatabasePW", "oru-slapdMasterPW",
                                        "oru-slapdProxyPw"};
    struct fixture *f = *state;
    char masked[512];
    encode(masked, sizeof masked, NULL, "open sesame");
    for (size_t i = 0; i < LENGTH(names); ++i) {
        load_line(f, NULL, names[i], masked);
        assert_found(f, names[i], names[i], "open sesame");
        load_line(f, NULL, names[i], "open sesame");
        assert_found(f, names[i], names[i], "open sesame");
    }
}

static void the_name_may_be_asked_for_in_any_case(void **state) {
    struct fixture *f = *state;
    load_line(f, NULL, "ORU-SLAPDMASTERPW", "open sesame");
    assert_found(f, "oru-slapdmasterpw", "ORU-SLAPDMASTERPW", "open sesame");
}

static void the_other_passwords_come_as_they_are_stored(void **state) {
    static const char *const names[] = {
        "oru-slapdDbUserPW",         "oru-slapdLdapCrlPassword", "oru-slapdPeerPW",
        "oru-slapdSslPKCS11TokenPW", "oru-slapdPtaBindPW",
    };
    struct fixture *f = *state;
    char masked[512];
    encode(masked, sizeof masked, NULL, "open sesame");
    for (size_t i = 0; i < LENGTH(names); ++i) {
        load_line(f, NULL, names[i], masked);
        assert_found(f, names[i], names[i], masked);
    }
}

static void the_administrators_own_password_comes_as_it_is_stored(void **state) {
    struct fixture *f = *state;
    char masked[512];
    char text[1024];
    encode(masked, sizeof masked, NULL, PASSWORD);
    snprintf(text, sizeof text, "dn: " BASE "\nobjectclass: top\noru-slapdAdminPW: %s\n", masked);
    load(f, text);
    assert_found(f, "oru-slapdAdminPW", "oru-slapdAdminPW", masked);
}

static void a_password_in_clear_is_encoded_when_it_is_read(void **state) {
    struct fixture *f = *state;
    load_line(f, NULL, "oru-slapdPeerPW", "open sesame");
    CfgMessage *result = NULL;
    assert_int_equal(search(f, "oru-slapdPeerPW", &result), CFG_SUCCESS);
    char **values = cfg_get_values(f->handle, result, "oru-slapdPeerPW");
    assert_int_equal(cfg_count_values(values), 1);
    assert_int_equal(check_format(values[0], (int)strlen(values[0])), 0);
    cfg_value_free(values);
    cfg_msgfree(result);
}

static void an_attribute_with_such_a_name_that_is_no_password_comes_as_it_is(void **state) {
    struct fixture *f = *state;
    char masked[512];
    encode(masked, sizeof masked, NULL, "open sesame");
    load_line(f, NULL, "oru-slapdMasterPWHint", masked);
    assert_found(f, "oru-slapdMasterPWHint", "oru-slapdMasterPWHint", masked);
}

static void passwords_that_are_not_asked_for_by_name_come_as_they_are_stored(void **state) {
    struct fixture *f = *state;
    char *nothing[] = {NULL};
    char masked[512];
    encode(masked, sizeof masked, NULL, "open sesame");
    load_line(f, NULL, "oru-slapdMasterPW", masked);
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    assert_values(f->handle, result, "oru-slapdMasterPW", masked);
    cfg_msgfree(result);
    result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, nothing);
    assert_values(f->handle, result, "oru-slapdMasterPW", masked);
    cfg_msgfree(result);
}

static void every_bind_that_succeeds_may_read_them(void **state) {
    /* KEPT: the state is only asked for being non-zero, and an anonymous bind's is 1. */
    struct fixture *f = *state;
    write_configuration(f, CONFIGURATION_HEAD "oru-slapdMasterPW: open sesame\n");
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    assert_found(f, "oru-slapdMasterPW", "oru-slapdMasterPW", "open sesame");
}

static void a_masked_password_may_lack_its_tag(void **state) {
    struct fixture *f = *state;
    char masked[512];
    encode(masked, sizeof masked, NULL, "open sesame");
    assert_int_equal(strncmp(masked, "{iMASK}>", 8), 0);
    load_line(f, NULL, "oru-slapdMasterPW", masked + 7);
    assert_found(f, "oru-slapdMasterPW", "oru-slapdMasterPW", "open sesame");
}

static void an_encrypted_password_needs_its_key(void **state) {
    struct fixture *f = *state;
    char encrypted[512];
    struct aes_key_data *key = aes_key_data_from_bytes(key_bytes, sizeof key_bytes);
    encode(encrypted, sizeof encrypted, key, "open sesame");
    load_line(f, key, "oru-slapdMasterPW", encrypted);
    assert_found(f, "oru-slapdMasterPW", "oru-slapdMasterPW", "open sesame");

    CfgMessage *result = (CfgMessage *)f;
    load_line(f, NULL, "oru-slapdMasterPW", encrypted);
    assert_int_equal(search(f, "oru-slapdMasterPW", &result), CFG_DECODING_ERROR);
    assert_null(result);
    cfg_unbind(f->handle);
    f->handle = NULL;
    aes_key_data_free(key);
}

static void a_password_that_can_not_be_decoded_gives_84_and_a_null_result(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    load_line(f, NULL, "oru-slapdMasterPW", "{SHA}c2VjcmV0");
    assert_int_equal(search(f, "oru-slapdMasterPW", &result), CFG_DECODING_ERROR);
    assert_null(result);
    assert_int_equal(cfg_get_exterror(f->handle), 1000);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "[src/libraries/cfg32stl/search:");
    assert_report_has(f->handle, CFG_DECODING_ERROR,
                      "]\n"
                      "msg     unformat_password();\n"
                      "ldapErr 84: Decoding error\n"
                      "extErr 1000: Unexpected error in cfg32 API\n"
                      "entry dn: cn=Configuration\n"
                      "attribute: oru-slapdMasterPW\n"
                      "value: {SHA}c2VjcmV0\n"
                      "Constraints for oru-slapdMasterPW\n"
                      "  Single-valued\n"
                      "  min: 1\n"
                      "  max: 1024\n");
}

static void it_does_not_matter_while_it_is_not_asked_for(void **state) {
    struct fixture *f = *state;
    load_line(f, NULL, "oru-slapdMasterPW", "{SHA}c2VjcmV0");
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
}

static void entries_before_the_one_that_fails_are_released(void **state) {
    char name[] = "oru-slapdMasterPW";
    char other[] = "cn";
    char *attrs[] = {name, other, NULL};
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    load(f, CONFIGURATION_HEAD
         "oru-slapdMasterPW: open sesame\n\n"
         "dn: cn=Bad, cn=Configuration\ncn: Bad\nobjectclass: top\noru-slapdMasterPW: {MD5}xyz\n");
    /* A sanitizer sees what is left. */
    assert_int_equal(cfg_search_s(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, attrs, 0, &result),
                     CFG_DECODING_ERROR);
    assert_null(result);
    assert_report_has(f->handle, CFG_DECODING_ERROR, "\nentry dn: cn=Bad, cn=Configuration\n");
}

static void a_stored_password_of_1024_bytes_or_more_gives_84(void **state) {
    struct fixture *f = *state;
    static const size_t lengths[] = {1023, 1024, 1025, 1900};
    for (size_t i = 0; i < LENGTH(lengths); ++i) {
        char stored[2000];
        CfgMessage *result = (CfgMessage *)f;
        memset(stored, 'A', lengths[i]);
        memcpy(stored, "{iMASK}>", 8);
        stored[lengths[i]] = '\0';
        load_line(f, NULL, "oru-slapdMasterPW", stored);
        assert_int_equal(search(f, "oru-slapdMasterPW", &result), CFG_DECODING_ERROR);
        assert_null(result);
        assert_report_has(f->handle, CFG_DECODING_ERROR, "msg     unformat_password();\n");
    }
}

static void a_long_password_comes_whole(void **state) {
    struct fixture *f = *state;
    char clear[1025];
    memset(clear, 'p', 1024);
    clear[1024] = '\0';
    load_line(f, NULL, "oru-slapdMasterPW", clear);
    assert_found(f, "oru-slapdMasterPW", "oru-slapdMasterPW", clear);
}

static void several_passwords_are_all_decoded(void **state) {
    struct fixture *f = *state;
    load(f, CONFIGURATION_HEAD "oru-slapdMasterPW: one\noru-slapdMasterPW: two\n");
    assert_found(f, "oru-slapdMasterPW", "oru-slapdMasterPW", "one|two");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(three_passwords_come_in_clear_when_they_are_asked_for),
        CREATED(the_name_may_be_asked_for_in_any_case),
        CREATED(the_other_passwords_come_as_they_are_stored),
        CREATED(the_administrators_own_password_comes_as_it_is_stored),
        CREATED(a_password_in_clear_is_encoded_when_it_is_read),
        CREATED(an_attribute_with_such_a_name_that_is_no_password_comes_as_it_is),
        CREATED(passwords_that_are_not_asked_for_by_name_come_as_they_are_stored),
        CREATED(every_bind_that_succeeds_may_read_them),
        CREATED(a_masked_password_may_lack_its_tag),
        CREATED(an_encrypted_password_needs_its_key),
        CREATED(a_password_that_can_not_be_decoded_gives_84_and_a_null_result),
        CREATED(it_does_not_matter_while_it_is_not_asked_for),
        CREATED(entries_before_the_one_that_fails_are_released),
        CREATED(a_stored_password_of_1024_bytes_or_more_gives_84),
        CREATED(a_long_password_comes_whole),
        CREATED(several_passwords_are_all_decoded),
    };
    return cmocka_run_group_tests_name("cfg_search_s_passwords", tests, NULL, NULL);
}
