#pragma once

#include <iosfwd>
#include <string>
#include <vector>

#include "LDIF_Line.h"

/// The comment and blank lines that precede an entry or an attribute, kept so that they can be
/// written back where they stood.
class LDIF_Comment {
  public:
    LDIF_Comment() = default;
    LDIF_Comment(const LDIF_Comment&) = default;
    LDIF_Comment(LDIF_Comment&&) noexcept = default;
    LDIF_Comment& operator=(const LDIF_Comment&) = default;
    LDIF_Comment& operator=(LDIF_Comment&&) noexcept = default;
    virtual ~LDIF_Comment() = default;

    /// Appends a comment or blank line; a line of another type is ignored.
    LDIF_Comment& operator+=(const LDIF_Line& line);
    LDIF_Comment& operator+=(const LDIF_Comment& other);
    LDIF_Comment& clear();

    /// Drops the blank lines at the end.
    void drop_trailing_blank_lines();

    bool empty() const { return lines_.empty(); }
    size_t line_count() const { return lines_.size(); }
    bool begins_with_blank_line() const;

    /// The lines, each with its newline.
    virtual std::string str() const;
    void append_to(std::string& out) const;

  private:
    std::vector<LDIF_Line> lines_;
};

std::ostream& operator<<(std::ostream& out, const LDIF_Comment& comment);
