/* Which values a modification may bring. */

#include <stdlib.h>
#include <string.h>

#include "changes.h"

struct row {
    const char *before;
    const char *mods;
    struct refusal refusal;
};

/* Each row is refused, and the file keeps its lines; so does the handle, if it is to. */
static void assert_rows_are_refused(const struct fixture *f, const struct row *rows, size_t count,
                                    int keeps_memory) {
    for (size_t i = 0; i < count; ++i) {
        load_lines(f, rows[i].before);
        const int code = modify(f->handle, A, rows[i].mods);
        if (code != rows[i].refusal.code) {
            fail_msg("%s: %d", rows[i].mods, code);
        }
        assert_refused(f, A, &rows[i].refusal);
        assert_lines(f, rows[i].before);
        if (keeps_memory) {
            assert_lines_in_memory(f->handle, A, rows[i].before);
            assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
            assert_lines(f, rows[i].before);
        }
    }
}

/* ---- one value only ---- */

#define SECOND "Attribute may not have multiple values."

static void a_second_value_of_a_single_valued_attribute_is_refused(void **state) {
    static const struct row rows[] = {
        {"cn: A\n", "add cn=B", {19, 1006, SECOND, "cn", "B"}},
        {"cn: A\n", "add CN=a|B|C", {19, 1006, SECOND, "CN", "B"}},
        {"cn: A\n", "binary add cn=B", {19, 1006, SECOND, "cn", "B"}},
        {"cn: A\n", "replace cn=B|C", {19, 1006, SECOND, "cn", "C"}},
        {"cn: A\n", "replace cn=A|B", {19, 1006, SECOND, "cn", "B"}},
        {"cn: A\n", "add oru-slapdPort=389|+0389|636", {19, 1006, SECOND, "oru-slapdPort", "636"}},
        {"cn: A\noru-slapdPort: 389\n",
         "add oru-slapdPort=636",
         {19, 1006, SECOND, "oru-slapdPort", "636"}},
        {"cn: A\noru-slapdPort: 389\n",
         "replace oru-slapdPort=636|1636",
         {19, 1006, SECOND, "oru-slapdPort", "1636"}},
        {"cn: A\noru-slapdReadOnly: true\n",
         "add oru-slapdReadOnly=FALSE",
         {19, 1006, SECOND, "oru-slapdReadOnly", "FALSE"}},
        {"cn: A\noru-slapdMasterDN: cn=x, o=y\n",
         "add oru-slapdMasterDN=cn=z",
         {19, 1006, SECOND, "oru-slapdMasterDN", "cn=z"}},
    };
    assert_rows_are_refused(*state, rows, LENGTH(rows), 1);
}

static void the_report_of_a_second_value_has_the_constraint(void **state) {
    struct fixture *f = *state;
    load_lines(f, "oru-slapdPort: 389\n");
    assert_int_equal(modify(f->handle, A, "add oru-slapdPort=636"), CFG_CONSTRAINT_VIOLATION);
    assert_int_equal(cfg_get_is_single(f->handle), 1);
    assert_int_equal(cfg_get_minimum(f->handle), 1);
    assert_int_equal(cfg_get_maximum(f->handle), 65535);
    assert_report_has(f->handle, 19, "\nConstraints for oru-slapdPort\n  Single-valued\n");
}

static void the_value_that_is_there_is_no_second_one(void **state) {
    static const struct {
        const char *lines;
        const char *mods;
    } rows[] = {
        {"cn: A\n", "add cn=A"},
        {"cn: A\n", "add CN=a|A|a"},
        {"cn: A\n", "replace cn=A|a"},
        {"oru-slapdPort: 389\n", "add oru-slapdPort=+0389|389"},
        {"oru-slapdReadOnly: true\n", "add oru-slapdReadOnly=TRUE"},
        {"oru-slapdMasterDN: cn=x, o=y\n", "add oru-slapdMasterDN=CN=X;O=Y"},
        {"oru-slapdMasterDN: cn=x, o=y\n", "replace oru-slapdMasterDN=cn=x,o=y|CN=X;O=Y"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, rows[i].lines);
        must_modify(f->handle, A, rows[i].mods);
        assert_lines(f, rows[i].lines);
    }
}

