#include "base64.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace cfg32::platform {
namespace {

bytes_view bytes_of(std::string_view text) {
    return {reinterpret_cast<const unsigned char*>(text.data()), text.size()};
}

std::string encoded(std::string_view bytes) {
    std::string text(base64_length(bytes.size()), '#');
    EXPECT_EQ(base64_encode(bytes_of(bytes), text.data()), text.data() + text.size());
    return text;
}

// The decoded bytes; "(refused)" if there are none.
std::string decoded(std::string_view text, std::size_t room = 64) {
    std::vector<unsigned char> out(room);
    const auto size = base64_decode(text, out);
    return size ? std::string(out.begin(), out.begin() + static_cast<std::ptrdiff_t>(*size))
                : "(refused)";
}

// RFC 4648 section 10, and the two characters beyond letters and digits.
const struct {
    std::string_view bytes, text;
} vectors[] = {
    {"", ""},
    {"f", "Zg=="},
    {"fo", "Zm8="},
    {"foo", "Zm9v"},
    {"foob", "Zm9vYg=="},
    {"fooba", "Zm9vYmE="},
    {"foobar", "Zm9vYmFy"},
    {std::string_view("\xfb\xff\xbf\0", 4), "+/+/AA=="},
};

TEST(Base64, EncodesTheVectors) {
    for (const auto& row : vectors)
        EXPECT_EQ(encoded(row.bytes), row.text);
}

TEST(Base64, DecodesTheVectors) {
    for (const auto& row : vectors)
        EXPECT_EQ(decoded(row.text), row.bytes);
}

TEST(Base64, RefusesEverySpellingButTheCanonicalOne) {
    for (const std::string_view text : {"Z",       "Zg",      "Zg=",      "Zg===", "Zm8",  "=",
                                        "====",    "Z===",    "Zg==Zg==", "Zm=v",  "=m9v",
                                        "Zh==",  // unused bits set, RFC 4648 section 3.5
                                        "Zm9=",    "Zm9v\n",  " Zm9v",    "Zm9v ", "Zm 9", "Zm-_",
                                        "Zm9\xc3", "Zm9v===="})
        EXPECT_EQ(decoded(text), "(refused)") << text;
    EXPECT_EQ(decoded(std::string_view("Zm9\0", 4)), "(refused)");
}

TEST(Base64, RefusesWhatDoesNotFit) {
    EXPECT_EQ(decoded("Zm9vYmFy", 6), "foobar");
    EXPECT_EQ(decoded("Zm9vYmFy", 5), "(refused)");
    EXPECT_EQ(decoded("Zm9vYg==", 4), "foob");
    EXPECT_EQ(decoded("Zm9vYg==", 3), "(refused)");
}

TEST(Base64, KnowsItsLengths) {
    for (std::size_t length = 0; length < 40; ++length) {
        EXPECT_LE(base64_length(base64_room(length)), length);
        EXPECT_GT(base64_length(base64_room(length) + 1), length);
    }
}

}  // namespace
}  // namespace cfg32::platform
