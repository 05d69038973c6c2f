/* cfg_get_file_line, cfg_get_entry, cfg_get_attribute and cfg_get_value: where a failure was. */

#include <string.h>

#include "fixture.h"

#define BASE "cn=Configuration"
#define FRONT_END "cn=Front End, " BASE

struct place {
    int line;
    const char *entry;
    const char *attribute;
    const char *value;
};

static const struct place nowhere = {0, NULL, NULL, NULL};
/* Of a failure that tells no place: there is an entry and a value, but no attribute. */
static const struct place unknown = {0, "", NULL, ""};

static void assert_place(CfgHandle *handle, struct place expected) {
    assert_int_equal(cfg_get_file_line(handle), expected.line);
    assert_text(cfg_get_entry(handle), expected.entry);
    assert_text(cfg_get_attribute(handle), expected.attribute);
    assert_text(cfg_get_value(handle), expected.value);
}

/* Leaves a failure with an entry, an attribute and a value. */
static void provoke_a_failure(CfgHandle *handle) {
    assert_int_equal(modify_one(handle, FRONT_END, LDAP_MOD_ADD, "oru-slapdSysLogLevel", "loud"),
                     CFG_INVALID_SYNTAX);
    assert_place(handle, (struct place){0, FRONT_END, "oru-slapdSysLogLevel", "loud"});
}

/* ---- no place ---- */

static void a_null_handle_gives_0_and_null(void **state) {
    (void)state;
    assert_place(NULL, nowhere);
}

static void without_a_failure_there_is_no_place(void **state) {
    struct fixture *f = *state;
    assert_place(f->handle, nowhere);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_place(f->handle, nowhere);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_place(f->handle, nowhere);
}

static void a_failure_without_a_report_has_no_place(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search_all(f->handle), CFG_PARAM_ERROR);
    assert_place(f->handle, nowhere);
    assert_int_equal(cfg_bind_s(f->handle, ADMINISTRATOR, "wrong", CFG_AUTH_SIMPLE),
                     CFG_INVALID_CREDENTIALS);
    assert_place(f->handle, nowhere);
}

static void a_report_without_a_place_has_an_empty_entry_and_value_but_no_attribute(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_place(f->handle, unknown);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_place(f->handle, unknown);
}

/* ---- calls that were refused ---- */

static void a_refused_modification_tells_entry_attribute_and_value(void **state) {
    static const struct {
        const char *dn;
        int operation;
        const char *name;
        const char *value;
        int code;
        const char *told_entry;
        const char *told_attribute;
        const char *told_value;
    } rows[] = {
        {FRONT_END, LDAP_MOD_ADD, "oru-slapdPort", "390", 19, FRONT_END, "oru-slapdPort", "390"},
        {FRONT_END, LDAP_MOD_ADD, "note", " x", 21, FRONT_END, "note", " x"},
        {FRONT_END, LDAP_MOD_DELETE, "note", NULL, 16, FRONT_END, "note", "<NULL>"},
        {FRONT_END, 7, "note", "x", 89, FRONT_END, NULL, ""},
        {"cn=none", LDAP_MOD_ADD, "note", "x", 32, "cn=none", NULL, ""},
        {"cn", LDAP_MOD_ADD, "note", "x", 34, "", NULL, "cn"},
        /* It leaves the attribute without values, hence the last. */
        {FRONT_END, LDAP_MOD_REPLACE, "oru-slapdPort", "0", 21, FRONT_END, "oru-slapdPort", "0"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(
            modify_one(f->handle, rows[i].dn, rows[i].operation, rows[i].name, rows[i].value),
            rows[i].code);
        assert_place(f->handle, (struct place){0, rows[i].told_entry, rows[i].told_attribute,
                                               rows[i].told_value});
    }
}

static void a_refused_entry_and_a_refused_deletion_tell_the_entry(void **state) {
    char *values[] = {"many", NULL};
    LDAPMod port = {.mod_type = "oru-slapdPort", .mod_values = values};
    LDAPMod *attributes[] = {&port, NULL};
    struct fixture *f = *state;
    assert_int_equal(cfg_add_s(f->handle, "cn=new, " BASE, attributes), CFG_INVALID_SYNTAX);
    assert_place(f->handle, (struct place){0, "cn=new, " BASE, "oru-slapdPort", "many"});
    assert_int_equal(cfg_delete_s(f->handle, BASE), CFG_NOT_ALLOWED_ON_NONLEAF);
    assert_place(f->handle, (struct place){0, BASE, NULL, ""});
}

static void the_entry_is_named_in_its_canonical_form(void **state) {
    struct fixture *f = *state;
    assert_int_equal(
        modify_one(f->handle, "cn = \"Front End\";CN=configuration", LDAP_MOD_ADD, "note", "x "),
        CFG_INVALID_SYNTAX);
    assert_text(cfg_get_entry(f->handle), "cn=\"Front End\", CN=configuration");
}

static void the_attribute_is_named_as_the_caller_wrote_it(void **state) {
    struct fixture *f = *state;
    assert_int_equal(modify_one(f->handle, FRONT_END, LDAP_MOD_ADD, "ORU-slapdport", "390"),
                     CFG_CONSTRAINT_VIOLATION);
    assert_text(cfg_get_attribute(f->handle), "ORU-slapdport");
}

static void a_failure_that_names_no_attribute_has_the_name_of_the_violated_one(void **state) {
    struct fixture *f = *state;
    write_configuration(f, "dn: " BASE "\nobjectclass: top\noru-slapdAdminPW: {SSHA}aaaa\n");
    assert_int_equal(bind_administrator(f->handle), CFG_DECODING_ERROR);
    assert_place(f->handle, (struct place){0, BASE, "oru-slapdAdminPW", "{SSHA}aaaa"});
    assert_null(strstr(cfg_dump_exception(f->handle), "\nattribute: "));
}

static void an_attribute_without_a_name_is_null(void **state) {
    static const char *const names[] = {"", NULL};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        assert_int_equal(modify_one(f->handle, FRONT_END, LDAP_MOD_ADD, names[i], "x"),
                         CFG_INVALID_SYNTAX);
        assert_place(f->handle, (struct place){0, FRONT_END, NULL, "x"});
        /* There is a violated attribute: any that is not in the table. */
        assert_report_has(f->handle, 21, "\nConstraints for UNKNOWN ATTRIBUTE TYPE\n");
    }
}

