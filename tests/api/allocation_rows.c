#include "allocation_rows.h"

#include <locale.h>
#include <stdlib.h>
#include <string.h>

#define CONFIGURATION "cn=Configuration"
#define TLS "cn=TLS, " CONFIGURATION
#define LISTENER "cn=Client Listener, cn=Network, " CONFIGURATION

/* ---- what the calls are made on ---- */

static void nothing(struct scene *s) {
    cfg_unbind(s->handle);
    s->handle = NULL;
    setlocale(LC_ALL, "C");
}

static void created(struct scene *s) {
    cfg_set_option(s->handle, CFG_OPT_CONFIG_FILE, s->f->config);
    cfg_set_option(s->handle, CFG_OPT_BACKUP_FILE, s->backup);
    cfg_set_option(s->handle, CFG_OPT_KEY_DATA, s->key);
}

static void unnamed(struct scene *s) {
    created(s);
    cfg_set_option(s->handle, CFG_OPT_CONFIG_FILE, NULL);
}

static void without_backup(struct scene *s) {
    created(s);
    cfg_set_option(s->handle, CFG_OPT_BACKUP_FILE, NULL);
}

static void bind_example(struct scene *s) {
    assert_int_equal(cfg_bind_s(s->handle, "cn=root", "Correct-Horse-7", CFG_AUTH_SIMPLE),
                     CFG_SUCCESS);
}

static void bound(struct scene *s) {
    created(s);
    bind_example(s);
}

static void bound_without_backup(struct scene *s) {
    without_backup(s);
    bind_example(s);
}

