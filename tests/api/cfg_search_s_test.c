#include <limits.h>
#include <stdio.h>

#include "fixture.h"

#define BASE "cn=Configuration"

#define ALL_DNS                                   \
    "cn=Configuration\n"                          \
    "cn=Front End, cn=Configuration\n"            \
    "cn=Caches, cn=Front End, cn=Configuration\n" \
    "cn=Replicas, cn=Configuration\n"

static int search(CfgHandle *handle, const char *base, const char *filter, CfgMessage **result) {
    return cfg_search_s(handle, base, CFG_SCOPE_SUBTREE, filter, NULL, 0, result);
}

/* ---- arguments ---- */

static void a_null_handle_gives_89(void **state) {
    CfgMessage *result = NULL;
    (void)state;
    assert_int_equal(search(NULL, BASE, NULL, &result), CFG_PARAM_ERROR);
    assert_int_equal(search(NULL, BASE, NULL, NULL), CFG_PARAM_ERROR);
}

static void a_handle_that_is_not_bound_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    assert_int_equal(search(f->handle, BASE, NULL, &result), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_int_equal(search(f->handle, BASE, NULL, &result), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
}

static void a_null_result_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search(f->handle, BASE, NULL, NULL), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
}

static void a_null_base_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    assert_int_equal(search(f->handle, NULL, NULL, &result), CFG_PARAM_ERROR);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
}

/* ---- the base ---- */

static void a_malformed_base_gives_34_and_a_null_result(void **state) {
    static const struct {
        const char *base;
        int code;
        int extended;
        const char *message;
    } rows[] = {
        {"=x", 34, 1012, "Invalid attribute sytax: "},
        {"cn", 34, 1013, "Missing RDN value: cn"},
        {"cn=a\\", 34, 1014, "Invalid escape sequence: \\"},
        {"cn=a\\q", 34, 1014, "Invalid escape sequence: \\q"},
        {"cn=a,", 34, 1011, "Missing RDN attribute"},
        {"Oid.2.5.4.3=x", 34, 1012, "Invalid character in RDN attribute: ."},
        {"cn=#41zz", 34, 1014, "Invalid character in RDN value: z"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = (CfgMessage *)f;
        if (search(f->handle, rows[i].base, NULL, &result) != rows[i].code) {
            fail_msg("base %s: %d", rows[i].base, cfg_get_errno(f->handle));
        }
        assert_null(result);
        assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
        assert_report_has(f->handle, rows[i].code, rows[i].message);
    }
}

static void a_base_that_is_not_there_gives_32_and_a_null_result(void **state) {
    static const char *const rows[] = {"cn=none", "cn=none, cn=Configuration", "cn=Caches",
                                       "cn=Configuration, o=x"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = (CfgMessage *)f;
        assert_int_equal(search(f->handle, rows[i], NULL, &result), 32);
        assert_null(result);
        assert_int_equal(cfg_get_exterror(f->handle), 32);
        assert_report_has(f->handle, 32, "Base entry not found");
    }
}

static void the_base_may_be_written_in_every_form_of_its_dn(void **state) {
    static const char *const rows[] = {
        "cn=Caches, cn=Front End, cn=Configuration",
        "CN=CACHES,CN=FRONT END,CN=CONFIGURATION",
        "  cn = Caches;cn=Front End; cn=Configuration",
        "cn=\"Caches\", cn=\"Front End\", cn=#436F6E66696775726174696F6E",
        "cn=\\43aches,cn=Front\\20End,cn=Configuration",
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = NULL;
        if (search(f->handle, rows[i], NULL, &result) != CFG_SUCCESS) {
            fail_msg("base %s: %s", rows[i], cfg_dump_exception(f->handle));
        }
        assert_dns(f->handle, result, "cn=Caches, cn=Front End, cn=Configuration\n");
        cfg_msgfree(result);
    }
}

static void the_empty_base_stands_above_all_entries(void **state) {
    struct fixture *f = *state;
    load(f, CONFIGURATION_HEAD
         "\ndn: cn=C, o=A\nobjectclass: top\n\n"
         "dn: o=A\nobjectclass: top\n");
    CfgMessage *result = found(f->handle, "", CFG_SCOPE_SUBTREE, NULL, NULL);
    assert_dns(f->handle, result, "cn=Configuration\no=A\ncn=C, o=A\n");
    cfg_msgfree(result);
    result = found(f->handle, "", CFG_SCOPE_ONELEVEL, NULL, NULL);
    assert_dns(f->handle, result, "cn=Configuration\no=A\n");
    cfg_msgfree(result);
}

static void the_lines_above_all_entries_are_an_entry_without_a_name(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, "", CFG_SCOPE_BASE, "version=1", NULL);
    assert_int_equal(cfg_count_entries(f->handle, result), 1);
    assert_attributes(f->handle, result, "charset version");
    char *dn = cfg_get_dn(f->handle, result);
    assert_string_equal(dn, "");
    cfg_memfree(dn);
    cfg_msgfree(result);
}

