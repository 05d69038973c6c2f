// A line of a file as it is shown to people.

#include "check/source_excerpt.h"

#include <wchar.h>

#include <algorithm>
#include <iterator>
#include <utility>
#include <vector>

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
    std::string text;
    size_t width;  // in columns
};

/// Marks that are not seen, and those that change the direction of writing, would make a line look
/// like another.
bool misleads(wchar_t code) {
    return code == 0xfeff || code == 0x200e || code == 0x200f ||
           (code >= 0x202a && code <= 0x202e) || (code >= 0x2066 && code <= 0x2069);
}

cell shown(const character& next, size_t column) {
    if (next.is_valid && next.code == L'\t') {
        const size_t width = tab_stop - column % tab_stop;
        return {std::string(width, ' '), width};
    }
    const int width = next.is_valid && !misleads(next.code) ? wcwidth(next.code) : -1;
    if (width < 0 || next.code == L'\0') {
        return {"?", 1};
    }
    return {std::string(next.bytes), static_cast<size_t>(width)};
}

std::vector<cell> cells_of(std::string_view text) {
    std::vector<cell> cells;
    size_t column = 0;
    while (!text.empty()) {
        const character next = first_character(text);
        cells.push_back(shown(next, column));
        column += cells.back().width;
        text.remove_prefix(next.bytes.size());
    }
    return cells;
}

using position = std::vector<cell>::const_iterator;

size_t width_of(position first, position last) {
    size_t width = 0;
    for (; first != last; ++first) {
        width += first->width;
    }
    return width;
}

std::string text_of(position first, position last) {
    std::string text;
    for (; first != last; ++first) {
        text += first->text;
    }
    return text;
}

/// All of a line, or what surrounds the place in a long one.
std::pair<position, position> shown_part(const std::vector<cell>& cells, position place) {
    if (width_of(cells.begin(), cells.end()) <= longest_shown) {
        return {cells.begin(), cells.end()};
    }
    position first = place;
    size_t width = 0;
    while (first != cells.begin() && width + std::prev(first)->width <= shown_before) {
        width += (--first)->width;
    }
    position last = place;
    while (last != cells.end() && width + last->width <= longest_shown) {
        width += (last++)->width;
    }
    return {first, last};
}

}  // namespace

std::string harmless(std::string_view text) {
    const std::vector<cell> cells = cells_of(text);
    return text_of(cells.begin(), cells.end());
}

source_excerpt source_excerpts::of(const problem& shown_problem) {
    std::string line = lines_.at(shown_problem.line);
    const bool is_hidden = line != file_.line(shown_problem.line);
    if (!is_hidden && line.ends_with('\r')) {
        line.pop_back();
    }
    const std::vector<cell> cells = cells_of(line);
    // What reaches into a hidden value is marked as all of it: not even its length shows.
    const size_t hidden = is_hidden ? cells.size() - hidden_text.size() : cells.size();
    const size_t at = std::min(static_cast<size_t>(shown_problem.column) - 1, hidden);
    const size_t behind = at + static_cast<size_t>(shown_problem.width);
    const position place = cells.begin() + static_cast<ptrdiff_t>(at);
    const position end =
        behind > hidden ? cells.end() : cells.begin() + static_cast<ptrdiff_t>(behind);
    const auto [first, last] = shown_part(cells, place);
    const std::string before(first == cells.begin() ? "" : cut);
    const std::string after(last == cells.end() ? "" : cut);
    const size_t marked = width_of(place, std::min(end, last));
    source_excerpt result;
    result.line = before + text_of(first, last) + after;
    result.indent = std::string(before.size() + width_of(first, place), ' ');
    result.marker = "^" + std::string(marked > 1 ? marked - 1 : 0, '~');
    return result;
}

}  // namespace cfg32::tool