static void a_refused_filter_gives_the_whole_text_of_the_base(void **state) {
    struct fixture *f = *state;
    assert_int_equal(search_below(f->handle, FRONT_END, "oru-slapdPort=many"), CFG_INVALID_SYNTAX);
    assert_text(cfg_get_attribute(f->handle), "oru-slapdPort");
    assert_text(cfg_get_value(f->handle), "many");
    assert_text(cfg_get_entry(f->handle), "dn: " FRONT_END
                                          "\n"
                                          "cn: Front End\n"
                                          "description: first line, continued\n"
                                          "objectclass: top\n"
                                          "oru-slapdPort: 389\n"
                                          "oru-slapdSetenv: TZ=Europe/Berlin\n"
                                          "oru-slapdSetenv: A=first\n"
                                          "\n");
}

/* ---- files that can't be loaded ---- */

struct unloadable {
    const char *text;
    int code;
    struct place place;
};

static const struct unloadable unloadable_files[] = {
    {"version: 1\n\ncn: stray\n", 65, {3, "<root>", "cn", "stray"}},
    /* A line that can't be used becomes an attribute, which the root does not allow. */
    {"version: 2\n", 65, {1, "<root>", "oru-slapdInvalidLine", "version: 2"}},
    {"version: 1\nversion: 1\n", 65, {2, "<root>", "oru-slapdInvalidLine", "version: 1"}},
    {CONFIGURATION_HEAD "\nno colon\n", 65, {11, "<root>", "oru-slapdInvalidLine", "no colon: "}},
    {CONFIGURATION_HEAD "\ndn: cn\ncn: x\n", 34, {11, "<root>", NULL, "cn"}},
    {CONFIGURATION_HEAD "dn: cn\n", 34, {10, "<root>", NULL, "cn"}},
    /* A line that is continued has the number of its last part. */
    {"# comment\ndn: c\n n\n o\n", 34, {4, "<root>", NULL, "cno"}},
};

static void a_file_that_can_not_be_loaded_tells_the_line(void **state) {
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(unloadable_files); ++i) {
        const struct unloadable *row = &unloadable_files[i];
        write_configuration(f, row->text);
        assert_int_equal(bind_administrator(f->handle), row->code);
        assert_place(f->handle, row->place);
    }
}

static void a_file_that_can_not_be_loaded_again_tells_the_line(void **state) {
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(unloadable_files); ++i) {
        const struct unloadable *row = &unloadable_files[i];
        load(f, standard_configuration);
        write_configuration(f, row->text);
        assert_int_equal(search_all(f->handle), row->code);
        assert_place(f->handle, row->place);
        load(f, standard_configuration);
        write_configuration(f, row->text);
        /* It is the file that fails, not the change: the entry is told by the file, too. */
        assert_int_equal(modify_one(f->handle, FRONT_END, LDAP_MOD_ADD, "note", "x"), row->code);
        assert_place(f->handle, row->place);
    }
}

