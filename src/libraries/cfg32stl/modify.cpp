// cfg_modify_s.

#include "update_call.h"

using namespace cfg32;

int cfg_modify_s(CfgHandle* handle, const char* dn, ldapmod** mods) noexcept {
    return entry_call(handle, "cfg_modify_s()", dn,
                      [&](LDIF_File& file, const LDIF_DN& entry) { file.modify(entry, mods); });
}
