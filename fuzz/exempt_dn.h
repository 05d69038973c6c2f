#pragma once

#include "LDIF_DN.h"
#include "LDIF_Value.h"

namespace cfg32::fuzz {

/// KEPT: what the grammar reads otherwise than it is printed: a plain value before the " + " of the
/// next pair, which loses its last character to the blank, unless that is a blank itself.
bool is_read_differently(const LDIF_DN& dn);

/// True for a value that is such a DN.
bool is_exempt(const LDIF_Value& value);

}  // namespace cfg32::fuzz
