// The lines of an LDIF text.

#include "change/ldif_lines.h"

#include <fmt/format.h>
#include <sodium.h>
#include <strings.h>

#include <algorithm>
#include <cctype>

#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

/// A physical line, taken from the front of the text without its line end.
std::string_view take_line(std::string_view& text) {
    std::string_view line = text.substr(0, text.find('\n'));
    text.remove_prefix(std::min(line.size() + 1, text.size()));
    if (line.ends_with('\r')) {
        line.remove_suffix(1);
    }
    return line;
}

bool is_comment(const ldif_text_line& line) { return line.text.starts_with('#'); }

/// Adds the record, unless it has nothing but comments.
void close(std::vector<ldif_lines>& records, ldif_lines& record) {
    std::erase_if(record, is_comment);
    if (!record.empty()) {
        records.push_back(std::move(record));
    }
    record.clear();
}

constexpr std::string_view name_characters =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_.;";

std::string from_base64(std::string_view text, int line) {
    std::string bytes(text.size(), '\0');
    size_t length = 0;
    const int status =
        sodium_base642bin(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size(), text.data(),
                          text.size(), nullptr, &length, nullptr, sodium_base64_VARIANT_ORIGINAL);
    if (status != 0) {
        throw ldif_error{line, "not valid base64"};
    }
    bytes.resize(length);
    return bytes;
}

std::string_view without_fill(std::string_view text) {
    return text.substr(std::min(text.find_first_not_of(' '), text.size()));
}

/// The configuration's lines could not hold such a value.
void require_one_line(std::string_view value, int line) {
    const size_t bad = value.find_first_of(std::string_view("\0\r\n", 3));
    if (bad != std::string_view::npos) {
        const char* const what = value[bad] == '\0'   ? "a NUL byte"
                                 : value[bad] == '\r' ? "a carriage return"
                                                      : "a line feed";
        throw ldif_error{line, fmt::format("a value may not hold {}", what)};
    }
}

}  // namespace

bool is_same_name(std::string_view left, std::string_view right) {
    return left.size() == right.size() && strncasecmp(left.data(), right.data(), left.size()) == 0;
}

std::vector<ldif_lines> split_records(std::string_view text) {
    std::vector<ldif_lines> records;
    ldif_lines record;
    for (int number = 1; !text.empty(); ++number) {
        const std::string_view line = take_line(text);
        if (line.empty()) {
            close(records, record);
        } else if (!line.starts_with(' ')) {
            record.push_back({number, std::string(line)});
        } else if (record.empty()) {
            record.push_back({number, std::string(line), true});
        } else {
            record.back().text += line.substr(1);
        }
    }
    close(records, record);
    return records;
}

bool is_attribute_name(std::string_view text) {
    return !text.empty() && isalnum(static_cast<unsigned char>(text.front())) &&
           text.back() != ';' && text.back() != '.' &&
           text.find_first_not_of(name_characters) == std::string_view::npos;
}

void require_name(std::string_view name, int line) {
    if (name.empty()) {
        throw ldif_error{line, "an attribute's name is missing"};
    }
    if (!is_attribute_name(name)) {
        // What follows a blank may be anything.
        const std::string_view front = name.substr(0, name.find_first_of(" :"));
        throw ldif_error{line, fmt::format("\"{}{}\" is not an attribute's name", shown_line(front),
                                           front == name ? "" : " ...")};
    }
}

named_value parse_line(const ldif_text_line& line) {
    if (line.is_orphan) {
        throw ldif_error{line.number,
                         "a line that begins with a blank, and none before it that "
                         "it could continue"};
    }
    const size_t colon = line.text.find(':');
    if (colon == std::string::npos) {
        throw ldif_error{line.number, "a line without a colon"};
    }
    named_value parsed = {line.number, line.text.substr(0, colon), {}};
    require_name(parsed.name, line.number);
    const std::string_view rest = std::string_view(line.text).substr(colon + 1);
    if (rest.starts_with('<')) {
        throw ldif_error{line.number, "values from URLs (\":<\") are not supported"};
    }
    parsed.value = rest.starts_with(':') ? from_base64(without_fill(rest.substr(1)), line.number)
                                         : std::string(without_fill(rest));
    require_one_line(parsed.value, line.number);
    return parsed;
}

}  // namespace cfg32::tool
