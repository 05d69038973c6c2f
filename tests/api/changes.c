#include "changes.h"

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "cfg32_platform.h"

/* ---- modification records ---- */

static void *allocate(size_t count, size_t size) {
    void *block = calloc(count, size);
    assert_non_null(block);
    return block;
}

static char *copy_of(const char *text, size_t length) {
    char *copy = allocate(1, length + 1);
    memcpy(copy, text, length);
    return copy;
}

/* The part of a text up to a separator, to be freed; *text moves behind it, or becomes null. */
static char *next_part(const char **text, const char *separator) {
    const char *end = strstr(*text, separator);
    char *part = copy_of(*text, end ? (size_t)(end - *text) : strlen(*text));
    *text = end ? end + strlen(separator) : NULL;
    return part;
}

static int skip_word(const char **text, const char *word) {
    const int is_there = strncmp(*text, word, strlen(word)) == 0;
    *text += is_there ? strlen(word) : 0;
    return is_there;
}

static int operation_of(const char **text) {
    static const struct {
        const char *word;
        int operation;
    } rows[] = {
        {"add ", LDAP_MOD_ADD}, {"delete ", LDAP_MOD_DELETE}, {"replace ", LDAP_MOD_REPLACE}};
    for (size_t i = 0; i < LENGTH(rows); ++i) {
        if (skip_word(text, rows[i].word)) {
            return rows[i].operation;
        }
    }
    char *end = NULL;
    const long code = strtol(*text, &end, 0);
    if (end == *text || *end != ' ') {
        fail_msg("no operation: %s", *text);
    }
    *text = end + 1;
    return (int)code;
}

static struct berval *counted(char *value) {
    struct berval *counted = allocate(1, sizeof *counted);
    counted->bv_len = strlen(value);
    counted->bv_val = value;
    return counted;
}

static void set_values(LDAPMod *mod, const char *text) {
    const size_t most = strlen(text) + 2;
    if (mod->mod_op & LDAP_MOD_BVALUES) {
        mod->mod_bvalues = allocate(most, sizeof *mod->mod_bvalues);
    } else {
        mod->mod_values = allocate(most, sizeof *mod->mod_values);
    }
    for (size_t i = 0; text; ++i) {
        char *value = next_part(&text, "|");
        if (mod->mod_op & LDAP_MOD_BVALUES) {
            mod->mod_bvalues[i] = counted(value);
        } else {
            mod->mod_values[i] = value;
        }
    }
}

static LDAPMod *mod_of(const char *text) {
    LDAPMod *mod = allocate(1, sizeof *mod);
    const int flag = skip_word(&text, "binary ") ? LDAP_MOD_BVALUES : 0;
    mod->mod_op = operation_of(&text) | flag;
    mod->mod_type = next_part(&text, "=");
    if (text) {
        set_values(mod, text);
    }
    return mod;
}

LDAPMod **mods_of(const char *text) {
    if (!text) {
        return NULL;
    }
    LDAPMod **mods = allocate(strlen(text) + 2, sizeof *mods);
    for (size_t i = 0; text; ++i) {
        char *record = next_part(&text, "; ");
        mods[i] = mod_of(record);
        free(record);
    }
    return mods;
}

static void free_values(LDAPMod *mod) {
    if (mod->mod_op & LDAP_MOD_BVALUES) {
        for (struct berval **value = mod->mod_bvalues; value && *value; ++value) {
            free((*value)->bv_val);
            free(*value);
        }
        free(mod->mod_bvalues);
        return;
    }
    for (char **value = mod->mod_values; value && *value; ++value) {
        free(*value);
    }
    free(mod->mod_values);
}

void free_mods(LDAPMod **mods) {
    for (LDAPMod **mod = mods; mod && *mod; ++mod) {
        free_values(*mod);
        free((*mod)->mod_type);
        free(*mod);
    }
    free(mods);
}

