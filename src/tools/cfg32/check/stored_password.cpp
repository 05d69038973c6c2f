// Trying stored passwords.

#include "check/stored_password.h"

#include <strings.h>

#include <algorithm>
#include <string_view>

#include "cfg32_platform.h"
#include "password.h"

namespace cfg32::tool {

namespace {

constexpr int clear_text = 1;  // answer of check_format

constexpr std::string_view two_way_tags[] = {
    {AES128_BRACED, sizeof AES128_BRACED},
    {AES192_BRACED, sizeof AES192_BRACED},
    {AES256_BRACED, sizeof AES256_BRACED},
    {iMASK_BRACED, sizeof iMASK_BRACED},
};

bool is_two_way(std::string_view encoded) {
    return std::any_of(std::begin(two_way_tags), std::end(two_way_tags), [&](auto tag) {
        return encoded.size() > tag.size() &&
               strncasecmp(encoded.data(), tag.data(), tag.size()) == 0;
    });
}

}  // namespace

bool is_decodable(const std::string& stored, aes_key_data* key) {
    if (stored.empty() ||
        check_format(stored.c_str(), static_cast<int>(stored.size())) == clear_text) {
        return true;
    }
    const std::string encoded = decoder_input(stored);
    char* clear = nullptr;
    const bool is_decoded = !is_two_way(encoded) || unformat_password(encoded.c_str(), &clear, key,
                                                                      CFG32_PASSWORD_FLAG) != 0;
    _slapd_utils_decode_buffer_free(&clear);
    return is_decoded;
}

}  // namespace cfg32::tool
