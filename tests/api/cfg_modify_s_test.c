/* cfg_modify_s makes its modifications in their order; see update_calls_test.c. */

#include <stdlib.h>
#include <string.h>

#include "changes.h"

/* ---- the operations ---- */

static void each_operation_changes_the_lines_of_the_file(void **state) {
    static const struct {
        const char *before;
        const char *mods;
        const char *after;
    } rows[] = {
        /* add */
        {"", "add note=a", "note: a\n"},
        {"", "add note=b|a", "note: b\nnote: a\n"},
        {"note: a\n", "add note=b", "note: a\nnote: b\n"},
        {"note: a\n", "add NOTE=b", "note: a\nnote: b\n"},
        {"note: a\n", "add note=a", "note: a\n"},
        {"note: a\n", "add note=a|b|a|b", "note: a\nnote: b\n"},
        {"note: a\n", "add note", "note: a\n"},
        {"", "add note", ""},
        {"", "add note=", "note: \n"},
        {"note: \n", "add note=", "note: \n"},
        {"note: z\n", "add alpha=1; add zeta=2", "alpha: 1\nnote: z\nzeta: 2\n"},
        {"objectclass: top\n", "add objectClass=TOP|list", "objectclass: top\nobjectclass: list\n"},
        {"oru-slapdSetenv: A=1\n", "add oru-slapdSetenv=a=1|B=2",
         "oru-slapdSetenv: A=1\noru-slapdSetenv: B=2\n"},
        {"oru-slapdSuffix: o=A\n", "add oru-slapdSuffix=O=a|cn=x;o=A",
         "oru-slapdSuffix: o=A\noru-slapdSuffix: cn=x, o=A\n"},
        {"# why\nnote: a\n", "add note=b", "# why\nnote: a\nnote: b\n"},
        /* delete */
        {"note: a\nnote: b\n", "delete note=a", "note: b\n"},
        {"note: a\nnote: b\nnote: c\n", "delete NOTE=c|a", "note: b\n"},
        {"note: a\nnote: b\n", "delete note=none", "note: a\nnote: b\n"},
        {"note: a\nnote: b\n", "delete note", ""},
        {"note: a\n", "delete note=a", ""},
        {"note: a\nnote: b\n", "delete note=a|b|c", ""},
        {"note: \n", "delete note=", ""},
        {"cn: A\n# why\nnote: a\n# other\nzeta: z\n", "delete note=a", "cn: A\n# other\nzeta: z\n"},
        {"cn: A\n# why\nnote: a\n", "delete note", "cn: A\n"},
        {"# why\nnote: a\nnote: b\n", "delete note=a", "# why\nnote: b\n"},
        {"objectclass: top\nobjectclass: list\n", "delete objectclass=TOP", "objectclass: list\n"},
        {"oru-slapdPort: 389\n", "delete oru-slapdPort=+0389", ""},
        {"oru-slapdSuffix: o=A\n", "delete oru-slapdSuffix=O=\"a\"", ""},
        /* A case-exact value is another one in other letters. */
        {"note: a\n", "delete note=A", "note: a\n"},
        /* replace */
        {"note: a\n", "replace note=b", "note: b\n"},
        {"note: a\nnote: b\n", "replace note=c|a", "note: c\nnote: a\n"},
        {"note: a\n", "replace NOTE=b", "note: b\n"},
        {"note: a\n", "replace note=a", "note: a\n"},
        {"", "replace note=b", "note: b\n"},
        {"note: a\n", "replace note", ""},
        {"note: a\n", "replace none", "note: a\n"},
        {"note: a\n", "replace note=", "note: \n"},
        {"# why\nnote: a\n", "replace note=b", "# why\nnote: b\n"},
        {"cn: A\n# why\nnote: a\n", "replace note", "cn: A\n"},
        {"oru-slapdPort: 389\n", "replace oru-slapdPort=+0636", "oru-slapdPort: 636\n"},
        {"oru-slapdPort: 389\n", "replace oru-slapdPort=0389", "oru-slapdPort: 389\n"},
        /* binary values are texts */
        {"note: a\n", "binary add note=b", "note: a\nnote: b\n"},
        {"note: a\nnote: b\n", "binary delete note=a", "note: b\n"},
        {"note: a\n", "binary replace note=b|c", "note: b\nnote: c\n"},
        {"note: a\n", "binary delete note", ""},
        {"note: a\n", "binary replace note", ""},
        {"note: a\n", "binary add note", "note: a\n"},
        {"oru-slapdPort: 389\n", "binary replace oru-slapdPort=636", "oru-slapdPort: 636\n"},
        /* one after the other */
        {"note: a\n", "delete note; add note=b", "note: b\n"},
        {"note: a\n", "add note=b; delete note=a; replace note=c", "note: c\n"},
        {"note: a\n", "replace note=b; delete note=b", ""},
        {"", "add note=a; add note=b; delete note=a", "note: b\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, rows[i].before);
        must_modify(f->handle, A, rows[i].mods);
        assert_lines(f, rows[i].after);
    }
}

static void only_the_named_entry_changes(void **state) {
    struct fixture *f = *state;
    load_entries(
        f, ENTRY("cn=A", "note: a\n") ENTRY("cn=B, cn=A", "note: b\n") ENTRY("cn=C", "note: c\n"));
    assert_int_equal(modify(f->handle, "cn=B, cn=A, " TOP, "replace note=new"), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=A", "note: a\n") ENTRY("cn=B, cn=A", "note: new\n")
                          ENTRY("cn=C", "note: c\n"));
}

static void the_lines_above_all_entries_can_be_changed(void **state) {
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    assert_int_equal(modify(f->handle, "", "replace charset=ISO-8859-1"), CFG_SUCCESS);
    char *file = read_file(f->config);
    assert_int_equal(strncmp(file, "charset: ISO-8859-1\nversion: 1\n\ndn: ", 36), 0);
    free(file);
}

static void an_entry_may_have_lost_all_its_attributes(void **state) {
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    must_modify(f->handle, A, "delete note");
    assert_lines(f, "");
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    must_modify(f->handle, A, "add note=b");
    assert_lines(f, "note: b\n");
}

/* ---- records ---- */

static void null_and_empty_records_write_the_file_whether_the_entry_is_there_or_not(void **state) {
    static const char *const names[] = {A, "cn=None", "cn=None, cn=At, cn=All", ""};
    LDAPMod *empty[] = {NULL};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(names); ++i) {
        load_lines(f, "note:not canonical\n");
        assert_int_equal(cfg_modify_s(f->handle, names[i], NULL), CFG_SUCCESS);
        assert_lines(f, "note: not canonical\n");
        load_lines(f, "note:not canonical\n");
        assert_int_equal(cfg_modify_s(f->handle, names[i], empty), CFG_SUCCESS);
        assert_lines(f, "note: not canonical\n");
    }
}

