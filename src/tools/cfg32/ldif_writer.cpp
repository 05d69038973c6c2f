// Printing LDIF.

#include "ldif_writer.h"

#include <sodium.h>

#include <algorithm>

namespace cfg32::tool {

namespace {

constexpr size_t line_length = 76;

/// A value that stands in the text as it is (RFC 2849, SAFE-STRING, but without what steers a
/// terminal, and with no blank at its end).
bool is_safe(std::string_view value) {
    const auto is_safe_byte = [](char c) { return (c >= ' ' && c < 0x7f) || c == '\t'; };
    return value.empty() ||
           (std::all_of(value.begin(), value.end(), is_safe_byte) && value.front() != ' ' &&
            value.front() != ':' && value.front() != '<' && value.back() != ' ');
}

std::string base64(std::string_view bytes) {
    std::string text(sodium_base64_ENCODED_LEN(bytes.size(), sodium_base64_VARIANT_ORIGINAL), '\0');
    sodium_bin2base64(text.data(), text.size(),
                      reinterpret_cast<const unsigned char*>(bytes.data()), bytes.size(),
                      sodium_base64_VARIANT_ORIGINAL);
    text.pop_back();  // the NUL
    return text;
}

/// The line with a newline after every 76 columns, and a space before what goes on.
std::string folded(std::string_view line) {
    std::string text(line.substr(0, line_length));
    for (size_t begin = line_length; begin < line.size(); begin += line_length - 1) {
        text.append("\n ").append(line.substr(begin, line_length - 1));
    }
    return text;
}

constexpr const char* kind_names[] = {"add", "modify", "delete"};
constexpr const char* operation_names[] = {"add", "delete", "replace"};

std::string block(const modification& change, bool is_folded) {
    std::string text = ldif_line(operation_names[change.kind], change.attribute, is_folded);
    for (const std::string& value : change.values) {
        text += ldif_line(change.attribute, value, is_folded);
    }
    return text + "-\n";
}

}  // namespace

std::string ldif_line(std::string_view name, std::string_view value, bool is_folded) {
    std::string line(name);
    line += is_safe(value) ? ":" : "::";
    if (!value.empty()) {
        line.append(" ").append(is_safe(value) ? std::string(value) : base64(value));
    }
    return (is_folded ? folded(line) : line) + "\n";
}

std::string ldif(const entry& printed, bool is_folded) {
    std::string text = ldif_line("dn", printed.dn, is_folded);
    for (const attribute& each : printed.attributes) {
        for (const std::string& value : each.values) {
            text += ldif_line(each.name, value, is_folded);
        }
    }
    return text + "\n";
}

std::string ldif(const change_record& record, bool is_folded) {
    std::string text = ldif_line("dn", record.dn, is_folded);
    text += ldif_line("changetype", kind_names[record.kind], is_folded);
    for (const modification& change : record.modifications) {
        if (record.kind == change_record::modify) {
            text += block(change, is_folded);
            continue;
        }
        for (const std::string& value : change.values) {
            text += ldif_line(change.attribute, value, is_folded);
        }
    }
    return text + "\n";
}

}  // namespace cfg32::tool