static int with_mods(int (*call)(CfgHandle *, const char *, LDAPMod **), CfgHandle *handle,
                     const char *dn, const char *text) {
    LDAPMod **mods = mods_of(text);
    const int code = call(handle, dn, mods);
    free_mods(mods);
    return code;
}

int modify(CfgHandle *handle, const char *dn, const char *mods) {
    return with_mods(cfg_modify_s, handle, dn, mods);
}

void must_modify(CfgHandle *handle, const char *dn, const char *mods) {
    if (modify(handle, dn, mods) != CFG_SUCCESS) {
        fail_msg("%s: %d %s", mods, cfg_get_errno(handle), cfg_dump_exception(handle));
    }
    assert_no_report(handle, CFG_SUCCESS);
}

int add(CfgHandle *handle, const char *dn, const char *mods) {
    return with_mods(cfg_add_s, handle, dn, mods);
}

/* ---- configurations ---- */

/* The administrator's password is stored as a rewrite would store it. */
static const char *configuration_head(void) {
    static char head[512];
    char stored[256];
    if (!*head) {
        assert_int_equal(format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, NULL,
                                         PASSWORD, (int)strlen(PASSWORD), stored, sizeof stored),
                         1);
        snprintf(head, sizeof head,
                 "charset: UTF-8\n"
                 "version: 1\n"
                 "\n"
                 "dn: " TOP
                 "\n"
                 "cn: Configuration\n"
                 "objectclass: top\n"
                 "oru-slapdAdminDN: " ADMINISTRATOR
                 "\n"
                 "oru-slapdAdminPW: %s\n"
                 "\n",
                 stored);
    }
    return head;
}

char *configuration_of(const char *entries) {
    const char *head = configuration_head();
    char *text = allocate(1, strlen(head) + strlen(entries) + 1);
    strcpy(text, head);
    return strcat(text, entries);
}

void write_entries(const struct fixture *f, const char *entries) {
    char *text = configuration_of(entries);
    write_configuration(f, text);
    free(text);
}

void load_entries(const struct fixture *f, const char *entries) {
    write_entries(f, entries);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
}

static char *a_with(const char *lines) {
    char *entries = allocate(1, sizeof A_LINES("") + strlen(lines));
    strcpy(entries, "dn: " A "\n");
    strcat(entries, lines);
    return strcat(entries, "\n");
}

void load_lines(const struct fixture *f, const char *lines) {
    char *entries = a_with(lines);
    load_entries(f, entries);
    free(entries);
}

/* ---- expectations ---- */

void assert_file(const char *path, const char *expected) {
    char *text = read_file(path);
    assert_string_equal(text, expected);
    free(text);
}

void assert_entries(const struct fixture *f, const char *expected) {
    char *text = configuration_of(expected);
    assert_file(f->config, text);
    free(text);
}

void assert_lines(const struct fixture *f, const char *expected) {
    char *entries = a_with(expected);
    assert_entries(f, entries);
    free(entries);
}

/* The lines of an attribute; its name alone when it has no values. */
static void print_attribute(FILE *out, CfgHandle *handle, CfgMessage *entry, const char *name) {
    char **values = cfg_get_values(handle, entry, name);
    assert_int_equal(cfg_get_errno(handle), CFG_SUCCESS);
    if (!values) {
        fprintf(out, "%s\n", name);
    }
    for (char **value = values; value && *value; ++value) {
        fprintf(out, "%s: %s\n", name, *value);
    }
    cfg_value_free(values);
}

void assert_lines_in_memory(CfgHandle *handle, const char *dn, const char *expected) {
    char *text = NULL;
    size_t length = 0;
    CfgCursor *cursor = NULL;
    FILE *out = open_memstream(&text, &length);
    assert_non_null(out);
    /* Every entry has an attribute, or else it is not asked about. */
    CfgMessage *entry = found(handle, dn, CFG_SCOPE_BASE, "cn=*", NULL);
    assert_non_null(entry);
    for (char *name = cfg_first_attribute(handle, entry, &cursor); name;
         name = cfg_next_attribute(handle, entry, cursor)) {
        print_attribute(out, handle, entry, name);
        cfg_memfree(name);
    }
    cfg_ber_free(cursor);
    cfg_msgfree(entry);
    fclose(out);
    assert_string_equal(text, expected);
    free(text);
}

