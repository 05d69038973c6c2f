// The lines of a file without its passwords.

#include "check/shown_lines.h"

#include <algorithm>

#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

/// What is so long has its name at its front.
constexpr size_t longest_judged = 4096;

}  // namespace

/// True for a continuation line of what is hidden.
bool shown_lines::is_hidden(int number) {
    const int beginning = file_.beginning_of(number);
    if (beginning != beginning_ || number < number_) {
        number_ = beginning_ = beginning;
        joined_ = file_.line(beginning);
        is_hidden_ = hides_something(joined_);
    }
    while (number_ < number) {
        ++number_;
        const bool is_judged = !is_hidden_ && joined_.size() < longest_judged;
        if (is_judged) {
            joined_ += file_.continuation(number_);
            is_hidden_ = hides_something(joined_);
        }
    }
    return is_hidden_;
}

std::string shown_lines::at(int number) {
    const std::string_view line = file_.line(number);
    if (file_.beginning_of(number) == number) {
        const bool is_below = number > 1 && is_password_below(file_.line(number - 1), line);
        return is_below ? std::string(hidden_text) : shown_line(line);
    }
    return is_hidden(number) ? " " + std::string(hidden_text) : std::string(line);
}

void shown_lines::hide_length(problem& found) {
    if (found.line > file_.line_count()) {
        return;
    }
    const std::string line = at(found.line);
    if (line == file_.line(found.line)) {
        return;
    }
    const int hidden = count_characters(line) - static_cast<int>(hidden_text.size()) + 1;
    if (found.column + found.width > hidden) {
        found.column = std::min(found.column, hidden);
        found.width = hidden - found.column + 1;
    }
}

}  // namespace cfg32::tool
