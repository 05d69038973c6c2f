#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "LDIF_DN.h"

namespace cfg32::tool {

/// Where an entry stands in a configuration's text: from the comment lines right above its DN line
/// to its last attribute line.
struct entry_text {
    size_t begin;    ///< in bytes
    size_t end;      ///< behind the last line's newline
    int first_line;  ///< counted from 1
};

/// Ends the command when there is no such entry, or when it stands there several times.
entry_text find_entry_text(std::string_view text, const std::string& dn);

}  // namespace cfg32::tool
