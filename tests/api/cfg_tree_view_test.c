/* cfg_tree_view draws every entry, and those that are missing above one. */

#include <stdlib.h>
#include <string.h>

#include "fixture.h"

#define BASE "cn=Configuration"

/* Line-drawing bytes of code page 437. */
#define CORNER "\xC0\xC4 "
#define TEE "\xC3\xC4 "
#define DASH "\xC4 "
#define BAR "\xB3"

static const char plain_standard_tree[] =
    "\n"
    "- cn=Configuration (suffix)\n"
    "    |\n"
    "    +- cn=Front End\n"
    "    |    |\n"
    "    |    +- cn=Caches\n"
    "    |\n"
    "    +- cn=Replicas\n";

static const char boxed_standard_tree[] = "\n" DASH
                                          "cn=Configuration (suffix)\n"
                                          "    " TEE
                                          "cn=Front End\n"
                                          "    " BAR "    " CORNER
                                          "cn=Caches\n"
                                          "    " CORNER "cn=Replicas\n";

/* Ancestors are missing below an entry, below nothing, and twice the same ones. */
static const char gaps[] = CONFIGURATION_HEAD
    "\n"
    "dn: cn=x, cn=Gone, cn=Away, cn=Configuration\nobjectclass: top\n\n"
    "dn: cn=y, cn=Gone, cn=Away, cn=Configuration\nobjectclass: top\n\n"
    "dn: cn=Last, cn=Configuration\nobjectclass: top\n\n"
    "dn: cn=Leaf, cn=Lost, cn=Last, cn=Configuration\nobjectclass: top\n\n"
    "dn: CN=Child, cn=Leaf, cn=Lost, cn=Last, cn=Configuration\nobjectclass: top\n\n"
    "dn: ou=People, o=Elsewhere\nobjectclass: top\n\n"
    "dn: cn=One, ou=People, o=Elsewhere\nobjectclass: top\n";

static const char undefined_entries[] =
    "\n"
    "* the following entries are undefined:\n"
    "cn=Gone, cn=Away, cn=Configuration\n"
    "cn=Away, cn=Configuration\n"
    "cn=Lost, cn=Last, cn=Configuration\n";

static const char plain_gaps[] =
    "\n"
    "- cn=Configuration (suffix)\n"
    "    |\n"
    "    +- cn=x, cn=Gone, cn=Away *\n"
    "    |\n"
    "    +- cn=y, cn=Gone, cn=Away *\n"
    "    |\n"
    "    +- cn=Last\n"
    "         |\n"
    "         +- cn=Leaf, cn=Lost *\n"
    "              |\n"
    "              +- CN=Child\n"
    "\n"
    "- ou=People, o=Elsewhere (suffix)\n"
    "    |\n"
    "    +- cn=One\n";

static const char boxed_gaps[] = "\n" DASH
                                 "cn=Configuration (suffix)\n"
                                 "    " TEE
                                 "cn=x, cn=Gone, cn=Away *\n"
                                 "    " TEE
                                 "cn=y, cn=Gone, cn=Away *\n"
                                 "    " CORNER
                                 "cn=Last\n"
                                 "         " CORNER
                                 "cn=Leaf, cn=Lost *\n"
                                 "              " CORNER
                                 "CN=Child\n"
                                 "\n" DASH
                                 "ou=People, o=Elsewhere (suffix)\n"
                                 "    " CORNER "cn=One\n";

/* An entry that can be loaded, but has no DN that could be printed. */
static const char unprintable[] =
    CONFIGURATION_HEAD "\ndn: cn=\"\", cn=Configuration\nobjectclass: top\n";

/* ---- the drawing ---- */

static void entries_are_drawn_in_plain_characters(void **state) {
    struct fixture *f = *state;
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
}

static void every_other_style_draws_in_code_page_437(void **state) {
    static const int styles[] = {CFG_TREE_CP437, 2, -1, 1 << 30};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(styles); ++i) {
        cfg_reset(f->handle);
        assert_text(cfg_tree_view(f->handle, styles[i]), boxed_standard_tree);
    }
}

static void missing_ancestors_are_marked_and_listed(void **state) {
    static const struct {
        int style;
        const char *tree;
    } rows[] = {{CFG_TREE_ASCII, plain_gaps}, {CFG_TREE_CP437, boxed_gaps}};
    struct fixture *f = *state;
    load(f, gaps);
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char expected[1024];
        strcpy(expected, rows[i].tree);
        strcat(expected, undefined_entries);
        cfg_reset(f->handle);
        assert_text(cfg_tree_view(f->handle, rows[i].style), expected);
    }
}

