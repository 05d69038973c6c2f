#pragma once

// The handle behind the C interface, and the frame that every exported operation stands in.

#include "LDIF_Exception.h"
#include "cfg32.h"
#include "failure.h"

class LDIF_File;

/// Allocated with malloc, zero-filled; the pointers are owned unless said otherwise.
struct CfgHandle {
    int err;                    ///< result code of the last call
    unsigned int flags;         ///< bits of the boolean options, see option.cpp
    char* fileName;             ///< configuration file, null until set or bound
    char* backupFileName;       ///< null: no backup
    LDIF_File* file;            ///< the loaded file, null until bound
    LDIF_Exception* exception;  ///< of the last call, null if none
    char* dumpText;             ///< cached by cfg_dump_exception()
    char* treeText;             ///< cached drawing of the entry tree
    aes_key_data* keyData;      ///< not owned
};
static_assert(sizeof(CfgHandle) == 64);

namespace cfg32 {

/// Keeps a copy of the exception in the handle; returns its LDAP code (90 when there is no memory
/// left for the copy).
int record(CfgHandle& handle, const LDIF_Exception& e) noexcept;

/// Keeps "System error in <call>" in the handle, for what nobody expected; returns 80 (or 90).
int record_system_error(CfgHandle& handle, const char* call, const throw_site& site) noexcept;

/// True after a successful bind.
inline bool is_bound(const CfgHandle& handle) { return handle.fileName && handle.file; }

/// Runs body, which returns a result code, and keeps the code, or what it throws, in the handle.
template <class Body>
int guarded(CfgHandle& handle, const char* call, Body body, const throw_site& site) noexcept {
    try {
        return handle.err = body();
    } catch (const LDIF_Exception& e) {
        return record(handle, e);
    } catch (...) {
        return record_system_error(handle, call, site);
    }
}

/// The frame of calls that need a handle: reset, operation(), record.
template <class Operation>
int handle_call(CfgHandle* handle, const char* call, Operation operation,
                const throw_site& site = {}) noexcept {
    if (cfg_reset(handle) != CFG_SUCCESS) {
        return CFG_PARAM_ERROR;
    }
    return guarded(*handle, call, operation, site);
}

/// The frame of calls that need a bound handle: reset, check, operation(file), record.
template <class Operation>
int bound_call(CfgHandle* handle, const char* call, Operation operation,
               const throw_site& site = {}) noexcept {
    return handle_call(
        handle, call,
        [&]() -> int { return is_bound(*handle) ? operation(*handle->file) : CFG_PARAM_ERROR; },
        site);
}

}  // namespace cfg32

/// The default configuration file, below the server's installation directory: text in a static
/// buffer of the thread, or null when the directory is unknown or its name is too long.
char* getDefaultConfigFilename();
