/**
 * @file cfg32.h
 * Reading and changing the configuration file of an LDAP directory server.
 *
 * The configuration is one LDIF text file: a tree of entries under "cn=Configuration". The calls
 * mirror the synchronous LDAP client interface (RFC 1823): make a handle, bind as the administrator
 * whose DN and password stand in the file itself, search, walk the results, add, modify, delete.
 *
 * Conventions
 *
 *  1. Handles. cfg_init() makes one, options name the file, cfg_bind_s() loads the file and
 *     authenticates, cfg_unbind() releases everything. A handle is "created" until a bind succeeds
 *     and "bound" from then on; another successful bind replaces what it is bound to, a failed one
 *     leaves that as it is. The calls that need a bound handle return CFG_PARAM_ERROR (89) for a
 *     null handle and for one that is not bound.
 *  2. Results. A call that returns int returns 0 for success and else an LDAP result code (RFC
 *     4511, 4.1.9, and the codes from 81 up that LDAP client interfaces added), save for the ones
 *     that count; cfg_err2string() gives a code's text. A call that returns a pointer returns null
 *     for failure. The code stays in the handle (cfg_get_errno()) until the next call that resets
 *     it.
 *  3. Reset. Every call that takes a handle first clears the handle's error and frees the report
 *     of the last failure, except the option calls and the ones that tell of that failure:
 *     cfg_get_option(), cfg_set_option(), cfg_get_errno(), cfg_get_exterror(), cfg_perror(),
 *     cfg_dump_exception(), the queries from cfg_get_file_name() to cfg_get_is_single(), and
 *     cfg_tree_view(). So ask about a failure before anything else.
 *  4. Memory. Each description says who owns what is returned: results go to cfg_msgfree(), value
 *     arrays to cfg_value_free(), strings to cfg_memfree(), cursors to cfg_ber_free(). A result
 *     outlives the handle that it came from. Text returned as const char * is not the caller's.
 *     Arguments stay the caller's and are not kept, save for the key of CFG_OPT_KEY_DATA.
 *  5. Changes. When a call that changes the configuration returns 0, the new file is on the disk,
 *     overwritten in place; links to it, its owner and its mode stay. If CFG_OPT_BACKUP_FILE names
 *     a backup, the file of before is on the disk as well, complete before the first byte of the
 *     file changes: at every moment one of the two is a complete version. A process that is killed
 *     in the middle, or a power cut, then leaves a file that no call loads (80/1002): copy the
 *     backup over it. Without a backup they may leave a mixture of both versions.
 *     When a call returns a failure, the file holds what it held, save for unusable lines that it
 *     found and kept in their own way (see cfg_bind_s()) and for what is said of codes 80 and 91
 *     at cfg_modify_s(). This handle's copy in memory is not rolled back: what was carried out
 *     before the refusal (earlier modifications, earlier values of a deletion), and a change that
 *     failed before the file was touched (no backup, no permission), is seen by its searches and
 *     written with its next change; one that failed for lack of room may be. The copy is dropped,
 *     and read again, when the failure came later, when the text could not be made, and when
 *     somebody else changes the file; to drop it yourself, unbind.
 *  6. Many programs. Every program that uses this library sees the changes of the others at its
 *     next call, and no change is lost when several make one at the same time: each keeps the
 *     others away (flock(2) on the file itself) while it changes the file, and while it reads it. A
 *     call that has to wait for longer than ten seconds gives up with CFG_BUSY (51). An editor does
 *     not ask: a call that notices that it changed the file meanwhile gives up with 51, too.
 *  7. Secrets. Passwords that a search decoded are wiped when their result is freed. Copies made by
 *     cfg_get_values() are the caller's to wipe. The report of a failure holds the value that was
 *     refused, or a whole entry, with which may come a password: don't log it where others read.
 *  8. Threads. A handle, its results and their cursors belong to one thread at a time. Handles
 *     are independent of each other, save for the two process-wide options CFG_OPT_SHOW_SOURCE and
 *     CFG_OPT_SHOW_STACK.
 *  9. Locale. cfg_init() calls setlocale(LC_ALL, "") under the server's locale lock: the text of
 *     the file is read in the character set of the environment. As setlocale() changes the whole
 *     process, make handles while no other thread is in a call of this library. In a process that
 *     chooses another locale later, names and values are compared as in that; what is read already
 *     is not read again for it.
 * 10. No C++ exception leaves a call.
 */