static void a_file_without_entries_is_an_empty_drawing(void **state) {
    static const char *const texts[] = {"", "# nothing\n", "version: 1\ncharset: UTF-8\n"};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(texts); ++i) {
        for (int style = CFG_TREE_ASCII; style <= CFG_TREE_CP437; ++style) {
            write_configuration(f, texts[i]);
            assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
            assert_text(cfg_tree_view(f->handle, style), "");
        }
    }
}

static void names_of_every_language_are_drawn_as_they_are(void **state) {
    struct fixture *f = *state;
    REQUIRE_UTF8();
    load(f, CONFIGURATION_HEAD
         "\ndn: cn=M\xC3\xBCnchen\\, S\xC3\xBC"
         "d," BASE "\ncn: x\n");
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII),
                "\n"
                "- cn=Configuration (suffix)\n"
                "    |\n"
                "    +- cn=M\xC3\xBCnchen\\, S\xC3\xBC"
                "d\n");
}

/* ---- what is drawn ---- */

static void without_a_bound_handle_there_is_no_drawing(void **state) {
    struct fixture *f = *state;
    assert_null(cfg_tree_view(NULL, CFG_TREE_ASCII));
    assert_null(cfg_tree_view(f->handle, CFG_TREE_ASCII));
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, 0), CFG_AUTH_UNKNOWN);
    assert_null(cfg_tree_view(f->handle, CFG_TREE_CP437));
    assert_report_has(f->handle, CFG_AUTH_UNKNOWN, "Bind method");
}

static void while_the_name_is_null_nothing_is_drawn(void **state) {
    struct fixture *f = *state;
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_null(cfg_tree_view(f->handle, CFG_TREE_ASCII));
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, f->config);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
}

static void what_was_drawn_before_the_name_was_null_stays(void **state) {
    struct fixture *f = *state;
    const char *tree = cfg_tree_view(f->handle, CFG_TREE_ASCII);
    cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, NULL);
    assert_ptr_equal(cfg_tree_view(f->handle, CFG_TREE_ASCII), tree);
}

static void an_anonymous_handle_draws_too(void **state) {
    struct fixture *f = *state;
    assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
}

static void a_change_of_the_handle_is_drawn(void **state) {
    struct fixture *f = *state;
    assert_non_null(cfg_tree_view(f->handle, CFG_TREE_ASCII));
    assert_int_equal(cfg_delete_s(f->handle, "cn=Caches, cn=Front End, " BASE), CFG_SUCCESS);
    assert_int_equal(cfg_add_s(f->handle, "cn=New, " BASE, NULL), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII),
                "\n"
                "- cn=Configuration (suffix)\n"
                "    |\n"
                "    +- cn=Front End\n"
                "    |\n"
                "    +- cn=Replicas\n"
                "    |\n"
                "    +- cn=New\n");
}

static void a_changed_file_is_drawn_when_another_call_has_read_it(void **state) {
    struct fixture *f = *state;
    write_configuration(f, CONFIGURATION_HEAD);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), "\n- cn=Configuration (suffix)\n");
}

/* ---- how long the text stays ---- */

static void the_same_text_is_returned_whatever_the_style(void **state) {
    struct fixture *f = *state;
    const char *tree = cfg_tree_view(f->handle, CFG_TREE_CP437);
    assert_ptr_equal(cfg_tree_view(f->handle, CFG_TREE_CP437), tree);
    assert_ptr_equal(cfg_tree_view(f->handle, CFG_TREE_ASCII), tree);
    assert_text(tree, boxed_standard_tree);
    cfg_reset(f->handle);
    tree = cfg_tree_view(f->handle, CFG_TREE_ASCII);
    assert_ptr_equal(cfg_tree_view(f->handle, CFG_TREE_CP437), tree);
    assert_text(tree, plain_standard_tree);
}

static void the_next_call_that_resets_forgets_the_text(void **state) {
    struct fixture *f = *state;
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
    assert_int_equal(search_all(f->handle), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_CP437), boxed_standard_tree);
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_CP437), boxed_standard_tree);
    assert_int_equal(cfg_flush_s(f->handle), CFG_SUCCESS);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
}

