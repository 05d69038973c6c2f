#include <limits.h>
#include <string.h>

#include "fixture.h"

struct row {
    int code;
    const char *text;
};

static const struct row ldap_codes[] = {
    {0, "Success"},
    {1, "Operations error"},
    {2, "Protocol error"},
    {3, "Timelimit exceeded"},
    {4, "Sizelimit exceeded"},
    {5, "Compare false"},
    {6, "Compare true"},
    {7, "Strong authentication not supported"},
    {8, "Strong authentication required"},
    {9, "Partial results and referral received"},
    {16, "No such attribute"},
    {10, "Referral returned"},
    {11, "Administration limit exceeded"},
    {12, "Critical extension not supported"},
    {13, "Confidentiality is required"},
    {14, "SASL Bind in progress"},
    {17, "Undefined attribute type"},
    {18, "Inappropriate matching"},
    {19, "Constraint violation"},
    {20, "Type or value exists"},
    {21, "Invalid syntax"},
    {32, "No such object"},
    {33, "Alias problem"},
    {34, "Invalid DN syntax"},
    {35, "Object is a leaf"},
    {36, "Alias dereferencing problem"},
    {48, "Inappropriate authentication"},
    {49, "Invalid credentials"},
    {50, "Insufficient access"},
    {51, "DSA is busy"},
    {52, "DSA is unavailable"},
    {53, "DSA is unwilling to perform"},
    {54, "Loop detected"},
    {64, "Naming violation"},
    {65, "Object class violation"},
    {66, "Operation not allowed on nonleaf"},
    {67, "Operation not allowed on RDN"},
    {68, "Already exists"},
    {69, "Cannot modify object class"},
    {70, "Results too large"},
    {71, "Affects multiple DSAS"},
    {80, "Unknown error"},
    {81, "Can't contact LDAP server"},
    {82, "Local error"},
    {83, "Encoding error"},
    {84, "Decoding error"},
    {85, "Timed out"},
    {86, "Unknown authentication method"},
    {87, "Bad search filter"},
    {88, "User cancelled operation"},
    {89, "Bad parameter to an ldap routine"},
    {90, "Out of memory"},
    {91, "Connection error"},
    {92, "Not Supported"},
    {93, "Control not found"},
    {94, "No results returned"},
    {95, "More result to return"},
    {96, "URL doesn't begin with ldap://"},
    {97, "URL has no DN (required)"},
    {98, "URL scope string is invalid"},
    {99, "can't allocate memory space"},
    {100, "Client loop"},
    {101, "Referral limit exceeded"},
    {112, "ldap_ssl_client_init successfully called previously in this process."},
    {113, "SSL initialization call failed"},
    {114, "Call ldap_ssl_client_init before attempting to use an ssl connection"},
    {115, "An invalid ssl parameter was previously specified."},
    {116, "Failed to connect to ssl server."},
    {117, "Failed to identify the maximum SSL encryption level for this host."},
    {118, "The SSL library cannot be loaded."},
    {119, "SSL Keyring file not found"},
    {120, "SSL password not specified"},
    {128, "No explicit owner found"},
    {129, "Could not obtain lock"},
    {133, "LDAP servers found"},
    {134, "Truncated DNS results"},
    {135, "Invalid DNS data"},
    {136, "Can't resolve system domain or nameserver"},
    {137, "DNS Configuration file error"},
    {160, "Output buffer overflow"},
    {161, "Input buffer truncated"},
    {162, "Unusable input character"},
    {163, "No codeset point to map to"},
    {176, "NT Registry file not found"},
    {177, "Cannot open NT Registry"},
    {178, "Cannot find NT Registry entry"},
    {192, "Plugin configuration file not opened"},
    {193, "Plugin library not loaded"},
    {194, "Plugin function not resolved"},
    {195, "Plugin library not initialized"},
    {196, "Plugin function could not bind"},
    {208, "gss_init_sec_context failed"},
};

/* The text "Value is not a valid file name." can't be reached: its row bears the code 1001, too. */
static const struct row cfg_codes[] = {
    {1000, "Unexpected error in cfg32 API"},
    {1001, "Configuration filename is not valid."},
    {1002, "Configuration file format is not valid."},
    {1003, "Configuration file not found."},
    {1004, "Configuration file cannot be opened."},
    {1005, "Value is not valid."},
    {1006, "Attribute may not have multiple values."},
    {1007, "Attribute is not a member of object class."},
    {1008, "No binary representation is defined for attribute."},
    {1009, "No string representation is defined for attribute."},
    {1010, "Unknown operation in LDAPMod."},
    {1011, "DN is not valid (missing attribute name)."},
    {1012, "Attribute name in DN is not valid."},
    {1013, "DN is not valid (missing attribute value)."},
    {1014, "Attribute value in DN is not valid."},
    {1015, "Integer value is not within allowable range."},
    {1016, "Value is not a valid integer."},
    {1017, "Enumerated value is not one of allowable values."},
    {1018, "Length of value is not within allowable range."},
    {1019, "Bitfield value is not within allowable bitmask."},
    {1020, "Value is not a valid OID."},
    {1021, "Value is not a valid tcp/ip domain component."},
    {1022, "Value is not a valid URL."},
    {1023, "URL protocol is not one of allowable values."},
    {1024, "Value is not a valid kerberos DN."},
    {1025, "Value is not a valid environment string."},
    {1026, "Value is not a valid filesystem path."},
    {1027, "One or more directories in path not found."},
    {1028, "Directory access denied."},
    {1030, "File not found."},
    {1031, "File access denied."},
    {1032, "Error in plugin directive."},
    {1033, "Plugin library not found."},
    {1034, "Plugin library could not be loaded."},
    {1035, "Could not load init function from plugin library."},
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
