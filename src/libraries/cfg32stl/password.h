#pragma once

#include <string>

// The tags of encoded passwords, without a terminating NUL (RFC 2307, 5.3, for the form).
inline constexpr char SHA_BRACED[5] = {'{', 'S', 'H', 'A', '}'};
inline constexpr char SSHA_BRACED[6] = {'{', 'S', 'S', 'H', 'A', '}'};
inline constexpr char MD5_BRACED[5] = {'{', 'M', 'D', '5', '}'};
inline constexpr char crypt_BRACED[7] = {'{', 'c', 'r', 'y', 'p', 't', '}'};
inline constexpr char iMASK_BRACED[7] = {'{', 'i', 'M', 'A', 'S', 'K', '}'};
inline constexpr char AES128_BRACED[8] = {'{', 'A', 'E', 'S', '1', '2', '8', '}'};
inline constexpr char AES192_BRACED[8] = {'{', 'A', 'E', 'S', '1', '9', '2', '}'};
inline constexpr char AES256_BRACED[8] = {'{', 'A', 'E', 'S', '2', '5', '6', '}'};
inline constexpr char VLDL_BRACED[6] = {'{', 'V', 'L', 'D', 'L', '}'};

namespace cfg32 {

/// What unformat_password takes for a stored password, which must not be empty: a masked one may
/// be stored without its tag, which is put back.
std::string decoder_input(const std::string& stored);

}  // namespace cfg32