static void text_of_another_character_set_is_told_with_the_line_before_it(void **state) {
    struct fixture *f = *state;
    REQUIRE_UTF8();
    /* The line before might have been continued by it. */
    write_configuration(f, CONFIGURATION_HEAD "note: \xff\nnote: y\n");
    assert_int_equal(bind_administrator(f->handle), 162);
    assert_place(f->handle, (struct place){9, BASE, NULL, "note: \xff"});
}

static void a_failed_bind_tells_the_entry_of_the_administrator(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, "cn", PASSWORD, CFG_AUTH_SIMPLE), CFG_INVALID_DN_SYNTAX);
    assert_place(f->handle, (struct place){0, BASE, "oru-slapdAdminDN", "cn"});
    write_configuration(f, "");
    assert_int_equal(bind_administrator(f->handle), CFG_NO_SUCH_OBJECT);
    assert_place(f->handle, (struct place){0, BASE, NULL, ""});
}

/* ---- how long a place is known ---- */

static void asking_resets_nothing_and_gives_the_same_texts_again(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    const char *report = cfg_dump_exception(f->handle);
    const char *entry = cfg_get_entry(f->handle);
    const char *attribute = cfg_get_attribute(f->handle);
    const char *value = cfg_get_value(f->handle);
    for (int i = 0; i < 3; ++i) {
        assert_int_equal(cfg_get_file_line(f->handle), 0);
        assert_ptr_equal(cfg_get_entry(f->handle), entry);
        assert_ptr_equal(cfg_get_attribute(f->handle), attribute);
        assert_ptr_equal(cfg_get_value(f->handle), value);
    }
    assert_int_equal(cfg_get_errno(f->handle), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1017);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
}

static void the_option_calls_keep_the_place(void **state) {
    struct fixture *f = *state;
    int flag = 0;
    provoke_a_failure(f->handle);
    const char *value = cfg_get_value(f->handle);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, "");
    cfg_get_option(f->handle, CFG_OPT_FLAG_A, &flag);
    assert_ptr_equal(cfg_get_value(f->handle), value);
    assert_place(f->handle, (struct place){0, FRONT_END, "oru-slapdSysLogLevel", "loud"});
}

static void the_next_call_that_resets_forgets_the_place(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    assert_int_equal(cfg_reset(f->handle), CFG_SUCCESS);
    assert_place(f->handle, nowhere);
    provoke_a_failure(f->handle);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_place(f->handle, nowhere);
    provoke_a_failure(f->handle);
    assert_null(cfg_first_entry(f->handle, NULL));
    assert_place(f->handle, nowhere);
}

static void the_next_failure_has_a_place_of_its_own(void **state) {
    struct fixture *f = *state;
    provoke_a_failure(f->handle);
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_place(f->handle, unknown);
}

static void each_handle_has_its_own(void **state) {
    struct fixture *f = *state;
    CfgHandle *other = cfg_init();
    provoke_a_failure(f->handle);
    assert_place(other, nowhere);
    assert_int_equal(cfg_bind_s(other, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_place(other, unknown);
    assert_text(cfg_get_value(f->handle), "loud");
    cfg_unbind(other);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_handle_gives_0_and_null),
        CREATED(without_a_failure_there_is_no_place),
        CREATED(a_failure_without_a_report_has_no_place),
        CREATED(a_report_without_a_place_has_an_empty_entry_and_value_but_no_attribute),
        BOUND(a_refused_modification_tells_entry_attribute_and_value),
        BOUND(a_refused_entry_and_a_refused_deletion_tell_the_entry),
        BOUND(the_entry_is_named_in_its_canonical_form),
        BOUND(the_attribute_is_named_as_the_caller_wrote_it),
        CREATED(a_failure_that_names_no_attribute_has_the_name_of_the_violated_one),
        BOUND(an_attribute_without_a_name_is_null),
        BOUND(a_refused_filter_gives_the_whole_text_of_the_base),
        CREATED(a_file_that_can_not_be_loaded_tells_the_line),
        BOUND(a_file_that_can_not_be_loaded_again_tells_the_line),
        CREATED(text_of_another_character_set_is_told_with_the_line_before_it),
        CREATED(a_failed_bind_tells_the_entry_of_the_administrator),
        BOUND(asking_resets_nothing_and_gives_the_same_texts_again),
        BOUND(the_option_calls_keep_the_place),
        BOUND(the_next_call_that_resets_forgets_the_place),
        BOUND(the_next_failure_has_a_place_of_its_own),
        BOUND(each_handle_has_its_own),
    };
    return cmocka_run_group_tests_name("cfg_get_entry", tests, NULL, NULL);
}
