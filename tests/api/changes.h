/*
 * What the tests of the calls that change the configuration share: modification records written as
 * a line of text, a configuration that a rewrite leaves as it is, and the four calls as a table.
 */
#ifndef CFG32_TESTS_API_CHANGES_H
#define CFG32_TESTS_API_CHANGES_H

#include "fixture.h"

/* Modification records */

/**
 * The records that a text tells, for free_mods(); null for null.
 *
 *   "replace cn=x; add note=a|b; delete note; binary add note=c; 0x3 note"
 *
 * A record without "=" has no values (a null pointer), one that ends with "=" an empty one. A
 * number in the place of the operation is the code itself.
 */
LDAPMod **mods_of(const char *text);
void free_mods(LDAPMod **mods);

/** cfg_modify_s with the records of a text. */
int modify(CfgHandle *handle, const char *dn, const char *mods);
/** The same; it must succeed. */
void must_modify(CfgHandle *handle, const char *dn, const char *mods);
/** cfg_add_s with the records of a text. */
int add(CfgHandle *handle, const char *dn, const char *mods);

/* Configurations: the administrator's entry and entries below it, in canonical form, so that a
 * rewrite changes nothing but what was asked for. */

#define TOP "cn=Configuration"
/** An entry below the administrator's. */
#define ENTRY(name, lines) "dn: " name ", " TOP "\n" lines "\n"
/** The entry of the tests that need one only. */
#define A "cn=A, " TOP
#define A_LINES(lines) ENTRY("cn=A", lines)

/** The whole text of a configuration with these entries, to be freed. */
char *configuration_of(const char *entries);
void write_entries(const struct fixture *f, const char *entries);
/** Writes them and binds as administrator. */
void load_entries(const struct fixture *f, const char *entries);
/** The entry A alone, with these lines. */
void load_lines(const struct fixture *f, const char *lines);

/** The file has this text. */
void assert_file(const char *path, const char *expected);
/** The configuration file has these entries, and not a byte more. */
void assert_entries(const struct fixture *f, const char *expected);
void assert_lines(const struct fixture *f, const char *expected);
/** The lines of an entry as searches of the handle see it; an attribute without values is its name
 * alone. */
void assert_lines_in_memory(CfgHandle *handle, const char *dn, const char *expected);

/** The last call failed like this, about this entry of the fixture's file. */
struct refusal {
    int code;
    int extended;
    const char *message;
    const char *attribute; /**< null for none */
    const char *value;
};
void assert_refused(const struct fixture *f, const char *dn, const struct refusal *expected);

/* The calls */

/** What update_calls change. */
extern const char *const update_entries;

/** Each of the four calls with a change that it makes to update_entries. */
struct update_call {
    const char *name;
    int (*run)(CfgHandle *handle);
    const char *after; /**< the entries, once the call was made */
};
extern const struct update_call update_calls[4];

#define FOR_EACH_UPDATE_CALL(call)                      \
    for (const struct update_call *call = update_calls; \
         call < update_calls + LENGTH(update_calls); ++call)

/** Makes the call, which must succeed. */
void must_succeed(CfgHandle *handle, const struct update_call *call);

/** The same; the configuration file has then what the call leaves. */
void must_change(const struct fixture *f, const struct update_call *call);
/** Makes the call, which must fail like this. */
void must_fail(const struct fixture *f, const struct update_call *call, int code, int extended,
               const char *message, int error);

/** Names a file of the folder as the backup, from the next bind on; its path, to be freed. */
char *set_backup(const struct fixture *f, const char *name);
/** Another handle for the fixture's file, bound as administrator. */
CfgHandle *second_handle(const struct fixture *f);

#endif
