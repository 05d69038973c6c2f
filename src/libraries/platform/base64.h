#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string_view>

#include "wiped_buffer.h"

// Base64 as RFC 4648 section 4 has it: with padding, without line ends.
namespace cfg32::platform {

constexpr std::size_t base64_length(std::size_t size) { return (size + 2) / 3 * 4; }

// The most bytes whose base64 form is no longer than this.
constexpr std::size_t base64_room(std::size_t length) { return length / 4 * 3; }

// Writes base64_length(bytes.size()) characters and no NUL; returns the position after them.
char* base64_encode(bytes_view bytes, char* out);

// Decodes into a buffer and returns the number of bytes. Nothing for a text that is not in the one
// canonical form (section 3.5: the unused bits of the last character are 0) or doesn't fit: a
// decoder that let some characters vary would let a sealed text be changed unnoticed.
std::optional<std::size_t> base64_decode(std::string_view text, std::span<unsigned char> out);

}  // namespace cfg32::platform