/* ---- the scope ---- */

static void a_subtree_comes_with_each_entry_before_its_children(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, NULL);
    assert_dns(f->handle, result, ALL_DNS);
    cfg_msgfree(result);
}

static void one_level_is_the_children_alone(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_ONELEVEL, NULL, NULL);
    assert_dns(f->handle, result,
               "cn=Front End, cn=Configuration\ncn=Replicas, cn=Configuration\n");
    cfg_msgfree(result);
}

static void every_other_scope_is_the_base_alone(void **state) {
    static const int scopes[] = {CFG_SCOPE_BASE, 3, -1, 4, INT_MAX, INT_MIN};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(scopes); ++i) {
        CfgMessage *result = found(f->handle, BASE, scopes[i], NULL, NULL);
        assert_dns(f->handle, result, "cn=Configuration\n");
        cfg_msgfree(result);
    }
}

/* ---- the filter ---- */

static void a_filter_is_one_term(void **state) {
    static const struct {
        const char *filter;
        const char *dns;
    } rows[] = {
        {NULL, ALL_DNS},
        {"", ALL_DNS},
        {"  ", ALL_DNS},
        {"=", ALL_DNS},
        {"=x", ALL_DNS},
        {"()", ALL_DNS},
        {"(=x)", ALL_DNS},
        {"objectclass=*", ALL_DNS},
        {"(objectclass=*)", ALL_DNS},
        {"(objectClass)", ALL_DNS},
        {"objectclass=", ALL_DNS},
        {"(objectclass=list)", "cn=Replicas, cn=Configuration\n"},
        {"(cn=Caches)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"(CN=Caches)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"cn=Caches", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"  (cn  =  Caches  )", "cn=Caches, cn=Front End, cn=Configuration\n"},
        /* KEPT: a blank after the parenthesis belongs to the attribute's name. */
        {"( cn=Caches)", ""},
        {"(cn=Caches", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"(cn=\\43aches)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"(cn=Caches\\4)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"(cn=Caches\\zz)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"(cn=Cach*)", ""},
        {"(cn=Cache)", ""},
        {"(oru-slapdPort=389)", "cn=Front End, cn=Configuration\n"},
        {"(oru-slapdPort=+0389)", "cn=Front End, cn=Configuration\n"},
        {"(oru-slapdPort=*)", "cn=Front End, cn=Configuration\n"},
        {"oru-slapdSetenv=A=first", "cn=Front End, cn=Configuration\n"},
        {"oru-slapdSetenv=a=FIRST", "cn=Front End, cn=Configuration\n"},
        {"oru-slapdAdminDN=CN=ROOT", "cn=Configuration\n"},
        {"oru-slapdAdminPW=" PASSWORD, "cn=Configuration\n"},
        {"oru-slapdAdminPW=wrong", ""},
        {"(note=*)", "cn=Caches, cn=Front End, cn=Configuration\n"},
        {"none=*", ""},
        {"none=x", ""},
        {"(&(cn=Caches)(objectclass=top))", ""},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = NULL;
        if (search(f->handle, BASE, rows[i].filter, &result) != CFG_SUCCESS) {
            fail_msg("filter %s: %s", rows[i].filter, cfg_dump_exception(f->handle));
        }
        assert_dns(f->handle, result, rows[i].dns);
        cfg_msgfree(result);
    }
}

static void a_value_that_the_syntax_refuses_gives_its_code(void **state) {
    static const struct {
        const char *filter;
        int code;
        int extended;
        const char *message;
    } rows[] = {
        {"oru-slapdPort=many", 21, 1016, "Value is not valid integer syntax"},
        {"oru-slapdPort=65536", 21, 1015, "Integer value out of range"},
        {"oru-slapdAdminDN==", 34, 1012, "Invalid attribute sytax: "},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *result = (CfgMessage *)f;
        assert_int_equal(search(f->handle, BASE, rows[i].filter, &result), rows[i].code);
        assert_null(result);
        assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
        assert_report_has(f->handle, rows[i].code, rows[i].message);
    }
}

static void a_refused_value_does_not_matter_where_the_attribute_is_missing(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    assert_int_equal(
        search(f->handle, "cn=Replicas, cn=Configuration", "oru-slapdPort=many", &result),
        CFG_SUCCESS);
    assert_null(result);
}

static void a_filter_of_another_character_set_gives_162(void **state) {
    REQUIRE_UTF8();
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    assert_int_equal(search(f->handle, BASE, "cn=\xff", &result), 162);
    assert_null(result);
    assert_non_null(cfg_dump_exception(f->handle));
}

static void a_base_of_another_character_set_gives_162(void **state) {
    REQUIRE_UTF8();
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    assert_int_equal(search(f->handle, "cn=\xff", NULL, &result), 162);
    assert_null(result);
}

static void nothing_found_is_a_success_with_a_null_result(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    assert_int_equal(search(f->handle, BASE, "(cn=none)", &result), CFG_SUCCESS);
    assert_null(result);
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_int_equal(cfg_count_entries(f->handle, result), 0);
}

static void a_base_that_does_not_match_gives_nothing(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, "cn=Caches", NULL);
    assert_null(result);
}

