#include <cstring>
#include <fstream>
#include <optional>

#include "LDIF_Exception.h"
#include "LDIF_Line.h"
#include "LDIF_Util.h"
#include "line_source.h"
#include "memory_file.h"
#include "property.h"

namespace cfg32::fuzz {

namespace {

struct read_lines {
    std::vector<LDIF_Line> lines;
    std::optional<std::string> failure;  ///< what ended the reading, if not the end
    int line_number = 0;
};

template <class Source>
read_lines read_all_lines(Source& source) {
    read_lines read;
    try {
        do {
            LDIF_Line line;
            read.line_number = line.next(source, read.line_number);
            read.lines.push_back(std::move(line));
        } while (read.lines.back().type != LDIF_Line::endOfFile);
    } catch (const LDIF_Exception& e) {
        require_equal(e.ldapErr, 162, "a line is refused only for its bytes");
        read.failure = e.dump();
    }
    return read;
}

read_lines lines_of(const std::string& text) {
    line_source source{given_text(text)};
    return read_all_lines(source);
}

void require_equal_lines(const LDIF_Line& left, const LDIF_Line& right, const char* promise) {
    require_equal(left.type, right.type, promise);
    require_equal(left.attribute, right.attribute, promise);
    require_equal(left.value, right.value, promise);
    require_equal(left.hasSeparator, right.hasSeparator, promise);
}

void require_equal_reading(const read_lines& left, const read_lines& right) {
    constexpr const char* promise = "a line is the same from memory and from a file";
    require_equal(left.lines.size(), right.lines.size(), promise);
    for (size_t i = 0; i < left.lines.size(); ++i) {
        require_equal_lines(left.lines[i], right.lines[i], promise);
        require_equal(left.lines[i].lineNumber, right.lines[i].lineNumber, promise);
    }
    require_equal(left.failure.value_or(""), right.failure.value_or(""), promise);
    require_equal(left.line_number, right.line_number, promise);
}

void require_numbers(const read_lines& read) {
    int last = 0;
    for (const LDIF_Line& line : read.lines) {
        require(line.lineNumber > last || line.type == LDIF_Line::endOfFile,
                "every line has a number greater than the one before");
        last = line.lineNumber;
    }
}

bool begins_with_space(const std::string& text) {
    if (text.empty()) {
        return false;
    }
    const character first = first_character(text);
    return first.is_valid && is_space(first.code);
}

/// True for a line that a file has in one piece: one that begins with whitespace continues the one
/// before it, and only a continuation brings whitespace to the front of a value.
bool stands_alone(const LDIF_Line& line) {
    const bool has_name = line.type == LDIF_Line::attr || line.type == LDIF_Line::dn;
    return line.type == LDIF_Line::comment ||
           (has_name && line.hasSeparator && !line.attribute.empty() &&
            !begins_with_space(line.attribute) && !begins_with_space(line.value));
}

void require_print(const LDIF_Line& line) {
    const read_lines again = lines_of(line.str() + "\n\n");
    require(!again.lines.empty(), "a line reads back");
    require_equal_lines(again.lines.front(), line, "a line reads back as it is written");
}

}  // namespace

void line_property(std::string_view input) {
    const std::string text(input);
    const read_lines read = lines_of(text);
    const tool::memory_file file(text);
    std::ifstream in(file.name());
    require_equal_reading(read, read_all_lines(in));
    require_numbers(read);
    for (const LDIF_Line& line : read.lines) {
        if (stands_alone(line)) {
            require_print(line);
        }
    }
}

}  // namespace cfg32::fuzz
