#pragma once

// The text of a file by lines and columns.

#include <string>
#include <string_view>
#include <vector>

namespace cfg32::tool {

/// Where something stands in a file: lines and columns are counted from 1, columns and width in
/// characters.
struct place {
    int line;
    int column;
    int width;
};

/// How many characters of the locale that is. A byte that begins none counts as one.
int count_characters(std::string_view text);

/// How many bytes of whitespace the text begins with, whatever follows.
size_t leading_space(std::string_view text);

/// The physical lines of a text, which must outlive the object.
class file_text {
  public:
    explicit file_text(std::string_view text);

    int line_count() const { return static_cast<int>(begins_.size()); }
    /// The line without its newline; empty for one that is not there.
    std::string_view line(int number) const;
    std::string_view text() const { return text_; }

    /// The first line of the logical line that this line belongs to, as a load puts them together.
    int beginning_of(int number) const;
    /// What a continuation line adds.
    std::string_view continuation(int number) const;

    /// The same text in which every byte that is not of the locale's character set is a "?".
    std::string_view readable() const { return readable_.empty() ? text_ : readable_; }
    /// The lines where there are such bytes before the NUL that may end the line.
    const std::vector<place>& invalid_bytes() const { return invalid_bytes_; }

    /// The name at the front of an attribute or DN line, or the whole of a line without a colon.
    place name_place(int number) const;
    /// The value behind it, as far as it stands on this line or, where nothing does, on the first
    /// of its continuation lines that has some of it; behind the line's end for none.
    place value_place(int number) const;
    /// The character that stands so many bytes into the value.
    place value_place(int number, size_t offset) const;

  private:
    void replace_invalid_bytes(int number);
    void find_beginnings();
    bool is_continuation(int number) const { return beginning_of(number) < number; }

    std::string_view text_;
    std::vector<size_t> begins_;
    std::vector<int> beginnings_;  // of the logical lines, by the numbers of the physical ones
    std::string readable_;         // empty when nothing is invalid
    std::vector<place> invalid_bytes_;
};

}  // namespace cfg32::tool
