/* cfg_add_s makes an entry, or adds to one; see update_calls_test.c for what the calls share. */

#include <string.h>

#include "changes.h"

#define NEW "cn=New, " TOP

static void an_entry_is_added_with_its_attributes_sorted(void **state) {
    static const struct {
        const char *mods;
        const char *lines;
    } rows[] = {
        {NULL, ""},
        {"add cn=New", "cn: New\n"},
        {"add note=b|a; add cn=New; add objectclass=top",
         "cn: New\nnote: b\nnote: a\nobjectclass: top\n"},
        {"add note=a; add NOTE=b", "note: a\nnote: b\n"},
        {"add note=a|a", "note: a\n"},
        {"add cn=New|NEW", "cn: New\n"},
        {"add note=", "note: \n"},
        {"binary add note=a|b", "note: a\nnote: b\n"},
        {"add oru-slapdPort=+0389", "oru-slapdPort: 389\n"},
        /* KEPT: the operation is not looked at. */
        {"delete note=a", "note: a\n"},
        {"replace note=a; replace note=b", "note: a\nnote: b\n"},
        {"3 note=a; binary delete note=b; 0x1000 note=c", "note: a\nnote: b\nnote: c\n"},
        /* No values, nothing to add. */
        {"add note", ""},
        {"delete note; binary replace note; add cn=New", "cn: New\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char expected[256] = ENTRY("cn=A", "note: a\n") "dn: " NEW "\n";
        load_lines(f, "note: a\n");
        if (add(f->handle, NEW, rows[i].mods) != CFG_SUCCESS) {
            fail_msg("%s: %s", rows[i].mods, cfg_dump_exception(f->handle));
        }
        assert_no_report(f->handle, CFG_SUCCESS);
        assert_entries(f, strcat(strcat(expected, rows[i].lines), "\n"));
    }
}

static void an_empty_array_of_records_adds_an_entry_without_attributes(void **state) {
    LDAPMod *mods[] = {NULL};
    struct fixture *f = *state;
    load_entries(f, "");
    assert_int_equal(cfg_add_s(f->handle, NEW, mods), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=New", ""));
}

static void the_name_is_written_in_its_canonical_form(void **state) {
    static const struct {
        const char *dn;
        const char *entries;
    } rows[] = {
        {" CN = New;cn=Configuration", "dn: CN=New, cn=Configuration\n\n"},
        {"cn=\"a,b\", " TOP, "dn: cn=\"a,b\", cn=Configuration\n\n"},
        {"cn=a\\,b, " TOP, "dn: cn=a\\,b, cn=Configuration\n\n"},
        {"oid.2.5.4.3=x, " TOP, "dn: 2.5.4.3=x, cn=Configuration\n\n"},
        {"o=Elsewhere", "dn: o=Elsewhere\n\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_entries(f, "");
        assert_int_equal(add(f->handle, rows[i].dn, NULL), CFG_SUCCESS);
        assert_entries(f, rows[i].entries);
        assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
        assert_int_equal(cfg_delete_s(f->handle, rows[i].dn), CFG_SUCCESS);
        assert_entries(f, "");
    }
}

/* ---- its place ---- */

static void an_entry_comes_after_its_siblings_and_their_children(void **state) {
    struct fixture *f = *state;
    load_entries(f, ENTRY("cn=A", "") ENTRY("cn=B", "") "dn: o=Elsewhere\n\n");
    assert_int_equal(add(f->handle, "cn=C, cn=A, " TOP, NULL), CFG_SUCCESS);
    assert_int_equal(add(f->handle, NEW, NULL), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=A", "") ENTRY("cn=C, cn=A", "") ENTRY("cn=B", "")
                          ENTRY("cn=New", "") "dn: o=Elsewhere\n\n");
}

static void the_ancestors_need_not_be_there(void **state) {
    struct fixture *f = *state;
    load_entries(f, ENTRY("cn=A", ""));
    assert_int_equal(add(f->handle, "cn=D, cn=C, cn=B, " TOP, "add note=d"), CFG_SUCCESS);
    assert_entries(f, ENTRY("cn=A", "") ENTRY("cn=D, cn=C, cn=B", "note: d\n"));
    CfgMessage *result = found(f->handle, "cn=D, cn=C, cn=B, " TOP, CFG_SCOPE_BASE, "note=d", NULL);
    assert_int_equal(cfg_count_entries(f->handle, result), 1);
    cfg_msgfree(result);
}

static void an_ancestor_that_comes_later_takes_its_place_above(void **state) {
    struct fixture *f = *state;
    load_entries(f, ENTRY("cn=C, cn=B", "note: c\n") ENTRY("cn=A", ""));
    assert_int_equal(add(f->handle, "cn=B, " TOP, "add note=b"), CFG_SUCCESS);
    assert_entries(f,
                   ENTRY("cn=A", "") ENTRY("cn=B", "note: b\n") ENTRY("cn=C, cn=B", "note: c\n"));
    assert_int_equal(cfg_delete_s(f->handle, "cn=B, " TOP), CFG_NOT_ALLOWED_ON_NONLEAF);
}

/* ---- an entry that is there already ---- */

static void an_entry_that_is_there_takes_over_the_attributes(void **state) {
    static const struct {
        const char *before;
        const char *mods;
        const char *after;
    } rows[] = {
        {"cn: A\n", NULL, "cn: A\n"},
        {"cn: A\n", "add note=n", "cn: A\nnote: n\n"},
        {"note: a\n", "add note=b|a", "note: a\nnote: b\n"},
        {"note: a\n", "replace NOTE=b", "note: a\nnote: b\n"},
        {"note: a\n", "delete note", "note: a\n"},
        {"cn: A\n", "add cn=a", "cn: A\n"},
        {"oru-slapdPort: 389\n", "add oru-slapdPort=0389", "oru-slapdPort: 389\n"},
        {"# why\nnote: a\n", "add note=b; add cn=A", "cn: A\n# why\nnote: a\nnote: b\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, rows[i].before);
        if (add(f->handle, "CN=a,cn=CONFIGURATION", rows[i].mods) != CFG_SUCCESS) {
            fail_msg("%s: %s", rows[i].mods, cfg_dump_exception(f->handle));
        }
        assert_lines(f, rows[i].after);
    }
}

static void it_keeps_its_name_its_comment_and_its_children(void **state) {
    struct fixture *f = *state;
    load_entries(f, "# first\n" ENTRY("cn=A", "note: a\n") ENTRY("cn=B, cn=A", "note: b\n"));
    assert_int_equal(add(f->handle, "CN=a; cn=configuration", "add zeta=z"), CFG_SUCCESS);
    assert_entries(
        f, "# first\n" ENTRY("cn=A", "note: a\nzeta: z\n") ENTRY("cn=B, cn=A", "note: b\n"));
}

static void an_entry_that_has_another_single_value_is_left_as_it_is(void **state) {
    static const struct refusal expected = {19, 1006, "Attribute may not have multiple values.",
                                            "oru-slapdPort", "636"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\noru-slapdPort: 389\n");
    assert_int_equal(add(f->handle, A, "add note=n; add cn=A; add oru-slapdPort=636"),
                     CFG_CONSTRAINT_VIOLATION);
    assert_refused(f, A, &expected);
    assert_lines(f, "cn: A\noru-slapdPort: 389\n");
    assert_lines_in_memory(f->handle, A, "cn: A\noru-slapdPort: 389\n");
}

/* ---- refusals ---- */

static void a_refused_value_adds_nothing(void **state) {
    static const struct {
        const char *mods;
        struct refusal refusal;
    } rows[] = {
        {"add cn=a|b", {19, 1006, "Attribute may not have multiple values.", "cn", "b"}},
        {"add cn=a; add note=n; add CN=b",
         {19, 1006, "Attribute may not have multiple values.", "CN", "b"}},
        {"add note=n; add oru-slapdPort=many",
         {21, 1016, "Value is not valid integer syntax", "oru-slapdPort", "many"}},
        {"delete oru-slapdPort=0", {21, 1015, "Integer value out of range", "oru-slapdPort", "0"}},
        {"add oru-slapdReadOnly=maybe",
         {21, 1017, "value not one of attrType.enumValues", "oru-slapdReadOnly", "maybe"}},
        {"add oru-slapdMasterDN=cn=a,",
         {34, 1011, "Missing RDN attribute", "oru-slapdMasterDN", "cn=a,"}},
        {"add note=a\nb",
         {21, 1005, "Attribute would not read back as it is written", "note", "a\nb"}},
        {"add note=n; add dn=cn=x",
         {21, 1005, "Attribute would not read back as it is written", "dn", "cn=x"}},
        {"add a:b=c", {21, 1005, "Attribute would not read back as it is written", "a:b", "c"}},
        {"add #a=c", {21, 1005, "Attribute would not read back as it is written", "#a", "c"}},
        {"add note=a ", {21, 1005, "Attribute would not read back as it is written", "note", "a "}},
        {"add  x=c", {21, 1005, "Attribute would not read back as it is written", " x", "c"}},
    };
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        if (add(f->handle, NEW, rows[i].mods) != rows[i].refusal.code) {
            fail_msg("%s: %d", rows[i].mods, cfg_get_errno(f->handle));
        }
        assert_refused(f, NEW, &rows[i].refusal);
        assert_lines(f, "note: a\n");
        assert_int_equal(modify(f->handle, NEW, "add note=n"), CFG_NO_SUCH_OBJECT);
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, "note: a\n");
    }
}

static void a_name_that_would_not_read_back_is_refused_and_forgotten(void **state) {
    static const char *const rows[] = {"cn=a\nb, " TOP, "cn=a\\0Ab, " TOP, "cn=a\\0Db, " TOP,
                                       "cn=\"a\nb\", " TOP, "cn=\"a\\0Ab\", " TOP};
    struct fixture *f = *state;
    load_lines(f, "note: a\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(add(f->handle, rows[i], "add note=n"), CFG_INVALID_SYNTAX);
        assert_int_equal(cfg_get_exterror(f->handle), 1005);
        assert_report_has(f->handle, 21, "Entry would not read back as it is written");
        assert_lines(f, "note: a\n");
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, "note: a\n");
        assert_int_equal(cfg_delete_s(f->handle, rows[i]), CFG_NO_SUCH_OBJECT);
    }
}

static void a_name_with_an_empty_value_is_refused_and_forgotten(void **state) {
    static const char *const rows[] = {"cn=, " TOP, "cn=#, " TOP, "cn=\"\", " TOP};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "note: a\n");
        assert_int_equal(add(f->handle, rows[i], "add note=n"), 34);
        assert_int_equal(cfg_get_exterror(f->handle), 1013);
        assert_report_has(f->handle, 34, "Missing RDN attribute value");
        assert_lines(f, "note: a\n");
        must_modify(f->handle, A, "add note=b");
        assert_lines(f, "note: a\nnote: b\n");
    }
}

