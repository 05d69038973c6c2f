#pragma once

// The frame of the calls that change the configuration file.

#include "LDIF_DN.h"
#include "LDIF_File.h"
#include "handle.h"

namespace cfg32 {

/// Refreshes, changes and writes the file while every other user of it is kept away.
template <class Change>
int updated(LDIF_File& file, Change change) {
    const LDIF_File::update lock(file);
    file.refresh();
    change();
    file.flush();
    return CFG_SUCCESS;
}

/// The frame of calls that change one entry, by change(file, dn).
template <class Change>
int entry_call(CfgHandle* handle, const char* call, const char* dn, Change change,
               const throw_site& site = {}) noexcept {
    return bound_call(
        handle, call,
        [&](LDIF_File& file) -> int {
            return dn ? updated(file, [&] { change(file, LDIF_DN{cisString(dn)}); })
                      : CFG_PARAM_ERROR;
        },
        site);
}

}  // namespace cfg32