static void an_empty_array_of_values_is_none(void **state) {
    char name[] = "note";
    char *no_texts[] = {NULL};
    struct berval *no_bytes[] = {NULL};
    LDAPMod texts = {LDAP_MOD_REPLACE, name, {no_texts}};
    LDAPMod bytes = {LDAP_MOD_DELETE | LDAP_MOD_BVALUES, name, {NULL}};
    LDAPMod *rows[] = {&texts, &bytes};
    struct fixture *f = *state;
    bytes.mod_bvalues = no_bytes;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        LDAPMod *mods[] = {rows[i], NULL};
        load_lines(f, "note: a\n");
        assert_int_equal(cfg_modify_s(f->handle, A, mods), CFG_SUCCESS);
        assert_lines(f, "");
        rows[i]->mod_op = (rows[i]->mod_op & LDAP_MOD_BVALUES) | LDAP_MOD_ADD;
        assert_int_equal(cfg_modify_s(f->handle, A, mods), CFG_SUCCESS);
        assert_lines(f, "");
    }
}

/* KEPT: only the bytes up to a NUL count; the length is not looked at. */
static void a_binary_value_ends_at_its_first_nul(void **state) {
    char name[] = "note";
    char bytes[] = "cut\0off";
    struct berval values[] = {{sizeof bytes - 1, bytes}, {0, NULL}};
    struct berval *list[] = {&values[0], NULL, NULL};
    LDAPMod mod = {LDAP_MOD_REPLACE | LDAP_MOD_BVALUES, name, {NULL}};
    LDAPMod *mods[] = {&mod, NULL};
    struct fixture *f = *state;
    static const unsigned long lengths[] = {7, 3, 0, 1, 1000000};
    mod.mod_bvalues = list;
    for (size_t i = 0; i < LENGTH(lengths); ++i) {
        load_lines(f, "note: a\n");
        values[0].bv_len = lengths[i];
        assert_int_equal(cfg_modify_s(f->handle, A, mods), CFG_SUCCESS);
        assert_lines(f, "note: cut\n");
    }
    /* Without bytes at all it is empty. */
    list[1] = &values[1];
    assert_int_equal(cfg_modify_s(f->handle, A, mods), CFG_SUCCESS);
    assert_lines(f, "note: cut\nnote: \n");
}

