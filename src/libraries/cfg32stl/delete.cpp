// cfg_delete_s.

#include "update_call.h"

using namespace cfg32;

int cfg_delete_s(CfgHandle* handle, const char* dn) noexcept {
    return entry_call(handle, "cfg_delete_s()", dn, [&](LDIF_File& file, const LDIF_DN& entry) {
        int with_subtree = 0;
        cfg_get_option(handle, CFG_OPT_DELETE_NON_LEAVES, &with_subtree);
        file.erase(entry, with_subtree != 0);
    });
}