#ifndef CFG32_H
#define CFG32_H

#include <stdint.h>

/*
 * Changes are told in the LDAP client interface's own records, LDAPMod and struct berval. A system
 * that has a client's <ldap.h> has them from there, so that a program can include both headers, in
 * any order; elsewhere, and where CFG32_WITHOUT_LDAP_H is defined, they are defined here in the
 * same form.
 */
#if !defined(LDAP_MOD_ADD) && !defined(CFG32_WITHOUT_LDAP_H) && defined(__has_include)
#if __has_include(<ldap.h>)
#include <ldap.h>
#endif
#endif

#ifdef __cplusplus
extern "C" {
#endif

/** Marks a call that the library exports. */
#if defined(__GNUC__)
#define CFG32_API __attribute__((visibility("default")))
#else
#define CFG32_API
#endif

/** Tells C++ callers that a call throws nothing. */
#if defined(__cplusplus) && __cplusplus >= 201103L
#define CFG32_NOEXCEPT noexcept
#else
#define CFG32_NOEXCEPT
#endif

/** A session with one configuration file. */
typedef struct CfgHandle CfgHandle;

/** A node of a search result: an entry, one of its attributes, or one of their values. */
typedef struct CfgMessage CfgMessage;

/** The place that cfg_next_attribute() has reached in an entry. */
typedef struct CfgCursor CfgCursor;

/** Key material for encoded passwords; made by the server's password routines. */
struct aes_key_data;

#ifndef LDAP_MOD_ADD

/** A counted value. */
typedef struct berval {
    unsigned long bv_len; /**< not looked at by this library */
    char *bv_val;         /**< ended by a NUL */
} BerValue;

/** One modification of an attribute (RFC 1823, 4.8). */
typedef struct ldapmod {
    int mod_op;     /**< LDAP_MOD_..., with LDAP_MOD_BVALUES for values in mod_bvalues */
    char *mod_type; /**< the attribute's name */
    union mod_vals_u {
        char **modv_strvals;
        struct berval **modv_bvals;
    } mod_vals; /**< the values, ended by null; null for none */
#define mod_values mod_vals.modv_strvals
#define mod_bvalues mod_vals.modv_bvals
} LDAPMod;

/** @name Operations of a modification
 * @{ */
#define LDAP_MOD_ADD 0x0000     /**< add the values; values that are there already are no error */
#define LDAP_MOD_DELETE 0x0001  /**< delete the values; without values, the whole attribute */
#define LDAP_MOD_REPLACE 0x0002 /**< let the values take the place of all there are */
#define LDAP_MOD_BVALUES 0x0080 /**< flag: the values are in mod_bvalues */
/** @} */

#endif

/** The result codes that callers most often ask for; cfg_err2string() knows all of them. */
enum {
    CFG_SUCCESS = 0,                 /**< done */
    CFG_NO_SUCH_ATTRIBUTE = 16,      /**< the entry has no attribute of that name */
    CFG_CONSTRAINT_VIOLATION = 19,   /**< a second value for a single-valued attribute */
    CFG_INVALID_SYNTAX = 21,         /**< a value that its attribute does not allow */
    CFG_NO_SUCH_OBJECT = 32,         /**< no entry of that DN */
    CFG_INVALID_DN_SYNTAX = 34,      /**< text that is no DN */
    CFG_INVALID_CREDENTIALS = 49,    /**< not the administrator's DN and password */
    CFG_INSUFFICIENT_ACCESS = 50,    /**< a file that may not be written or backed up */
    CFG_BUSY = 51,                   /**< another program has the file, or changed it meanwhile */
    CFG_NOT_ALLOWED_ON_NONLEAF = 66, /**< an entry that has others below it */
    CFG_OTHER = 80,                  /**< a failure of the system or of the library */
    CFG_DECODING_ERROR = 84,         /**< a stored password can't be decoded */
    CFG_AUTH_UNKNOWN = 86,           /**< a bind method other than CFG_AUTH_SIMPLE */
    CFG_PARAM_ERROR = 89,            /**< a null argument, or a handle that is not bound */
    CFG_NO_MEMORY = 90,              /**< memory is exhausted */
    CFG_CONNECT_ERROR = 91           /**< a file that is missing or can't be opened */
};

/** @name Options
 * The argument of cfg_get_option() and the value of cfg_set_option() for each.
 * @{ */
/** Boolean, at first on. Kept for the caller; the library does not look at it. */
#define CFG_OPT_FLAG_A 1000
/** Boolean, at first off. Kept for the caller; the library does not look at it. */
#define CFG_OPT_FLAG_B 1001
/** Boolean, process-wide, off after every cfg_init(): the library's one-line reports begin with the
 * position in its source. cfg_dump_exception() shows that position always. */
#define CFG_OPT_SHOW_SOURCE 1002
/** Boolean, process-wide, on after every cfg_init(): reports show the causes of a failure. */
#define CFG_OPT_SHOW_STACK 1003
/** Boolean, at first off: an entry may be deleted together with its subtree. */
#define CFG_OPT_DELETE_NON_LEAVES 1004
/** Text, at first null: the configuration file that the next cfg_bind_s() loads. A bound handle
 * keeps the file it has, but while this is null its calls return 89. */
#define CFG_OPT_CONFIG_FILE 1005
/** Text, at first null: where the next cfg_bind_s(), and then every change, has the file copied
 * before it is written, with its owner, group and mode. Another name than the file's. Null makes no
 * backup. */
#define CFG_OPT_BACKUP_FILE 1006
/** struct aes_key_data *, at first null: key for encoded passwords. The next cfg_bind_s() loads the
 * file with it, and changes encode with the key of the bind; searches decode with the present one.
 * Without a key passwords are only masked. It stays the caller's and must outlive the handle. */
#define CFG_OPT_KEY_DATA 1007

/** Values for the boolean options of cfg_set_option(); every pointer but null means on. */
#define CFG_OPT_ON ((const void *)1)
#define CFG_OPT_OFF ((const void *)0)
/** @} */

/** The bind method: simple authentication (RFC 4511, 4.2). No other is accepted. */
#define CFG_AUTH_SIMPLE 0x80

/** @name Search scopes (RFC 4511, 4.5.1.2)
 * @{ */
#define CFG_SCOPE_BASE 0     /**< the base entry itself */
#define CFG_SCOPE_ONELEVEL 1 /**< the entries directly below the base */
#define CFG_SCOPE_SUBTREE 2  /**< the base and everything below it */
/** @} */

/* ---------------------------------------------------------------------------------------------
 * The handle
 * ------------------------------------------------------------------------------------------- */

/**
 * Makes a handle with every option at its first value. Opens no file.
 *
 * Sets the process's locale from the environment, under the server's locale lock.
 *
 * @return the handle, for cfg_unbind(); null when memory is exhausted.
 */
CFG32_API CfgHandle *cfg_init(void) CFG32_NOEXCEPT;

/**
 * Loads the configuration file and authenticates the caller as its administrator.
 *
 * The file is the one of CFG_OPT_CONFIG_FILE or, without one, "/etc/oruslapd.conf" below the
 * server's installation directory. The administrator's DN and password are the first values of
 * oru-slapdAdminDN and oru-slapdAdminPW in the entry "cn=Configuration". A file without the first
 * lets any DN in that comes with the password.
 *
 * Lines that can't be used (without a ":", or with a value that their attribute does not allow) do
 * not stop the load: each becomes an attribute oru-slapdInvalidLine of its entry and the file is
 * rewritten at once, after a backup if CFG_OPT_BACKUP_FILE names one. Writing a file encodes its
 * passwords, and so does every later change.
 *
 * @param handle    a created handle
 * @param dn        the administrator's DN, or null with a null password for an anonymous bind;
 *                  that one may change the file, too: who may is up to the file's own permissions
 * @param password  in clear text
 * @param method    CFG_AUTH_SIMPLE
 * @return 0;
 *         21 (Invalid syntax) for a password of more than 1024 bytes, and when a file with unusable
 *         lines can't be rewritten because an entry would not read back as it is written;
 *         32 (No such object) when the file has no entry "cn=Configuration";
 *         34 (Invalid DN syntax) for a dn, or an entry of the file, whose DN can't be parsed;
 *         49 (Invalid credentials), without a failure report;
 *         50 (Insufficient access) when a file with unusable lines can't be backed up or rewritten;
 *         51 (DSA is busy) when another program kept the file for ten seconds;
 *         65 (Object class violation) for an attribute outside of an entry, save one "version" and
 *         one "charset" line that can be used;
 *         80 for a failure of the system (exhausted memory included) or of the library, when no
 *         file name is known, or for a file that was not written to its end;
 *         83 (Encoding error) for a password that is too long when it is encoded, and for want of
 *         random numbers to encode one of the file with;
 *         84 (Decoding error) for a stored password that can't be decoded with the key given;
 *         86 for another method;
 *         89 for a null handle;
 *         90 when memory is exhausted before the file is read;
 *         91 (Connection error) when the file is missing or can't be opened;
 *         162 (Unusable input character) for text that is not of the locale's character set.
 *         After a failure the handle is what it was, with the default file name if it had none,
 *         and may be bound again.
 */
CFG32_API int cfg_bind_s(CfgHandle *handle, const char *dn, const char *password,
                         int method) CFG32_NOEXCEPT;

/**
 * Releases a handle, bound or not, with all it owns. Writes nothing: the file on disk is current
 * after every call. Results of searches stay valid.
 *
 * @return 0; 89 for a null handle. The handle is gone in every case.
 */
CFG32_API int cfg_unbind(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Clears the handle's error and frees its failure report, as the other calls do when they begin.
 *
 * @return 0; 89 for a null handle.
 */
CFG32_API int cfg_reset(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Reads an option. Does not reset the handle.
 *
 * @param option  CFG_OPT_...; another number returns 0 and writes nothing
 * @param out     int * for a boolean option (set to 1 or 0); char ** for a text, set to a copy for
 *                cfg_memfree(), or to null when there is none or memory is exhausted;
 *                struct aes_key_data ** for CFG_OPT_KEY_DATA, not a copy
 * @return 0; 89 for a null handle or a null out.
 */
CFG32_API int cfg_get_option(CfgHandle *handle, int option, void *out) CFG32_NOEXCEPT;

/**
 * Sets an option. Does not reset the handle and records no failure in it.
 *
 * @code
 * cfg_set_option(handle, CFG_OPT_CONFIG_FILE, "/opt/server/etc/oruslapd.conf");
 * cfg_set_option(handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
 * @endcode
 *
 * @param option  CFG_OPT_...; another number returns 0 and changes nothing
 * @param value   CFG_OPT_ON or CFG_OPT_OFF; a text, which is copied (1 to 4096 bytes; null unsets
 *                it); or the key, which is not copied
 * @return 0; 21 (Invalid syntax) for a file name that is empty or too long; 89 for a null handle;
 *         90 when memory is exhausted. After a failure the option is unchanged.
 */
CFG32_API int cfg_set_option(CfgHandle *handle, int option, const void *value) CFG32_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Searching
 * ------------------------------------------------------------------------------------------- */

/**
 * Searches the configuration. A file that was changed on disk is read again first.
 *
 * @param handle      a bound handle
 * @param base        DN of the entry to start at (RFC 4514; ";" also separates RDNs, "oid." may
 *                    precede a numeric type, values may be quoted)
 * @param scope       CFG_SCOPE_...; any other number searches the base entry only
 * @param filter      one term: "(attribute=value)" or "(attribute=*)", the parentheses optional;
 *                    exact match by the attribute's syntax, backslash and two hexadecimal digits
 *                    for a byte (RFC 4515). An empty text, and null, match every entry that has an
 *                    objectclass
 * @param attrs       names of the wanted attributes, ended by null; null means all. Passwords in
 *                    oru-slapdSslKeyDatabasePW, oru-slapdMasterPW and oru-slapdProxyPw come in
 *                    clear when they are asked for by name, on an anonymous bind too, and as stored
 *                    otherwise
 * @param attrsonly   accepted as in LDAP; the result carries the values either way
 * @param result      set to the first entry found, for cfg_msgfree(), or to null when there is none
 * @return 0, also when nothing was found;
 *         18 (Inappropriate matching), 21 or 34 for a filter value that the attribute's syntax does
 *         not allow;
 *         32 (No such object) when there is no base entry;
 *         34 for a malformed base, or a found entry whose DN has an empty value;
 *         80 for a failure of the system (exhausted memory included) or of the library;
 *         84 for a password that can't be decoded;
 *         89 for a handle that is null or not bound, or a null base or result;
 *         90 when memory is exhausted while the result is built;
 *         162 for a base or filter that is not of the locale's character set;
 *         or what cfg_bind_s() returns when the file has to be read again.
 */
CFG32_API int cfg_search_s(CfgHandle *handle, const char *base, int scope, const char *filter,
                           char **attrs, int attrsonly, CfgMessage **result) CFG32_NOEXCEPT;

/** Returns the first entry of a result, which is the result itself. */
CFG32_API CfgMessage *cfg_first_entry(CfgHandle *handle, CfgMessage *result) CFG32_NOEXCEPT;

/** Returns the entry after this one; null at the end and for a null entry. */
CFG32_API CfgMessage *cfg_next_entry(CfgHandle *handle, CfgMessage *entry) CFG32_NOEXCEPT;

/**
 * Counts the entries from this one to the end of its result.
 *
 * @return the number, 0 for null; 89 for a null handle.
 */
CFG32_API int cfg_count_entries(CfgHandle *handle, CfgMessage *entry) CFG32_NOEXCEPT;

/**
 * Counts the attributes of an entry.
 *
 * @return the number, 0 for null; 89 for a null handle.
 */
CFG32_API int cfg_count_attributes(CfgHandle *handle, CfgMessage *entry) CFG32_NOEXCEPT;

/**
 * Begins a walk over an entry's attributes.
 *
 * @code
 * CfgCursor *cursor;
 * for (char *name = cfg_first_attribute(handle, entry, &cursor); name;
 *      name = cfg_next_attribute(handle, entry, cursor)) {
 *     ...
 *     cfg_memfree(name);
 * }
 * cfg_ber_free(cursor);
 * @endcode
 *
 * @param cursor  set to a new cursor for cfg_ber_free(), also when the entry has no attributes; to
 *                null after an error
 * @return the first attribute's name, for cfg_memfree(); null for an entry without attributes
 *         (error 0), for a null entry or cursor (89), or when memory is exhausted (90).
 */
CFG32_API char *cfg_first_attribute(CfgHandle *handle, CfgMessage *entry,
                                    CfgCursor **cursor) CFG32_NOEXCEPT;

/**
 * Returns the name of the next attribute, for cfg_memfree().
 *
 * @param entry   not looked at: the cursor knows its entry
 * @param cursor  from cfg_first_attribute()
 * @return null after the last attribute (error 0), for a null cursor (89), or when memory is
 *         exhausted (90).
 */
CFG32_API char *cfg_next_attribute(CfgHandle *handle, CfgMessage *entry,
                                   CfgCursor *cursor) CFG32_NOEXCEPT;

/**
 * Returns copies of an attribute's values.
 *
 * @param attribute  its name, in any case
 * @return an array ended by null, for cfg_value_free(); null when the attribute has no values
 *         (error 0) or is not there (16), for a null entry or name (89), or when memory is
 *         exhausted (90).
 *         Pass a handle: without one the values can't be counted, and an attribute with fewer than
 *         89 of them gives null.
 */
CFG32_API char **cfg_get_values(CfgHandle *handle, CfgMessage *entry,
                                const char *attribute) CFG32_NOEXCEPT;

/** Returns the number of strings in an array that ends with null; 0 for null. */
CFG32_API int cfg_count_values(char **values) CFG32_NOEXCEPT;

/** Frees an array of cfg_get_values() and its strings. Null is ignored. */
CFG32_API void cfg_value_free(char **values) CFG32_NOEXCEPT;

/**
 * Returns an entry's DN in its canonical form, for cfg_memfree().
 *
 * @return null for a node that is not an entry (89), or when memory is exhausted (90).
 */
CFG32_API char *cfg_get_dn(CfgHandle *handle, CfgMessage *entry) CFG32_NOEXCEPT;

/** Frees a result from its first entry on; decoded passwords are wiped. Null is ignored.
 * @return 0. */
CFG32_API int cfg_msgfree(CfgMessage *result) CFG32_NOEXCEPT;

/** Frees a cursor. Null is ignored. */
CFG32_API void cfg_ber_free(CfgCursor *cursor) CFG32_NOEXCEPT;

/** Frees a string that a call returned as char *. Null is ignored. */
CFG32_API void cfg_memfree(void *text) CFG32_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Changing
 * ------------------------------------------------------------------------------------------- */

/**
 * Changes the attributes of an entry, and writes the file.
 *
 * The modifications are carried out in their order:
 *  - LDAP_MOD_ADD adds values. One that is there already, by the attribute's own comparison, is
 *    passed over.
 *  - LDAP_MOD_DELETE deletes values, or without values the whole attribute. A value that is not
 *    there is passed over; an attribute whose last value goes is deleted, with the comment lines
 *    before it.
 *  - LDAP_MOD_REPLACE lets values take the place of all there are, and keeps the comment; without
 *    values it deletes the attribute, which need not be there. A replacement that the attribute's
 *    syntax refuses leaves the attribute without values in this handle (see convention 5).
 *
 * @code
 * char *port[] = {"1389", NULL};
 * LDAPMod replace = {.mod_op = LDAP_MOD_REPLACE, .mod_type = "oru-slapdPort", .mod_values = port};
 * LDAPMod *changes[] = {&replace, NULL};
 * int code = cfg_modify_s(handle, "cn=Front End, cn=Configuration", changes);
 * if (code != CFG_SUCCESS) {
 *     const char *report = cfg_dump_exception(handle);
 *     fprintf(stderr, "%s\n", report ? report : cfg_err2string(code));
 * }
 * @endcode
 *
 * @param handle  a bound handle
 * @param dn      the entry; "" for the lines above all entries, version and charset
 * @param mods    ended by null; null or empty writes the file as it is, whether there is such an
 *                entry or not. Values are texts ended by NUL, binary ones as well. They stay the
 *                caller's.
 * @return 0;
 *         16 (No such attribute) when an attribute to delete from is not there;
 *         18, 21, 34, 83 or 84 for a value that the attribute's syntax does not allow;
 *         19 (Constraint violation) for a second, different value of a single-valued attribute:
 *         that modification changes nothing;
 *         21 (Invalid syntax) also for a name or value that would not read back as it is written
 *         (a line feed, blanks at its ends): that modification changes nothing;
 *         21 or 34 also when an entry of the file, whichever, can't be written: the change is
 *         forgotten;
 *         32 (No such object) when there is no such entry;
 *         34 (Invalid DN syntax) for a malformed dn;
 *         50 (Insufficient access) when the file can't be backed up or opened for writing;
 *         51 (DSA is busy) when another program kept the file for ten seconds, or one that does
 *         not ask changed it during this call: try again;
 *         80 for a failure of the system (exhausted memory included; the report tells the errno,
 *         of a full disk for example) or of the library, or for a file that was not written to its
 *         end. When the file had been written to, the old content was put back; if that failed as
 *         well, the report says so, and the backup is the complete version;
 *         89 for a handle that is null or not bound, a null dn, or an unknown operation;
 *         90 when memory is exhausted and not even the report can be kept;
 *         91 (Connection error) when the file is missing. With the message "_stat()" after the file
 *         was written, it could not be looked at afterwards;
 *         162 (Unusable input character) for text that is not of the locale's character set;
 *         or what cfg_bind_s() returns when the file has to be read again.
 */
CFG32_API int cfg_modify_s(CfgHandle *handle, const char *dn, struct ldapmod **mods) CFG32_NOEXCEPT;

/**
 * Adds an entry, and writes the file.
 *
 * The entry's ancestors need not be there. An entry that is there already takes over the new
 * attributes and values.
 *
 * @param dn    the entry's DN; the attribute of its first part is not added by itself
 * @param mods  the attributes with their values, ended by null; may be null. The operation is not
 *              looked at, save for LDAP_MOD_BVALUES; an attribute without values is passed over
 * @return as cfg_modify_s(), save 16, 32 and the unknown operation. A refused entry leaves nothing.
 */
CFG32_API int cfg_add_s(CfgHandle *handle, const char *dn, struct ldapmod **mods) CFG32_NOEXCEPT;

/**
 * Deletes an entry, with the comment lines before it, and writes the file. With
 * CFG_OPT_DELETE_NON_LEAVES everything below the entry goes with it.
 *
 * @return as cfg_modify_s(), of 0, 21, 32, 34, 50, 51, 80, 89, 90, 91 and 162; 66 (Operation not
 *         allowed on nonleaf) for an entry with others below it while CFG_OPT_DELETE_NON_LEAVES is
 *         off.
 */
CFG32_API int cfg_delete_s(CfgHandle *handle, const char *dn) CFG32_NOEXCEPT;

/**
 * Writes the file as it is: in its canonical form, after a backup. No other call needs this one.
 *
 * @return as cfg_modify_s(), of 0, 21, 34, 50, 51, 80, 89, 90 and 91, and what cfg_bind_s() returns
 *         when the file has to be read again.
 */
CFG32_API int cfg_flush_s(CfgHandle *handle) CFG32_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Failures
 * ------------------------------------------------------------------------------------------- */

/**
 * Returns the text of a result code (up to 999) or of an extended code (1000 and up).
 *
 * @return static text, "Unknown error" for a code without one; never null.
 */
CFG32_API const char *cfg_err2string(int code) CFG32_NOEXCEPT;

/** Returns the result code of the handle's last call; 89 for a null handle. */
CFG32_API int cfg_get_errno(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Returns the extended code of the last failure: the library's own finer code (1000 and up) or,
 * where there is none, the result code.
 *
 * @return 0 after a success; 89 for a null handle.
 */
CFG32_API int cfg_get_exterror(CfgHandle *handle) CFG32_NOEXCEPT;

/** Does nothing; it is there for programs that were written against the LDAP interface. */
CFG32_API void cfg_perror(CfgHandle *handle, const char *prefix) CFG32_NOEXCEPT;

/**
 * Returns a report of the last failure: the codes with their texts, the file and line, the entry,
 * attribute and value, what the attribute allows, and the causes.
 *
 * @return several lines, owned by the handle until the next call that resets it; null when the
 *         last call succeeded, failed without a report (a wrong password, a null argument,
 *         exhausted memory), or the handle is null.
 */
CFG32_API const char *cfg_dump_exception(CfgHandle *handle) CFG32_NOEXCEPT;

/*
 * Where the last failure was, and what would have been allowed. None of these calls resets the
 * handle. Text belongs to the library; text of the failure itself is valid until the next call that
 * resets the handle.
 */

/**
 * Returns the configuration file of the last failure; when it tells none, of the bind; of a handle
 * that is not bound (or whose CFG_OPT_CONFIG_FILE is null), that option's or the default one.
 *
 * @return null for a null handle, or when no name is known. The default name is valid until the
 *         next call in the same thread that asks for it.
 */
CFG32_API const char *cfg_get_file_name(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the line of that file, counted from 1; 0 when none is known and for a null handle. */
CFG32_API int cfg_get_file_line(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Returns the DN of the entry; for a refused search filter, the whole text of the base entry.
 *
 * @return "" when the failure tells none, null without a failure or handle.
 */
CFG32_API const char *cfg_get_entry(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the attribute's name; null when the failure tells none, without a failure or handle. */
CFG32_API const char *cfg_get_attribute(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the value; "" when the failure tells none, null without a failure or handle. */
CFG32_API const char *cfg_get_value(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Returns the words that the violated attribute allows.
 *
 * @return an array ended by null, static; null when it has no such list, and without a violated
 *         attribute.
 */
CFG32_API const char *const *cfg_get_enum(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the bits that the violated attribute allows; 0 for none. */
CFG32_API int64_t cfg_get_bitmask(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the least value of the violated attribute, or the least length of its text in bytes. */
CFG32_API int64_t cfg_get_minimum(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns the greatest value, or length; there is a range when this or the minimum is not 0. */
CFG32_API int64_t cfg_get_maximum(CfgHandle *handle) CFG32_NOEXCEPT;

/** Returns 1 when the violated attribute takes one value only, else 0. */
CFG32_API int cfg_get_is_single(CfgHandle *handle) CFG32_NOEXCEPT;

/**
 * Draws the tree of the entries that the handle has in memory. Does not reset the handle and does
 * not read the file again.
 *
 * @param style  CFG_TREE_ASCII, or another number for the line-drawing bytes of code page 437
 * @return text that belongs to the handle until the next call that resets it; a second call before
 *         that returns the same text, whatever the style. Null for a handle that is null or not
 *         bound, when memory is exhausted, and when an entry's DN can't be printed (cfg_flush_s()
 *         tells which).
 */
CFG32_API char *cfg_tree_view(CfgHandle *handle, int style) CFG32_NOEXCEPT;

/** @name Styles of cfg_tree_view()
 * @{ */
#define CFG_TREE_ASCII 0
#define CFG_TREE_CP437 1
/** @} */

#ifdef __cplusplus
}
#endif

#endif
