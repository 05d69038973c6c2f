/* How the calls that change an entry take its name. */

#include <stdio.h>

#include "changes.h"

static int modify_nothing(CfgHandle *handle, const char *dn) {
    return cfg_modify_s(handle, dn, NULL);
}
static int modify_note(CfgHandle *handle, const char *dn) {
    return modify(handle, dn, "replace note=x");
}
static int add_nothing(CfgHandle *handle, const char *dn) { return cfg_add_s(handle, dn, NULL); }

static int (*const entry_calls[])(CfgHandle *, const char *) = {modify_note, modify_nothing,
                                                                add_nothing, cfg_delete_s};

static void a_null_name_gives_89_without_a_report(void **state) {
    struct fixture *f = *state;
    load_entries(f, update_entries);
    for (size_t i = 0; i < LENGTH(entry_calls); ++i) {
        assert_int_equal(entry_calls[i](f->handle, NULL), CFG_PARAM_ERROR);
        assert_no_report(f->handle, CFG_PARAM_ERROR);
    }
    assert_entries(f, update_entries);
}

static void a_malformed_name_gives_34(void **state) {
    static const struct {
        const char *dn;
        int extended;
        const char *message;
    } rows[] = {
        {"=x", 1012, "Invalid attribute sytax: "},
        {"cn", 1013, "Missing RDN value: cn"},
        {"cn=a\\", 1014, "Invalid escape sequence: \\"},
        {"cn=a,", 1011, "Missing RDN attribute"},
        {"cn=a=b", 1014, "Invalid character in RDN value: ="},
    };
    struct fixture *f = *state;
    load_entries(f, update_entries);
    for (size_t call = 0; call < LENGTH(entry_calls); ++call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            assert_int_equal(entry_calls[call](f->handle, rows[i].dn), 34);
            assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
            assert_report_has(f->handle, 34, rows[i].message);
        }
    }
    assert_entries(f, update_entries);
}

/* What the file has become is looked at before the name. */
static void a_malformed_name_hides_no_file_that_can_not_be_read(void **state) {
    static const struct {
        const char *text; /* null: the file is removed */
        int code;
        int extended;
    } rows[] = {
        {"dn: cn=x\n\ncn: stray\n", 65, 1007},
        {"# This file is being written. If it stays so, its backup is the complete version.\n", 80,
         1002},
        {NULL, CFG_CONNECT_ERROR, 1003},
    };
    static const char *const names[] = {"=x", "cn", "cn=a,"};
    struct fixture *f = *state;
    for (size_t call = 0; call < LENGTH(entry_calls); ++call) {
        for (size_t i = 0; i < LENGTH(rows); ++i) {
            load_entries(f, update_entries);
            if (rows[i].text) {
                write_configuration(f, rows[i].text);
            } else {
                assert_int_equal(remove(f->config), 0);
            }
            for (size_t name = 0; name < LENGTH(names); ++name) {
                assert_int_equal(entry_calls[call](f->handle, names[name]), rows[i].code);
                assert_int_equal(cfg_get_exterror(f->handle), rows[i].extended);
            }
        }
    }
}

static void a_name_of_another_character_set_gives_162(void **state) {
    REQUIRE_UTF8();
    struct fixture *f = *state;
    load_entries(f, update_entries);
    for (size_t call = 0; call < LENGTH(entry_calls); ++call) {
        assert_int_equal(entry_calls[call](f->handle, "cn=\xff"), 162);
        assert_non_null(cfg_dump_exception(f->handle));
    }
    assert_entries(f, update_entries);
}

static void an_entry_is_found_by_every_form_of_its_name(void **state) {
    static const char *const rows[] = {A, "CN=a,CN=CONFIGURATION", " cn = A;cn=Configuration",
                                       "cn=\"A\", cn=#436F6E66696775726174696F6E",
                                       "cn=\\41, cn=Configuration"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "note: old\n");
        assert_int_equal(modify(f->handle, rows[i], "replace note=new"), CFG_SUCCESS);
        assert_lines(f, "note: new\n");
        assert_int_equal(add(f->handle, rows[i], "add note=more"), CFG_SUCCESS);
        assert_lines(f, "note: new\nnote: more\n");
        assert_int_equal(cfg_delete_s(f->handle, rows[i]), CFG_SUCCESS);
        assert_entries(f, "");
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(a_null_name_gives_89_without_a_report),
        CREATED(a_malformed_name_gives_34),
        CREATED(a_malformed_name_hides_no_file_that_can_not_be_read),
        CREATED(a_name_of_another_character_set_gives_162),
        CREATED(an_entry_is_found_by_every_form_of_its_name),
    };
    return cmocka_run_group_tests_name("update_names", tests, NULL, NULL);
}
