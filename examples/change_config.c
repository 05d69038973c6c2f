/*
 * Changes a configuration file: deletes an entry, adds one, gives a listener another port. Then it
 * shows what a refused change reports, what the backup holds, and the tree of all entries.
 *
 *   change_config CONFIG-FILE BACKUP-FILE KEY-FILE ADMINISTRATOR-DN < file-with-the-password
 *
 * It changes the file, so try it on a copy. Each change is on the disk when its call returns. A
 * function returns 1 when it has done its work and 0 when it has reported why not.
 */
#define _DEFAULT_SOURCE /* explicit_bzero */
#include <cfg32.h>
#include <cfg32_platform.h>
#include <inttypes.h>
#include <stdio.h>
#include <string.h>

#define NETWORK "cn=Network, cn=Configuration"
#define LISTENER "cn=Management Listener, " NETWORK

/* Tells how a call ended, and of a failure all that is known. Must be called before anything else
 * is done with the handle, which would forget the failure. */
static int succeeded(CfgHandle *handle, const char *what, int code) {
    fprintf(code == CFG_SUCCESS ? stdout : stderr, "%s: %s\n", what, cfg_err2string(code));
    const char *details = cfg_dump_exception(handle);
    if (code != CFG_SUCCESS && details) {
        fprintf(stderr, "%s", details);
    }
    return code == CFG_SUCCESS;
}

static int set_options(CfgHandle *handle, const char *file, const char *backup,
                       struct aes_key_data *key) {
    int code = cfg_set_option(handle, CFG_OPT_CONFIG_FILE, file);
    code = code ? code : cfg_set_option(handle, CFG_OPT_BACKUP_FILE, backup);
    code = code ? code : cfg_set_option(handle, CFG_OPT_KEY_DATA, key);
    return succeeded(handle, "set options", code);
}

static int delete_mail_system(CfgHandle *handle) {
    const char *dn = "cn=Old Mail System, cn=Pass-Through, cn=Configuration";
    return succeeded(handle, "delete the old mail system", cfg_delete_s(handle, dn));
}

static int add_listener(CfgHandle *handle) {
    char *names[] = {"Night Listener", NULL};
    char *kinds[] = {"top", "oruListener", NULL};
    char *ports[] = {"1389", NULL};
    LDAPMod name = {.mod_type = "cn", .mod_values = names};
    LDAPMod kind = {.mod_type = "objectclass", .mod_values = kinds};
    LDAPMod port = {.mod_type = "oru-slapdPort", .mod_values = ports};
    LDAPMod *attributes[] = {&name, &kind, &port, NULL};
    const char *dn = "cn=Night Listener, " NETWORK;
    return succeeded(handle, "add a listener", cfg_add_s(handle, dn, attributes));
}

/* Returns the call's result code. */
static int modify_port(CfgHandle *handle, int operation, char *port) {
    char *ports[] = {port, NULL};
    LDAPMod change = {.mod_op = operation, .mod_type = "oru-slapdPort", .mod_values = ports};
    LDAPMod *changes[] = {&change, NULL};
    return cfg_modify_s(handle, LISTENER, changes);
}

/* A listener has one port. These calls tell a program what cfg_dump_exception() tells a person. */
static int try_a_second_port(CfgHandle *handle) {
    int code = modify_port(handle, LDAP_MOD_ADD, "3540");
    if (code != CFG_CONSTRAINT_VIOLATION) {
        return succeeded(handle, "add a second port", code);
    }
    printf("add a second port: %s\n", cfg_err2string(cfg_get_exterror(handle)));
    printf("  file: %s\n  entry: %s\n", cfg_get_file_name(handle), cfg_get_entry(handle));
    printf("  %s: %s\n", cfg_get_attribute(handle), cfg_get_value(handle));
    printf("  allowed: %" PRId64 " to %" PRId64 "%s\n", cfg_get_minimum(handle),
           cfg_get_maximum(handle), cfg_get_is_single(handle) ? ", one value" : "");
    return 1;
}

/* The last change replaced a line by another: the lines of both files go side by side. */
static void print_differences(FILE *backup, FILE *file) {
    char before[2048], after[2048];
    while (fgets(before, sizeof before, backup) && fgets(after, sizeof after, file)) {
        if (strcmp(before, after) != 0) {
            printf("-%s+%s", before, after);
        }
    }
}

static int compare(const char *backup_name, const char *file_name) {
    FILE *backup = fopen(backup_name, "r");
    FILE *file = backup ? fopen(file_name, "r") : NULL;
    if (file) {
        printf("--- %s\n+++ %s\n", backup_name, file_name);
        print_differences(backup, file);
        fclose(file);
    } else {
        perror(backup ? file_name : backup_name);
    }
    if (backup) {
        fclose(backup);
    }
    return file != NULL;
}

static int draw_tree(CfgHandle *handle) {
    const char *tree = cfg_tree_view(handle, CFG_TREE_ASCII); /* the handle's: not to be freed */
    if (!tree) {
        fprintf(stderr, "the tree can't be drawn\n");
        return 0;
    }
    printf("%s", tree);
    return 1;
}

int main(int argc, char **argv) {
    char password[1026]; /* 1024 characters at most */
    if (argc != 5 || !fgets(password, sizeof password, stdin)) {
        fprintf(stderr, "usage: %s CONFIG-FILE BACKUP-FILE KEY-FILE ADMINISTRATOR-DN\n", argv[0]);
        return 2;
    }
    password[strcspn(password, "\n")] = '\0';
    struct aes_key_data *key = aes_key_data_from_file(argv[3]);
    if (!key) {
        perror(argv[3]);
    }
    CfgHandle *handle = cfg_init();
    int done = key && set_options(handle, argv[1], argv[2], key) &&
               succeeded(handle, "bind", cfg_bind_s(handle, argv[4], password, CFG_AUTH_SIMPLE)) &&
               delete_mail_system(handle) && add_listener(handle) &&
               succeeded(handle, "move a port", modify_port(handle, LDAP_MOD_REPLACE, "3539")) &&
               try_a_second_port(handle) && compare(argv[2], argv[1]) && draw_tree(handle);
    cfg_unbind(handle);
    aes_key_data_free(key);
    explicit_bzero(password, sizeof password);
    return done && fflush(stdout) == 0 ? 0 : 1;
}
