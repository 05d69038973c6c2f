#include <cstdlib>
#include <cstring>

#include "cfg32_platform.h"

namespace {

constexpr const char* configured_path = CFG32_INSTALL_PATH;

}  // namespace

char* getNUVInstallPath() noexcept {
    const char* path = secure_getenv("NUV_INSTALL_PATH");
    if (path == nullptr || *path == '\0') {
        path = configured_path;
    }
    return *path == '\0' ? nullptr : strdup(path);
}