/* Its canonical form would read back as another name, which counts only once it was read. */
static void a_name_of_several_pairs_that_is_there_is_no_second_value(void **state) {
    static const struct {
        const char *attribute;
        const char *mods;
    } rows[] = {
        {"oru-slapdMasterDN", "add oru-slapdMasterDN=cn=x+ou=y"},
        {"oru-slapdMasterDN", "add oru-slapdMasterDN=cn=x+ou=y|CN=X+OU=Y"},
        {"oru-slapdSuffix", "add oru-slapdSuffix=cn=x+ou=y"},
        {"oru-slapdSuffix", "add oru-slapdSuffix=cn=x+ou=y|CN=X+OU=Y"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "cn: A\n");
        must_modify(f->handle, A, rows[i].mods);
        char *once = read_file(f->config);
        must_modify(f->handle, A, rows[i].mods);
        assert_file(f->config, once);
        free(once);
        CfgMessage *entry = found(f->handle, A, CFG_SCOPE_BASE, "cn=*", NULL);
        char **values = cfg_get_values(f->handle, entry, rows[i].attribute);
        assert_int_equal(cfg_count_values(values), 1);
        cfg_value_free(values);
        cfg_msgfree(entry);
    }
}

static void a_single_value_may_go_before_another_comes(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    must_modify(f->handle, A, "delete cn=a; add cn=B");
    assert_lines(f, "cn: B\n");
    assert_int_equal(modify(f->handle, A, "add cn=C; delete cn=B"), CFG_CONSTRAINT_VIOLATION);
    assert_lines(f, "cn: B\n");
}

