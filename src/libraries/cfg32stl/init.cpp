// cfg_init, and the name of the default configuration file.

#include <pthread.h>

#include <cerrno>
#include <clocale>
#include <cstdlib>

#include "cfg32_platform.h"
#include "handle.h"

namespace {

/// The environment's locale becomes the process's. False when memory is exhausted: a handle would
/// then read files in another character set than theirs. A locale that there is not leaves the old
/// one.
bool take_locale() {
    initLocaleMutex();
    pthread_mutex_lock(&set_locale_mutex);
    errno = 0;
    const bool is_exhausted = !setlocale(LC_ALL, "") && errno == ENOMEM;
    pthread_mutex_unlock(&set_locale_mutex);
    return !is_exhausted;
}

}  // namespace

CfgHandle* cfg_init() noexcept {
    auto* handle = static_cast<CfgHandle*>(calloc(1, sizeof(CfgHandle)));
    if (!handle) {
        return nullptr;
    }
    if (!take_locale()) {
        free(handle);
        return nullptr;
    }
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
