#include <locale.h>
#include <stdlib.h>
#include <string.h>

#include "fixture.h"

static void it_makes_a_handle_with_every_option_at_its_first_value(void **state) {
    static const struct {
        int option;
        int value;
    } booleans[] = {
        {CFG_OPT_FLAG_A, 1},
        {CFG_OPT_FLAG_B, 0},
        {CFG_OPT_SHOW_SOURCE, 0},
        {CFG_OPT_SHOW_STACK, 1},
        {CFG_OPT_DELETE_NON_LEAVES, 0},
    };
    static const int pointers[] = {CFG_OPT_CONFIG_FILE, CFG_OPT_BACKUP_FILE, CFG_OPT_KEY_DATA};
    (void)state;
    CfgHandle *handle = cfg_init();
    assert_non_null(handle);
    for (size_t i = 0; i < LENGTH(booleans); ++i) {
        int value = -1;
        assert_int_equal(cfg_get_option(handle, booleans[i].option, &value), CFG_SUCCESS);
        if (value != booleans[i].value) {
            fail_msg("option %d is %d", booleans[i].option, value);
        }
    }
    for (size_t i = 0; i < LENGTH(pointers); ++i) {
        void *value = &value;
        assert_int_equal(cfg_get_option(handle, pointers[i], &value), CFG_SUCCESS);
        assert_null(value);
    }
    cfg_unbind(handle);
}

static void it_makes_a_handle_without_an_error(void **state) {
    (void)state;
    CfgHandle *handle = cfg_init();
    assert_no_report(handle, CFG_SUCCESS);
    cfg_unbind(handle);
}

static void every_call_makes_a_handle_of_its_own(void **state) {
    int value = 0;
    (void)state;
    CfgHandle *one = cfg_init();
    CfgHandle *other = cfg_init();
    assert_ptr_not_equal(one, other);
    cfg_set_option(one, CFG_OPT_FLAG_B, CFG_OPT_ON);
    cfg_get_option(other, CFG_OPT_FLAG_B, &value);
    assert_int_equal(value, 0);
    cfg_unbind(one);
    cfg_unbind(other);
}

static void it_resets_the_options_that_all_handles_share(void **state) {
    int show_source = -1;
    int show_stack = -1;
    (void)state;
    CfgHandle *one = cfg_init();
    cfg_set_option(one, CFG_OPT_SHOW_SOURCE, CFG_OPT_ON);
    cfg_set_option(one, CFG_OPT_SHOW_STACK, CFG_OPT_OFF);
    CfgHandle *other = cfg_init();
    cfg_get_option(one, CFG_OPT_SHOW_SOURCE, &show_source);
    cfg_get_option(one, CFG_OPT_SHOW_STACK, &show_stack);
    assert_int_equal(show_source, 0);
    assert_int_equal(show_stack, 1);
    cfg_unbind(one);
    cfg_unbind(other);
}

static void it_sets_the_locale_from_the_environment(void **state) {
    static const char *const locales[] = {"C.UTF-8", "C"};
    const char *environment = getenv("LC_ALL");
    char *saved = environment ? strdup(environment) : NULL;
    (void)state;
    for (size_t i = 0; i < LENGTH(locales); ++i) {
        setenv("LC_ALL", locales[i], 1);
        cfg_unbind(cfg_init());
        assert_string_equal(setlocale(LC_ALL, NULL), locales[i]);
    }
    if (saved) {
        setenv("LC_ALL", saved, 1);
    } else {
        unsetenv("LC_ALL");
    }
    free(saved);
}

static void it_opens_no_file(void **state) {
    (void)state;
    setenv("NUV_INSTALL_PATH", "/nonexistent", 1);
    CfgHandle *handle = cfg_init();
    assert_non_null(handle);
    cfg_unbind(handle);
    unsetenv("NUV_INSTALL_PATH");
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(it_makes_a_handle_with_every_option_at_its_first_value),
        cmocka_unit_test(it_makes_a_handle_without_an_error),
        cmocka_unit_test(every_call_makes_a_handle_of_its_own),
        cmocka_unit_test(it_resets_the_options_that_all_handles_share),
        cmocka_unit_test(it_sets_the_locale_from_the_environment),
        cmocka_unit_test(it_opens_no_file),
    };
    return cmocka_run_group_tests_name("cfg_init", tests, NULL, NULL);
}
