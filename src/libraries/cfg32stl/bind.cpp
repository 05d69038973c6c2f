// cfg_bind_s.

#include <cstring>
#include <memory>

#include "LDIF_File.h"
#include "handle.h"

using namespace cfg32;

namespace {

constexpr failure no_default_name{
    80, 1000,
    "Unable to get default config filename. Either out of memory or ldaphome not in registry"};
constexpr failure no_memory_for_name{90, 90, "strdup()"};
constexpr failure not_simple{86, 86, "Bind method must be one of { LDAP_AUTH_SIMPLE }"};

void require_file_name(CfgHandle& handle) {
    if (handle.fileName) {
        return;
    }
    const char* name = getDefaultConfigFilename();
    if (!name) {
        raise(no_default_name);
    }
    handle.fileName = strdup(name);
    if (!handle.fileName) {
        raise(no_memory_for_name);
    }
}

}  // namespace

int cfg_bind_s(CfgHandle* handle, const char* dn, const char* password, int method) noexcept {
    return handle_call(handle, "cfg_bind_s()", [&]() -> int {
        require_file_name(*handle);
        if (method != CFG_AUTH_SIMPLE) {
            raise(not_simple);
        }
        const char* backup = handle->backupFileName;
        auto file =
            std::make_unique<LDIF_File>(handle->fileName, backup ? backup : "", handle->keyData);
        const int authentication = with_system_error(
            in("LDIF_File::setAuthentication()"),
            [&] { return file->setAuthentication(dn, password, method); }, no_details);
        if (authentication == LDIF_File::not_authenticated) {
            return CFG_INVALID_CREDENTIALS;
        }
        delete handle->file;
        handle->file = file.release();
        return CFG_SUCCESS;
    });
}
