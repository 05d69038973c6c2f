/* cfg_msgfree and cfg_memfree. */

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fixture.h"

enum { many_entries = 50000, entry_size = 80, small_stack = 64 * 1024 };

static void a_null_result_gives_0(void **state) {
    (void)state;
    assert_int_equal(cfg_msgfree(NULL), CFG_SUCCESS);
}

static void it_frees_entries_attributes_and_values(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_SUBTREE, NULL, NULL);
    /* A sanitizer sees what is left. */
    assert_int_equal(cfg_msgfree(result), CFG_SUCCESS);
}

static void it_changes_no_handle(void **state) {
    struct fixture *f = *state;
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_SUBTREE, NULL, NULL);
    cfg_get_values(f->handle, result, "none");
    cfg_msgfree(result);
    assert_int_equal(cfg_get_errno(f->handle), CFG_NO_SUCH_ATTRIBUTE);
}

static void memfree_ignores_null(void **state) {
    (void)state;
    cfg_memfree(NULL);
}

static void memfree_frees_what_malloc_gave(void **state) {
    (void)state;
    cfg_memfree(malloc(100));
}

static char *configuration_of(int entries) {
    char *text = malloc(sizeof CONFIGURATION_HEAD + (size_t)entries * entry_size);
    assert_non_null(text);
    char *end = text + sprintf(text, "%s", CONFIGURATION_HEAD);
    for (int i = 0; i < entries; ++i) {
        end += sprintf(end, "\ndn: cn=%d, cn=Configuration\nobjectclass: top\n", i);
    }
    return text;
}

static void a_large_result_is_freed_on_a_small_stack(void **state) {
    struct fixture *f = *state;
    char *text = configuration_of(many_entries);
    load(f, text);
    free(text);
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_SUBTREE, NULL, NULL);
    assert_int_equal(cfg_count_entries(f->handle, result), many_entries + 1);
    free_on_a_stack_of(small_stack, result);
}

static void an_attribute_with_many_values_is_freed_on_a_small_stack(void **state) {
    struct fixture *f = *state;
    enum { values = 1000 };
    char *text = malloc(sizeof CONFIGURATION_HEAD + (size_t)values * 32);
    assert_non_null(text);
    char *end = text + sprintf(text, "%s", CONFIGURATION_HEAD);
    for (int i = 0; i < values; ++i) {
        end += sprintf(end, "number: %d\n", i);
    }
    load(f, text);
    free(text);
    CfgMessage *result = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
    free_on_a_stack_of(small_stack, result);
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(a_null_result_gives_0),
        BOUND(it_frees_entries_attributes_and_values),
        BOUND(it_changes_no_handle),
        cmocka_unit_test(memfree_ignores_null),
        cmocka_unit_test(memfree_frees_what_malloc_gave),
        CREATED(a_large_result_is_freed_on_a_small_stack),
        CREATED(an_attribute_with_many_values_is_freed_on_a_small_stack),
    };
    return cmocka_run_group_tests_name("cfg_msgfree", tests, NULL, NULL);
}
