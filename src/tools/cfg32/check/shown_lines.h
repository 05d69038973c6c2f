#pragma once

// The lines of a file without its passwords.

#include <string>

#include "check/file_text.h"
#include "check/problem.h"

namespace cfg32::tool {

/// The lines of a text, which must outlive the object, as they may be seen: also a password that
/// goes on on the next line, or whose name does, is hidden. Quickest in their order.
class shown_lines {
  public:
    explicit shown_lines(const file_text& file) : file_(file) {}

    std::string at(int number);

    /// Lets a place tell nothing of a hidden password's length: what lies behind the first of its
    /// characters counts as that one.
    void hide_length(problem& found);

  private:
    bool is_hidden(int number);

    const file_text& file_;
    // The logical line of the last physical one that was asked for, as far as it.
    int number_ = 0;
    int beginning_ = 0;
    std::string joined_;
    bool is_hidden_ = false;
};

}  // namespace cfg32::tool
