// cfg_init, and the name of the default configuration file.

#include <pthread.h>

#include <clocale>
#include <cstdlib>

#include "cfg32_platform.h"
#include "handle.h"

CfgHandle* cfg_init() noexcept {
    auto* handle = static_cast<CfgHandle*>(calloc(1, sizeof(CfgHandle)));
    if (!handle) {
        return nullptr;
    }
    initLocaleMutex();
    pthread_mutex_lock(&set_locale_mutex);
    setlocale(LC_ALL, "");
    pthread_mutex_unlock(&set_locale_mutex);
    cfg_set_option(handle, CFG_OPT_FLAG_A, CFG_OPT_ON);
    cfg_set_option(handle, CFG_OPT_FLAG_B, CFG_OPT_OFF);
    cfg_set_option(handle, CFG_OPT_SHOW_SOURCE, CFG_OPT_OFF);
    cfg_set_option(handle, CFG_OPT_SHOW_STACK, CFG_OPT_ON);
    cfg_set_option(handle, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_OFF);
    return handle;
}

char* getDefaultConfigFilename() {
    static thread_local char name[512];
    char* installation = getNUVInstallPath();
    if (!installation) {
        return nullptr;
    }
    const int length = nuv_snprintf(name, sizeof name, "%s/etc/oruslapd.conf", installation);
    free(installation);
    return length >= 0 && static_cast<size_t>(length) < sizeof name ? name : nullptr;
}
