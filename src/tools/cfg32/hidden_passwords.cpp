// Hiding passwords in what is printed.

#include "hidden_passwords.h"

#include <algorithm>

#include "LDIF_AttrType.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "check/file_text.h"
#include "cisString.h"
#include "password.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

constexpr int clear_text = 1;  // answer of check_format

const cisString kept_line_attribute = "oru-slapdInvalidLine";

/// What hides a password says how it is stored: an encrypted or hashed text hides itself.
std::string shown_password(const std::string& stored) {
    if (stored.empty()) {
        return {};
    }
    const std::string encoded = decoder_input(stored);
    if (check_format(encoded.c_str(), static_cast<int>(encoded.size())) == clear_text) {
        return std::string(hidden_text);
    }
    const bool is_masked = encoded.starts_with(std::string(iMASK_BRACED, sizeof iMASK_BRACED));
    return is_masked ? std::string(hidden_text) : stored;
}

/// Name and value as they are meant, whatever stands between them.
struct meant_line {
    std::string_view name;
    size_t value;  // where it begins
};

meant_line meant(std::string_view line) {
    const std::string_view text = line.substr(leading_space(line));
    const std::string_view name = text.substr(0, text.find_first_not_of(keyChar));
    const size_t end = line.size() - text.size() + name.size();
    return {name, std::min(line.find_first_not_of(":;,=< \t", end), line.size())};
}

}  // namespace

bool is_password_attribute(std::string_view name) {
    return getAttrType(std::string(name).c_str())->fromStr == pwFromStr;
}

std::string shown_value(std::string_view attribute, std::string_view value) {
    if (is_password_attribute(attribute)) {
        return shown_password(std::string(value));
    }
    const bool is_kept_line = cisString(std::string(attribute)) == kept_line_attribute;
    return is_kept_line ? shown_line(value) : std::string(value);
}

bool is_password_line(std::string_view line) {
    const std::string_view name = meant(line).name;
    if (name.empty() || find_attribute(name)) {
        return is_password_attribute(name);
    }
    const auto nearest = nearest_attribute(name);
    return nearest && is_password_attribute(*nearest);
}

std::string shown_line(std::string_view line) {
    const auto [name, begin] = meant(line);
    if (begin == line.size()) {
        return std::string(line);
    }
    const std::string front(line.substr(0, begin));
    const std::string_view value = line.substr(begin);
    if (cisString(std::string(name)) == kept_line_attribute) {
        return front + shown_line(value);
    }
    if (!is_password_line(line)) {
        return std::string(line);
    }
    return front + (find_attribute(name) ? shown_value(name, value) : std::string(hidden_text));
}

}  // namespace cfg32::tool
