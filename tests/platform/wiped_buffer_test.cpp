#include "wiped_buffer.h"

#include <gtest/gtest.h>

#include <cstring>
#include <new>

namespace cfg32::platform {
namespace {

using small_buffer = wiped_buffer<64>;

TEST(WipedBuffer, IsWipedWholeWhateverItsSize) {
    alignas(small_buffer) unsigned char storage[sizeof(small_buffer)];
    auto* buffer = new (storage) small_buffer;
    std::memset(buffer->data(), 'S', small_buffer::capacity());
    buffer->resize(3);
    buffer->~small_buffer();
    // The storage outlives the object and may be looked at byte by byte.
    EXPECT_EQ(std::count(std::begin(storage), std::end(storage), 'S'), 0);
}

TEST(WipedBuffer, NeverGrowsBeyondItsCapacity) {
    small_buffer buffer;
    EXPECT_EQ(buffer.size(), 0u);
    buffer.resize(1000);
    EXPECT_EQ(buffer.size(), 64u);
    EXPECT_EQ(buffer.view().size(), 64u);
}

}  // namespace
}  // namespace cfg32::platform