/* Somebody's file has two: they are kept, and each of them may be named again. */
static void a_file_with_two_values_of_a_single_valued_attribute_keeps_them(void **state) {
    static const struct refusal expected = {19, 1006, SECOND, "cn", "C"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\ncn: B\n");
    must_modify(f->handle, A, "add note=n");
    assert_lines(f, "cn: A\ncn: B\nnote: n\n");
    must_modify(f->handle, A, "add cn=b|a");
    assert_lines(f, "cn: A\ncn: B\nnote: n\n");
    assert_int_equal(modify(f->handle, A, "add cn=C"), CFG_CONSTRAINT_VIOLATION);
    assert_refused(f, A, &expected);
    must_modify(f->handle, A, "replace cn=C");
    assert_lines(f, "cn: C\nnote: n\n");
}

/* ---- syntax ---- */

#define NO_INTEGER "Value is not valid integer syntax"
#define OUT_OF_RANGE "Integer value out of range"
#define NO_WORD "value not one of attrType.enumValues"

static void an_added_value_that_its_syntax_refuses_changes_nothing(void **state) {
    static const struct row rows[] = {
        {"cn: A\n", "add oru-slapdPort=many", {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
        {"cn: A\n", "add oru-slapdPort=", {21, 1016, NO_INTEGER, "oru-slapdPort", ""}},
        {"cn: A\n", "add oru-slapdport=0", {21, 1015, OUT_OF_RANGE, "oru-slapdPort", "0"}},
        {"cn: A\n",
         "binary add oru-slapdPort=65536",
         {21, 1015, OUT_OF_RANGE, "oru-slapdPort", "65536"}},
        {"cn: A\noru-slapdPort: 389\n",
         "add oru-slapdPort=many",
         {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
        {"cn: A\n",
         "add oru-slapdReadOnly=maybe",
         {21, 1017, NO_WORD, "oru-slapdReadOnly", "maybe"}},
        {"cn: A\n",
         "add oru-slapdMasterDN==",
         {34, 1012, "Invalid attribute sytax: ", "oru-slapdMasterDN", "="}},
        {"cn: A\n",
         "add oru-slapdSuffix=o=a|cn",
         {34, 1013, "Missing RDN value: cn", "oru-slapdSuffix", "cn"}},
        /* Values to be deleted are compared by their syntax. */
        {"cn: A\noru-slapdPort: 389\n",
         "delete oru-slapdPort=many",
         {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
        {"cn: A\noru-slapdSuffix: o=A\n",
         "delete oru-slapdSuffix==",
         {34, 1012, "Invalid attribute sytax: ", "oru-slapdSuffix", "="}},
        /* An attribute that was not there is not there after a refused replacement. */
        {"cn: A\n", "replace oru-slapdPort=many", {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
    };
    assert_rows_are_refused(*state, rows, LENGTH(rows), 1);
}

static void the_report_has_what_the_attribute_allows(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    assert_int_equal(modify(f->handle, A, "add oru-slapdPort=0"), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_minimum(f->handle), 1);
    assert_int_equal(cfg_get_maximum(f->handle), 65535);
    assert_int_equal(modify(f->handle, A, "add oru-slapdSslCipherSpecs=255"), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1019);
    assert_int_equal(cfg_get_bitmask(f->handle), 0xff00);
    assert_int_equal(modify(f->handle, A, "add oru-slapdReadOnly=maybe"), CFG_INVALID_SYNTAX);
    const char *const *words = cfg_get_enum(f->handle);
    assert_non_null(words);
    assert_non_null(words[0]);
}

/* KEPT: the old values go before the new ones are looked at. */
static void a_replacement_that_its_syntax_refuses_leaves_the_attribute_without_values_in_memory(
    void **state) {
    static const struct row rows[] = {
        {"cn: A\noru-slapdPort: 389\n",
         "replace oru-slapdPort=many",
         {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
        {"cn: A\noru-slapdPort: 389\n",
         "replace oru-slapdPort=636|many",
         {21, 1016, NO_INTEGER, "oru-slapdPort", "many"}},
        {"cn: A\noru-slapdPort: 389\n",
         "binary replace oru-slapdPort=0",
         {21, 1015, OUT_OF_RANGE, "oru-slapdPort", "0"}},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_rows_are_refused(f, &rows[i], 1, 0);
        assert_lines_in_memory(f->handle, A, "cn: A\noru-slapdPort\n");
        /* The next change writes that. */
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, "cn: A\n");
        /* The empty attribute can still be replaced, added to and deleted. */
        must_modify(f->handle, A, "add oru-slapdPort=636");
        assert_lines(f, "cn: A\noru-slapdPort: 636\n");
    }
}

static void an_attribute_without_values_is_deleted_whatever_values_are_named(void **state) {
    static const char *const rows[] = {"delete oru-slapdPort=1", "delete oru-slapdPort",
                                       "binary delete oru-slapdPort=1|2", "replace oru-slapdPort"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "cn: A\noru-slapdPort: 389\n");
        assert_int_equal(modify(f->handle, A, "replace oru-slapdPort=many"), CFG_INVALID_SYNTAX);
        assert_int_equal(modify(f->handle, A, rows[i]), CFG_SUCCESS);
        assert_lines(f, "cn: A\n");
        assert_lines_in_memory(f->handle, A, "cn: A\n");
    }
}

static void an_attribute_that_was_emptied_takes_one_value_but_not_two(void **state) {
    static const struct refusal expected = {19, 1006, SECOND, "oru-slapdPort", "2"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\noru-slapdPort: 389\n");
    assert_int_equal(modify(f->handle, A, "replace oru-slapdPort=many"), CFG_INVALID_SYNTAX);
    assert_int_equal(modify(f->handle, A, "add oru-slapdPort=1|2"), CFG_CONSTRAINT_VIOLATION);
    assert_refused(f, A, &expected);
    assert_lines_in_memory(f->handle, A, "cn: A\noru-slapdPort\n");
    assert_lines(f, "cn: A\noru-slapdPort: 389\n");
    must_modify(f->handle, A, "add oru-slapdPort=1");
    assert_lines(f, "cn: A\noru-slapdPort: 1\n");
}

/* ---- what would not read back ---- */

#define NOT_READABLE "Attribute would not read back as it is written"

static void a_name_or_value_that_would_not_read_back_is_refused_and_forgotten(void **state) {
    static const struct row rows[] = {
        {"cn: A\n", "add =x", {21, 1005, NOT_READABLE, NULL, "x"}},
        {"cn: A\n", "add a:b=x", {21, 1005, NOT_READABLE, "a:b", "x"}},
        {"cn: A\n", "add :=x", {21, 1005, NOT_READABLE, ":", "x"}},
        {"cn: A\n", "add #x=x", {21, 1005, NOT_READABLE, "#x", "x"}},
        {"cn: A\n", "add x =x", {21, 1005, NOT_READABLE, "x ", "x"}},
        {"cn: A\n", "add  x=x", {21, 1005, NOT_READABLE, " x", "x"}},
        {"cn: A\n", "add \tx=x", {21, 1005, NOT_READABLE, "\tx", "x"}},
        {"cn: A\n", "add dn=x", {21, 1005, NOT_READABLE, "dn", "x"}},
        {"cn: A\n", "add DN=cn=A", {21, 1005, NOT_READABLE, "DN", "cn=A"}},
        {"cn: A\n", "add x\ny=x", {21, 1005, NOT_READABLE, "x\ny", "x"}},
        {"cn: A\n", "add x\r=x", {21, 1005, NOT_READABLE, "x\r", "x"}},
        {"cn: A\n", "add note=a\nb", {21, 1005, NOT_READABLE, "note", "a\nb"}},
        {"cn: A\n", "add note=a\n b", {21, 1005, NOT_READABLE, "note", "a\n b"}},
        {"cn: A\n", "add note=a\ndn: cn=b", {21, 1005, NOT_READABLE, "note", "a\ndn: cn=b"}},
        {"cn: A\n", "add note=\n", {21, 1005, NOT_READABLE, "note", "\n"}},
        {"cn: A\n", "add note=a\r", {21, 1005, NOT_READABLE, "note", "a\r"}},
        {"cn: A\n", "add note=a\rb", {21, 1005, NOT_READABLE, "note", "a\rb"}},
        {"cn: A\n", "add note= a", {21, 1005, NOT_READABLE, "note", " a"}},
        {"cn: A\n", "add note=a ", {21, 1005, NOT_READABLE, "note", "a "}},
        {"cn: A\n", "add note=\ta", {21, 1005, NOT_READABLE, "note", "\ta"}},
        {"cn: A\n", "add note=a\t", {21, 1005, NOT_READABLE, "note", "a\t"}},
        {"cn: A\n", "add note= ", {21, 1005, NOT_READABLE, "note", " "}},
        {"cn: A\n", "add note=good|bad ", {21, 1005, NOT_READABLE, "note", "bad "}},
        {"cn: A\n", "binary add note=a\nb", {21, 1005, NOT_READABLE, "note", "a\nb"}},
        /* A replacement does not touch the old value. */
        {"cn: A\nnote: a\n", "replace note=b\nc", {21, 1005, NOT_READABLE, "note", "b\nc"}},
        {"cn: A\nnote: a\n", "replace note= b", {21, 1005, NOT_READABLE, "note", " b"}},
    };
    assert_rows_are_refused(*state, rows, LENGTH(rows), 1);
}

static void names_and_values_that_do_read_back_are_taken(void **state) {
    static const struct {
        const char *mods;
        const char *lines;
    } rows[] = {
        {"add x y=z", "x y: z\n"},
        {"add x#=z", "x#: z\n"},
        {"add dna=z", "dna: z\n"},
        {"add d=n", "d: n\n"},
        {"add note=a  b\tc", "note: a  b\tc\n"},
        {"add note=#a", "note: #a\n"},
        {"add note=a:b", "note: a:b\n"},
        {"add note=dn: cn=x", "note: dn: cn=x\n"},
        {"add note=a\\", "note: a\\\n"},
        {"add oru-slapdInvalidLine=garbage:", "oru-slapdInvalidLine: garbage:\n"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        load_lines(f, "");
        must_modify(f->handle, A, rows[i].mods);
        assert_lines(f, rows[i].lines);
        /* And they do read back. */
        assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, rows[i].lines);
    }
}

/* A line reads what follows the first ":" and the colons right behind it. */
static void a_value_that_begins_with_a_colon_reads_back(void **state) {
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    must_modify(f->handle, A, "add note=:b");
    assert_lines(f, "cn: A\nnote: :b\n");
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_lines_in_memory(f->handle, A, "cn: A\nnote: :b\n");
}

static void text_of_another_character_set_is_refused(void **state) {
    REQUIRE_UTF8();
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    assert_int_equal(modify(f->handle, A, "add note=\xff"), 162);
    assert_non_null(cfg_dump_exception(f->handle));
    assert_int_equal(modify(f->handle, A, "add n\xff=x"), 162);
    assert_lines(f, "cn: A\n");
    assert_lines_in_memory(f->handle, A, "cn: A\n");
    must_modify(f->handle, A, "add note=Jörg, 東京");
    assert_lines(f, "cn: A\nnote: Jörg, 東京\n");
}

static void what_no_file_has_above_its_entries_is_refused(void **state) {
    static const char *const rows[] = {"add note=x", "replace cn=x", "add version=1; add note=x"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_int_equal(modify(f->handle, "", rows[i]), CFG_INVALID_SYNTAX);
        assert_int_equal(cfg_get_exterror(f->handle), 1005);
        assert_report_has(f->handle, 21, NOT_READABLE);
        assert_lines(f, "cn: A\n");
        assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
        assert_lines(f, "cn: A\n");
    }
}

/* The text above the administrator's entry. */
static void assert_lines_above_all_entries(const struct fixture *f, const char *expected) {
    char *text = read_file(f->config);
    char *end = strstr(text, "\ndn: " TOP "\n");
    assert_non_null(end);
    *end = '\0';
    assert_string_equal(text, expected);
    free(text);
}

static void one_of_them_is_refused_by_the_modification_that_brings_it(void **state) {
    static const struct refusal expected = {21, 1005, NOT_READABLE, "note", "x"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    assert_int_equal(
        modify(f->handle, "", "replace charset=ISO-8859-1; add note=x; replace charset=US-ASCII"),
        CFG_INVALID_SYNTAX);
    assert_refused(f, "", &expected);
    assert_lines(f, "cn: A\n");
    /* The modification before it was made, and those after it were not. */
    must_modify(f->handle, A, "add note=n");
    assert_lines_above_all_entries(f, "charset: ISO-8859-1\nversion: 1\n");
}

static void a_refused_version_leaves_none_and_hinders_no_later_change(void **state) {
    static const struct refusal expected = {21, 1015, OUT_OF_RANGE, "version", "2"};
    struct fixture *f = *state;
    load_lines(f, "cn: A\n");
    assert_int_equal(modify(f->handle, "", "replace version=2"), CFG_INVALID_SYNTAX);
    assert_refused(f, "", &expected);
    assert_lines(f, "cn: A\n");
    must_modify(f->handle, A, "add note=n");
    assert_lines_above_all_entries(f, "charset: UTF-8\n");
    assert_lines_in_memory(f->handle, A, "cn: A\nnote: n\n");
    /* The file can be loaded without one. */
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    must_modify(f->handle, A, "delete note");
    assert_lines_in_memory(f->handle, A, "cn: A\n");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(a_second_value_of_a_single_valued_attribute_is_refused),
        CREATED(the_report_of_a_second_value_has_the_constraint),
        CREATED(the_value_that_is_there_is_no_second_one),
        CREATED(a_name_of_several_pairs_that_is_there_is_no_second_value),
        CREATED(a_single_value_may_go_before_another_comes),
        CREATED(a_file_with_two_values_of_a_single_valued_attribute_keeps_them),
        CREATED(an_added_value_that_its_syntax_refuses_changes_nothing),
        CREATED(the_report_has_what_the_attribute_allows),
        CREATED(
            a_replacement_that_its_syntax_refuses_leaves_the_attribute_without_values_in_memory),
        CREATED(an_attribute_without_values_is_deleted_whatever_values_are_named),
        CREATED(an_attribute_that_was_emptied_takes_one_value_but_not_two),
        CREATED(a_name_or_value_that_would_not_read_back_is_refused_and_forgotten),
        CREATED(names_and_values_that_do_read_back_are_taken),
        CREATED(a_value_that_begins_with_a_colon_reads_back),
        CREATED(text_of_another_character_set_is_refused),
        CREATED(what_no_file_has_above_its_entries_is_refused),
        CREATED(one_of_them_is_refused_by_the_modification_that_brings_it),
        CREATED(a_refused_version_leaves_none_and_hinders_no_later_change),
    };
    return cmocka_run_group_tests_name("cfg_modify_s_values", tests, NULL, NULL);
}
