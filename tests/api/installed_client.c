#include <cfg32.h>
#include <stdio.h>

int main(int argc, char **argv) {
    CfgHandle *handle = cfg_init();
    const char *name = argc > 1 ? argv[1] : "oruslapd.conf";
    cfg_set_option(handle, CFG_OPT_CONFIG_FILE, name);
    const int code = cfg_bind_s(handle, NULL, NULL, CFG_AUTH_SIMPLE);
    puts(cfg_err2string(code));
    return cfg_unbind(handle);
}
