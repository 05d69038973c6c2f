// Texts that nobody else is to see.

#include "secret.h"

#include <sodium.h>

#include <utility>

#include "LDIF_AttrType.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "password.h"

namespace cfg32::tool {

namespace {

constexpr int clear_text = 1;  // answer of check_format

const std::string kept_line_attribute = "oru-slapdInvalidLine";

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

/// The name at the front of a line: all before a colon or a space.
std::string_view name_of(std::string_view line) {
    return without_leading_space(line.substr(0, line.find_first_of(": \t")));
}

}  // namespace

void wipe(std::string& text) {
    sodium_memzero(text.data(), text.capacity());
    text.clear();
}

void secret::wipe() { tool::wipe(text_); }

secret::secret(secret&& other) noexcept { *this = std::move(other); }

secret& secret::operator=(secret&& other) noexcept {
    if (this != &other) {
        wipe();
        // A copy: moving a short text would leave it behind.
        text_ = other.text_;
        other.wipe();
    }
    return *this;
}

bool is_password_attribute(std::string_view name) {
    return getAttrType(std::string(name).c_str())->fromStr == pwFromStr;
}

std::string shown_value(std::string_view attribute, std::string_view value) {
    if (is_password_attribute(attribute)) {
        return shown_password(std::string(value));
    }
    const bool is_kept_line = kept_line_attribute == attribute;
    return is_kept_line ? shown_line(value) : std::string(value);
}

std::string shown_line(std::string_view line) {
    const std::string_view name = name_of(line);
    const size_t begin = line.find_first_not_of(": \t", name.data() + name.size() - line.data());
    if (begin == std::string_view::npos) {
        return std::string(line);
    }
    return std::string(line.substr(0, begin)) + shown_value(name, line.substr(begin));
}

}  // namespace cfg32::tool
