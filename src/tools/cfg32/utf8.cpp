// Text for programs, which is UTF-8 whatever the locale.

#include "utf8.h"

#include "LDIF_Util.h"

namespace cfg32::tool {

namespace {

constexpr wchar_t replacement = 0xfffd;

bool is_scalar_value(wchar_t code) { return code < 0xd800 || (code > 0xdfff && code <= 0x10ffff); }

/// RFC 3629, section 3.
void append(std::string& out, wchar_t code) {
    const auto add = [&](wchar_t byte) { out += static_cast<char>(byte); };
    const auto tail = [&](int shift) { add(0x80 | (code >> shift & 0x3f)); };
    if (code < 0x80) {
        add(code);
    } else if (code < 0x800) {
        add(0xc0 | code >> 6);
        tail(0);
    } else if (code < 0x10000) {
        add(0xe0 | code >> 12);
        tail(6);
        tail(0);
    } else {
        add(0xf0 | code >> 18);
        tail(12);
        tail(6);
        tail(0);
    }
}

}  // namespace

std::string utf8(std::string_view text) {
    if (is_plain(text)) {
        return std::string(text);
    }
    std::string out;
    while (!text.empty()) {
        const character next = first_character(text);
        append(out, next.is_valid && is_scalar_value(next.code) ? next.code : replacement);
        text.remove_prefix(next.bytes.size());
    }
    return out;
}

}  // namespace cfg32::tool
