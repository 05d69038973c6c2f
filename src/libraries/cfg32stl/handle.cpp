// What the handle keeps of a failure, and how it forgets it.

#include "handle.h"

#include <cstdlib>
#include <memory>
#include <new>
#include <utility>

int cfg_reset(CfgHandle* handle) noexcept {
    if (!handle) {
        return CFG_PARAM_ERROR;
    }
    handle->err = CFG_SUCCESS;
    free(std::exchange(handle->dumpText, nullptr));
    free(std::exchange(handle->treeText, nullptr));
    delete std::exchange(handle->exception, nullptr);
    return CFG_SUCCESS;
}

namespace cfg32 {

int record(CfgHandle& handle, const LDIF_Exception& e) noexcept {
    try {
        handle.exception = std::make_unique<LDIF_Exception>(e).release();
        return handle.err = e.ldapErr;
    } catch (const std::bad_alloc&) {
        return handle.err = CFG_NO_MEMORY;
    }
}

int record_system_error(CfgHandle& handle, const char* call, const throw_site& site) noexcept {
    try {
        const LDIF_Exception e = make_exception({80, 1000, "System error in "}, call, site);
        return record(handle, e);
    } catch (const std::bad_alloc&) {
        return handle.err = CFG_NO_MEMORY;
    }
}

}  // namespace cfg32
