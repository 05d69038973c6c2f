#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "wiped_buffer.h"

// Authenticated encryption (AES-GCM, NIST SP 800-38D) of one byte string. The sealed form is
// flags (1 byte), nonce (12), ciphertext (as long as the plain bytes), authentication tag (16).
namespace cfg32::platform {

inline constexpr std::size_t seal_nonce_size = 12;
inline constexpr std::size_t seal_tag_size = 16;
inline constexpr std::size_t seal_overhead = 1 + seal_nonce_size + seal_tag_size;

// What a text is sealed under: the key (16, 24 or 32 bytes) and a label that isn't part of the
// sealed form but authenticated with it, as the flags are.
struct seal_context {
    bytes_view key;
    std::string_view label;
};

// The room for the sealed form must be exactly plain.size() + seal_overhead.
bool seal_bytes(const seal_context& context, std::uint8_t flags, bytes_view plain,
                std::span<unsigned char> sealed);

// The room for the plain bytes must be exactly sealed.size() - seal_overhead. False if any byte of
// the sealed form, the label or the key is not as it was; what was written to plain until then is
// not to be used.
bool unseal_bytes(const seal_context& context, bytes_view sealed, std::uint8_t& flags,
                  std::span<unsigned char> plain);

}  // namespace cfg32::platform
