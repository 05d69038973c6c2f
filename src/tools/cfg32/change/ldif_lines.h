#pragma once

// The lines of an LDIF text (RFC 2849): records of logical lines, split at their colons.

#include <string>
#include <string_view>
#include <vector>

#include "change/ldif_reader.h"

namespace cfg32::tool {

/// A logical line: its continuations are joined to it.
struct ldif_text_line {
    int number;  ///< of its first physical line, counted from 1
    std::string text;
    bool is_orphan = false;  ///< a continuation without a line before it
};

/// The lines between two blank ones, comments left out.
using ldif_lines = std::vector<ldif_text_line>;

/// The records of a text. None is empty.
std::vector<ldif_lines> split_records(std::string_view text);

/// A logical line "name: value".
struct named_value {
    int line;
    std::string name;
    std::string value;  ///< decoded, without NULs and line ends
};

/// Throws ldif_error.
named_value parse_line(const ldif_text_line& line);

/// Compares names, whose case means nothing.
bool is_same_name(std::string_view left, std::string_view right);

/// True for a text that can be an attribute's name in LDIF.
bool is_attribute_name(std::string_view text);

/// Throws ldif_error for a text that is no attribute's name.
void require_name(std::string_view name, int line);

}  // namespace cfg32::tool
