#include "LDIF_Comment.h"

#include <algorithm>
#include <ostream>

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Line& line) {
    if (line.type == LDIF_Line::blankLine || line.type == LDIF_Line::comment) {
        text_.append(line.value).append("\n");
    }
    return *this;
}

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Comment& other) {
    text_ += other.text_;
    return *this;
}

LDIF_Comment& LDIF_Comment::clear() {
    text_.clear();
    return *this;
}

void LDIF_Comment::drop_trailing_blank_lines() {
    while (text_ == "\n" || text_.ends_with("\n\n")) {
        text_.pop_back();
    }
}

size_t LDIF_Comment::line_count() const {
    return static_cast<size_t>(std::count(text_.begin(), text_.end(), '\n'));
}

std::ostream& operator<<(std::ostream& out, const LDIF_Comment& comment) {
    return out << comment.str();
}