static void the_calls_that_reset_nothing_keep_the_text(void **state) {
    struct fixture *f = *state;
    int flag = 0;
    assert_int_equal(search_below(f->handle, "cn=none", NULL), CFG_NO_SUCH_OBJECT);
    const char *tree = cfg_tree_view(f->handle, CFG_TREE_ASCII);
    cfg_get_errno(f->handle);
    cfg_get_exterror(f->handle);
    cfg_dump_exception(f->handle);
    cfg_get_file_name(f->handle);
    cfg_get_file_line(f->handle);
    cfg_get_entry(f->handle);
    cfg_get_attribute(f->handle);
    cfg_get_value(f->handle);
    cfg_get_enum(f->handle);
    cfg_get_bitmask(f->handle);
    cfg_get_minimum(f->handle);
    cfg_get_maximum(f->handle);
    cfg_get_is_single(f->handle);
    cfg_get_option(f->handle, CFG_OPT_FLAG_A, &flag);
    cfg_set_option(f->handle, CFG_OPT_FLAG_A, CFG_OPT_OFF);
    assert_ptr_equal(cfg_tree_view(f->handle, CFG_TREE_ASCII), tree);
    assert_text(tree, plain_standard_tree);
}

/* ---- failures ---- */

static void a_drawing_keeps_the_failure_of_the_call_before(void **state) {
    struct fixture *f = *state;
    assert_int_equal(modify_one(f->handle, BASE, LDAP_MOD_ADD, "oru-slapdPort", "0"),
                     CFG_INVALID_SYNTAX);
    const char *report = cfg_dump_exception(f->handle);
    const char *value = cfg_get_value(f->handle);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
    assert_int_equal(cfg_get_errno(f->handle), CFG_INVALID_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1015);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
    assert_ptr_equal(cfg_get_value(f->handle), value);
    assert_int_equal(cfg_get_maximum(f->handle), 65535);
}

static void a_dn_that_can_not_be_printed_gives_null_and_flush_tells_it(void **state) {
    struct fixture *f = *state;
    load(f, unprintable);
    for (int style = CFG_TREE_ASCII; style <= CFG_TREE_CP437; ++style) {
        assert_null(cfg_tree_view(f->handle, style));
        assert_no_report(f->handle, CFG_SUCCESS);
    }
    assert_int_equal(cfg_flush_s(f->handle), CFG_INVALID_DN_SYNTAX);
    assert_int_equal(cfg_get_exterror(f->handle), 1013);
    assert_report_has(f->handle, CFG_INVALID_DN_SYNTAX, "msg     Missing RDN attribute value");
    load(f, standard_configuration);
    assert_text(cfg_tree_view(f->handle, CFG_TREE_ASCII), plain_standard_tree);
}

static void a_failed_drawing_keeps_the_failure_of_the_call_before(void **state) {
    struct fixture *f = *state;
    load(f, unprintable);
    assert_int_equal(modify_one(f->handle, BASE, LDAP_MOD_ADD, "oru-slapdPort", "0"),
                     CFG_INVALID_SYNTAX);
    const char *report = cfg_dump_exception(f->handle);
    const char *value = cfg_get_value(f->handle);
    assert_null(cfg_tree_view(f->handle, CFG_TREE_ASCII));
    assert_int_equal(cfg_get_exterror(f->handle), 1015);
    assert_ptr_equal(cfg_dump_exception(f->handle), report);
    assert_ptr_equal(cfg_get_value(f->handle), value);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        BOUND(entries_are_drawn_in_plain_characters),
        BOUND(every_other_style_draws_in_code_page_437),
        CREATED(missing_ancestors_are_marked_and_listed),
        CREATED(a_file_without_entries_is_an_empty_drawing),
        CREATED(names_of_every_language_are_drawn_as_they_are),
        CREATED(without_a_bound_handle_there_is_no_drawing),
        BOUND(while_the_name_is_null_nothing_is_drawn),
        BOUND(what_was_drawn_before_the_name_was_null_stays),
        CREATED(an_anonymous_handle_draws_too),
        BOUND(a_change_of_the_handle_is_drawn),
        BOUND(a_changed_file_is_drawn_when_another_call_has_read_it),
        BOUND(the_same_text_is_returned_whatever_the_style),
        BOUND(the_next_call_that_resets_forgets_the_text),
        BOUND(the_calls_that_reset_nothing_keep_the_text),
        BOUND(a_drawing_keeps_the_failure_of_the_call_before),
        CREATED(a_dn_that_can_not_be_printed_gives_null_and_flush_tells_it),
        CREATED(a_failed_drawing_keeps_the_failure_of_the_call_before),
    };
    return cmocka_run_group_tests_name("cfg_tree_view", tests, NULL, NULL);
}
