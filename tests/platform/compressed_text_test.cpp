#define ZLIB_CONST
#include "compressed_text.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <string>
#include <vector>

#include "call_faults.h"

namespace cfg32::platform {
namespace {

bytes_view bytes_of(std::string_view text) {
    return {reinterpret_cast<const unsigned char*>(text.data()), text.size()};
}

// Empty for what is refused; no deflate data is empty.
std::string compressed(std::string_view text, std::size_t room = 2000) {
    std::vector<unsigned char> out(room);
    const auto size = compress_text(bytes_of(text), out);
    return std::string(out.begin(), out.begin() + static_cast<std::ptrdiff_t>(size.value_or(0)));
}

std::string expanded(std::string_view data, std::size_t room = 2000) {
    std::vector<unsigned char> out(room);
    const auto size = expand_text(bytes_of(data), out);
    return size ? std::string(out.begin(), out.begin() + static_cast<std::ptrdiff_t>(*size))
                : "(refused)";
}

TEST(CompressedText, ComesBackAsItWas) {
    std::string noise;
    for (int i = 0; i < 1024; ++i)
        noise += static_cast<char>(i * i % 251);
    for (const std::string& text : {std::string(), std::string("a"), std::string(1024, 'a'), noise})
        EXPECT_EQ(expanded(compressed(text)), text);
    EXPECT_LT(compressed(std::string(1024, 'a')).size(), 30u);
}

TEST(CompressedText, FitsOrIsRefused) {
    const std::string text = std::string(500, 'a') + std::string(500, 'b');
    const std::string data = compressed(text);
    EXPECT_EQ(compressed(text, data.size() + 1), data);
    EXPECT_EQ(compressed(text, data.size() - 1), "");
    EXPECT_EQ(compressed(text, 0), "");
}

TEST(CompressedText, ExpandsOnlyIntoTheRoomThatIsThere) {
    const std::string data = compressed(std::string(1024, 'a'));
    EXPECT_EQ(expanded(data, 1024).size(), 1024u);
    EXPECT_EQ(expanded(data, 1023), "(refused)");
    EXPECT_EQ(expanded(data, 0), "(refused)");
}

TEST(CompressedText, StopsABombAtTheEdge) {
    const std::string text(std::size_t{10} << 20, 'a');
    z_stream stream{};
    ASSERT_EQ(deflateInit2(&stream, 9, Z_DEFLATED, -15, 9, Z_DEFAULT_STRATEGY), Z_OK);
    std::string bomb(20000, '\0');
    stream.next_in = reinterpret_cast<const Bytef*>(text.data());
    stream.avail_in = static_cast<uInt>(text.size());
    stream.next_out = reinterpret_cast<Bytef*>(bomb.data());
    stream.avail_out = static_cast<uInt>(bomb.size());
    ASSERT_EQ(deflate(&stream, Z_FINISH), Z_STREAM_END);
    bomb.resize(stream.total_out);
    deflateEnd(&stream);
    EXPECT_EQ(expanded(bomb, 1024), "(refused)");
}

TEST(CompressedText, RefusesDamagedData) {
    const std::string data = compressed(std::string(100, 'a') + "bcdefgh");
    EXPECT_EQ(expanded(data + "x"), "(refused)");
    EXPECT_EQ(expanded(data.substr(0, data.size() - 1)), "(refused)");
    EXPECT_EQ(expanded(""), "(refused)");
    EXPECT_EQ(expanded("\xff\xff\xff"), "(refused)");
}

TEST(CompressedText, ExhaustedMemoryIsARefusalAtEveryAllocation) {
    const std::string text(1024, 'a');
    int nth = 1;
    for (std::string data; data.empty(); ++nth) {
        ASSERT_LT(nth, 20);
        call_fault fault(watched_call::allocate, nth, ENOMEM);
        data = compressed(text);
        EXPECT_EQ(data.empty(), fault.happened());
    }
    EXPECT_GT(nth, 3) << "the compressor allocates more than once";
}

TEST(CompressedText, DoesNotComeBackWhenAnyAllocationFails) {
    const std::string text = "a text, a text, and a text";
    const std::string data = compressed(text);
    int nth = 1;
    for (std::string back; back != text; ++nth) {
        ASSERT_LT(nth, 20);
        call_fault fault(watched_call::allocate, nth, ENOMEM);
        back = expanded(data);
        EXPECT_EQ(back == "(refused)", fault.happened());
    }
    EXPECT_GT(nth, 2) << "the expander allocates";
}

TEST(CompressedText, LeavesNoTraceInFreedMemory) {
    const std::string secret = "Tr0ub4dor&3-horse";
    std::string text;
    for (int i = 0; i < 50; ++i)
        text += secret + std::to_string(i);
    unsigned char data[2000];
    unsigned char back[2000];
    const free_watch watch(secret);
    const auto size = compress_text(bytes_of(text), data);
    ASSERT_TRUE(size);
    ASSERT_TRUE(expand_text({data, *size}, back));
    EXPECT_GT(watch.blocks(), 3);
    EXPECT_EQ(watch.leaks(), 0);
}

}  // namespace
}  // namespace cfg32::platform