/* ---- the attributes ---- */

static void entries_have_their_attributes_sorted_by_name(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, "cn=Front End, " BASE, 0, NULL, NULL);
    assert_attributes(f->handle, result,
                      "cn description objectclass oru-slapdPort oru-slapdSetenv");
    assert_values(f->handle, result, "oru-slapdSetenv", "TZ=Europe/Berlin|A=first");
    assert_values(f->handle, result, "description", "first line, continued");
    cfg_msgfree(result);
}

static void only_the_wanted_attributes_come(void **state) {
    char name1[] = "OBJECTCLASS";
    char name2[] = "oru-slapdport";
    char name3[] = "objectclass";
    char name4[] = "none";
    char *attrs[] = {name1, name2, name3, name4, NULL};
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, attrs);
    assert_int_equal(cfg_count_entries(f->handle, result), 4);
    assert_attributes(f->handle, result, "objectclass");
    assert_attributes(f->handle, cfg_next_entry(f->handle, result), "objectclass oru-slapdPort");
    cfg_msgfree(result);
}

static void an_entry_without_the_wanted_attributes_still_comes(void **state) {
    char name[] = "none";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, attrs);
    assert_dns(f->handle, result, ALL_DNS);
    assert_int_equal(cfg_count_attributes(f->handle, result), 0);
    cfg_msgfree(result);
}

static void an_empty_list_of_attributes_means_all(void **state) {
    char *attrs[] = {NULL};
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs);
    assert_attributes(f->handle, result, "cn objectclass oru-slapdAdminDN oru-slapdAdminPW");
    cfg_msgfree(result);
}

static void the_filter_may_name_an_attribute_that_is_not_wanted(void **state) {
    char name[] = "objectclass";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, "cn=Caches", attrs);
    assert_dns(f->handle, result, "cn=Caches, cn=Front End, cn=Configuration\n");
    assert_attributes(f->handle, result, "objectclass");
    cfg_msgfree(result);
}

static void attributes_only_still_brings_the_values(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = NULL;
    assert_int_equal(cfg_search_s(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL, 1, &result),
                     CFG_SUCCESS);
    assert_values(f->handle, result, "cn", "Configuration");
    cfg_msgfree(result);
}

static void an_empty_value_is_the_empty_text(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, "note=*", NULL);
    char **values = cfg_get_values(f->handle, result, "note");
    assert_non_null(values);
    assert_string_equal(values[0], "");
    assert_null(values[1]);
    cfg_value_free(values);
    cfg_msgfree(result);
}

static void text_is_returned_byte_for_byte(void **state) {
    REQUIRE_UTF8();
    struct fixture *f = *state;
    load(f, CONFIGURATION_HEAD
         "description: Jörg Voß, 東京 \xf0\x9f\x90\x99\n"
         "note: \\41 \"quoted\"\ttab\n");
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
    assert_values(f->handle, result, "description", "Jörg Voß, 東京 \xf0\x9f\x90\x99");
    assert_values(f->handle, result, "note", "\\41 \"quoted\"\ttab");
    cfg_msgfree(result);
}

static void the_callers_texts_are_not_changed(void **state) {
    char base[] = " cn=Front End; cn=Configuration";
    char filter[] = " (cn = Front\\20End )";
    char name[] = "CN";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    cfg_msgfree(found(f->handle, base, CFG_SCOPE_BASE, filter, attrs));
    assert_string_equal(base, " cn=Front End; cn=Configuration");
    assert_string_equal(filter, " (cn = Front\\20End )");
    assert_string_equal(name, "CN");
    assert_ptr_equal(attrs[0], name);
    assert_null(attrs[1]);
}

/* ---- the file behind it ---- */

