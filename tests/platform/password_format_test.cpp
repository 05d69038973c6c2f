#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <random>
#include <set>
#include <thread>
#include <vector>

#include "call_faults.h"
#include "password_support.h"

namespace {

// 0 stands for no key: masking.
constexpr std::size_t all_key_sizes[] = {16, 24, 32, 0};
// The longest clear text that goes into the usual room whatever it is.
constexpr std::size_t always_fits = 730;

const char* tag_for(std::size_t key_size) {
    switch (key_size) {
        case 16:
            return "{AES128}";
        case 24:
            return "{AES192}";
        case 32:
            return "{AES256}";
        default:
            return "{iMASK}>";
    }
}

std::string random_text(std::size_t length, std::string_view alphabet, unsigned seed) {
    std::mt19937 random(seed);
    std::string text(length, '\0');
    for (char& c : text)
        c = alphabet[random() % alphabet.size()];
    return text;
}

// Every byte but NUL: a password may be in any encoding.
std::string random_bytes(std::size_t length, unsigned seed) {
    std::string alphabet;
    for (int c = 1; c < 256; ++c)
        alphabet += static_cast<char>(c);
    return random_text(length, alphabet, seed);
}

std::string random_printable(std::size_t length, unsigned seed) {
    std::string alphabet;
    for (char c = ' '; c <= '~'; ++c)
        alphabet += c;
    return random_text(length, alphabet, seed);
}

class EachScheme : public testing::TestWithParam<std::size_t> {
  protected:
    key_pointer key_ = make_key(GetParam());
};
INSTANTIATE_TEST_SUITE_P(Password, EachScheme, testing::ValuesIn(all_key_sizes),
                         [](const auto& scheme) {
                             return scheme.param == 0 ? "Masked"
                                                      : "Key" + std::to_string(scheme.param);
                         });

// Round trips -----------------------------------------------------------------------------------

TEST_P(EachScheme, ATextOfEveryLengthComesBack) {
    for (std::size_t length = 0; length <= CFG32_PASSWORD_MAX; ++length) {
        const std::string noise = random_bytes(std::min(length, always_fits), 1);
        const std::string clear = noise + std::string(length - noise.size(), 'x');
        // A room in which nothing needs to be compressed, and the usual one.
        EXPECT_EQ(decode(encode(clear, key_.get(), 2048), key_.get()), clear) << length;
        const std::string even(length, 'e');
        EXPECT_EQ(decode(encode(even, key_.get()), key_.get()), even) << length;
    }
}

TEST_P(EachScheme, TheEncodedTextIsTagAndBase64OnOneLine) {
    const std::string text = encode("\xc3\xa4\n\t\x01secret", key_.get());
    const std::string tag = tag_for(GetParam());
    ASSERT_EQ(text.substr(0, tag.size()), tag);
    EXPECT_EQ(text.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz"
                                     "0123456789+/=",
                                     tag.size()),
              std::string::npos);
    EXPECT_EQ(text.find("secret"), std::string::npos);
}

TEST_P(EachScheme, TheSameTextIsEncodedDifferentlyEachTime) {
    std::set<std::string> seen;
    for (int i = 0; i < 50; ++i)
        seen.insert(encode("secret", key_.get()));
    EXPECT_EQ(seen.size(), 50u);
}

TEST_P(EachScheme, TheTagMayBeInAnyCase) {
    std::string text = encode("secret", key_.get());
    for (int (*change)(int) : {&::tolower, &::toupper}) {
        std::transform(text.begin(), text.begin() + 8, text.begin(),
                       [change](char c) { return static_cast<char>(change(c)); });
        EXPECT_EQ(decode(text, key_.get()), "secret") << text;
        EXPECT_FALSE(is_clear(text)) << text;
    }
}

TEST_P(EachScheme, WhatIsEncodedIsRecognised) {
    for (const std::size_t length : {0u, 1u, 5u, 730u, 1024u})
        EXPECT_FALSE(is_clear(encode(std::string(length, 'a'), key_.get()))) << length;
}

TEST_P(EachScheme, ManyThreadsCanShareAKey) {
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([this, i] {
            for (int round = 0; round < 100; ++round) {
                const std::string clear = std::to_string(i) + ":" + std::to_string(round);
                EXPECT_EQ(decode(encode(clear, key_.get()), key_.get()), clear);
            }
        });
    }
    for (auto& thread : threads)
        thread.join();
}

// Damage ----------------------------------------------------------------------------------------

