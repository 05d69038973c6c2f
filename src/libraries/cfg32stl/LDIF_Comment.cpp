#include "LDIF_Comment.h"

#include <algorithm>
#include <ostream>

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Line& line) {
    if (line.type == LDIF_Line::blankLine || line.type == LDIF_Line::comment) {
        text_.append(line.value + "\n");
    }
    return *this;
}

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Comment& other) {
    text_.append(other.text_.view());
    return *this;
}

LDIF_Comment& LDIF_Comment::clear() {
    text_ = {};
    return *this;
}

void LDIF_Comment::drop_trailing_blank_lines() {
    while (text_ == "\n" || text_.view().ends_with("\n\n")) {
        text_.remove_suffix(1);
    }
}

size_t LDIF_Comment::line_count() const {
    return static_cast<size_t>(std::ranges::count(text_.view(), '\n'));
}

std::ostream& operator<<(std::ostream& out, const LDIF_Comment& comment) {
    return out << comment.str();
}
