#pragma once

#include <cstdlib>
#include <memory>
#include <string>
#include <string_view>

#include "cfg32_platform.h"

// What the server gives the encoder.
inline constexpr int usual_room = 1024;

struct key_data_free {
    void operator()(aes_key_data* key) const { aes_key_data_free(key); }
};
using key_pointer = std::unique_ptr<aes_key_data, key_data_free>;

// A key of the bytes first, first + 1, ...; null for size 0, which means masking.
inline key_pointer make_key(std::size_t size, unsigned char first = 0) {
    std::string bytes(size, '\0');
    for (std::size_t i = 0; i < size; ++i)
        bytes[i] = static_cast<char>(first + i);
    return key_pointer(
        aes_key_data_from_bytes(reinterpret_cast<const unsigned char*>(bytes.data()), size));
}

// The encoded text; empty on failure, when all of the buffer must be zeros.
inline std::string encode(std::string_view clear, aes_key_data* key = nullptr,
                          int room = usual_room) {
    std::string out(static_cast<std::size_t>(room), '#');
    if (format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, clear.data(),
                        static_cast<int>(clear.size()), out.data(), room) != 0)
        return out.c_str();
    return out.find_first_not_of('\0') == std::string::npos ? "" : "(not wiped)";
}

// The clear text; "(refused)" on failure.
inline std::string decode(const std::string& encoded, aes_key_data* key = nullptr) {
    char* clear = nullptr;
    if (unformat_password(encoded.c_str(), &clear, key, CFG32_PASSWORD_FLAG) == 0)
        return clear == nullptr ? "(refused)" : "(touched)";
    const std::string text = clear;
    _slapd_utils_decode_buffer_free(&clear);
    return clear == nullptr ? text : "(not set to null)";
}

inline bool is_clear(std::string_view text) {
    return check_format(text.data(), static_cast<int>(text.size())) == 1;
}
