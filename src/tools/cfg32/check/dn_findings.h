#pragma once

// What is to be said of a distinguished name's text.

#include <cstddef>
#include <optional>
#include <string>

#include "LDIF_DN.h"

namespace cfg32::tool {

/// The DN of a text, if it is one.
std::optional<LDIF_DN> parsed_dn(const std::string& text);

/// How many bytes were parsed of a text that is not a DN.
size_t parsed_length(const std::string& text);

/// Why a DN that was written so is not what it looks like, or would not be it any more after it was
/// printed and read; empty when there is nothing to say.
std::string change_of(const LDIF_DN& dn, const std::string& written);

/// True when the DN can't stand in a line of the file.
bool is_unprintable(const LDIF_DN& dn);
/// The same of a text.
bool breaks_line(std::string_view text);

}  // namespace cfg32::tool
