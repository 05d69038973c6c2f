#include <limits.h>
#include <string.h>

#include "fixture.h"

struct row {
    int code;
    const char *text;
};

static const struct row ldap_codes[] = {
#include "../support/ldap_error_rows.inc"
};

/* The first row of a code counts: the text "Value is not a valid file name." can't be reached. */
static const struct row cfg_codes[] = {
#include "../support/cfg_error_rows.inc"
};

static const struct row *find(const struct row *rows, size_t count, int code) {
    for (size_t i = 0; i < count; ++i) {
        if (rows[i].code == code) {
            return &rows[i];
        }
    }
    return NULL;
}

static const char *expected(int code) {
    const struct row *row = code < 1000 ? find(ldap_codes, LENGTH(ldap_codes), code)
                                        : find(cfg_codes, LENGTH(cfg_codes), code);
    return row ? row->text : "Unknown error";
}

static void every_code_has_its_text_and_the_others_are_unknown(void **state) {
    (void)state;
    for (int code = -1500; code <= 2500; ++code) {
        const char *text = cfg_err2string(code);
        assert_non_null(text);
        if (strcmp(text, expected(code)) != 0) {
            fail_msg("%d: \"%s\", not \"%s\"", code, text, expected(code));
        }
    }
}

static void the_greatest_and_the_least_code_are_unknown(void **state) {
    (void)state;
    assert_string_equal(cfg_err2string(INT_MAX), "Unknown error");
    assert_string_equal(cfg_err2string(INT_MIN), "Unknown error");
}

static void the_text_is_static(void **state) {
    (void)state;
    assert_ptr_equal(cfg_err2string(32), cfg_err2string(32));
    assert_ptr_equal(cfg_err2string(1016), cfg_err2string(1016));
}

static void codes_that_stand_apart(void **state) {
    static const struct row rows[] = {
        {16, "No such attribute"},
        {15, "Unknown error"},
        {-1, "Unknown error"},
        {999, "Unknown error"},
        {80, "Unknown error"},
        {1000, "Unexpected error in cfg32 API"},
        {1001, "Configuration filename is not valid."},
        {1029, "Unknown error"},
        {1036, "Unknown error"},
    };
    (void)state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        assert_string_equal(cfg_err2string(rows[i].code), rows[i].text);
    }
}

int main(void) {
    const struct CMUnitTest tests[] = {
        cmocka_unit_test(every_code_has_its_text_and_the_others_are_unknown),
        cmocka_unit_test(the_greatest_and_the_least_code_are_unknown),
        cmocka_unit_test(the_text_is_static),
        cmocka_unit_test(codes_that_stand_apart),
    };
    return cmocka_run_group_tests_name("cfg_err2string", tests, NULL, NULL);
}
