#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fixture.h"

#define BASE "cn=Configuration"

static void assert_report(CfgHandle *handle, const char *expected) {
    char *report = report_without_lines(handle);
    assert_string_equal(report, expected);
    free(report);
}

static int search(const struct fixture *f, const char *filter) {
    CfgMessage *result = NULL;
    return cfg_search_s(f->handle, BASE, CFG_SCOPE_SUBTREE, filter, NULL, 0, &result);
}

/* The number of exceptions that a report shows: each begins with "[" on a line of its own. */
static int depth(CfgHandle *handle) {
    const char *report = cfg_dump_exception(handle);
    int count = *report == '[';
    while ((report = strstr(report, "\n["))) {
        ++count;
        ++report;
    }
    return count;
}

static void a_null_handle_gives_null(void **state) {
    (void)state;
    assert_null(cfg_dump_exception(NULL));
}

static void without_a_failure_there_is_none(void **state) {
    struct fixture *f = *state;
    assert_null(cfg_dump_exception(f->handle));
    search_all(f->handle);
    assert_null(cfg_dump_exception(f->handle));
}

static void a_failure_without_a_report_has_none(void **state) {
    struct fixture *f = *state;
    cfg_bind_s(f->handle, ADMINISTRATOR, "wrong", CFG_AUTH_SIMPLE);
    assert_null(cfg_dump_exception(f->handle));
}

static void an_extended_code_that_repeats_the_code_is_left_out(void **state) {
    struct fixture *f = *state;
    cfg_bind_s(f->handle, NULL, NULL, 0);
    assert_report(f->handle,
                  "[src/libraries/cfg32stl/bind:#]\n"
                  "msg     Bind method must be one of { LDAP_AUTH_SIMPLE }\n"
                  "ldapErr 86: Unknown authentication method\n");
}

static void a_failure_of_the_system_shows_its_errno(void **state) {
    struct fixture *f = *state;
    char expected[512];
    remove(f->config);
    cfg_set_option(f->handle, CFG_OPT_SHOW_STACK, CFG_OPT_OFF);
    cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE);
    snprintf(expected, sizeof expected,
             "[src/libraries/cfg32stl/LDIF_File:#]\n"
             "msg     _stat()\n"
             "errno 2: No such file or directory\n"
             "ldapErr 91: Connection error\n"
             "extErr 1003: Configuration file not found.\n"
             "Config file: %s\n",
             f->config);
    assert_report(f->handle, expected);
}

static void a_line_of_the_file_is_shown_with_its_number(void **state) {
    struct fixture *f = *state;
    char expected[512];
    write_configuration(f, "version: 1\n\ncn: stray\n");
    cfg_set_option(f->handle, CFG_OPT_SHOW_STACK, CFG_OPT_OFF);
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), 65);
    snprintf(expected, sizeof expected,
             "[src/libraries/cfg32stl/LDIF_File:#]\n"
             "msg     \"cn\" attribute not allowed in <root> object\n"
             "ldapErr 65: Object class violation\n"
             "extErr 1007: Attribute is not a member of object class.\n"
             "Line 3 of %s\n"
             "entry dn: <root>\n"
             "attribute: cn\n"
             "value: stray\n",
             f->config);
    assert_report(f->handle, expected);
}

