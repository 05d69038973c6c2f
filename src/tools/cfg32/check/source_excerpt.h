#pragma once

// A line of a file as it is shown to people.

#include <cstddef>
#include <string>
#include <string_view>

#include "check/file_text.h"
#include "check/problem.h"
#include "check/shown_lines.h"

namespace cfg32::tool {

/// A line, or the part of it around a place, and a marker below that place. Both are free of
/// control characters.
struct source_excerpt {
    std::string line;
    std::string indent;  ///< what precedes the marker
    std::string marker;  ///< "^~~~"
};

/// How far a place is from the front of its line.
struct place_on_screen {
    size_t bytes = 0;
    size_t characters = 0;
    size_t columns = 0;
};

/// Shows the lines of a file, passwords hidden. Quickest in their order.
class source_excerpts {
  public:
    explicit source_excerpts(const file_text& file) : file_(file), lines_(file) {}

    source_excerpt of(const problem& shown);

  private:
    void look_at(int number);
    void go_to(size_t character);

    const file_text& file_;
    shown_lines lines_;
    // The line that was asked for last, and the way that was gone in it.
    int number_ = 0;
    std::string line_;
    size_t visible_ = 0;     // characters, all or those before a hidden value
    bool fits_ = true;       // no part of it has to be cut
    place_on_screen first_;  // that is shown
    place_on_screen place_;  // that is asked for
};

/// Text without control characters and bytes that are no characters: a "?" stands for each.
std::string harmless(std::string_view text);

}  // namespace cfg32::tool
