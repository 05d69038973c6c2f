/*
 * What the tests of the C interface share: a temporary folder with a configuration file, and a
 * handle for it. The tests know the library by cfg32.h alone.
 */
#ifndef CFG32_TESTS_API_FIXTURE_H
#define CFG32_TESTS_API_FIXTURE_H

#include <setjmp.h>
#include <stdarg.h>
#include <stddef.h>
#include <stdint.h>

#include <cmocka.h>

#include "cfg32.h"

#define LENGTH(array) (sizeof(array) / sizeof *(array))

/** The administrator of the standard configuration. */
#define ADMINISTRATOR "cn=root"
#define PASSWORD "correct horse"

/** Begins a configuration: the file-level lines and the administrator's entry, left open. */
#define CONFIGURATION_HEAD        \
    "version: 1\n"                \
    "charset: UTF-8\n"            \
    "\n"                          \
    "dn: cn=Configuration\n"      \
    "cn: Configuration\n"         \
    "objectclass: top\n"          \
    "objectclass: oruTop\n"       \
    "oru-slapdAdminDN: cn=root\n" \
    "oru-slapdAdminPW: " PASSWORD "\n"

/** CONFIGURATION_HEAD and a few entries; see fixture.c. */
extern const char *const standard_configuration;

struct fixture {
    char folder[128];
    char config[192];  /**< the configuration file, in the folder */
    CfgHandle *handle; /**< a test that unbinds it sets it to null */
};

/** A handle for the standard configuration, not bound. */
int set_up(void **state);
/** The same, bound as administrator. */
int set_up_bound(void **state);
int tear_down(void **state);

#define CREATED(test) cmocka_unit_test_setup_teardown(test, set_up, tear_down)
#define BOUND(test) cmocka_unit_test_setup_teardown(test, set_up_bound, tear_down)

/** Skips a test about text that only a UTF-8 locale has. */
#define REQUIRE_UTF8()    \
    do {                  \
        if (!is_utf8()) { \
            skip();       \
        }                 \
    } while (0)
int is_utf8(void);

/* Files */

/** The path of a file in the folder, to be freed. */
char *path_of(const struct fixture *f, const char *name);
/** Writes a file; its modification time differs from that of every one written before. */
void write_file(const char *path, const char *text);
/** Writes the configuration file. */
void write_configuration(const struct fixture *f, const char *text);
/** The text of a file, to be freed; fails the test if it is not there. */
char *read_file(const char *path);
int file_exists(const char *path);

/* Handles */

/** cfg_bind_s as administrator. */
int bind_administrator(CfgHandle *handle);
/** Writes the configuration and binds as administrator; both must succeed. */
void load(const struct fixture *f, const char *text);
/** A search that must succeed. */
CfgMessage *found(CfgHandle *handle, const char *base, int scope, const char *filter, char **attrs);
/** The result code of a subtree search; what it finds is freed. */
int search_below(CfgHandle *handle, const char *base, const char *filter);
/** The same of the whole configuration. */
int search_all(CfgHandle *handle);
/** cfg_modify_s with one modification, of one value; a null value is none. */
int modify_one(CfgHandle *handle, const char *dn, int operation, const char *name,
               const char *value);

/* Expectations */

/** The text is the expected one, or both are null. */
void assert_text(const char *text, const char *expected);
/** The handle holds the code, and a report that has the text. */
void assert_report_has(CfgHandle *handle, int code, const char *text);
/** The handle holds the code and no report. */
void assert_no_report(CfgHandle *handle, int code);
/** The report's text, with "#" for the line numbers of source positions; to be freed. */
char *report_without_lines(CfgHandle *handle);
/** The DNs of a result, each followed by a newline, are these. */
void assert_dns(CfgHandle *handle, CfgMessage *result, const char *expected);
/** The names of an entry's attributes, joined by blanks, are these. */
void assert_attributes(CfgHandle *handle, CfgMessage *entry, const char *expected);
/** The values of an attribute, joined by "|", are these. */
void assert_values(CfgHandle *handle, CfgMessage *entry, const char *attribute,
                   const char *expected);

/** Frees a result in a thread with a stack of so many bytes. */
void free_on_a_stack_of(size_t size, CfgMessage *result);

#endif
