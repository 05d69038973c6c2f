#pragma once

#include <cstddef>
#include <span>
#include <string_view>

#include "cfg32_platform.h"
#include "wiped_buffer.h"

// Encoded passwords as texts; the header describes their form.
namespace cfg32::platform {

using clear_text = wiped_buffer<CFG32_PASSWORD_MAX>;

// The scheme that follows from the key (null: masking) is the one that is used. False if the text
// doesn't fit with its terminating NUL; what was written to out until then is not to be used.
bool encode_password(bytes_view clear, const aes_key_data* key, std::span<char> out);

// False for all that has no clear text for the holder of this key (which may be null).
bool decode_password(std::string_view encoded, const aes_key_data* key, clear_text& clear);

bool is_encoded_password(std::string_view text);

}  // namespace cfg32::platform
