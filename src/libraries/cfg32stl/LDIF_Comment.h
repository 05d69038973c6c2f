#pragma once

#include <iosfwd>
#include <string>

#include "LDIF_Line.h"
#include "kept_text.h"

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
    /// Appends lines in file form.
    void append(const cfg32::given_text& lines) { text_.append(lines); }
    LDIF_Comment& clear();

    /// Drops the blank lines at the end.
    void drop_trailing_blank_lines();

    bool empty() const { return text_.empty(); }
    size_t line_count() const;
    bool begins_with_blank_line() const { return text_.view().starts_with('\n'); }

    /// The lines, each with its newline.
    virtual std::string str() const { return text_.str(); }
    void append_to(std::string& out) const { out += text_.view(); }

  private:
    cfg32::kept_text text_;  // in file form
};

std::ostream& operator<<(std::ostream& out, const LDIF_Comment& comment);
