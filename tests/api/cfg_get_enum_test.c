/*
 * cfg_get_enum, cfg_get_bitmask, cfg_get_minimum, cfg_get_maximum and cfg_get_is_single: what the
 * violated attribute allows.
 */

#include <stdio.h>
#include <string.h>

#include "fixture.h"

#define BASE "cn=Configuration"
#define FRONT_END "cn=Front End, " BASE

struct constraints {
    const char *words; /* joined by blanks; null for no list */
    int64_t bitmask;
    int64_t minimum;
    int64_t maximum;
    int is_single;
};

static const struct constraints none = {NULL, 0, 0, 0, 0};

static void assert_words(const char *const *words, const char *expected) {
    char text[512] = "";
    for (const char *const *word = words; words && *word; ++word) {
        const size_t length = strlen(text);
        snprintf(text + length, sizeof text - length, "%s%s", length > 0 ? " " : "", *word);
    }
    assert_text(words ? text : NULL, expected);
}

static void assert_constraints(CfgHandle *handle, struct constraints expected) {
    assert_words(cfg_get_enum(handle), expected.words);
    assert_true(cfg_get_bitmask(handle) == expected.bitmask);
    assert_true(cfg_get_minimum(handle) == expected.minimum);
    assert_true(cfg_get_maximum(handle) == expected.maximum);
    assert_int_equal(cfg_get_is_single(handle), expected.is_single);
}

static int add_value(CfgHandle *handle, const char *name, const char *value) {
    return modify_one(handle, FRONT_END, LDAP_MOD_ADD, name, value);
}

static void provoke_a_failure(CfgHandle *handle) {
    assert_int_equal(add_value(handle, "oru-slapdSysLogLevel", "loud"), CFG_INVALID_SYNTAX);
    assert_constraints(handle, (struct constraints){"l m h", 0, 0, 0, 1});
}

/* ---- nothing is violated ---- */

static void a_null_handle_gives_0_and_null(void **state) {
    (void)state;
    assert_constraints(NULL, none);
}

static void without_a_failure_there_are_none(void **state) {
    struct fixture *f = *state;
    assert_constraints(f->handle, none);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_constraints(f->handle, none);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_constraints(f->handle, none);
}

static void a_failure_without_a_report_has_none(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    assert_constraints(f->handle, none);
    assert_int_equal(cfg_bind_s(f->handle, ADMINISTRATOR, "wrong", CFG_AUTH_SIMPLE),
                     CFG_INVALID_CREDENTIALS);
    assert_constraints(f->handle, none);
}

static void a_failure_that_violates_no_attribute_has_none(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_constraints(f->handle, none);
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_constraints(f->handle, none);
    assert_int_equal(modify_one(f->handle, FRONT_END, LDAP_MOD_DELETE, "oru-slapdSysLogLevel", "m"),
                     CFG_NO_SUCH_ATTRIBUTE);
    assert_constraints(f->handle, none);
    assert_int_equal(cfg_delete_s(f->handle, BASE), CFG_NOT_ALLOWED_ON_NONLEAF);
    assert_constraints(f->handle, none);
    /* The attribute has a line and a name, but was not looked at yet. */
    write_configuration(f, "version: 1\n\noru-slapdSysLogLevel: m\n");
    assert_int_equal(search_all(f->handle), 65);
    assert_text(cfg_get_attribute(f->handle), "oru-slapdSysLogLevel");
    assert_int_equal(cfg_get_file_line(f->handle), 3);
    assert_constraints(f->handle, none);
}

/* ---- every kind of constraint ---- */

static void a_refused_value_tells_what_its_attribute_allows(void **state) {
    static const struct {
        const char *name;
        const char *value;
        int code;
        int extended_code;
        struct constraints constraints;
    } rows[] = {
        /* Words; the first list runs on into the second. */
        {"oru-slapdSysLogLevel", "loud", 21, 1017, {"l m h", 0, 0, 0, 1}},
        {"oru-slapdEThreadActivate", "x", 21, 1017, {"S T SOT SAT any primarywrite", 0, 0, 0, 1}},
        {"oru-slapdProxyBackendServerRole", "S", 21, 1017, {"any primarywrite", 0, 0, 0, 1}},
        {"oru-slapdAdminRole",
         "Guest",
         21,
         1017,
         {"AuditAdmin DirDataAdmin NoAdmin ReplicationAdmin SchemaAdmin ServerConfigGroupMember "
          "ServerStartStopAdmin PasswordAdmin",
          0, 0, 0, 0}},
        /* Bits. */
        {"oru-slapdSslCipherSpecs", "255", 21, 1019, {NULL, 0xff00, 0, 0, 1}},
        /* Numbers. */
        {"oru-slapdPtaConnectionPoolSize", "1", 21, 1015, {NULL, 0, 2, 15, 1}},
        {"oru-slapdPtaConnectionPoolSize", "two", 21, 1016, {NULL, 0, 2, 15, 1}},
        {"oru-slapdAuthIntegration", "-1", 21, 1015, {NULL, 0, 0, INT64_MAX, 1}},
        {"oru-slapdCachedAttributeSize", "-1", 21, 1015, {NULL, 0, 0, 18014398509481982, 1}},
        /* Lengths. */
        {"oru-slapdDbName", "ninechars", 21, 1018, {NULL, 0, 1, 8, 1}},
        {"oru-slapdPtaAttrMapping", "ab", 21, 1018, {NULL, 0, 3, 1024, 1}},
        {"oru-slapdCachedAttributeAutoAdjustTime", "T12", 21, 1018, {NULL, 0, 7, 7, 1}},
        {"oru-slapdAdminPW", "", 21, 1018, {NULL, 0, 1, 1024, 1}},
        /* Names; what is only reported and never enforced is reported, too. */
        {"oru-slapdAdminDN", "root", 34, 1013, {NULL, 0, 0, 0, 1}},
        {"oru-slapdPtaSubtree", "root", 34, 1013, {NULL, 0, 1, 0, 0}},
        /* A second value. */
        {"oru-slapdPort", "390", 19, 1006, {NULL, 0, 1, 65535, 1}},
        {"cn", "Back End", 19, 1006, {NULL, 0, 0, 0, 1}},
        /* A line that would not read back. */
        {"oru-slapdServerID", " x", 21, 1005, {NULL, 0, 0, 1024, 1}},
        {"objectclass", " x", 21, 1005, {NULL, 0, 0, 0, 0}},
        /* An attribute that is not in the table takes any number of any texts. */
        {"note", " x", 21, 1005, {NULL, 0, 0, 0, 0}},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        const int code = add_value(f->handle, rows[i].name, rows[i].value);
        if (code != rows[i].code || cfg_get_exterror(f->handle) != rows[i].extended_code) {
            fail_msg("%s: %s gives %d/%d", rows[i].name, rows[i].value, code,
                     cfg_get_exterror(f->handle));
        }
        assert_constraints(f->handle, rows[i].constraints);
    }
}

