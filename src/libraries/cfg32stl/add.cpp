// cfg_add_s.

#include "update_call.h"

using namespace cfg32;

int cfg_add_s(CfgHandle* handle, const char* dn, ldapmod** mods) noexcept {
    return entry_call(handle, "cfg_add_s()", dn,
                      [&](LDIF_File& file, const LDIF_DN& entry) { file.add(entry, mods); });
}