static void the_constraints_of_the_attribute_are_shown(void **state) {
    static const struct {
        const char *line;
        const char *filter;
        const char *constraints;
    } rows[] = {
        {"oru-slapdPort: 1", "oru-slapdPort=x",
         "\nConstraints for oru-slapdPort\n  Single-valued\n  min: 1\n  max: 65535\n"},
        {"oru-slapdSysLogLevel: m", "oru-slapdSysLogLevel=x",
         "\nConstraints for oru-slapdSysLogLevel\n  Single-valued\n  enumeration: { l, m, h }\n"},
        {"oru-slapdAdminRole: NoAdmin", "oru-slapdAdminRole=x",
         "\nConstraints for oru-slapdAdminRole\n  Multi-valued\n  enumeration: { AuditAdmin, "
         "DirDataAdmin, NoAdmin, ReplicationAdmin, SchemaAdmin, ServerConfigGroupMember, "
         "ServerStartStopAdmin, PasswordAdmin }\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char text[512];
        snprintf(text, sizeof text, "%s%s\n", CONFIGURATION_HEAD, rows[i].line);
        load(f, text);
        assert_int_equal(search(f, rows[i].filter), 21);
        assert_report_has(f->handle, 21, rows[i].constraints);
    }
}

static void a_bit_mask_is_announced_without_its_digits(void **state) {
    struct fixture *f = *state;
    load(f, CONFIGURATION_HEAD "oru-slapdSslCipherSpecs: 256\n");
    assert_int_equal(search(f, "oru-slapdSslCipherSpecs=255"), 21);
    assert_int_equal(cfg_get_exterror(f->handle), 1019);
    assert_report_has(f->handle, 21, "\n  bit mask: 0x\n");
}

static void the_causes_follow_after_a_blank_line_each(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search(f, "oru-slapdPort=many"), 21);
    assert_true(depth(f->handle) > 1);
    const char *report = cfg_dump_exception(f->handle);
    for (const char *cause = report; (cause = strstr(cause, "\n[")); ++cause) {
        assert_true(cause > report && cause[-1] == '\n');
    }
    assert_int_equal(report[strlen(report) - 1], '\n');
    assert_true(report[strlen(report) - 2] != '\n');
}

static void show_stack_off_hides_the_causes(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_SHOW_STACK, CFG_OPT_OFF);
    assert_int_equal(search(f, "oru-slapdPort=many"), 21);
    assert_int_equal(depth(f->handle), 1);
    cfg_set_option(f->handle, CFG_OPT_SHOW_STACK, CFG_OPT_ON);
    /* The text that was made stays until the failure is forgotten. */
    assert_int_equal(depth(f->handle), 1);
    assert_int_equal(search(f, "oru-slapdPort=many"), 21);
    assert_true(depth(f->handle) > 1);
}

static void show_source_changes_nothing_here(void **state) {
    struct fixture *f = *state;
    search(f, "oru-slapdPort=many");
    char *before = strdup(cfg_dump_exception(f->handle));
    cfg_set_option(f->handle, CFG_OPT_SHOW_SOURCE, CFG_OPT_ON);
    search(f, "oru-slapdPort=many");
    assert_string_equal(cfg_dump_exception(f->handle), before);
    free(before);
}

static void asking_again_gives_the_same_text(void **state) {
    struct fixture *f = *state;
    search(f, "oru-slapdPort=many");
    const char *report = cfg_dump_exception(f->handle);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

static void the_next_failure_has_a_report_of_its_own(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    search(f, "oru-slapdPort=many");
    assert_non_null(cfg_dump_exception(f->handle));
    cfg_search_s(f->handle, "cn=none", 0, NULL, NULL, 0, &result);
    assert_report_has(f->handle, 32, "Base entry not found");
    assert_null(strstr(cfg_dump_exception(f->handle), "integer"));
}

static void no_report_tells_where_the_library_was_built(void **state) {
    struct fixture *f = *state;
    search(f, "oru-slapdPort=many");
    const char *report = cfg_dump_exception(f->handle);
    for (const char *at = report; at; at = strstr(at, "\n[")) {
        at = strchr(at, '[');
        assert_int_equal(strncmp(at, "[src/libraries/cfg32stl/", 24), 0);
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_null),
        BOUND(without_a_failure_there_is_none),
        BOUND(a_failure_without_a_report_has_none),
        CREATED(an_extended_code_that_repeats_the_code_is_left_out),
        CREATED(a_failure_of_the_system_shows_its_errno),
        CREATED(a_line_of_the_file_is_shown_with_its_number),
        CREATED(the_constraints_of_the_attribute_are_shown),
        CREATED(a_bit_mask_is_announced_without_its_digits),
        BOUND(the_causes_follow_after_a_blank_line_each),
        BOUND(show_stack_off_hides_the_causes),
        BOUND(show_source_changes_nothing_here),
        BOUND(asking_again_gives_the_same_text),
        BOUND(the_next_failure_has_a_report_of_its_own),
        BOUND(no_report_tells_where_the_library_was_built),
    };
    return cmocka_run_group_tests_name("cfg_dump_exception", tests, NULL, NULL);
}
