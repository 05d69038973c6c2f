#include <cstdlib>
#include <cstring>
#include <string_view>

#include "cfg32_platform.h"
#include "password_text.h"

using namespace cfg32::platform;

int check_format(const char* text, int length) noexcept {
    if (text == nullptr || length < 0) {
        return 1;
    }
    return is_encoded_password({text, strnlen(text, static_cast<size_t>(length))}) ? 0 : 1;
}

int format_password(int selector, int flag, aes_key_data* key, const char* clear, int length,
                    char* out, int out_size) noexcept {
    if (out == nullptr || out_size <= 0) {
        return 0;
    }
    const std::span<char> room(out, static_cast<size_t>(out_size));
    if (selector == CFG32_PASSWORD_SELECTOR && flag == CFG32_PASSWORD_FLAG && clear != nullptr &&
        length >= 0 &&
        encode_password(
            {reinterpret_cast<const unsigned char*>(clear), static_cast<size_t>(length)}, key,
            room)) {
        return 1;
    }
    explicit_bzero(room.data(), room.size());
    return 0;
}

int unformat_password(const char* encoded, char** clear, aes_key_data* key, int flag) noexcept {
    if (encoded == nullptr || clear == nullptr || flag != CFG32_PASSWORD_FLAG) {
        return 0;
    }
    clear_text text;
    if (!decode_password(encoded, key, text)) {
        return 0;
    }
    auto* copy = static_cast<char*>(std::malloc(text.size() + 1));
    if (copy == nullptr) {
        return 0;
    }
    std::memcpy(copy, text.data(), text.size());
    copy[text.size()] = '\0';
    *clear = copy;
    return 1;
}

void _slapd_utils_decode_buffer_free(char** clear) noexcept {
    if (clear == nullptr || *clear == nullptr) {
        return;
    }
    explicit_bzero(*clear, std::strlen(*clear));
    std::free(*clear);
    *clear = nullptr;
}
