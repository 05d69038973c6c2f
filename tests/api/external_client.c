/* A host program that brings all of the server's routines with it. */

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "cfg32.h"
#include "host_routines.h"

static void expect(int holds, const char *what) {
    if (!holds) {
        fprintf(stderr, "not so: %s\n", what);
        exit(1);
    }
}

int main(int argc, char **argv) {
    char name[] = "oru-slapdMasterPW";
    char *attrs[] = {name, NULL};
    char *file = NULL;
    CfgMessage *result = NULL;
    expect(argc == 2, "the installation directory is given");
    reset_host();
    host.install_path = argv[1];
    CfgHandle *handle = cfg_init();
    expect(host.initialised_locale == 1, "initLocaleMutex was called");
    cfg_set_option(handle, CFG_OPT_BACKUP_FILE, "/the/backup");
    expect(cfg_bind_s(handle, "cn=root", "secret", CFG_AUTH_SIMPLE) == CFG_SUCCESS, "bound");
    cfg_get_option(handle, CFG_OPT_CONFIG_FILE, &file);
    expect(strncmp(file, argv[1], strlen(argv[1])) == 0, "the host's directory was used");
    cfg_memfree(file);
    expect(strcmp(host.copy_target, "/the/backup") == 0, "copyFile was called");
    expect(host.encoded > 0 && host.decoded > 0 && host.freed > 0, "passwords were handled");
    expect(cfg_search_s(handle, "cn=Configuration", CFG_SCOPE_BASE, NULL, attrs, 0, &result) ==
               CFG_SUCCESS,
           "searched");
    char **values = cfg_get_values(handle, result, name);
    expect(values && strcmp(values[0], "sesame") == 0, "the host decoded the password");
    cfg_value_free(values);
    cfg_msgfree(result);
    return cfg_unbind(handle);
}
