#pragma once

#include <cstddef>
#include <string_view>

namespace cfg32::platform {

enum class scheme_kind {
    hashed,     // one way: recognised, never made or decoded here
    encrypted,  // sealed with the caller's key
    masked,     // sealed with a key that everybody has
};

struct password_scheme {
    std::string_view tag;
    scheme_kind kind;
    std::size_t key_size;  // in bytes, for the encrypted schemes
};

// clang-format off
inline constexpr password_scheme password_schemes[] = {
    {"{SHA}",    scheme_kind::hashed,    0},
    {"{SSHA}",   scheme_kind::hashed,    0},
    {"{MD5}",    scheme_kind::hashed,    0},
    {"{crypt}",  scheme_kind::hashed,    0},
    {"{VLDL}",   scheme_kind::hashed,    0},
    {"{AES128}", scheme_kind::encrypted, 16},
    {"{AES192}", scheme_kind::encrypted, 24},
    {"{AES256}", scheme_kind::encrypted, 32},
    {"{iMASK}",  scheme_kind::masked,    0},
};
// clang-format on

// The scheme whose tag, in any case (RFC 3112 practice), the text begins with; null if there is
// none or nothing follows the tag.
const password_scheme* scheme_of(std::string_view text);

// The scheme that encrypts with keys of this size; null if there is none.
const password_scheme* scheme_for_key(std::size_t key_size);

}  // namespace cfg32::platform