static const char *or_none(const char *text) { return text ? text : "<none>"; }

void assert_refused(const struct fixture *f, const char *dn, const struct refusal *expected) {
    char message[512];
    snprintf(message, sizeof message, "\nmsg     %s\n", expected->message);
    assert_report_has(f->handle, expected->code, message);
    assert_int_equal(cfg_get_exterror(f->handle), expected->extended);
    assert_string_equal(cfg_get_file_name(f->handle), f->config);
    assert_string_equal(cfg_get_entry(f->handle), dn);
    assert_string_equal(or_none(cfg_get_attribute(f->handle)), or_none(expected->attribute));
    assert_string_equal(cfg_get_value(f->handle), expected->value);
}

/* ---- the calls ---- */

#define B_LINES ENTRY("cn=B", "cn: B\nnote: b\n")

const char *const update_entries = A_LINES("cn: A\nnote: old\n") B_LINES;

static int run_modify(CfgHandle *handle) { return modify(handle, A, "replace note=new"); }
static int run_add(CfgHandle *handle) { return add(handle, "cn=C, " TOP, "add cn=C; add note=c"); }
static int run_delete(CfgHandle *handle) { return cfg_delete_s(handle, "cn=B, " TOP); }

const struct update_call update_calls[4] = {
    {"cfg_modify_s", run_modify, A_LINES("cn: A\nnote: new\n") B_LINES},
    {"cfg_add_s", run_add, A_LINES("cn: A\nnote: old\n") B_LINES ENTRY("cn=C", "cn: C\nnote: c\n")},
    {"cfg_delete_s", run_delete, A_LINES("cn: A\nnote: old\n")},
    {"cfg_flush_s", cfg_flush_s, A_LINES("cn: A\nnote: old\n") B_LINES},
};

void must_succeed(CfgHandle *handle, const struct update_call *call) {
    if (call->run(handle) != CFG_SUCCESS) {
        fail_msg("%s: %d %s", call->name, cfg_get_errno(handle), cfg_dump_exception(handle));
    }
    assert_no_report(handle, CFG_SUCCESS);
}

void must_change(const struct fixture *f, const struct update_call *call) {
    must_succeed(f->handle, call);
    assert_entries(f, call->after);
}

void must_fail(const struct fixture *f, const struct update_call *call, int code, int extended,
               const char *message, int error) {
    char expected[512];
    if (call->run(f->handle) != code) {
        fail_msg("%s: %d %s", call->name, cfg_get_errno(f->handle), cfg_dump_exception(f->handle));
    }
    assert_int_equal(cfg_get_exterror(f->handle), extended);
    assert_string_equal(cfg_get_file_name(f->handle), f->config);
    snprintf(expected, sizeof expected, "\nmsg     %s", message);
    assert_report_has(f->handle, code, expected);
    snprintf(expected, sizeof expected, "\nerrno %d: ", error);
    assert_report_has(f->handle, code, expected);
}

char *set_backup(const struct fixture *f, const char *name) {
    char *backup = path_of(f, name);
    assert_int_equal(cfg_set_option(f->handle, CFG_OPT_BACKUP_FILE, backup), CFG_SUCCESS);
    return backup;
}

CfgHandle *second_handle(const struct fixture *f) {
    CfgHandle *handle = cfg_init();
    assert_int_equal(cfg_set_option(handle, CFG_OPT_CONFIG_FILE, f->config), CFG_SUCCESS);
    assert_int_equal(bind_administrator(handle), CFG_SUCCESS);
    return handle;
}
