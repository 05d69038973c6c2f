#pragma once

#include <string.h>

#include <algorithm>
#include <cstddef>
#include <span>

namespace cfg32::platform {

using bytes_view = std::span<const unsigned char>;

// A byte buffer of fixed capacity on the stack that is wiped whole when it goes. Secrets live in
// these and nowhere else, so that no path, whether it returns early or late, can forget them.
template <std::size_t Capacity>
class wiped_buffer {
  public:
    // cppcheck-suppress uninitMemberVar  ; written before it is read, and large
    wiped_buffer() = default;
    wiped_buffer(const wiped_buffer&) = delete;
    wiped_buffer& operator=(const wiped_buffer&) = delete;
    ~wiped_buffer() { explicit_bzero(bytes_, Capacity); }

    static constexpr std::size_t capacity() { return Capacity; }
    std::size_t size() const { return size_; }
    void resize(std::size_t size) { size_ = std::min(size, Capacity); }

    unsigned char* data() { return bytes_; }
    const unsigned char* data() const { return bytes_; }
    bytes_view view() const { return {bytes_, size_}; }

  private:
    std::size_t size_ = 0;
    // Left unset: every byte within the size is written before it is read.
    unsigned char bytes_[Capacity];
};

}  // namespace cfg32::platform
