#pragma once

#include <cstddef>
#include <optional>
#include <span>

#include "wiped_buffer.h"

// Raw deflate data (RFC 1951) of short secret texts. The compressor's working memory, which holds
// the text, is wiped before it is released.
namespace cfg32::platform {

// Return the size of the result. Nothing if it doesn't fit: neither routine ever writes, or takes
// memory, beyond the room it is given, whatever the data says.
//
// The compressor may ask for one byte of room that it then leaves unused.
std::optional<std::size_t> compress_text(bytes_view text, std::span<unsigned char> out);

// Nothing as well for data that is damaged, cut short or followed by more.
std::optional<std::size_t> expand_text(bytes_view compressed, std::span<unsigned char> out);

}  // namespace cfg32::platform
