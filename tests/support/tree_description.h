#pragma once

#include <cstddef>
#include <string>

#include "LDIF_File.h"

namespace cfg32::tests {

/// The blank line below the root's attributes is read as the first entry's, whether it was that
/// entry's before or one that the root brought.
inline std::string without_separator(const std::string& comment) {
    return comment.substr(comment.starts_with('\n') ? 1 : 0);
}

inline void describe(const LDIF_Entry& entry, size_t depth, bool is_first, std::string& out) {
    const std::string margin(depth * 2, ' ');
    const std::string comment = entry.comment().str();
    out += margin + "[" + entry.name().text() + "] " + entry.dn().str() + " | " +
           entry.relative_dn().str() + "\n" + (is_first ? without_separator(comment) : comment);
    for (const LDIF_Attribute& attribute : entry.attributes()) {
        out += attribute.comment().str() + margin + attribute.name().text() + "\n";
        for (const LDIF_Value& value : attribute.values()) {
            out += margin + "  <" + value.str() + ">\n";
        }
    }
    for (const LDIF_Entry& child : entry.children()) {
        describe(child, depth + 1, entry.is_root() && &child == &entry.children().front(), out);
    }
}

/// All that a store holds.
inline std::string description(const LDIF_File& file) {
    std::string out;
    describe(file.root(), 0, false, out);
    return out + "end\n" + file.trailing_comment().str();
}

}  // namespace cfg32::tests
