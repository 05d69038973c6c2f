#pragma once

#include <cstddef>

#include "wiped_buffer.h"

// The largest key is AES-256's; size is 16, 24 or 32 in every object that exists.
struct aes_key_data {
    static constexpr std::size_t largest_size = 32;

    std::size_t size;
    unsigned char bytes[largest_size];

    cfg32::platform::bytes_view view() const { return {bytes, size}; }
};
