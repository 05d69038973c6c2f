#include "password_text.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "base64.h"
#include "compressed_text.h"
#include "password_support.h"
#include "sealed_bytes.h"

namespace cfg32::platform {
namespace {

// What another implementation of AES-GCM made of "secret" with the keys 00 01 02 ... and the nonce
// a0 ... ab. These texts stand in configuration files and have to stay readable.
const struct {
    std::size_t key_size;
    const char* encoded;
} known_answers[] = {
    {16, "{AES128}EKChoqOkpaanqKmqq9njW8kb/e7f4YGJvZJvcS51ntKx+eY="},
    {24, "{AES192}EKChoqOkpaanqKmqq0gH3RCcJ7p8DJRosWhLPPRQuH7Ta2s="},
    {32, "{AES256}EKChoqOkpaanqKmqq5V9H18gv00+8rnk96pemQwONtW4ljw="},
    {0, "{iMASK}>EKChoqOkpaanqKmqqzk7koA1L9qIvlKsspq05qArLsaQhdU="},
};

TEST(PasswordText, DecodesTheKnownAnswers) {
    for (const auto& row : known_answers)
        EXPECT_EQ(decode(row.encoded, make_key(row.key_size).get()), "secret") << row.encoded;
}

TEST(PasswordText, DecodesAKnownCompressedAnswer) {
    EXPECT_EQ(decode("{iMASK}>EaChoqOkpaanqKmqqwES7ffzO1zz2VOGgBJEHixAbHQjbXLjMG0rGg=="),
              std::string(1024, 'a'));
}

// A text sealed with a right key whose content no encoder of this version would have written.
std::string crafted(std::uint8_t flags, std::string_view content) {
    std::vector<unsigned char> key(16);
    for (std::size_t i = 0; i < key.size(); ++i)
        key[i] = static_cast<unsigned char>(i);
    std::vector<unsigned char> sealed(content.size() + seal_overhead);
    const auto* plain = reinterpret_cast<const unsigned char*>(content.data());
    EXPECT_TRUE(seal_bytes({key, "{AES128}"}, flags, {plain, content.size()}, sealed));
    std::string text(base64_length(sealed.size()), '\0');
    base64_encode(sealed, text.data());
    return "{AES128}" + text;
}

std::string decode_crafted(std::uint8_t flags, std::string_view content) {
    return decode(crafted(flags, content), make_key(16).get());
}

std::string compressed(std::string_view text) {
    std::string data(2000, '\0');
    auto* room = reinterpret_cast<unsigned char*>(data.data());
    const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
    data.resize(compress_text({bytes, text.size()}, {room, data.size()}).value_or(0));
    return data;
}

TEST(PasswordText, RefusesFlagsOfNoKnownVersion) {
    EXPECT_EQ(decode_crafted(0x10, "secret"), "secret");
    for (unsigned flags = 0; flags < 256; ++flags) {
        if (flags != 0x10 && flags != 0x11) {
            EXPECT_EQ(decode_crafted(static_cast<std::uint8_t>(flags), "secret"), "(refused)")
                << flags;
        }
    }
}

TEST(PasswordText, RefusesACompressedTextThatExpandsBeyondTheLimit) {
    EXPECT_EQ(decode_crafted(0x11, compressed(std::string(1024, 'a'))), std::string(1024, 'a'));
    EXPECT_EQ(decode_crafted(0x11, compressed(std::string(1025, 'a'))), "(refused)");
    EXPECT_EQ(decode_crafted(0x11, compressed(std::string(500000, 'a'))), "(refused)");
}

TEST(PasswordText, RefusesACompressedTextThatIsNone) {
    EXPECT_EQ(decode_crafted(0x11, "\xff\xffsecret"), "(refused)");
    EXPECT_EQ(decode_crafted(0x11, ""), "(refused)");
    EXPECT_EQ(decode_crafted(0x11, compressed("secret") + "x"), "(refused)");
}

TEST(PasswordText, RefusesAnOverlongTextBeforeAnythingElse) {
    EXPECT_EQ(decode_crafted(0x10, std::string(1024, 'a')), std::string(1024, 'a'));
    EXPECT_EQ(decode_crafted(0x10, std::string(1025, 'a')), "(refused)");
    EXPECT_EQ(decode("{iMASK}>" + std::string(4000000, 'A')), "(refused)");
}

TEST(PasswordText, RefusesAClearTextThatIsNoCString) {
    EXPECT_EQ(decode_crafted(0x10, std::string_view("sec\0ret", 7)), "(refused)");
    EXPECT_EQ(decode_crafted(0x11, compressed(std::string_view("sec\0ret", 7))), "(refused)");
}

TEST(PasswordText, RefusesATextTooShortToBeSealed) {
    const std::string whole = crafted(0x10, "").substr(8);
    EXPECT_EQ(whole.size(), 40u);
    for (std::size_t length = 0; length < whole.size(); ++length)
        EXPECT_EQ(decode("{AES128}" + whole.substr(0, length), make_key(16).get()), "(refused)");
}

}  // namespace
}  // namespace cfg32::platform
