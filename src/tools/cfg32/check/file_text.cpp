// The text of a file by lines and columns.

#include "check/file_text.h"

#include <algorithm>

#include "LDIF_Util.h"

namespace cfg32::tool {

namespace {

/// What a load sees of a line: all before a NUL.
std::string_view seen(std::string_view line) { return line.substr(0, line.find('\0')); }

/// Carriage returns are not seen, neither at a line's front.
std::string_view without_leading_returns(std::string_view line) {
    return line.substr(std::min(line.find_first_not_of('\r'), line.size()));
}

/// Where the value begins in a line, as a load finds it: it does not see carriage returns.
size_t value_begin(std::string_view line) {
    const size_t colon = line.find(':');
    if (colon == std::string_view::npos) {
        return line.size();
    }
    const size_t begin = std::min(line.find_first_not_of(":\r", colon), line.size());
    return begin + leading_space(line.substr(begin));
}

std::string_view without_trailing_blanks(std::string_view text) {
    return text.substr(0, text.find_last_not_of(" \t\r") + 1);
}

place of_part(int number, std::string_view line, size_t begin, std::string_view part) {
    return {number, count_characters(line.substr(0, begin)) + 1,
            std::max(count_characters(part), 1)};
}

}  // namespace

size_t leading_space(std::string_view text) {
    std::string_view rest = text;
    while (!rest.empty()) {
        const character next = first_character(rest);
        if (!next.is_valid || !is_space(next.code)) {
            break;
        }
        rest.remove_prefix(next.bytes.size());
    }
    return text.size() - rest.size();
}

int count_characters(std::string_view text) {
    if (is_plain(text)) {
        return static_cast<int>(text.size());
    }
    int count = 0;
    for (; !text.empty(); ++count) {
        text.remove_prefix(first_character(text).bytes.size());
    }
    return count;
}

file_text::file_text(std::string_view text) : text_(text) {
    for (size_t begin = 0; begin < text.size();) {
        begins_.push_back(begin);
        const size_t newline = text.find('\n', begin);
        begin = newline == std::string_view::npos ? text.size() : newline + 1;
    }
    for (int number = 1; number <= line_count(); ++number) {
        if (!is_plain(line(number))) {
            replace_invalid_bytes(number);
        }
    }
    find_beginnings();
}

/// Comments and blank lines are not continued.
void file_text::find_beginnings() {
    bool is_open = false;
    for (int number = 1; number <= line_count(); ++number) {
        const std::string_view line = without_leading_returns(seen(this->line(number)));
        const size_t blanks = leading_space(line);
        if (is_open && blanks > 0) {
            beginnings_.push_back(beginnings_.back());
        } else {
            beginnings_.push_back(number);
            is_open = blanks < line.size() && !line.starts_with('#');
        }
    }
}

int file_text::beginning_of(int number) const {
    const bool is_there = number >= 1 && number <= line_count();
    return is_there ? beginnings_[static_cast<size_t>(number) - 1] : number;
}

std::string_view file_text::continuation(int number) const {
    const std::string_view line = without_leading_returns(seen(this->line(number)));
    return line.empty() ? line : line.substr(first_character(line).bytes.size());
}

std::string_view file_text::line(int number) const {
    if (number < 1 || number > line_count()) {
        return {};
    }
    const size_t begin = begins_[static_cast<size_t>(number) - 1];
    return text_.substr(begin, std::min(text_.find('\n', begin), text_.size()) - begin);
}

void file_text::replace_invalid_bytes(int number) {
    std::string_view rest = seen(line(number));
    int column = 1;
    bool is_first = true;
    for (; !rest.empty(); ++column) {
        const character next = first_character(rest);
        if (!next.is_valid) {
            if (readable_.empty()) {
                readable_ = text_;
            }
            readable_[static_cast<size_t>(rest.data() - text_.data())] = '?';
            if (is_first) {
                invalid_bytes_.push_back({number, column, 0});
            }
            is_first = false;
            place& found = invalid_bytes_.back();
            found.width += column == found.column + found.width ? 1 : 0;
        }
        rest.remove_prefix(next.bytes.size());
    }
}

place file_text::name_place(int number) const {
    const std::string_view text = seen(line(number));
    const size_t colon = text.find(':');
    const bool has_name = colon != 0 && colon != std::string_view::npos;
    return of_part(number, text, 0,
                   without_trailing_blanks(text.substr(0, has_name ? colon : text.size())));
}

place file_text::value_place(int number) const {
    std::string_view text = seen(line(number));
    std::string_view value = without_trailing_blanks(text.substr(value_begin(text)));
    const place nothing = of_part(number, text, value_begin(text), value);
    while (value.empty()) {
        if (!is_continuation(++number)) {
            return nothing;
        }
        text = seen(line(number));
        value = without_trailing_blanks(text.substr(leading_space(text)));
    }
    return of_part(number, text, static_cast<size_t>(value.data() - text.data()), value);
}

place file_text::value_place(int number, size_t offset) const {
    const place whole = value_place(number);
    std::string_view text = seen(line(number));
    size_t at = value_begin(text);
    while (true) {
        for (; offset > 0 && at < text.size(); ++at) {
            offset -= text[at] == '\r' ? 0U : 1U;
        }
        const bool is_last = !is_continuation(number + 1);
        if (at < text.size() || is_last) {
            return offset > 0 ? whole : of_part(number, text, at, {});
        }
        text = seen(line(++number));
        at = static_cast<size_t>(continuation(number).data() - text.data());
    }
}

}  // namespace cfg32::tool
