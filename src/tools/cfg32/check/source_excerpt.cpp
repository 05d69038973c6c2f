// A line of a file as it is shown to people.

#include "check/source_excerpt.h"

#include <wchar.h>

#include <algorithm>

#include "LDIF_Util.h"
#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

constexpr size_t tab_stop = 8;
constexpr size_t longest_shown = 100;  // columns
constexpr size_t shown_before = 40;    // the place, in a line that is cut
constexpr std::string_view cut = "...";

/// A character on the screen.
struct cell {
    std::string_view text;
    size_t width;  // in columns
};

/// Marks that are not seen, and those that change the direction of writing, would make a line look
/// like another.
bool misleads(wchar_t code) {
    return code == 0xfeff || code == 0x200e || code == 0x200f ||
           (code >= 0x202a && code <= 0x202e) || (code >= 0x2066 && code <= 0x2069);
}

cell shown(const character& next, size_t column) {
    constexpr std::string_view blanks = "        ";
    static_assert(blanks.size() == tab_stop);
    if (next.is_valid && next.code == L'\t') {
        const size_t width = tab_stop - column % tab_stop;
        return {blanks.substr(0, width), width};
    }
    const int width = next.is_valid && !misleads(next.code) ? wcwidth(next.code) : -1;
    if (width < 0 || next.code == L'\0') {
        return {"?", 1};
    }
    return {next.bytes, static_cast<size_t>(width)};
}

/// Goes over the next character of a line. Returns what is shown of it.
std::string_view pass(std::string_view line, place_on_screen& at) {
    const character next = first_character(line.substr(at.bytes));
    const cell passed = shown(next, at.columns);
    at.bytes += next.bytes.size();
    at.characters += 1;
    at.columns += passed.width;
    return passed.text;
}

bool fits(std::string_view line) {
    place_on_screen end;
    while (end.bytes < line.size() && end.columns <= longest_shown) {
        pass(line, end);
    }
    return end.columns <= longest_shown;
}

}  // namespace

std::string harmless(std::string_view text) {
    std::string shown;
    for (place_on_screen at; at.bytes < text.size();) {
        shown += pass(text, at);
    }
    return shown;
}

void source_excerpts::look_at(int number) {
    if (number == number_) {
        return;
    }
    number_ = number;
    line_ = lines_.at(number);
    const bool is_hidden = line_ != file_.line(number);
    if (!is_hidden && line_.ends_with('\r')) {
        line_.pop_back();
    }
    visible_ = static_cast<size_t>(count_characters(line_)) - (is_hidden ? hidden_text.size() : 0);
    fits_ = fits(line_);
    first_ = place_ = {};
}

void source_excerpts::go_to(size_t character) {
    if (character < place_.characters) {
        first_ = place_ = {};
    }
    while (place_.characters < character) {
        pass(line_, place_);
        while (!fits_ && place_.columns - first_.columns > shown_before) {
            pass(line_, first_);
        }
    }
}

source_excerpt source_excerpts::of(const problem& shown) {
    look_at(shown.line);
    const size_t at = std::min(static_cast<size_t>(shown.column) - 1, visible_);
    go_to(at);
    // What reaches into a hidden value is marked as all of it: not even its length shows.
    const size_t behind = at + static_cast<size_t>(shown.width);
    const size_t end = behind > visible_ ? line_.size() : behind;
    std::string text;
    size_t marked = 0;
    place_on_screen last = first_;
    while (last.bytes < line_.size()) {
        place_on_screen next = last;
        const std::string_view added = pass(line_, next);
        if (next.columns - first_.columns > longest_shown) {
            break;
        }
        text += added;
        last = next;
        const bool is_marked = last.characters > at && last.characters <= end;
        marked = is_marked ? last.columns - place_.columns : marked;
    }
    const std::string_view before = first_.bytes == 0 ? "" : cut;
    const std::string_view after = last.bytes == line_.size() ? "" : cut;
    source_excerpt result;
    result.line = std::string(before).append(text).append(after);
    result.indent = std::string(before.size() + place_.columns - first_.columns, ' ');
    result.marker = "^" + std::string(marked > 1 ? marked - 1 : 0, '~');
    return result;
}

}  // namespace cfg32::tool