static void a_list_that_is_not_enforced_is_told_all_the_same(void **state) {
    struct fixture *f = *state;
    assert_int_equal(add_value(f->handle, "oru-slapdPtaURL", "http://example.com"), CFG_SUCCESS);
    assert_int_equal(add_value(f->handle, "oru-slapdPtaURL", "ldap://example.com"),
                     CFG_CONSTRAINT_VIOLATION);
    assert_constraints(f->handle, (struct constraints){"ldap ldaps", 0, 0, 0, 1});
}

static void a_refused_filter_tells_them(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search_below(f->handle, BASE, "oru-slapdPort=0"), CFG_INVALID_SYNTAX);
    assert_constraints(f->handle, (struct constraints){NULL, 0, 1, 65535, 1});
}

static void a_refused_new_entry_tells_them(void **state) {
    char *values[] = {"ReplicationAdmin", "Guest", NULL};
    LDAPMod roles = {.mod_type = "oru-slapdAdminRole", .mod_values = values};
    LDAPMod *attributes[] = {&roles, NULL};
    struct fixture *f = *state;
    assert_int_equal(cfg_add_s(f->handle, "cn=new, " BASE, attributes), CFG_INVALID_SYNTAX);
    assert_string_equal(cfg_get_enum(f->handle)[0], "AuditAdmin");
    assert_int_equal(cfg_get_is_single(f->handle), 0);
}

static void a_failed_bind_tells_them(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, "root", PASSWORD, CFG_AUTH_SIMPLE),
                     CFG_INVALID_DN_SYNTAX);
    assert_constraints(f->handle, (struct constraints){NULL, 0, 0, 0, 1});
    write_configuration(f, "dn: " BASE "\nobjectclass: top\noru-slapdAdminPW: {SSHA}aaaa\n");
    assert_int_equal(bind_administrator(f->handle), CFG_DECODING_ERROR);
    assert_constraints(f->handle, (struct constraints){NULL, 0, 1, 1024, 1});
}

/* ---- how long they are known ---- */

static void asking_resets_nothing(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    const char *report = cfg_dump_exception(f->handle);
    const char *const *words = cfg_get_enum(f->handle);
    for (int i = 0; i < 3; ++i) {
        assert_constraints(f->handle, (struct constraints){"l m h", 0, 0, 0, 1});
        assert_ptr_equal(cfg_get_enum(f->handle), words);
    }
    assert_int_equal(cfg_get_errno(f->handle), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1017);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

static void the_next_call_that_resets_forgets_them(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
    assert_constraints(f->handle, none);
    provoke_a_failure(f->handle);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_constraints(f->handle, none);
    provoke_a_failure(f->handle);
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_constraints(f->handle, none);
}

static void the_words_outlive_the_handle(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    const char *const *words = cfg_get_enum(f->handle);
    assert_int_equal(cfg_unbind(f->handle), CFG_SUCCESS);
    f->handle = NULL;
    assert_words(words, "l m h");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_0_and_null),
        CREATED(without_a_failure_there_are_none),
        CREATED(a_failure_without_a_report_has_none),
        BOUND(a_failure_that_violates_no_attribute_has_none),
        BOUND(a_refused_value_tells_what_its_attribute_allows),
        BOUND(a_list_that_is_not_enforced_is_told_all_the_same),
        BOUND(a_refused_filter_tells_them),
        BOUND(a_refused_new_entry_tells_them),
        CREATED(a_failed_bind_tells_them),
        BOUND(asking_resets_nothing),
        BOUND(the_next_call_that_resets_forgets_them),
        BOUND(the_words_outlive_the_handle),
    };
    return cmocka_run_group_tests_name("cfg_get_enum", tests, NULL, NULL);
}
