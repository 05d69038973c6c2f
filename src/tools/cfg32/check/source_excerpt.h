#pragma once

// A line of a file as it is shown to people.

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

/// Shows the lines of a file, passwords hidden. Quickest in their order.
class source_excerpts {
  public:
    explicit source_excerpts(const file_text& file) : file_(file), lines_(file) {}

    source_excerpt of(const problem& shown);

  private:
    const file_text& file_;
    shown_lines lines_;
};

/// Text without control characters and bytes that are no characters: a "?" stands for each.
std::string harmless(std::string_view text);

}  // namespace cfg32::tool
