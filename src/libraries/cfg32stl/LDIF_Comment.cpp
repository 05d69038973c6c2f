#include "LDIF_Comment.h"

#include <ostream>

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Line& line) {
    if (line.type == LDIF_Line::blankLine || line.type == LDIF_Line::comment) {
        lines_.push_back(line);
    }
    return *this;
}

LDIF_Comment& LDIF_Comment::operator+=(const LDIF_Comment& other) {
    // By position and up to the size of before: a comment may be appended to itself.
    const size_t count = other.lines_.size();
    for (size_t i = 0; i < count; ++i) {
        lines_.push_back(other.lines_[i]);
    }
    return *this;
}

LDIF_Comment& LDIF_Comment::clear() {
    lines_.clear();
    return *this;
}

void LDIF_Comment::drop_trailing_blank_lines() {
    while (!lines_.empty() && lines_.back().type == LDIF_Line::blankLine) {
        lines_.pop_back();
    }
}

bool LDIF_Comment::begins_with_blank_line() const {
    return !lines_.empty() && lines_.front().type == LDIF_Line::blankLine;
}

std::string LDIF_Comment::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Comment::append_to(std::string& out) const {
    for (const LDIF_Line& line : lines_) {
        out.append(line.str()).append("\n");
    }
}

std::ostream& operator<<(std::ostream& out, const LDIF_Comment& comment) {
    return out << comment.str();
}
