/* cfg_first_attribute, cfg_next_attribute, cfg_count_attributes and cfg_ber_free. */

#include <string.h>

#include "fixture.h"

static CfgMessage *front_end(const struct fixture *f) {
    return found(f->handle, "cn=Front End, cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
}

static CfgMessage *without_attributes(const struct fixture *f) {
    char name[] = "none";
    char *attrs[] = {name, NULL};
    return found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, attrs);
}

static void a_walk_names_every_attribute_once(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_attributes(f->handle, entry, "cn description objectclass oru-slapdPort oru-slapdSetenv");
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(entry);
}

static void after_the_last_attribute_null_comes_again_and_again(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = front_end(f);
    cfg_memfree(cfg_first_attribute(f->handle, entry, &cursor));
    for (int i = 0; i < 4; ++i) {
        char *name = cfg_next_attribute(f->handle, entry, cursor);
        assert_non_null(name);
        cfg_memfree(name);
    }
    for (int i = 0; i < 3; ++i) {
        assert_null(cfg_next_attribute(f->handle, entry, cursor));
        assert_no_report(f->handle, CFG_SUCCESS);
    }
    cfg_ber_free(cursor);
    cfg_msgfree(entry);
}

static void a_walk_needs_no_handle(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_attributes(NULL, entry, "cn description objectclass oru-slapdPort oru-slapdSetenv");
    cfg_msgfree(entry);
}

static void the_cursor_knows_its_entry(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = front_end(f);
    CfgMessage *other = without_attributes(f);
    cfg_memfree(cfg_first_attribute(f->handle, entry, &cursor));
    char *name = cfg_next_attribute(f->handle, NULL, cursor);
    assert_string_equal(name, "description");
    cfg_memfree(name);
    name = cfg_next_attribute(f->handle, other, cursor);
    assert_string_equal(name, "objectclass");
    cfg_memfree(name);
    cfg_ber_free(cursor);
    cfg_msgfree(other);
    cfg_msgfree(entry);
}

static void cursors_of_one_entry_are_apart(void **state) {
    struct fixture *f = *state;
    CfgCursor *one = NULL;
    CfgCursor *two = NULL;
    CfgMessage *entry = front_end(f);
    cfg_memfree(cfg_first_attribute(f->handle, entry, &one));
    cfg_memfree(cfg_next_attribute(f->handle, entry, one));
    cfg_memfree(cfg_first_attribute(f->handle, entry, &two));
    assert_ptr_not_equal(one, two);
    char *name = cfg_next_attribute(f->handle, entry, two);
    assert_string_equal(name, "description");
    cfg_memfree(name);
    cfg_ber_free(one);
    name = cfg_next_attribute(f->handle, entry, two);
    assert_string_equal(name, "objectclass");
    cfg_memfree(name);
    cfg_ber_free(two);
    cfg_msgfree(entry);
}

static void names_are_copies(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = front_end(f);
    char *name = cfg_first_attribute(f->handle, entry, &cursor);
    strcpy(name, "xx");
    cfg_memfree(name);
    cfg_ber_free(cursor);
    assert_attributes(f->handle, entry, "cn description objectclass oru-slapdPort oru-slapdSetenv");
    cfg_msgfree(entry);
}

static void an_entry_without_attributes_is_no_error_and_gets_a_cursor(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = NULL;
    CfgMessage *entry = without_attributes(f);
    assert_null(cfg_first_attribute(f->handle, entry, &cursor));
    assert_no_report(f->handle, CFG_SUCCESS);
    assert_non_null(cursor);
    assert_null(cfg_next_attribute(f->handle, entry, cursor));
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_ber_free(cursor);
    cfg_msgfree(entry);
}

static void a_null_entry_gives_89_and_a_null_cursor(void **state) {
    struct fixture *f = *state;
    CfgCursor *cursor = (CfgCursor *)f;
    assert_null(cfg_first_attribute(f->handle, NULL, &cursor));
    assert_null(cursor);
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    cursor = (CfgCursor *)f;
    assert_null(cfg_first_attribute(NULL, NULL, &cursor));
    assert_null(cursor);
}

static void nowhere_to_put_the_cursor_gives_89(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_null(cfg_first_attribute(f->handle, entry, NULL));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    assert_null(cfg_first_attribute(f->handle, NULL, NULL));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    assert_null(cfg_first_attribute(NULL, entry, NULL));
    cfg_msgfree(entry);
}

static void a_null_cursor_gives_89(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_null(cfg_next_attribute(f->handle, entry, NULL));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    assert_null(cfg_next_attribute(NULL, entry, NULL));
    cfg_msgfree(entry);
}

static void attributes_are_counted(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    CfgMessage *empty = without_attributes(f);
    assert_int_equal(cfg_count_attributes(f->handle, entry), 5);
    assert_int_equal(cfg_count_attributes(f->handle, empty), 0);
    assert_int_equal(cfg_count_attributes(f->handle, NULL), 0);
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(empty);
    cfg_msgfree(entry);
}

static void counting_without_a_handle_gives_89_whatever_there_is(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_int_equal(cfg_count_attributes(NULL, entry), CFG_PARAM_ERROR);
    assert_int_equal(cfg_count_attributes(NULL, NULL), CFG_PARAM_ERROR);
    cfg_msgfree(entry);
}

static void freeing_a_null_cursor_does_nothing(void **state) {
    (void)state;
    cfg_ber_free(NULL);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        BOUND(a_walk_names_every_attribute_once),
        BOUND(after_the_last_attribute_null_comes_again_and_again),
        BOUND(a_walk_needs_no_handle),
        BOUND(the_cursor_knows_its_entry),
        BOUND(cursors_of_one_entry_are_apart),
        BOUND(names_are_copies),
        BOUND(an_entry_without_attributes_is_no_error_and_gets_a_cursor),
        BOUND(a_null_entry_gives_89_and_a_null_cursor),
        BOUND(nowhere_to_put_the_cursor_gives_89),
        BOUND(a_null_cursor_gives_89),
        BOUND(attributes_are_counted),
        BOUND(counting_without_a_handle_gives_89_whatever_there_is),
        cmocka_unit_test(freeing_a_null_cursor_does_nothing),
    };
    return cmocka_run_group_tests_name("cfg_first_attribute", tests, NULL, NULL);
}