static void a_changed_file_is_read_again(void **state) {
    struct fixture *f = *state;
    write_configuration(f, CONFIGURATION_HEAD "\ndn: cn=New, cn=Configuration\nobjectclass: top\n");
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_ONELEVEL, NULL, NULL);
    assert_dns(f->handle, result, "cn=New, cn=Configuration\n");
    cfg_msgfree(result);
}

static void a_file_that_can_not_be_read_again_gives_the_loaders_code(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    write_configuration(f, "dn: =x\n");
    assert_int_equal(search(f->handle, BASE, NULL, &result), 34);
    assert_null(result);
    assert_report_has(f->handle, 34, "\nLine 1 of ");
    assert_report_has(f->handle, 34, f->config);
    assert_int_equal(search_all(f->handle), 34);

    assert_int_equal(remove(f->config), 0);
    assert_int_equal(search_all(f->handle), 91);
    assert_int_equal(cfg_get_exterror(f->handle), 1003);

    write_configuration(f, standard_configuration);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_no_report(f->handle, CFG_SUCCESS);
}

static void another_handle_sees_the_same_file(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    cfg_set_option(other, CFG_OPT_CONFIG_FILE, f->config);
    assert_int_equal(bind_administrator(other), CFG_SUCCESS);
    CfgMessage *one = found(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, NULL);
    CfgMessage *two = found(other, BASE, CFG_SCOPE_SUBTREE, NULL, NULL);
    /* Results know nothing of the handle that made them. */
    assert_dns(other, one, ALL_DNS);
    assert_dns(f->handle, two, ALL_DNS);
    cfg_msgfree(one);
    cfg_msgfree(two);
    cfg_unbind(other);
}

static void a_result_outlives_reset_searches_and_failures(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, BASE, CFG_SCOPE_SUBTREE, NULL, NULL);
    cfg_reset(f->handle);
    search_all(f->handle);
    write_configuration(f, "");
    assert_int_equal(search_all(f->handle), 32);
    assert_dns(f->handle, result, ALL_DNS);
    cfg_msgfree(result);
}

static void an_entry_that_can_not_be_named_fails_the_whole_result(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = (CfgMessage *)f;
    load(f, CONFIGURATION_HEAD "\ndn: cn=, cn=Configuration\nobjectclass: top\n");
    cfg_msgfree(found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL));
    assert_int_equal(search(f->handle, BASE, NULL, &result), 34);
    assert_null(result);
    assert_int_equal(cfg_get_exterror(f->handle), 1013);
    assert_report_has(f->handle, 34, "Missing RDN attribute value");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_89),
        CREATED(a_handle_that_is_not_bound_gives_89_without_a_report),
        BOUND(a_null_result_gives_89_without_a_report),
        BOUND(a_null_base_gives_89_without_a_report),
        BOUND(a_malformed_base_gives_34_and_a_null_result),
        BOUND(a_base_that_is_not_there_gives_32_and_a_null_result),
        BOUND(the_base_may_be_written_in_every_form_of_its_dn),
        CREATED(the_empty_base_stands_above_all_entries),
        BOUND(the_lines_above_all_entries_are_an_entry_without_a_name),
        BOUND(a_subtree_comes_with_each_entry_before_its_children),
        BOUND(one_level_is_the_children_alone),
        BOUND(every_other_scope_is_the_base_alone),
        BOUND(a_filter_is_one_term),
        BOUND(a_value_that_the_syntax_refuses_gives_its_code),
        BOUND(a_refused_value_does_not_matter_where_the_attribute_is_missing),
        BOUND(a_filter_of_another_character_set_gives_162),
        BOUND(a_base_of_another_character_set_gives_162),
        BOUND(nothing_found_is_a_success_with_a_null_result),
        BOUND(a_base_that_does_not_match_gives_nothing),
        BOUND(entries_have_their_attributes_sorted_by_name),
        BOUND(only_the_wanted_attributes_come),
        BOUND(an_entry_without_the_wanted_attributes_still_comes),
        BOUND(an_empty_list_of_attributes_means_all),
        BOUND(the_filter_may_name_an_attribute_that_is_not_wanted),
        BOUND(attributes_only_still_brings_the_values),
        BOUND(an_empty_value_is_the_empty_text),
        CREATED(text_is_returned_byte_for_byte),
        BOUND(the_callers_texts_are_not_changed),
        BOUND(a_changed_file_is_read_again),
        BOUND(a_file_that_can_not_be_read_again_gives_the_loaders_code),
        BOUND(another_handle_sees_the_same_file),
        BOUND(a_result_outlives_reset_searches_and_failures),
        CREATED(an_entry_that_can_not_be_named_fails_the_whole_result),
    };
    return cmocka_run_group_tests_name("cfg_search_s", tests, NULL, NULL);
}
