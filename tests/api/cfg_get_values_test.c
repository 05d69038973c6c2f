/* cfg_get_values, cfg_count_values and cfg_value_free. */

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fixture.h"

#define BASE "cn=Configuration"

static CfgMessage *front_end(const struct fixture *f) {
    return found(f->handle, "cn=Front End, " BASE, CFG_SCOPE_BASE, NULL, NULL);
}

/* The administrator's entry with this many values, "1" to "<count>", of the attribute number. */
static CfgMessage *entry_with_values(const struct fixture *f, int count) {
    char *text = malloc(strlen(CONFIGURATION_HEAD) + (size_t)count * 32 + 1);
    assert_non_null(text);
    char *end = text + sprintf(text, "%s", CONFIGURATION_HEAD);
    for (int i = 1; i <= count; ++i) {
        end += sprintf(end, "number: %d\n", i);
    }
    load(f, text);
    free(text);
    return found(f->handle, BASE, CFG_SCOPE_BASE, NULL, NULL);
}

static void values_come_in_the_order_of_the_file(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_values(f->handle, entry, "oru-slapdSetenv", "TZ=Europe/Berlin|A=first");
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(entry);
}

static void names_are_compared_without_case(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_values(f->handle, entry, "OBJECTCLASS", "top");
    assert_values(f->handle, entry, "oRu-SlapdPORT", "389");
    cfg_msgfree(entry);
}

static void a_missing_attribute_gives_16(void **state) {
    static const char *const names[] = {"none", "", "c", "cn ", "cnx"};
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    for (size_t i = 0; i < LENGTH(names); ++i) {
        assert_null(cfg_get_values(f->handle, entry, names[i]));
        assert_no_report(f->handle, CFG_NO_SUCH_ATTRIBUTE);
    }
    assert_null(cfg_get_values(NULL, entry, "none"));
    cfg_msgfree(entry);
}

static void an_entry_without_attributes_gives_16(void **state) {
    char name[] = "none";
    char *attrs[] = {name, NULL};
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, BASE, CFG_SCOPE_BASE, NULL, attrs);
    assert_null(cfg_get_values(f->handle, entry, "cn"));
    assert_no_report(f->handle, CFG_NO_SUCH_ATTRIBUTE);
    cfg_msgfree(entry);
}

static void a_null_entry_gives_89(void **state) {
    struct fixture *f = *state;
    assert_null(cfg_get_values(f->handle, NULL, "cn"));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    assert_null(cfg_get_values(NULL, NULL, "cn"));
}

static void a_null_name_gives_89(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    assert_null(cfg_get_values(f->handle, entry, NULL));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    cfg_msgfree(entry);
}

static void values_are_copies_that_outlive_the_result(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = front_end(f);
    char **one = cfg_get_values(f->handle, entry, "oru-slapdPort");
    strcpy(one[0], "xxx");
    char **two = cfg_get_values(f->handle, entry, "oru-slapdPort");
    cfg_msgfree(entry);
    assert_string_equal(two[0], "389");
    cfg_value_free(one);
    cfg_value_free(two);
}

static void without_a_handle_89_values_are_counted_whatever_there_is(void **state) {
    static const struct {
        int there;
        int returned;
    } rows[] = {{1, 0}, {88, 0}, {89, 89}, {90, 89}, {200, 89}};
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        CfgMessage *entry = entry_with_values(f, rows[i].there);
        char **values = cfg_get_values(NULL, entry, "number");
        assert_int_equal(cfg_count_values(values), rows[i].returned);
        if (rows[i].returned == 0) {
            assert_null(values);
        } else {
            assert_string_equal(values[0], "1");
            assert_string_equal(values[88], "89");
        }
        cfg_value_free(values);

        values = cfg_get_values(f->handle, entry, "number");
        assert_int_equal(cfg_count_values(values), rows[i].there);
        cfg_value_free(values);
        cfg_msgfree(entry);
    }
}

static void values_are_counted_to_the_null(void **state) {
    char value[] = "";
    char *none[] = {NULL};
    char *three[] = {value, value, value, NULL, value, NULL};
    (void)state;
    assert_int_equal(cfg_count_values(NULL), 0);
    assert_int_equal(cfg_count_values(none), 0);
    assert_int_equal(cfg_count_values(three), 3);
}

static void an_array_is_freed_to_the_null(void **state) {
    (void)state;
    cfg_value_free(NULL);
    cfg_value_free(calloc(1, sizeof(char *)));
    char **values = calloc(3, sizeof *values);
    assert_non_null(values);
    values[0] = strdup("one");
    values[1] = strdup("two");
    cfg_value_free(values);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        BOUND(values_come_in_the_order_of_the_file),
        BOUND(names_are_compared_without_case),
        BOUND(a_missing_attribute_gives_16),
        BOUND(an_entry_without_attributes_gives_16),
        BOUND(a_null_entry_gives_89),
        BOUND(a_null_name_gives_89),
        BOUND(values_are_copies_that_outlive_the_result),
        CREATED(without_a_handle_89_values_are_counted_whatever_there_is),
        cmocka_unit_test(values_are_counted_to_the_null),
        cmocka_unit_test(an_array_is_freed_to_the_null),
    };
    return cmocka_run_group_tests_name("cfg_get_values", tests, NULL, NULL);
}
