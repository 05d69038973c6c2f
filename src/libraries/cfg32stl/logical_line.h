#pragma once

#include <fstream>
#include <string>
#include <string_view>

#include "kept_text.h"

namespace cfg32 {

class line_source;

/// A logical line of the configuration file, as LDIF_Line describes it. Its parts stand where the
/// source has them, if it has them in one piece, and are gone with the next line.
class logical_line {
  public:
    int type = 0;  ///< an LDIF_Line::Type
    int line_number = 0;
    bool has_separator = false;
    given_text attribute;
    given_text value;

    logical_line() = default;
    logical_line(const logical_line&) = delete;
    logical_line& operator=(const logical_line&) = delete;

    /// True when all of it is ASCII, and reads the same in every locale.
    bool is_in_ascii() const { return is_in_ascii_; }
    /// True for an attribute line that stands in the source as it is written.
    bool is_canonical() const;

    /// Of a comment or blank line: its file form, with the newline.
    const given_text& with_newline() const { return with_newline_; }

    // See LDIF_Line::next.
    int next(line_source& in, int last);
    int next(std::ifstream& in, int last);

    /// See LDIF_Line::changeToInvalidAttr.
    void change_to_invalid_attribute();

  private:
    template <class Source>
    int read(Source& in, int last);
    template <class Source, class Line>
    int read_value(Source& in, int last, const Line& first, std::string_view begin);
    template <class Source>
    int read_continuations(Source& in, int last, std::string_view begin);
    void keep_line(std::string_view line, const char* lasting);

    given_text with_newline_;
    bool is_in_ascii_ = true;
    std::string line_memory_;
    std::string attribute_memory_;
    std::string value_memory_;
};

}  // namespace cfg32