TEST_P(EachScheme, ADamagedTextIsRefusedAtEveryPosition) {
    for (const std::string& clear : {std::string("secret"), std::string(1024, 'a')}) {
        const std::string text = encode(clear, key_.get());
        for (std::size_t at = 0; at < text.size(); ++at) {
            for (const char c : {'A', 'B', 'g', '7', '/', '=', ' ', '>', '{', '\x80'}) {
                if (std::tolower(c) == std::tolower(text[at]) && (at < 8 || c == text[at]))
                    continue;
                std::string damaged = text;
                damaged[at] = c;
                EXPECT_EQ(decode(damaged, key_.get()), "(refused)") << at << damaged;
            }
        }
    }
}

TEST_P(EachScheme, ACutOrLengthenedTextIsRefused) {
    const std::string text = encode("secret", key_.get());
    for (std::size_t length = 0; length < text.size(); ++length)
        EXPECT_EQ(decode(text.substr(0, length), key_.get()), "(refused)") << length;
    for (const char* more : {"A", "AAAA", "=", "\n", " ", "===="})
        EXPECT_EQ(decode(text + more, key_.get()), "(refused)") << more;
    for (const char* before : {" ", "\n", "{iMASK}", "{AES128}", ">"})
        EXPECT_EQ(decode(before + text, key_.get()), "(refused)") << before;
}

TEST_P(EachScheme, OnlyTheRightKeyDecodes) {
    const std::string text = encode("secret", key_.get());
    for (const std::size_t size : all_key_sizes) {
        const bool right = size == GetParam() || GetParam() == 0;
        EXPECT_EQ(decode(text, make_key(size).get()), right ? "secret" : "(refused)") << size;
        if (size != 0) {
            EXPECT_EQ(decode(text, make_key(size, 1).get()),
                      GetParam() == 0 ? "secret" : "(refused)");
        }
    }
}

TEST_P(EachScheme, ATagOfAnotherSchemeDoesNotDecode) {
    const std::string text = encode("secret", key_.get());
    for (const std::size_t other : all_key_sizes) {
        if (other == GetParam())
            continue;
        const std::string relabelled = tag_for(other) + text.substr(8);
        for (const std::size_t size : all_key_sizes)
            EXPECT_EQ(decode(relabelled, make_key(size).get()), "(refused)") << relabelled;
    }
}

// Room ------------------------------------------------------------------------------------------

TEST_P(EachScheme, TheRoomIsUsedToTheByteAndNotBeyond) {
    for (const std::string& clear : {std::string(), std::string("secret"), random_bytes(30, 7)}) {
        const int needed = static_cast<int>(encode(clear, key_.get()).size()) + 1;
        std::string buffer(static_cast<std::size_t>(needed) + 1, '#');
        EXPECT_NE(format_password(133, 0, key_.get(), clear.data(), static_cast<int>(clear.size()),
                                  buffer.data(), needed),
                  0);
        EXPECT_EQ(buffer.back(), '#') << "written beyond the room";
        EXPECT_EQ(decode(buffer.c_str(), key_.get()), clear);
        buffer.back() = '#';
        EXPECT_EQ(format_password(133, 0, key_.get(), clear.data(), static_cast<int>(clear.size()),
                                  buffer.data(), needed - 1),
                  0)
            << needed;
        EXPECT_EQ(buffer[buffer.size() - 2], '\0') << "the room's byte before was not touched";
        EXPECT_EQ(encode(clear, key_.get(), needed - 1), "");
    }
}

TEST_P(EachScheme, EveryRoomHoldsTheWholeTextOrNothing) {
    const std::string clear(200, 'a');
    bool fitted = false;
    for (int room = 1; room < 400; ++room) {
        const std::string text = encode(clear, key_.get(), room);
        EXPECT_FALSE(fitted && text.empty()) << "a larger room must do as well: " << room;
        fitted = fitted || !text.empty();
        if (!text.empty()) {
            EXPECT_EQ(decode(text, key_.get()), clear) << room;
        }
    }
    EXPECT_TRUE(fitted);
}

TEST_P(EachScheme, TheLongestTextThatAlwaysFitsIsAsDocumented) {
    EXPECT_EQ(decode(encode(random_bytes(always_fits, 3), key_.get()), key_.get()),
              random_bytes(always_fits, 3));
    EXPECT_EQ(encode(random_bytes(always_fits + 1, 3), key_.get()), "");
}

TEST_P(EachScheme, ALongRepetitiveTextFits) {
    const std::string clear(1024, 'p');
    const std::string text = encode(clear, key_.get());
    EXPECT_LT(text.size(), 100u);
    EXPECT_EQ(decode(text, key_.get()), clear);
}

