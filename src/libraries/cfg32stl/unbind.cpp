// cfg_unbind.

#include <cstdlib>
#include <cstring>

#include "LDIF_File.h"
#include "handle.h"

int cfg_unbind(CfgHandle* handle) noexcept {
    if (cfg_reset(handle) != CFG_SUCCESS) {
        return CFG_PARAM_ERROR;
    }
    free(handle->fileName);
    free(handle->backupFileName);
    delete handle->file;
    explicit_bzero(handle, sizeof *handle);
    free(handle);
    return CFG_SUCCESS;
}
