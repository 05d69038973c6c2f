#pragma once

#include <string>

#include "LDIF_DN.h"

namespace cfg32::tests {

inline LDIF_DN dn_of(const std::string& text) { return LDIF_DN(cisString(text)); }

}  // namespace cfg32::tests
