#pragma once

// LDIF (RFC 2849) as LDAP tools print it: base64 where a value is not plain ASCII text, long lines
// folded at 76 columns.

#include <string>
#include <string_view>
#include <vector>

#include "change/change_record.h"
#include "entry.h"

namespace cfg32::tool {

/// A line, with its newline, and in base64 or folded where it must be.
std::string ldif_line(std::string_view name, std::string_view value, bool is_folded = true);

/// An entry with a blank line after it.
std::string ldif(const entry& printed, bool is_folded = true);

/// A change record with a blank line after it.
std::string ldif(const change_record& record, bool is_folded = true);

}  // namespace cfg32::tool
