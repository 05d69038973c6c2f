// cfg_flush_s.

#include "update_call.h"

using namespace cfg32;

int cfg_flush_s(CfgHandle* handle) noexcept {
    return bound_call(handle, "cfg_flush_s()",
                      [](LDIF_File& file) { return updated(file, [] {}); });
}