static void whitespace_at_the_ends_of_a_name_is_written_in_hexadecimal(void **state) {
    static const char *const rows[] = {"cn=\\0A", "cn=\\20a", "cn=\\09a\\0D"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char expected[64] = "dn: ";
        load_entries(f, "");
        assert_int_equal(add(f->handle, rows[i], NULL), CFG_SUCCESS);
        assert_entries(f, strcat(strcat(expected, rows[i]), "\n\n"));
        assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
        assert_int_equal(cfg_delete_s(f->handle, rows[i]), CFG_SUCCESS);
        assert_entries(f, "");
    }
}

static void the_empty_name_adds_to_the_lines_above_all_entries(void **state) {
    struct fixture *f = *state;
    load_entries(f, "");
    assert_int_equal(add(f->handle, "", "add version=1; add charset=utf-8"),
                     CFG_CONSTRAINT_VIOLATION);
    assert_int_equal(add(f->handle, "", "add version=1; add charset=UTF-8"), CFG_SUCCESS);
    assert_entries(f, "");
    assert_int_equal(add(f->handle, "", "add note=n"), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1005);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_entries(f, "");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(an_entry_is_added_with_its_attributes_sorted),
        CREATED(an_empty_array_of_records_adds_an_entry_without_attributes),
        CREATED(the_name_is_written_in_its_canonical_form),
        CREATED(an_entry_comes_after_its_siblings_and_their_children),
        CREATED(the_ancestors_need_not_be_there),
        CREATED(an_ancestor_that_comes_later_takes_its_place_above),
        CREATED(an_entry_that_is_there_takes_over_the_attributes),
        CREATED(it_keeps_its_name_its_comment_and_its_children),
        CREATED(an_entry_that_has_another_single_value_is_left_as_it_is),
        CREATED(a_refused_value_adds_nothing),
        CREATED(a_name_that_would_not_read_back_is_refused_and_forgotten),
        CREATED(a_name_with_an_empty_value_is_refused_and_forgotten),
        CREATED(whitespace_at_the_ends_of_a_name_is_written_in_hexadecimal),
        CREATED(the_empty_name_adds_to_the_lines_above_all_entries),
    };
    return cmocka_run_group_tests_name("cfg_add_s", tests, NULL, NULL);
}