static void the_callers_records_are_not_changed(void **state) {
    char name[] = "NOTE";
    char value[] = "b";
    char *values[] = {value, NULL};
    LDAPMod mod = {LDAP_MOD_REPLACE, name, {values}};
    LDAPMod *mods[] = {&mod, NULL};
    char dn[] = " cn=A;cn=Configuration";
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    assert_int_equal(cfg_modify_s(f->handle, dn, mods), CFG_SUCCESS);
    strcpy(value, "z");
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_lines(f, "note: b\n");
    assert_string_equal(dn, " cn=A;cn=Configuration");
    assert_string_equal(name, "NOTE");
    assert_ptr_equal(values[0], value);
    assert_null(values[1]);
    assert_int_equal(mod.mod_op, LDAP_MOD_REPLACE);
    assert_ptr_equal(mod.mod_type, name);
    assert_ptr_equal(mod.mod_values, values);
    assert_ptr_equal(mods[0], &mod);
    assert_null(mods[1]);
}

/* ---- refusals ---- */

static void a_refused_modification_leaves_the_file_alone_and_is_reported(void **state) {
    static const struct {
        const char *mods;
        struct refusal refusal;
    } rows[] = {
        {"delete none", {16, 16, "Target attribute of MOD_DELETE not found", "none", "<NULL>"}},
        {"binary delete none",
         {16, 16, "Target attribute of MOD_DELETE not found", "none", "<NULL>"}},
        /* KEPT: not the value but the attribute's name once more. */
        {"delete none=x", {16, 16, "Target attribute of MOD_DELETE not found", "none", "none"}},
        {"binary delete none=x",
         {16, 16, "Target attribute of MOD_DELETE not found", "none", "<binary>"}},
        {"delete =x", {16, 16, "Target attribute of MOD_DELETE not found", NULL, ""}},
        {"3 note=x", {89, 1010, "Unknown mod_op: 3", NULL, ""}},
        {"0x83 note=x", {89, 1010, "Unknown mod_op: 131", NULL, ""}},
        {"0x04 note", {89, 1010, "Unknown mod_op: 4", NULL, ""}},
        {"0x1000 note=x", {89, 1010, "Unknown mod_op: 4096", NULL, ""}},
        {"0x1080 note=x", {89, 1010, "Unknown mod_op: 4224", NULL, ""}},
        {"2147483647 note", {89, 1010, "Unknown mod_op: 2147483647", NULL, ""}},
        {"-1 note", {89, 1010, "Unknown mod_op: 4294967295", NULL, ""}},
        {"-2147483648 note", {89, 1010, "Unknown mod_op: 2147483648", NULL, ""}},
    };
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(modify(f->handle, A, rows[i].mods), rows[i].refusal.code);
        assert_refused(f, A, &rows[i].refusal);
        assert_lines(f, "note: a\n");
    }
}

