#pragma once

#include <string>
#include <vector>

#include "LDIF_Comment.h"
#include "LDIF_Line.h"

namespace cfg32::tests {

/// A line as the reader would have left it.
inline LDIF_Line line_of(int type, const std::string& attribute, const std::string& value) {
    LDIF_Line line;
    line.type = type;
    line.attribute = attribute;
    line.value = value;
    line.hasSeparator = 1;
    return line;
}

/// A comment of these lines; an empty one is a blank line.
inline LDIF_Comment comment_of(const std::vector<std::string>& lines) {
    LDIF_Comment comment;
    for (const std::string& text : lines) {
        comment += line_of(text.empty() ? LDIF_Line::blankLine : LDIF_Line::comment, "", text);
    }
    return comment;
}

}  // namespace cfg32::tests
