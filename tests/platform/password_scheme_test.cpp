#include "password_scheme.h"

#include <gtest/gtest.h>

#include <cctype>
#include <string>

namespace cfg32::platform {
namespace {

TEST(PasswordScheme, IsFoundByItsTagInAnyCase) {
    for (const auto& scheme : password_schemes) {
        std::string lower(scheme.tag);
        std::string upper(scheme.tag);
        for (std::size_t i = 0; i < scheme.tag.size(); ++i) {
            lower[i] = static_cast<char>(std::tolower(scheme.tag[i]));
            upper[i] = static_cast<char>(std::toupper(scheme.tag[i]));
        }
        EXPECT_EQ(scheme_of(std::string(scheme.tag) + "x"), &scheme) << scheme.tag;
        EXPECT_EQ(scheme_of(lower + "x"), &scheme) << lower;
        EXPECT_EQ(scheme_of(upper + "x"), &scheme) << upper;
    }
}

TEST(PasswordScheme, IsNoneWhereNoWholeTagIsFollowedByText) {
    for (const std::string_view text :
         {"",           "{",        "{}",     "{}x",     "{SHA",    "{SHA}",      "{crypt}",
          "{iMASK}",    "{AES128}", "SHA}x",  " {SHA}x", "x{SHA}x", "{SHA256}x",  "{AES}x",
          "{AES1280}x", "{SHA }x",  "[SHA]x", "{MD4}x",  "{IMASK",  "{\xcdMASK}x"})
        EXPECT_EQ(scheme_of(text), nullptr) << text;
}

TEST(PasswordScheme, IsFoundByItsKeySize) {
    EXPECT_EQ(scheme_for_key(16)->tag, "{AES128}");
    EXPECT_EQ(scheme_for_key(24)->tag, "{AES192}");
    EXPECT_EQ(scheme_for_key(32)->tag, "{AES256}");
    for (const std::size_t size : {0u, 1u, 8u, 15u, 17u, 33u, 64u})
        EXPECT_EQ(scheme_for_key(size), nullptr) << size;
}

}  // namespace
}  // namespace cfg32::platform