static void an_entry_that_is_not_there_gives_32(void **state) {
    static const char *const rows[] = {"cn=none", "cn=none, " A, "cn=A", A ", o=x"};
    static const struct refusal expected = {32, 32, "Entry not found", NULL, ""};
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(modify(f->handle, rows[i], "add note=b"), CFG_NO_SUCH_OBJECT);
        assert_refused(f, rows[i], &expected);
    }
    assert_lines(f, "note: a\n");
}

static void the_report_names_the_entry_in_its_canonical_form(void **state) {
    static const struct refusal expected = {32, 32, "Entry not found", NULL, ""};
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    assert_int_equal(modify(f->handle, " cn = None;o=\"x\"", "add note=b"), CFG_NO_SUCH_OBJECT);
    assert_refused(f, "cn=None, o=\"x\"", &expected);
}

/* ---- order ---- */

static void modifications_before_the_refused_one_stay_and_those_after_it_are_not_made(
    void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\nnote: a\n");
    assert_int_equal(modify(f->handle, A, "add note=b; delete none; add note=c"),
                     CFG_NO_SUCH_ATTRIBUTE);
    assert_lines(f, "cn: A\nnote: a\n");
    assert_lines_in_memory(f->handle, A, "cn: A\nnote: a\nnote: b\n");
    /* The next change writes them. */
    must_modify(f->handle, A, "add zeta=z");
    assert_lines(f, "cn: A\nnote: a\nnote: b\nzeta: z\n");
}

static void values_deleted_before_a_refused_one_are_gone_in_memory_alone(void **state) {
    static const char lines[] = "cn: A\noru-slapdSuffix: o=A\noru-slapdSuffix: o=B\n";
    struct fixture *f = *state;
    load_lines(f, lines);
    assert_int_equal(modify(f->handle, A, "delete oru-slapdSuffix=o=A|="), CFG_INVALID_DN_SYNTAX);
    assert_lines(f, lines);
    assert_lines_in_memory(f->handle, A, "cn: A\noru-slapdSuffix: o=B\n");
    /* The next change writes that. */
    must_modify(f->handle, A, "add zeta=z");
    assert_lines(f, "cn: A\noru-slapdSuffix: o=B\nzeta: z\n");
}

static void what_was_not_written_is_dropped_by_unbinding(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\nnote: a\n");
    assert_int_equal(modify(f->handle, A, "add note=b; delete none"), CFG_NO_SUCH_ATTRIBUTE);
    cfg_unbind(f->handle);
    f->handle = second_handle(f);
    assert_lines_in_memory(f->handle, A, "cn: A\nnote: a\n");
}

static void what_was_not_written_is_dropped_when_the_file_has_changed(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\nnote: a\n");
    assert_int_equal(modify(f->handle, A, "add note=b; delete none"), CFG_NO_SUCH_ATTRIBUTE);
    CfgHandle *other = second_handle(f);
    must_modify(other, A, "add note=c");
    cfg_unbind(other);
    assert_lines_in_memory(f->handle, A, "cn: A\nnote: a\nnote: c\n");
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_lines(f, "cn: A\nnote: a\nnote: c\n");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(each_operation_changes_the_lines_of_the_file),
        CREATED(only_the_named_entry_changes),
        CREATED(the_lines_above_all_entries_can_be_changed),
        CREATED(an_entry_may_have_lost_all_its_attributes),
        CREATED(null_and_empty_records_write_the_file_whether_the_entry_is_there_or_not),
        CREATED(an_empty_array_of_values_is_none),
        CREATED(a_binary_value_ends_at_its_first_nul),
        CREATED(the_callers_records_are_not_changed),
        CREATED(a_refused_modification_leaves_the_file_alone_and_is_reported),
        CREATED(an_entry_that_is_not_there_gives_32),
        CREATED(the_report_names_the_entry_in_its_canonical_form),
        CREATED(modifications_before_the_refused_one_stay_and_those_after_it_are_not_made),
        CREATED(values_deleted_before_a_refused_one_are_gone_in_memory_alone),
        CREATED(what_was_not_written_is_dropped_by_unbinding),
        CREATED(what_was_not_written_is_dropped_when_the_file_has_changed),
    };
    return cmocka_run_group_tests_name("cfg_modify_s", tests, NULL, NULL);
}
