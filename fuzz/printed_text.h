#pragma once

#include <string>

#include "LDIF_File.h"

namespace cfg32::fuzz {

/// The text of each entry, of lines that were not read unless somebody asked: what a file has when
/// it was written.
inline std::string printed_text(const LDIF_File& file) {
    std::string text;
    for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) { entry.append_to(text); });
    file.trailing_comment().append_to(text);
    return text;
}

}  // namespace cfg32::fuzz