TEST_P(EachScheme, ALongTextOfFewLettersFits) {
    const std::string clear = random_text(1024, "0123456789abcdef", 5);
    EXPECT_EQ(decode(encode(clear, key_.get()), key_.get()), clear);
}

TEST_P(EachScheme, ALongRandomTextIsRefusedAndNotCut) {
    EXPECT_EQ(encode(random_printable(1024, 11), key_.get()), "");
}

TEST_P(EachScheme, MayBeEncodedInPlace) {
    char buffer[usual_room] = "secret";
    EXPECT_NE(format_password(133, 0, key_.get(), buffer, 6, buffer, usual_room), 0);
    EXPECT_EQ(decode(buffer, key_.get()), "secret");
}

// Arguments -------------------------------------------------------------------------------------

TEST(FormatPassword, RefusesAnUnknownSelectorOrFlag) {
    for (const auto& [selector, flag] :
         {std::pair{132, 0}, {0, 0}, {-133, 0}, {133, 1}, {133, -1}}) {
        char out[usual_room] = "old";
        EXPECT_EQ(format_password(selector, flag, nullptr, "secret", 6, out, usual_room), 0);
        EXPECT_EQ(std::string(out, 4), std::string(4, '\0')) << selector << " " << flag;
    }
}

TEST(FormatPassword, RefusesATextThatIsNone) {
    char out[usual_room] = "old";
    EXPECT_EQ(format_password(133, 0, nullptr, nullptr, 0, out, usual_room), 0);
    EXPECT_EQ(format_password(133, 0, nullptr, nullptr, 6, out, usual_room), 0);
    EXPECT_EQ(format_password(133, 0, nullptr, "secret", -1, out, usual_room), 0);
    EXPECT_EQ(out[0], '\0');
}

TEST(FormatPassword, RefusesANulInTheText) {
    EXPECT_EQ(encode(std::string_view("sec\0ret", 7)), "");
    EXPECT_EQ(encode(std::string_view("secret\0", 7)), "");
    EXPECT_EQ(encode(std::string_view("\0", 1)), "");
}

TEST(FormatPassword, RefusesMoreThanTheLongestPassword) {
    EXPECT_NE(encode(std::string(1024, 'a'), nullptr, 4096), "");
    EXPECT_EQ(encode(std::string(1025, 'a'), nullptr, 4096), "");
}

TEST(FormatPassword, ReadsNoByteBeyondTheLength) {
    const std::vector<char> exact = {'a', 'b', 'c'};  // not NUL-terminated
    char out[usual_room];
    ASSERT_NE(format_password(133, 0, nullptr, exact.data(), 3, out, usual_room), 0);
    EXPECT_EQ(decode(out), "abc");
}

TEST(FormatPassword, SurvivesNoBuffer) {
    EXPECT_EQ(format_password(133, 0, nullptr, "secret", 6, nullptr, usual_room), 0);
    char byte = '#';
    EXPECT_EQ(format_password(133, 0, nullptr, "secret", 6, &byte, 0), 0);
    EXPECT_EQ(format_password(133, 0, nullptr, "secret", 6, &byte, -1), 0);
    EXPECT_EQ(byte, '#');
}

TEST(FormatPassword, FailsWithoutRandomDataAndWipesTheBuffer) {
    const call_fault fault(watched_call::random, 1, ENOSYS);
    EXPECT_EQ(encode("secret"), "");
    EXPECT_TRUE(fault.happened());
}

TEST(FormatPassword, FailsWithoutMemoryToCompressAndWipesTheBuffer) {
    const call_fault fault(watched_call::allocate, 2, 0);
    EXPECT_EQ(encode(std::string(1024, 'a')), "");
    EXPECT_TRUE(fault.happened());
}

TEST(UnformatPassword, RefusesHashedAndClearTexts) {
    const key_pointer key = make_key(32);
    for (const char* text :
         {"", "secret", "{SHA}W6ph5Mm5Pz8GgiULbPgzG37mj9g=", "{SSHA}x", "{MD5}x", "{crypt}x",
          "{VLDL}x", "{iMASK}", "{iMASK}x", "{iMASK}>", "{AES128}", "{AES256}x", ">", ">>", ">x"}) {
        EXPECT_EQ(decode(text), "(refused)") << text;
        EXPECT_EQ(decode(text, key.get()), "(refused)") << text;
    }
}

TEST(UnformatPassword, RefusesNullsAndUnknownFlags) {
    char* clear = nullptr;
    const std::string text = encode("secret");
    EXPECT_EQ(unformat_password(nullptr, &clear, nullptr, 0), 0);
    EXPECT_EQ(unformat_password(text.c_str(), nullptr, nullptr, 0), 0);
    EXPECT_EQ(unformat_password(text.c_str(), &clear, nullptr, 1), 0);
    EXPECT_EQ(clear, nullptr);
}

