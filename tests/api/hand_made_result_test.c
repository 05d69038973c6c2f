/*
 * The traversal calls on nodes that no search returns: attributes without values, nodes without a
 * text, attribute and value nodes in the place of entries. The nodes' layout is a secret of the
 * library; this is the one test that knows it.
 */

#include <stdlib.h>
#include <string.h>

#include "fixture.h"

enum { entry_kind, attribute_kind, value_kind };

struct node {
    int kind;
    char *text;
    struct node *child;
    struct node *next;
};

static struct node *node(int kind, const char *text, struct node *child, struct node *next) {
    struct node *made = calloc(1, sizeof *made);
    assert_non_null(made);
    made->kind = kind;
    made->text = text ? strdup(text) : NULL;
    made->child = child;
    made->next = next;
    return made;
}

static CfgMessage *message(struct node *node_) { return (CfgMessage *)node_; }

static void a_node_has_32_bytes(void **state) {
    (void)state;
    assert_int_equal(sizeof(struct node), 32);
}

static void an_attribute_without_values_is_no_error(void **state) {
    struct fixture *f = *state;
    struct node *entry = node(entry_kind, "cn=x", node(attribute_kind, "cn", NULL, NULL), NULL);
    assert_null(cfg_get_values(f->handle, message(entry), "cn"));
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_int_equal(cfg_count_attributes(f->handle, message(entry)), 1);
    cfg_msgfree(message(entry));
}

static void a_value_without_a_text_is_the_empty_text(void **state) {
    struct fixture *f = *state;
    struct node *values = node(value_kind, NULL, NULL, node(value_kind, "b", NULL, NULL));
    struct node *entry = node(entry_kind, "cn=x", node(attribute_kind, "cn", values, NULL), NULL);
    assert_values(f->handle, message(entry), "cn", "|b");
    cfg_msgfree(message(entry));
}

static void an_attribute_without_a_name_ends_the_names(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    struct node *entry = node(entry_kind, "cn=x", node(attribute_kind, NULL, NULL, NULL), NULL);
    assert_null(cfg_first_attribute(f->handle, message(entry), &cursor));
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_non_null(cursor);
    cfg_ber_free(cursor);
    cfg_msgfree(message(entry));

    entry = node(entry_kind, "cn=x",
                 node(attribute_kind, "cn", NULL, node(attribute_kind, NULL, NULL, NULL)), NULL);
    cfg_memfree(cfg_first_attribute(f->handle, message(entry), &cursor));
    assert_null(cfg_next_attribute(f->handle, message(entry), cursor));
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_ber_free(cursor);
    cfg_msgfree(message(entry));
}

static void only_an_entry_has_a_dn(void **state) {
    static const int kinds[] = {attribute_kind, value_kind, 3, -1};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(kinds); ++i) {
        struct node *other = node(kinds[i], "cn", NULL, NULL);
        assert_null(cfg_get_dn(f->handle, message(other)));
        assert_no_report(f->handle, CFG_PARAM_ERROR);
        assert_null(cfg_get_dn(NULL, message(other)));
        cfg_msgfree(message(other));
    }
}

static void an_entry_without_a_text_has_no_dn(void **state) {
    struct fixture *f = *state;
    struct node *entry = node(entry_kind, NULL, NULL, NULL);
    assert_null(cfg_get_dn(f->handle, message(entry)));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    cfg_msgfree(message(entry));
}

static void nodes_without_texts_can_be_freed(void **state) {
    (void)state;
    struct node *values = node(value_kind, NULL, NULL, node(value_kind, NULL, NULL, NULL));
    struct node *attributes =
        node(attribute_kind, NULL, values, node(attribute_kind, NULL, NULL, NULL));
    struct node *entries = node(entry_kind, NULL, attributes, node(entry_kind, NULL, NULL, NULL));
    assert_int_equal(cfg_msgfree(message(entries)), CFG_SUCCESS);
}

static void a_million_entries_can_be_freed(void **state) {
    struct node *first = NULL;
    (void)state;
    for (int i = 0; i < 1000000; ++i) {
        first = node(entry_kind, NULL, NULL, first);
    }
    free_on_a_stack_of((size_t)8 << 20, message(first));
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_node_has_32_bytes),
        CREATED(an_attribute_without_values_is_no_error),
        CREATED(a_value_without_a_text_is_the_empty_text),
        CREATED(an_attribute_without_a_name_ends_the_names),
        CREATED(only_an_entry_has_a_dn),
        CREATED(an_entry_without_a_text_has_no_dn),
        cmocka_unit_test(nodes_without_texts_can_be_freed),
        cmocka_unit_test(a_million_entries_can_be_freed),
    };
    return cmocka_run_group_tests_name("hand_made_result", tests, NULL, NULL);
}
