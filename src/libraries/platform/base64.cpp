#include "base64.h"

#include <array>
#include <cstdint>

namespace cfg32::platform {

namespace {

constexpr std::string_view alphabet =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr char padding = '=';
constexpr std::uint8_t no_digit = 0xff;

consteval std::array<std::uint8_t, 256> make_digit_table() {
    std::array<std::uint8_t, 256> table{};
    table.fill(no_digit);
    for (std::size_t value = 0; value < alphabet.size(); ++value) {
        table[static_cast<unsigned char>(alphabet[value])] = static_cast<std::uint8_t>(value);
    }
    return table;
}

constexpr auto digits = make_digit_table();

// The 24 bits of a group of four characters, of which the last ones may be padding.
std::optional<std::uint32_t> group_bits(std::string_view group, std::size_t padded) {
    std::uint32_t bits = 0;
    for (std::size_t i = 0; i < 4 - padded; ++i) {
        const std::uint8_t digit = digits[static_cast<unsigned char>(group[i])];
        if (digit == no_digit) {
            return std::nullopt;
        }
        bits = bits << 6 | digit;
    }
    return bits << (6 * padded);
}

std::size_t padding_of(std::string_view text) {
    if (text.empty() || text.back() != padding) {
        return 0;
    }
    return text[text.size() - 2] == padding ? 2 : 1;
}

}  // namespace

char* base64_encode(bytes_view bytes, char* out) {
    for (std::size_t at = 0; at < bytes.size(); at += 3) {
        const std::size_t count = std::min<std::size_t>(3, bytes.size() - at);
        std::uint32_t bits = 0;
        for (std::size_t i = 0; i < 3; ++i) {
            bits = bits << 8 | (i < count ? bytes[at + i] : 0u);
        }
        for (std::size_t i = 0; i < 4; ++i) {
            *out++ = i <= count ? alphabet[bits >> (18 - 6 * i) & 63] : padding;
        }
    }
    return out;
}

std::optional<std::size_t> base64_decode(std::string_view text, std::span<unsigned char> out) {
    if (text.size() % 4 != 0) {
        return std::nullopt;
    }
    const std::size_t padded = padding_of(text);
    const std::size_t size = text.size() / 4 * 3 - padded;
    if (size > out.size()) {
        return std::nullopt;
    }
    for (std::size_t at = 0, written = 0; at < text.size(); at += 4) {
        const std::size_t absent = at + 4 == text.size() ? padded : 0;
        const auto bits = group_bits(text.substr(at, 4), absent);
        if (!bits || (*bits & ((1u << (8 * absent)) - 1)) != 0) {
            return std::nullopt;
        }
        for (std::size_t i = 0; i < 3 - absent; ++i) {
            out[written++] = static_cast<unsigned char>(*bits >> (16 - 8 * i));
        }
    }
    return size;
}

}  // namespace cfg32::platform