static void bound_to_delete_subtrees(struct scene *s) {
    bound(s);
    cfg_set_option(s->handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
}

/* Writes the example with other entries at its end. */
static void write_with(const struct scene *s, const char *entries) {
    char *text = calloc(1, strlen(s->example) + strlen(entries) + 1);
    assert_non_null(text);
    strcat(strcpy(text, s->example), entries);
    write_file(s->f->config, text);
    free(text);
}

static void with_unusable_lines(struct scene *s) {
    created(s);
    write_with(s, "\ndn: cn=Extra, " CONFIGURATION "\ncn: Extra\nno attribute\noru-slapdPort: x\n");
}

static void with_a_malformed_dn(struct scene *s) {
    created(s);
    write_with(s, "\ndn: Extra\ncn: Extra\n");
}

static void changed_meanwhile(struct scene *s) {
    bound(s);
    write_with(s, "\n# Others.\ndn: cn=Extra, " CONFIGURATION "\ncn: Extra\nobjectclass: top\n");
}

static void with_uncanonical_lines(struct scene *s) {
    created(s);
    write_with(s, "\ndn:CN = Extra, " CONFIGURATION "\ncn:Extra\noru-slapdPort:  0389\n");
    bind_example(s);
}

/* What was searched has its attributes read, and indexes are made. */
static void read_before(struct scene *s) {
    bound(s);
    assert_int_equal(search_below(s->handle, CONFIGURATION, "oru-slapdPort=389"), CFG_SUCCESS);
    assert_int_equal(search_below(s->handle, CONFIGURATION, "objectclass=*"), CFG_SUCCESS);
}

static void searched(struct scene *s) {
    bound(s);
    s->result = found(s->handle, CONFIGURATION, CFG_SCOPE_SUBTREE, NULL, NULL);
}

static void walked(struct scene *s) {
    searched(s);
    cfg_memfree(cfg_first_attribute(s->handle, s->result, &s->cursor));
}

static void given_values(struct scene *s) {
    searched(s);
    s->values = cfg_get_values(s->handle, s->result, "objectclass");
}

static void given_text(struct scene *s) {
    searched(s);
    s->text = cfg_get_dn(s->handle, s->result);
}

static void refused_value(struct scene *s, const char *dn, const char *name, const char *value) {
    bound(s);
    assert_int_equal(modify_one(s->handle, dn, LDAP_MOD_REPLACE, name, value), 21);
}

static void refused(struct scene *s) { refused_value(s, LISTENER, "oru-slapdPort", "70000"); }

static void refused_word(struct scene *s) {
    refused_value(s, CONFIGURATION, "oru-slapdSysLogLevel", "loud");
}

static void refused_mask(struct scene *s) {
    refused_value(s, TLS, "oru-slapdSslCipherSpecs", "255");
}

static void refused_line(struct scene *s) {
    created(s);
    write_file(s->f->config, "version: 1\n\ncn: before any entry\n");
    assert_int_equal(cfg_bind_s(s->handle, "cn=root", "Correct-Horse-7", CFG_AUTH_SIMPLE), 65);
}

static void refused_and_told(struct scene *s) {
    refused(s);
    assert_non_null(cfg_dump_exception(s->handle));
    assert_non_null(cfg_tree_view(s->handle, CFG_TREE_ASCII));
}

/* ---- the answers ---- */

static void tell_code(struct scene *s, FILE *out) {
    assert_int_equal(s->handle ? cfg_get_errno(s->handle) : s->code, s->code);
    fprintf(out, "%d", s->code);
}

static void tell_number(struct scene *s, FILE *out) { fprintf(out, "%d", s->code); }

/* The handle has its options, and the example can be loaded by it. */
static void tell_handle(struct scene *s, FILE *out) {
    if (!s->handle) {
        fputs("null", out);
        return;
    }
    int is_on = 0;
    cfg_get_option(s->handle, CFG_OPT_FLAG_A, &is_on);
    created(s);
    fprintf(out, "%d %d", is_on,
            cfg_bind_s(s->handle, "cn=root", "Correct-Horse-7", CFG_AUTH_SIMPLE));
    cfg_unbind(s->handle);
    s->handle = NULL;
}

/* The file's path is another in each run. */
static const char *shown(const struct scene *s, const char *text) {
    return !text ? "null" : strcmp(text, s->f->config) == 0 ? "the file" : text;
}

static void tell_name_option(struct scene *s, FILE *out) {
    char *name = NULL;
    cfg_get_option(s->handle, CFG_OPT_CONFIG_FILE, &name);
    fprintf(out, "%d %s", s->code, shown(s, name));
    cfg_memfree(name);
}

/* A text that is the caller's, or null and the code. */
static void tell_text(struct scene *s, FILE *out) {
    if (s->text) {
        fputs(shown(s, s->text), out);
    } else {
        fprintf(out, "null %d", cfg_get_errno(s->handle));
    }
    cfg_memfree(s->text);
    s->text = NULL;
}

static void tell_first_attribute(struct scene *s, FILE *out) {
    assert_int_equal(!s->cursor, !s->text);
    cfg_ber_free(s->cursor);
    s->cursor = NULL;
    tell_text(s, out);
}

static void tell_seen_text(struct scene *s, FILE *out) { fputs(shown(s, s->seen), out); }

static void tell_seen_list(struct scene *s, FILE *out) {
    const char *const *words = s->seen;
    for (const char *const *word = words; word && *word; ++word) {
        fprintf(out, "%s%s", word == words ? "" : " ", *word);
    }
}

static void tell_values(struct scene *s, FILE *out) {
    if (!s->values) {
        fprintf(out, "null %d", cfg_get_errno(s->handle));
    }
    for (char **value = s->values; value && *value; ++value) {
        fprintf(out, "%s\n", *value);
    }
    cfg_value_free(s->values);
    s->values = NULL;
}

static void tell_attribute(struct scene *s, FILE *out, CfgMessage *entry, const char *name) {
    char **values = cfg_get_values(s->handle, entry, name);
    for (char **value = values; value && *value; ++value) {
        fprintf(out, "%s: %s\n", name, *value);
    }
    cfg_value_free(values);
}

static void tell_entry(struct scene *s, FILE *out, CfgMessage *entry) {
    CfgCursor *cursor = NULL;
    char *dn = cfg_get_dn(s->handle, entry);
    fprintf(out, "\ndn: %s\n", dn);
    cfg_memfree(dn);
    for (char *name = cfg_first_attribute(s->handle, entry, &cursor); name;
         name = cfg_next_attribute(s->handle, entry, cursor)) {
        tell_attribute(s, out, entry, name);
        cfg_memfree(name);
    }
    cfg_ber_free(cursor);
}

static void tell_result(struct scene *s, FILE *out) {
    tell_code(s, out);
    assert_true(s->code == CFG_SUCCESS || !s->result);
    if (s->code == CFG_SUCCESS) {
        fprintf(out, ", %d found", cfg_count_entries(s->handle, s->result));
    }
    for (CfgMessage *entry = s->result; entry; entry = cfg_next_entry(s->handle, entry)) {
        tell_entry(s, out, entry);
    }
    cfg_msgfree(s->result);
    s->result = NULL;
}

/* ---- the calls ---- */

static void init(struct scene *s) { s->handle = cfg_init(); }

static void bind_administrator_of_example(struct scene *s) {
    s->code = cfg_bind_s(s->handle, "cn=root", "Correct-Horse-7", CFG_AUTH_SIMPLE);
}
static void bind_by_unknown_method(struct scene *s) {
    s->code = cfg_bind_s(s->handle, NULL, NULL, 0);
}

static void unbind(struct scene *s) {
    s->code = cfg_unbind(s->handle);
    s->handle = NULL;
}
static void reset(struct scene *s) { s->code = cfg_reset(s->handle); }

static void get_name_option(struct scene *s) {
    s->text = NULL;
    s->code = cfg_get_option(s->handle, CFG_OPT_CONFIG_FILE, &s->text);
}
static void get_flag_option(struct scene *s) {
    cfg_get_option(s->handle, CFG_OPT_FLAG_A, &s->code);
}
static void set_name_option(struct scene *s) {
    s->code = cfg_set_option(s->handle, CFG_OPT_CONFIG_FILE,
                             "/a/name/that/does/not/fit/into/a/short/text");
}
static void set_flag_option(struct scene *s) {
    s->code = cfg_set_option(s->handle, CFG_OPT_FLAG_A, CFG_OPT_OFF);
}

static void search(struct scene *s, const char *base, int scope, const char *filter, char **names) {
    s->result = (CfgMessage *)s;
    s->code = cfg_search_s(s->handle, base, scope, filter, names, 0, &s->result);
}
static void search_all_names(struct scene *s) {
    char name[] = "cn";
    char *wanted[] = {name, NULL};
    search(s, CONFIGURATION, CFG_SCOPE_SUBTREE, NULL, wanted);
}
static void search_subtree(struct scene *s) {
    search(s, "cn=Network, " CONFIGURATION, CFG_SCOPE_SUBTREE, NULL, NULL);
}
static void search_extra(struct scene *s) {
    search(s, "cn=Extra, " CONFIGURATION, CFG_SCOPE_BASE, "cn=*", NULL);
}
static void search_one_level(struct scene *s) {
    search(s, "CN=network,cn=configuration", CFG_SCOPE_ONELEVEL, "(objectclass=*)", NULL);
}
static void search_number(struct scene *s) {
    search(s, CONFIGURATION, CFG_SCOPE_SUBTREE, "(oru-slapdPort=0389)", NULL);
}
static void search_dn(struct scene *s) {
    search(s, CONFIGURATION, CFG_SCOPE_SUBTREE, "oru-slapdSuffix=DC=Example,dc=\\63om", NULL);
}
static void search_passwords(struct scene *s) {
    char names[][32] = {"oru-slapdMasterPW", "cn"};
    char *wanted[] = {names[0], names[1], NULL};
    search(s, CONFIGURATION, CFG_SCOPE_SUBTREE, "oru-slapdMasterPW=*", wanted);
}
static void search_refused_value(struct scene *s) {
    search(s, CONFIGURATION, CFG_SCOPE_SUBTREE, "oru-slapdPort=none", NULL);
}
static void search_missing_base(struct scene *s) { search(s, "cn=none", 0, NULL, NULL); }

static void first_entry(struct scene *s) {
    s->code = cfg_first_entry(s->handle, s->result) == s->result;
}
static void next_entry(struct scene *s) { s->code = cfg_next_entry(s->handle, s->result) != NULL; }
static void count_entries(struct scene *s) { s->code = cfg_count_entries(s->handle, s->result); }
static void count_attributes(struct scene *s) {
    s->code = cfg_count_attributes(s->handle, s->result);
}
static void first_attribute(struct scene *s) {
    s->text = cfg_first_attribute(s->handle, s->result, &s->cursor);
}
/* A name that could not be copied is passed over. */
static void next_attribute(struct scene *s) {
    s->text = cfg_next_attribute(s->handle, s->result, s->cursor);
}
static void get_values(struct scene *s) {
    s->values = cfg_get_values(s->handle, s->result, "objectclass");
}
static void count_values(struct scene *s) { s->code = cfg_count_values(s->values); }
static void value_free(struct scene *s) {
    cfg_value_free(s->values);
    s->values = NULL;
}
static void get_dn(struct scene *s) { s->text = cfg_get_dn(s->handle, s->result); }
static void msgfree(struct scene *s) {
    s->code = cfg_msgfree(s->result);
    s->result = NULL;
}
static void free_cursor(struct scene *s) {
    cfg_ber_free(s->cursor);
    s->cursor = NULL;
}
static void memfree(struct scene *s) {
    cfg_memfree(s->text);
    s->text = NULL;
}

static void modify_number(struct scene *s) {
    s->code = modify_one(s->handle, LISTENER, LDAP_MOD_REPLACE, "oru-slapdPort", "1389");
}
static void modify_password(struct scene *s) {
    s->code = modify_one(s->handle, TLS, LDAP_MOD_REPLACE, "oru-slapdSslKeyDatabasePW", "secret");
}
static void modify_by_adding(struct scene *s) {
    s->code = modify_one(s->handle, "CN=client listener,cn=network," CONFIGURATION, LDAP_MOD_ADD,
                         "description", "Gr\303\266\303\237e of a text that is longer than short");
}
static void modify_by_deleting(struct scene *s) {
    s->code = modify_one(s->handle, "cn=Front End, " CONFIGURATION, LDAP_MOD_DELETE,
                         "oru-slapdSetenv", "TZ=Europe/Berlin");
}
static void modify_missing_entry(struct scene *s) {
    s->code = modify_one(s->handle, "cn=none", LDAP_MOD_REPLACE, "cn", "none");
}
static void add_entry(struct scene *s) {
    char name[] = "cn";
    char text[] = "Another entry with a long name";
    char *values[] = {text, NULL};
    LDAPMod mod = {LDAP_MOD_ADD, name, {values}};
    LDAPMod *mods[] = {&mod, NULL};
    s->code =
        cfg_add_s(s->handle, "cn=Another entry with a long name, cn=none, " CONFIGURATION, mods);
}
static void delete_leaf(struct scene *s) { s->code = cfg_delete_s(s->handle, LISTENER); }
static void delete_subtree(struct scene *s) {
    s->code = cfg_delete_s(s->handle, "cn=Network, " CONFIGURATION);
}
static void flush(struct scene *s) { s->code = cfg_flush_s(s->handle); }

static void err2string(struct scene *s) { s->seen = cfg_err2string(1015); }
static void get_errno(struct scene *s) { s->code = cfg_get_errno(s->handle); }
static void get_exterror(struct scene *s) { s->code = cfg_get_exterror(s->handle); }
static void call_perror(struct scene *s) { cfg_perror(s->handle, "cfg32"); }
static void dump_exception(struct scene *s) { s->seen = cfg_dump_exception(s->handle); }
static void get_file_name(struct scene *s) { s->seen = cfg_get_file_name(s->handle); }
static void get_file_line(struct scene *s) { s->code = cfg_get_file_line(s->handle); }
static void get_entry(struct scene *s) { s->seen = cfg_get_entry(s->handle); }
static void get_attribute(struct scene *s) { s->seen = cfg_get_attribute(s->handle); }
static void get_value(struct scene *s) { s->seen = cfg_get_value(s->handle); }
static void get_enum(struct scene *s) { s->seen = cfg_get_enum(s->handle); }
static void get_bitmask(struct scene *s) { s->code = (int)cfg_get_bitmask(s->handle); }
static void get_minimum(struct scene *s) { s->code = (int)cfg_get_minimum(s->handle); }
static void get_maximum(struct scene *s) { s->code = (int)cfg_get_maximum(s->handle); }
static void get_is_single(struct scene *s) { s->code = cfg_get_is_single(s->handle); }
static void draw_ascii(struct scene *s) { s->seen = cfg_tree_view(s->handle, CFG_TREE_ASCII); }
static void draw_cp437(struct scene *s) { s->seen = cfg_tree_view(s->handle, CFG_TREE_CP437); }

#define SYSTEM_OR_MEMORY "80|90"
/* The server's routines don't tell why they can't decode a password, or make a backup. */
#define OR_DECODING "|84"
#define OR_BACKUP "|50"

/* Rows that are alike in the rest. */
/* clang-format off */
#define BIND(of, prepare, make, answer, failures, besides) \
    {"cfg_bind_s", of, prepare, make, tell_code, answer, failures, NULL, besides}
#define SEARCH(of, prepare, make, answer, failures) \
    {"cfg_search_s", of, prepare, make, tell_result, answer, failures, NULL, 0}
#define CHANGE(call, of, prepare, make, answer, done_before) \
    {call, of, prepare, make, tell_code, answer, SYSTEM_OR_MEMORY OR_BACKUP, done_before, 0}
#define GIVES(call, of, prepare, make, tell, answer, failures) \
    {call, of, prepare, make, tell, answer, failures, NULL, 0}
#define NEVER_FAILS(call, of, prepare, make, tell, answer) \
    {call, of, prepare, make, tell, answer, NULL, NULL, 0}

const struct row allocation_rows[] = {
    {"cfg_init", "a process in the C locale", nothing, init, tell_handle, "1 0", "null", NULL, loses_a_block},
    BIND("the default file", unnamed, bind_administrator_of_example, "0", SYSTEM_OR_MEMORY OR_DECODING, 0),
    BIND("another method", created, bind_by_unknown_method, "86", SYSTEM_OR_MEMORY, 0),
    BIND("unusable lines", with_unusable_lines, bind_administrator_of_example, "0", SYSTEM_OR_MEMORY OR_DECODING OR_BACKUP, repairs_first),
    BIND("a malformed DN", with_a_malformed_dn, bind_administrator_of_example, "34", SYSTEM_OR_MEMORY, 0),
    BIND("a bound handle", refused_and_told, bind_administrator_of_example, "0", SYSTEM_OR_MEMORY OR_DECODING, 0),
    NEVER_FAILS("cfg_unbind", "a failed handle", refused_and_told, unbind, tell_number, "0"),
    NEVER_FAILS("cfg_reset", "a failed handle", refused_and_told, reset, tell_code, "0"),
    GIVES("cfg_get_option", "a name", created, get_name_option, tell_text, "the file", "null 0"),
    NEVER_FAILS("cfg_get_option", "a flag", created, get_flag_option, tell_number, "1"),
    GIVES("cfg_set_option", "a name", created, set_name_option, tell_name_option, "0 /a/name/that/does/not/fit/into/a/short/text", "90 the file"),
    NEVER_FAILS("cfg_set_option", "a flag", created, set_flag_option, tell_number, "0"),
    SEARCH("all names", bound, search_all_names, "0, 75 found", SYSTEM_OR_MEMORY),
    SEARCH("a subtree", bound, search_subtree, "0, 7 found", SYSTEM_OR_MEMORY),
    SEARCH("a subtree, read before", read_before, search_subtree, "0, 7 found", SYSTEM_OR_MEMORY),
    SEARCH("uncanonical lines", with_uncanonical_lines, search_extra, "0, 1 found", SYSTEM_OR_MEMORY),
    SEARCH("a changed file", changed_meanwhile, search_extra, "0, 1 found", SYSTEM_OR_MEMORY OR_DECODING),
    SEARCH("one level", bound, search_one_level, "0, 5 found", SYSTEM_OR_MEMORY),
    SEARCH("a number", bound, search_number, "0, 1 found", SYSTEM_OR_MEMORY),
    SEARCH("a number, uncanonical", with_uncanonical_lines, search_number, "0, 2 found", SYSTEM_OR_MEMORY),
    SEARCH("a DN", bound, search_dn, "0, 1 found", SYSTEM_OR_MEMORY),
    SEARCH("passwords", bound, search_passwords, "0, 2 found", SYSTEM_OR_MEMORY OR_DECODING),
    SEARCH("a refused value", bound, search_refused_value, "21", SYSTEM_OR_MEMORY),
    SEARCH("a missing base", bound, search_missing_base, "32", SYSTEM_OR_MEMORY),
    NEVER_FAILS("cfg_first_entry", "a result", searched, first_entry, tell_number, "1"),
    NEVER_FAILS("cfg_next_entry", "a result", searched, next_entry, tell_number, "1"),
    NEVER_FAILS("cfg_count_entries", "a result", searched, count_entries, tell_number, "75"),
    NEVER_FAILS("cfg_count_attributes", "a result", searched, count_attributes, tell_number, "14"),
    GIVES("cfg_first_attribute", "a result", searched, first_attribute, tell_first_attribute, "cn", "null 90"),
    {"cfg_next_attribute", "a result", walked, next_attribute, tell_text, "nuv-instanceDesc", "null 90", "nuv-instanceLocation", 0},
    GIVES("cfg_get_values", "a result", searched, get_values, tell_values, "top", "null 90"),
    NEVER_FAILS("cfg_count_values", "values", given_values, count_values, tell_number, "2"),
    NEVER_FAILS("cfg_value_free", "values", given_values, value_free, tell_number, "0"),
    GIVES("cfg_get_dn", "a result", searched, get_dn, tell_text, CONFIGURATION, "null 90"),
    NEVER_FAILS("cfg_msgfree", "a result", searched, msgfree, tell_number, "0"),
    NEVER_FAILS("cfg_ber_free", "a cursor", walked, free_cursor, tell_number, "0"),
    NEVER_FAILS("cfg_memfree", "a DN", given_text, memfree, tell_number, "0"),
    CHANGE("cfg_modify_s", "a number", bound, modify_number, "0", NULL),
    GIVES("cfg_modify_s", "a number, no backup", bound_without_backup, modify_number, tell_code, "0", SYSTEM_OR_MEMORY),
    CHANGE("cfg_modify_s", "a password", bound, modify_password, "0", NULL),
    CHANGE("cfg_modify_s", "one more value", bound, modify_by_adding, "0", NULL),
    CHANGE("cfg_modify_s", "one value less", bound, modify_by_deleting, "0", NULL),
    CHANGE("cfg_modify_s", "no entry", bound, modify_missing_entry, "32", NULL),
    CHANGE("cfg_add_s", "an entry", bound, add_entry, "0", NULL),
    CHANGE("cfg_delete_s", "a leaf", bound, delete_leaf, "0", "32"),
    CHANGE("cfg_delete_s", "a subtree", bound_to_delete_subtrees, delete_subtree, "0", "32"),
    CHANGE("cfg_delete_s", "an entry with others below", bound, delete_subtree, "66", NULL),
    CHANGE("cfg_flush_s", "the file", bound, flush, "0", NULL),
    CHANGE("cfg_flush_s", "uncanonical lines", with_uncanonical_lines, flush, "0", NULL),
    NEVER_FAILS("cfg_err2string", "a code", refused, err2string, tell_seen_text, "Integer value is not within allowable range."),
    NEVER_FAILS("cfg_get_errno", "a refusal", refused, get_errno, tell_number, "21"),
    NEVER_FAILS("cfg_get_exterror", "a refusal", refused, get_exterror, tell_number, "1015"),
    NEVER_FAILS("cfg_perror", "a refusal", refused, call_perror, tell_number, "0"),
    GIVES("cfg_dump_exception", "a refusal", refused, dump_exception, tell_seen_text, "value: 70000", "null"),
    NEVER_FAILS("cfg_get_file_name", "a refusal", refused, get_file_name, tell_seen_text, "the file"),
    GIVES("cfg_get_file_name", "the default file", unnamed, get_file_name, tell_seen_text, "the file", "null"),
    NEVER_FAILS("cfg_get_file_line", "a refused number", refused, get_file_line, tell_number, "0"),
    NEVER_FAILS("cfg_get_file_line", "a refused line", refused_line, get_file_line, tell_number, "3"),
    NEVER_FAILS("cfg_get_entry", "a refusal", refused, get_entry, tell_seen_text, LISTENER),
    NEVER_FAILS("cfg_get_attribute", "a refusal", refused, get_attribute, tell_seen_text, "oru-slapdPort"),
    NEVER_FAILS("cfg_get_value", "a refusal", refused, get_value, tell_seen_text, "70000"),
    NEVER_FAILS("cfg_get_enum", "a refused number", refused, get_enum, tell_seen_list, ""),
    NEVER_FAILS("cfg_get_enum", "a refused word", refused_word, get_enum, tell_seen_list, "l m h"),
    NEVER_FAILS("cfg_get_bitmask", "a refused number", refused, get_bitmask, tell_number, "0"),
    NEVER_FAILS("cfg_get_bitmask", "a refused mask", refused_mask, get_bitmask, tell_number, "65280"),
    NEVER_FAILS("cfg_get_minimum", "a refused number", refused, get_minimum, tell_number, "1"),
    NEVER_FAILS("cfg_get_maximum", "a refused number", refused, get_maximum, tell_number, "65535"),
    NEVER_FAILS("cfg_get_is_single", "a refused number", refused, get_is_single, tell_number, "1"),
    GIVES("cfg_tree_view", "ASCII", bound, draw_ascii, tell_seen_text, "- " CONFIGURATION " (suffix)", "null"),
    GIVES("cfg_tree_view", "lines", bound, draw_cp437, tell_seen_text, "\xC4 " CONFIGURATION " (suffix)", "null"),
    {NULL, NULL, NULL, NULL, NULL, NULL, NULL, NULL, 0},
};
/* clang-format on */
