/*
 * A program that changes a configuration with the LDAP client interface's own records, with and
 * without an LDAP client's header:
 *
 *   LDAP_HEADER_BEFORE       includes <ldap.h> before cfg32.h
 *   LDAP_HEADER_AFTER        includes it after cfg32.h
 *   CFG32_WITHOUT_LDAP_H     does without
 *   none of these            leaves it to cfg32.h
 *
 * Strictly C99, and C++20 as well. It prints how the records are laid out, which has to be the same
 * in every variant.
 *
 * usage: ldap_client <configuration file>
 */
#ifdef LDAP_HEADER_BEFORE
#include <ldap.h>
#endif
#include "cfg32.h"
#ifdef LDAP_HEADER_AFTER
#include <ldap.h>
#endif

#include <stddef.h>
#include <stdio.h>

#if defined(LDAP_HEADER_BEFORE) || defined(LDAP_HEADER_AFTER)
#ifndef LDAP_API_VERSION
#error "this is not an LDAP client's header"
#endif
#elif defined(CFG32_WITHOUT_LDAP_H) && defined(LDAP_API_VERSION)
#error "an LDAP client's header was included"
#endif

#define SHOW(number) printf("%s: %lu\n", #number, (unsigned long)(number))

static void show_layout(void) {
    SHOW(sizeof(LDAPMod));
    SHOW(sizeof(struct ldapmod));
    SHOW(offsetof(LDAPMod, mod_op));
    SHOW(offsetof(LDAPMod, mod_type));
    SHOW(offsetof(LDAPMod, mod_values));
    SHOW(offsetof(LDAPMod, mod_bvalues));
    SHOW(sizeof(((LDAPMod *)0)->mod_op));
    SHOW(sizeof(((LDAPMod *)0)->mod_vals));
    SHOW(sizeof(struct berval));
    SHOW(sizeof(BerValue));
    SHOW(offsetof(struct berval, bv_len));
    SHOW(offsetof(struct berval, bv_val));
    SHOW(sizeof(((struct berval *)0)->bv_len));
    SHOW(LDAP_MOD_ADD);
    SHOW(LDAP_MOD_DELETE);
    SHOW(LDAP_MOD_REPLACE);
    SHOW(LDAP_MOD_BVALUES);
}

static LDAPMod with_texts(int operation, char *name, char **values) {
    LDAPMod mod;
    mod.mod_op = operation;
    mod.mod_type = name;
    mod.mod_values = values;
    return mod;
}

static LDAPMod with_bytes(int operation, char *name, struct berval **values) {
    LDAPMod mod;
    mod.mod_op = operation | LDAP_MOD_BVALUES;
    mod.mod_type = name;
    mod.mod_bvalues = values;
    return mod;
}

static int change(CfgHandle *handle) {
    char cn[] = "cn", note[] = "note", port[] = "oru-slapdPort";
    char new_name[] = "New", old_note[] = "old", port_number[] = "1389", bytes[] = "binary";
    char *names[] = {new_name, NULL};
    char *notes[] = {old_note, NULL};
    char *ports[] = {port_number, NULL};
    BerValue value;
    struct berval *values[] = {&value, NULL};
    LDAPMod name = with_texts(LDAP_MOD_ADD, cn, names);
    LDAPMod drop = with_texts(LDAP_MOD_DELETE, note, notes);
    LDAPMod take = with_bytes(LDAP_MOD_ADD, note, values);
    LDAPMod move = with_texts(LDAP_MOD_REPLACE, port, ports);
    LDAPMod *of_new[] = {&name, &take, NULL};
    LDAPMod *of_old[] = {&drop, &take, &move, NULL};
    LDAPMod **changes = of_old;
    value.bv_len = sizeof bytes - 1;
    value.bv_val = bytes;
    return cfg_add_s(handle, "cn=New, cn=Configuration", of_new) == CFG_SUCCESS &&
           cfg_modify_s(handle, "cn=Old, cn=Configuration", changes) == CFG_SUCCESS &&
           cfg_delete_s(handle, "cn=Gone, cn=Configuration") == CFG_SUCCESS &&
           cfg_flush_s(handle) == CFG_SUCCESS;
}

int main(int argc, char **argv) {
    CfgHandle *handle = cfg_init();
    if (argc != 2 || cfg_set_option(handle, CFG_OPT_CONFIG_FILE, argv[1]) != CFG_SUCCESS ||
        cfg_bind_s(handle, NULL, NULL, CFG_AUTH_SIMPLE) != CFG_SUCCESS || !change(handle)) {
        const char *report = cfg_dump_exception(handle);
        fprintf(stderr, "%s\n", report ? report : cfg_err2string(cfg_get_errno(handle)));
        cfg_unbind(handle);
        return 1;
    }
    show_layout();
    return cfg_unbind(handle);
}
