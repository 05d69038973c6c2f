/*
 * Reads a configuration file: the server's ports, and the suppliers it replicates from with the
 * passwords it uses there.
 *
 *   read_config CONFIG-FILE KEY-FILE ADMINISTRATOR-DN < file-with-the-password
 *
 * Copy what you need: every call is checked, everything is freed, and a failure is reported in
 * full.
 */
#include <cfg32.h>
#include <cfg32_platform.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

static int report(CfgHandle *handle, const char *what) {
    const char *details = cfg_dump_exception(handle);
    fprintf(stderr, "%s: %s\n", what, cfg_err2string(cfg_get_errno(handle)));
    if (details) {
        fprintf(stderr, "%s", details);
    }
    return 0;
}

static void print_values(CfgHandle *handle, CfgMessage *entry, const char *attribute) {
    char **values = cfg_get_values(handle, entry, attribute);
    int count = cfg_count_values(values);
    for (int i = 0; i < count; i++) {
        printf("  %s: %s\n", attribute, values[i]);
    }
    cfg_value_free(values);
}

static void print_entry(CfgHandle *handle, CfgMessage *entry) {
    char *dn = cfg_get_dn(handle, entry);
    printf("%s\n", dn ? dn : "(out of memory)");
    cfg_memfree(dn);

    CfgCursor *cursor = NULL;
    char *attribute = cfg_first_attribute(handle, entry, &cursor);
    while (attribute) {
        print_values(handle, entry, attribute);
        cfg_memfree(attribute);
        attribute = cfg_next_attribute(handle, entry, cursor);
    }
    cfg_ber_free(cursor);
}

/* Prints what a subtree search finds; attrs ends with NULL. */
static int print_search(CfgHandle *handle, const char *base, const char *filter, char **attrs) {
    CfgMessage *result = NULL;
    if (cfg_search_s(handle, base, CFG_SCOPE_SUBTREE, filter, attrs, 0, &result) != CFG_SUCCESS) {
        return report(handle, "search");
    }
    printf("%s below %s: %d\n", filter, base, cfg_count_entries(handle, result));
    for (CfgMessage *entry = cfg_first_entry(handle, result); entry;
         entry = cfg_next_entry(handle, entry)) {
        print_entry(handle, entry);
    }
    cfg_msgfree(result);
    return 1;
}

static int print_configuration(CfgHandle *handle) {
    /* The same words in an array that may be changed, as the call's signature has it. */
    char port[] = "oru-slapdPort", secure_port[] = "oru-slapdSecurePort";
    char *ports[] = {port, secure_port, NULL};
    /* A password that is asked for by name comes in clear. */
    char dn[] = "oru-slapdMasterDN", password[] = "oru-slapdMasterPW";
    char *suppliers[] = {dn, password, NULL};

    return print_search(handle, "cn=Configuration", "(oru-slapdPort=*)", ports) &&
           print_search(handle, "cn=Replication, cn=Configuration", "(objectclass=oruSupplier)",
                        suppliers);
}

static int set_options(CfgHandle *handle, const char *file, struct aes_key_data *key) {
    int code = cfg_set_option(handle, CFG_OPT_CONFIG_FILE, file);
    if (code == CFG_SUCCESS) {
        code = cfg_set_option(handle, CFG_OPT_KEY_DATA, key);
    }
    if (code != CFG_SUCCESS) {
        fprintf(stderr, "%s: %s\n", file, cfg_err2string(code));
    }
    return code == CFG_SUCCESS;
}

static int bind_as(CfgHandle *handle, const char *dn, const char *password) {
    return cfg_bind_s(handle, dn, password, CFG_AUTH_SIMPLE) == CFG_SUCCESS ||
           report(handle, "bind");
}

int main(int argc, char **argv) {
    char password[1026];
    if (argc != 4 || !fgets(password, sizeof password, stdin)) {
        fprintf(stderr, "usage: %s CONFIG-FILE KEY-FILE ADMINISTRATOR-DN < PASSWORD-FILE\n",
                argv[0]);
        return 2;
    }
    password[strcspn(password, "\n")] = '\0';

    struct aes_key_data *key = aes_key_data_from_file(argv[2]);
    if (!key) {
        perror(argv[2]);
        return 1;
    }
    CfgHandle *handle = cfg_init();
    int done = handle && set_options(handle, argv[1], key) && bind_as(handle, argv[3], password) &&
               print_configuration(handle);
    explicit_bzero(password, sizeof password);
    cfg_unbind(handle);
    aes_key_data_free(key);
    return done ? 0 : 1;
}
