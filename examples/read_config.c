/*
 * Reads a configuration file: the server's ports, and the suppliers it replicates from with the
 * passwords it uses there.
 *
 *   read_config CONFIG-FILE KEY-FILE ADMINISTRATOR-DN < file-with-the-password
 *
 * Copy what you need: every call is checked, everything is freed, clear passwords are wiped, and a
 * failure is reported in full. A function returns 1 when it has done its work and 0 when it has
 * reported why not.
 */
#define _DEFAULT_SOURCE /* explicit_bzero */
#include <cfg32.h>
#include <cfg32_platform.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

/* Must be called before anything else is done with the handle, which would forget the failure. */
static int report(CfgHandle *handle, const char *what) {
    const char *details = cfg_dump_exception(handle);
    fprintf(stderr, "%s: %s\n", what, cfg_err2string(cfg_get_errno(handle)));
    if (details) {
        fprintf(stderr, "%s", details);
    }
    return 0;
}

static void print_and_wipe(const char *attribute, char *value) {
    printf("  %s: %s\n", attribute, value);
    explicit_bzero(value, strlen(value));
}

static int print_values(CfgHandle *handle, CfgMessage *entry, const char *attribute) {
    char **values = cfg_get_values(handle, entry, attribute);
    if (!values && cfg_get_errno(handle) != CFG_SUCCESS) {
        return report(handle, attribute);
    }
    int count = cfg_count_values(values);
    for (int i = 0; i < count; i++) {
        print_and_wipe(attribute, values[i]);
    }
    cfg_value_free(values);
    return 1;
}

static int print_attributes(CfgHandle *handle, CfgMessage *entry) {
    CfgCursor *cursor = NULL;
    char *attribute = cfg_first_attribute(handle, entry, &cursor);
    int done = 1;
    while (attribute && done) {
        done = print_values(handle, entry, attribute);
        cfg_memfree(attribute);
        attribute = done ? cfg_next_attribute(handle, entry, cursor) : NULL;
    }
    /* A walk ends with a null name; only the error tells whether it came to the end. */
    if (done && cfg_get_errno(handle) != CFG_SUCCESS) {
        done = report(handle, "attributes");
    }
    cfg_ber_free(cursor);
    return done;
}

static int print_entry(CfgHandle *handle, CfgMessage *entry) {
    char *dn = cfg_get_dn(handle, entry);
    if (!dn) {
        return report(handle, "entry");
    }
    printf("%s\n", dn);
    cfg_memfree(dn);
    return print_attributes(handle, entry);
}

/* Prints what a subtree search finds; attrs ends with NULL. */
static int print_search(CfgHandle *handle, const char *base, const char *filter, char **attrs) {
    CfgMessage *result = NULL;
    if (cfg_search_s(handle, base, CFG_SCOPE_SUBTREE, filter, attrs, 0, &result) != CFG_SUCCESS) {
        return report(handle, "search");
    }
    printf("%s below %s: %d\n", filter, base, cfg_count_entries(handle, result));
    int done = 1;
    for (CfgMessage *entry = cfg_first_entry(handle, result); entry && done;
         entry = cfg_next_entry(handle, entry)) {
        done = print_entry(handle, entry);
    }
    cfg_msgfree(result);
    return done;
}

static int print_configuration(CfgHandle *handle) {
    /* Arrays of their own, as the call's signature has it: it doesn't change the names. */
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

static int read_config(const char *file, struct aes_key_data *key, const char *dn,
                       const char *password) {
    CfgHandle *handle = cfg_init();
    if (!handle) {
        fprintf(stderr, "%s\n", cfg_err2string(CFG_NO_MEMORY));
        return 0;
    }
    int done = set_options(handle, file, key) && bind_as(handle, dn, password) &&
               print_configuration(handle);
    cfg_unbind(handle);
    return done;
}

/* Reads a line of up to size - 2 characters, without its newline. */
static int read_line(char *line, int size) {
    if (!fgets(line, size, stdin)) {
        return 0;
    }
    size_t length = strcspn(line, "\n");
    int is_whole = line[length] == '\n' || feof(stdin);
    line[length] = '\0';
    return is_whole;
}

int main(int argc, char **argv) {
    char password[1026]; /* 1024 characters at most */
    if (argc != 4 || !read_line(password, sizeof password)) {
        fprintf(stderr, "usage: %s CONFIG-FILE KEY-FILE ADMINISTRATOR-DN < PASSWORD-FILE\n",
                argv[0]);
        return 2;
    }
    struct aes_key_data *key = aes_key_data_from_file(argv[2]);
    if (!key) {
        perror(argv[2]);
    }
    int done = key && read_config(argv[1], key, argv[3], password);
    explicit_bzero(password, sizeof password);
    aes_key_data_free(key);
    if (fflush(stdout) != 0) {
        perror("standard output");
        done = 0;
    }
    return done ? 0 : 1;
}
