#pragma once

// LDIF of changes (RFC 2849), read strictly: what is not well-formed is an error with its line, and
// nothing is guessed.

#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "change/change_record.h"

namespace cfg32::tool {

/// What is wrong with a record; the other records are read all the same.
struct ldif_error {
    int line;
    std::string text;
};

/// Each record of the text, or what is wrong with it. A record without "changetype:" is of the
/// default kind: an added entry with its content, a modification's blocks, or an entry's DN alone.
std::vector<std::variant<change_record, ldif_error>> read_ldif(
    std::string_view text, change_record::operation default_kind);

}  // namespace cfg32::tool
