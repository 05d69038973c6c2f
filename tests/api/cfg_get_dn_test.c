#include <string.h>

#include "fixture.h"

static void it_gives_the_dn_in_canonical_form(void **state) {
    static const struct {
        const char *written;
        const char *canonical;
    } rows[] = {
        {"CN=Print Server,O=Lab", "CN=Print Server, O=Lab"},
        {"cn=a;o=b", "cn=a, o=b"},
        {"sn=a+cn=b", "cn=b + sn=a"},
        {"oid.2.5.4.3=x", "2.5.4.3=x"},
        {"cn=#414243", "cn=#414243"},
        {"cn=\"a,b\"", "cn=\"a,b\""},
        {"cn=a\\,b", "cn=a\\,b"},
        {"cn=a\\2Cb", "cn=a\\,b"},
        {"cn=ab ,o=x", "cn=a\\20, o=x"},
    };
    struct fixture *f = *state;
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        char text[256];
        strcpy(text, "dn: ");
        strcat(text, rows[i].written);
        strcat(text, "\nobjectclass: top\n");
        write_configuration(f, text);
        assert_int_equal(cfg_bind_s(f->handle, NULL, NULL, CFG_AUTH_SIMPLE), CFG_SUCCESS);
        CfgMessage *entry = found(f->handle, "", CFG_SCOPE_ONELEVEL, NULL, NULL);
        char *dn = cfg_get_dn(f->handle, entry);
        assert_string_equal(dn, rows[i].canonical);
        cfg_memfree(dn);
        cfg_msgfree(entry);
    }
}

static void it_leaves_no_error(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
    cfg_memfree(cfg_get_dn(f->handle, entry));
    assert_no_report(f->handle, CFG_SUCCESS);
    cfg_msgfree(entry);
}

static void it_gives_a_copy_that_outlives_the_result(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
    char *one = cfg_get_dn(f->handle, entry);
    one[0] = 'X';
    char *two = cfg_get_dn(f->handle, entry);
    cfg_msgfree(entry);
    assert_string_equal(two, "cn=Configuration");
    cfg_memfree(one);
    cfg_memfree(two);
}

static void it_needs_no_handle(void **state) {
    struct fixture *f = *state;
    CfgMessage *entry = found(f->handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, NULL);
    char *dn = cfg_get_dn(NULL, entry);
    assert_string_equal(dn, "cn=Configuration");
    cfg_memfree(dn);
    cfg_msgfree(entry);
}

static void a_null_entry_gives_89(void **state) {
    struct fixture *f = *state;
    assert_null(cfg_get_dn(f->handle, NULL));
    assert_no_report(f->handle, CFG_PARAM_ERROR);
    assert_null(cfg_get_dn(NULL, NULL));
}

int main(void) {
    const struct CMUnitTest tests[] = {
        CREATED(it_gives_the_dn_in_canonical_form),
        BOUND(it_leaves_no_error),
        BOUND(it_gives_a_copy_that_outlives_the_result),
        BOUND(it_needs_no_handle),
        BOUND(a_null_entry_gives_89),
    };
    return cmocka_run_group_tests_name("cfg_get_dn", tests, NULL, NULL);
}