TEST(UnformatPassword, AcceptsAMaskedTextWithoutItsTag) {
    const std::string stored = encode("secret").substr(7);
    ASSERT_EQ(stored[0], '>');
    EXPECT_EQ(decode("{iMASK}" + stored), "secret");
    EXPECT_EQ(decode(stored), "secret");
}

TEST(UnformatPassword, FailsWithoutMemoryAndLeavesTheResult) {
    const std::string text = encode("secret");
    const call_fault fault(watched_call::allocate, 1, 0);
    char* clear = nullptr;
    EXPECT_EQ(unformat_password(text.c_str(), &clear, nullptr, 0), 0);
    EXPECT_TRUE(fault.happened());
    EXPECT_EQ(clear, nullptr);
}

// What is clear and what is not ------------------------------------------------------------------

TEST(CheckFormat, RecognisesEveryTagThatIsFollowedByText) {
    for (const char* text :
         {"{SHA}x", "{SSHA}x", "{MD5}x", "{crypt}x", "{AES128}x", "{AES192}x", "{AES256}x",
          "{VLDL}x", "{iMASK}x", "{iMASK}>x", "{CRYPT}x", "{sha}x", "{Imask}x", "{aes256}x"})
        EXPECT_FALSE(is_clear(text)) << text;
}

TEST(CheckFormat, TakesEverythingElseForClear) {
    for (const char* text :
         {"", "secret", "{SHA}", "{iMASK}", "{crypt", "{other}x", " {SHA}x", "{", "}", "{}"})
        EXPECT_TRUE(is_clear(text)) << text;
}

TEST(CheckFormat, APasswordThatMerelyBeginsWithTheMaskMarkIsClear) {
    const std::string stored = encode("secret").substr(7);
    EXPECT_FALSE(is_clear(stored));
    for (const std::string& text :
         {std::string(">"), std::string(">secret"), ">" + stored, stored + "A", stored + " ",
          stored.substr(0, stored.size() - 1), ">" + std::string(56, 'A'),
          ">" + std::string(100000, 'A'), stored.substr(1)})
        EXPECT_TRUE(is_clear(text)) << text.substr(0, 80);
    for (std::size_t at = 1; at < stored.size(); ++at) {
        std::string damaged = stored;
        damaged[at] = damaged[at] == 'A' ? 'B' : 'A';
        EXPECT_TRUE(is_clear(damaged)) << damaged;
    }
}

TEST(CheckFormat, APasswordThatBeginsWithTheMaskMarkIsEncodedLikeAnyOther) {
    EXPECT_EQ(decode(encode(">secret")), ">secret");
}

TEST(CheckFormat, LooksAtNoMoreThanTheLength) {
    EXPECT_EQ(check_format("{SHA}xyz", 5), 1);
    EXPECT_EQ(check_format("{SHA}xyz", 6), 0);
    const std::vector<char> exact = {'{', 'S', 'H', 'A', '}', 'x'};  // not NUL-terminated
    EXPECT_EQ(check_format(exact.data(), 6), 0);
    EXPECT_EQ(check_format("{SHA}\0x", 7), 1) << "a NUL ends the text";
}

TEST(CheckFormat, TakesNullAndNegativeLengthsForClear) {
    EXPECT_EQ(check_format(nullptr, 0), 1);
    EXPECT_EQ(check_format(nullptr, 10), 1);
    EXPECT_EQ(check_format("{SHA}x", -1), 1);
    EXPECT_EQ(check_format("{SHA}x", 0), 1);
}

// Releasing -------------------------------------------------------------------------------------

TEST(DecodeBufferFree, WipesFreesAndSetsToNull) {
    char* clear = nullptr;
    ASSERT_NE(unformat_password(encode("Tr0ub4dor&3").c_str(), &clear, nullptr, 0), 0);
    const free_watch watch("Tr0");
    _slapd_utils_decode_buffer_free(&clear);
    EXPECT_EQ(clear, nullptr);
    EXPECT_EQ(watch.blocks(), 1);
    EXPECT_EQ(watch.leaks(), 0);
}

TEST(DecodeBufferFree, AllowsNulls) {
    _slapd_utils_decode_buffer_free(nullptr);
    char* clear = nullptr;
    _slapd_utils_decode_buffer_free(&clear);
    EXPECT_EQ(clear, nullptr);
}

}  // namespace
