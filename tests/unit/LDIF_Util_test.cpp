#include "LDIF_Util.h"

#include <gmock/gmock.h>

#include <cctype>
#include <clocale>
#include <cwctype>
#include <set>
#include <string>
#include <string_view>

#include "failures.h"
#include "utf8_locale.h"

namespace {

using cfg32::tests::failure_of;
using cfg32::tests::summary;
using namespace std::string_literals;

// "h", e with an acute accent, "!"; and an ideographic space, which is whitespace.
constexpr const char* accented = "h\xc3\xa9!";
constexpr const wchar_t* wide_accented = L"h\u00e9!";
#define WIDE_SPACE "\xe3\x80\x80"

/// Bytes that are no text in any locale that the tests run in.
constexpr const char* bad_bytes[] = {"\xff", "a\xff", "\xff z", "a b\xfe"};

void expect_unusable(const LDIF_Exception& e, const std::string& text) {
    EXPECT_EQ(summary(e), "162/162 mbstowcs( " + text + " )");
    EXPECT_EQ(e.value, text);
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Util");
    EXPECT_GT(e.srcLine, 0);
    EXPECT_EQ(e.cause, nullptr);
}

TEST(LDIF_Util, CharacterClassesHaveTheirCharactersInOrder) {
    EXPECT_EQ(ALPHA, "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz");
    EXPECT_EQ(DIGIT, "0123456789");
    EXPECT_EQ(hexChar, "0123456789ABCDEFabcdef");
    EXPECT_EQ(keyChar, "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-");
    EXPECT_EQ(oidChar, "0123456789.");
    EXPECT_EQ(special, ",=+<>#;\\\"");
    EXPECT_EQ(special.size(), 9u);
}

TEST(LDIF_Util, EmptyStrIsAnEmptyText) {
    ASSERT_NE(empty_str, nullptr);
    EXPECT_STREQ(empty_str, "");
}

TEST(LDIF_Util, WhitespaceIsWhatTheCLibrarySays) {
    for (unsigned int c = 0; c <= 0x3100; ++c) {
        ASSERT_EQ(w_my_isspace(c), iswspace(c) != 0) << c;
    }
    for (const unsigned int c : {' ', '\t', '\n', '\v', '\f', '\r'}) {
        EXPECT_TRUE(w_my_isspace(c)) << c;
    }
    EXPECT_FALSE(w_my_isspace('a'));
    EXPECT_FALSE(w_my_isspace(0));
    EXPECT_FALSE(w_my_isspace(static_cast<unsigned int>(WEOF)));
}

TEST(LDIF_Util, IdeographicSpaceIsWhitespaceInUtf8) {
    REQUIRE_UTF8();
    EXPECT_TRUE(w_my_isspace(0x3000));
    EXPECT_FALSE(w_my_isspace(0xa0)) << "a no-break space is not";
}

TEST(LDIF_Util, BlankTextHasOnlyWhitespace) {
    const struct {
        std::string text;
        bool expected;
    } rows[] = {
        {"", true},      {" ", true},      {" \t\r\n\v\f", true}, {"a", false},
        {" a", false},   {"a ", false},    {"  .  ", false},      {"\0"s, true},
        {" \0a"s, true}, {"a\0 "s, false}, {"\x1f", false},       {"\x7f", false},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(isBlank(row.text), row.expected) << testing::PrintToString(row.text);
    }
    EXPECT_TRUE(w_isBlank(L""));
    EXPECT_TRUE(w_isBlank(L" \t\r\n\v\f"));
    EXPECT_FALSE(w_isBlank(L"  x"));
    EXPECT_FALSE(w_isBlank(L"x  "));
}

TEST(LDIF_Util, BlankTextMayHaveIdeographicSpaces) {
    REQUIRE_UTF8();
    EXPECT_TRUE(isBlank(WIDE_SPACE));
    EXPECT_TRUE(isBlank(" " WIDE_SPACE "\t"));
    EXPECT_FALSE(isBlank(WIDE_SPACE "x"));
    EXPECT_FALSE(isBlank(accented));
    EXPECT_TRUE(w_isBlank(L" \u3000"));
}

TEST(LDIF_Util, StrippingRemovesWhitespaceFromOneSide) {
    const struct {
        const char* text;
        const char* leading;
        const char* trailing;
    } rows[] = {
        {"", "", ""},
        {"a", "a", "a"},
        {"   ", "", ""},
        {" ", "", ""},
        {" \t\r\n\v\fa b \t\r\n\v\f", "a b \t\r\n\v\f", " \t\r\n\v\fa b"},
        {"  a", "a", "  a"},
        {"a  ", "a  ", "a"},
        {" a ", "a ", " a"},
        {"\x7f ", "\x7f ", "\x7f"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(testing::PrintToString(row.text));
        const std::string_view text = row.text;
        std::string narrow(text);
        EXPECT_EQ(&stripLeading(narrow), &narrow);
        EXPECT_EQ(narrow, row.leading);
        narrow = text;
        EXPECT_EQ(&stripTrailing(narrow), &narrow);
        EXPECT_EQ(narrow, row.trailing);
        std::wstring wide(text.begin(), text.end());
        EXPECT_EQ(&w_stripLeading(wide), &wide);
        EXPECT_EQ(wide2multibyte(wide), row.leading);
        wide.assign(text.begin(), text.end());
        EXPECT_EQ(&w_stripTrailing(wide), &wide);
        EXPECT_EQ(wide2multibyte(wide), row.trailing);
    }
}

TEST(LDIF_Util, StrippingTakesWholeCharacters) {
    REQUIRE_UTF8();
    const std::string text = WIDE_SPACE " \xc3\xa9 x\xc2\xa0" WIDE_SPACE "\t";
    std::string stripped = text;
    EXPECT_EQ(stripLeading(stripped), "\xc3\xa9 x\xc2\xa0" WIDE_SPACE "\t");
    stripped = text;
    EXPECT_EQ(stripTrailing(stripped), WIDE_SPACE " \xc3\xa9 x\xc2\xa0");
    stripped = WIDE_SPACE;
    EXPECT_EQ(stripLeading(stripped), "");
    stripped = WIDE_SPACE;
    EXPECT_EQ(stripTrailing(stripped), "");
}

TEST(LDIF_Util, StrippingTextWithANulKeepsWhatIsBeforeIt) {
    std::string text = " a \0 b "s;
    EXPECT_EQ(stripLeading(text), "a ");
    text = " a \0 b "s;
    EXPECT_EQ(stripTrailing(text), " a");
}

TEST(LDIF_Util, EveryCarriageReturnIsRemoved) {
    const struct {
        const wchar_t* text;
        const wchar_t* expected;
    } rows[] = {
        {L"", L""},       {L"a", L"a"},         {L"a\rb\r", L"ab"},         {L"\r", L""},
        {L"\r\r\r", L""}, {L"\ra\r\rb", L"ab"}, {L"a\r\n b\t", L"a\n b\t"},
    };
    for (const auto& row : rows) {
        std::wstring text = row.text;
        w_stripCarriageReturn(text);
        EXPECT_EQ(text, row.expected);
    }
}

TEST(LDIF_Util, HexDigitsAreTakenFromTheFront) {
    const struct {
        const char* text;
        int byte;  ///< -1: no two digits
        const char* rest;
    } rows[] = {
        {"4a1", 0x4a, "1"}, {"4A", 0x4a, ""},   {"00", 0, ""},        {"ff", 0xff, ""},
        {"FF", 0xff, ""},   {"aF9", 0xaf, "9"}, {"09zz", 0x09, "zz"}, {"90", 0x90, ""},
        {"4", -1, "4"},     {"", -1, ""},       {"G0", -1, "G0"},     {"0G", -1, "0G"},
        {"g0", -1, "g0"},   {" 41", -1, " 41"}, {"0x41", -1, "0x41"}, {"@1", -1, "@1"},
        {"/1", -1, "/1"},   {":1", -1, ":1"},   {"`1", -1, "`1"},     {"1`", -1, "1`"},
        {"-1", -1, "-1"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const std::string_view text = row.text;
        char out = '?';
        std::wstring wide(text.begin(), text.end());
        EXPECT_EQ(w_hex2byte(wide, out), row.byte >= 0);
        EXPECT_EQ(wide2multibyte(wide), row.rest);
        EXPECT_EQ(out, row.byte >= 0 ? static_cast<char>(row.byte) : '?');
        out = '?';
        std::string narrow(text);
        EXPECT_EQ(hex2byte(narrow, out), row.byte >= 0);
        EXPECT_EQ(narrow, row.rest);
        EXPECT_EQ(out, row.byte >= 0 ? static_cast<char>(row.byte) : '?');
    }
}

TEST(LDIF_Util, ByteGoesToHexAndBack) {
    for (unsigned int byte = 0; byte < 256; ++byte) {
        std::string hex;
        EXPECT_EQ(&byte2hex(byte, hex), &hex);
        ASSERT_EQ(hex.size(), 2u);
        char out = '?';
        EXPECT_TRUE(hex2byte(hex, out));
        EXPECT_EQ(static_cast<unsigned char>(out), byte);
        EXPECT_EQ(hex, "");
    }
}

TEST(LDIF_Util, OnlyAsciiDigitsAreHexDigits) {
    REQUIRE_UTF8();
    std::wstring fullwidth = L"\uff14\uff11";
    char out = '?';
    EXPECT_FALSE(w_hex2byte(fullwidth, out));
    EXPECT_EQ(fullwidth, L"\uff14\uff11");
    std::string rest = "41\xc3\xa9";
    EXPECT_TRUE(hex2byte(rest, out));
    EXPECT_EQ(rest, "\xc3\xa9");
    EXPECT_EQ(out, 'A');
}

TEST(LDIF_Util, HexFormIsTwoUpperCaseDigitsAppended) {
    const struct {
        unsigned int byte;
        const char* expected;
    } rows[] = {{0x0a, ">0A"}, {0x00, ">00"}, {0x99, ">99"}, {0xa9, ">A9"},
                {0x9a, ">9A"}, {0xff, ">FF"}, {0x7f, ">7F"}};
    for (const auto& row : rows) {
        std::string text = ">";
        EXPECT_EQ(byte2hex(row.byte, text), row.expected);
    }
}

TEST(LDIF_Util, HexFormOfASignedCharIsThatOfItsByte) {
    std::string text;
    EXPECT_EQ(byte2hex(static_cast<unsigned int>('\xab'), text), "AB");
}

TEST(LDIF_Util, PlainTextIsTheSameInBothForms) {
    for (const char* text : {"", "a", "a b\t", "~\x7f\x01", "\r\n"}) {
        const std::string_view plain = text;
        const std::wstring wide(plain.begin(), plain.end());
        EXPECT_EQ(multibyte2wide(text), wide);
        EXPECT_EQ(wide2multibyte(wide), text);
    }
    const std::string longer(100000, 'x');
    EXPECT_EQ(wide2multibyte(multibyte2wide(longer)), longer);
}

TEST(LDIF_Util, Utf8TextIsConvertedCharacterByCharacter) {
    REQUIRE_UTF8();
    EXPECT_EQ(multibyte2wide(accented), wide_accented);
    EXPECT_EQ(wide2multibyte(wide_accented), accented);
    EXPECT_EQ(multibyte2wide("\xf0\x9f\x98\x80"), L"\U0001f600");
    EXPECT_EQ(wide2multibyte(L"\U0001f600"), "\xf0\x9f\x98\x80");
}

TEST(LDIF_Util, ConversionEndsAtTheFirstNul) {
    EXPECT_EQ(multibyte2wide("ab\0cd"s), L"ab");
    EXPECT_EQ(multibyte2wide("\0cd"s), L"");
    EXPECT_EQ(multibyte2wide("ab\0\xff"s), L"ab") << "what follows is not even looked at";
    EXPECT_EQ(wide2multibyte(std::wstring(L"ab\0cd", 5)), "ab");
    EXPECT_EQ(wide2multibyte(std::wstring(L"\0cd", 3)), "");
}

TEST(LDIF_Util, TextThatIsNotValidIsAnUnusableInput) {
    for (const char* text : bad_bytes) {
        expect_unusable(failure_of([&] { multibyte2wide(text); }), text);
    }
}

TEST(LDIF_Util, Utf8TextThatIsNotWellFormedIsAnUnusableInput) {
    REQUIRE_UTF8();
    for (const char* text :
         {"\xc3", "a\xc3", "\xc3(", "\xa9", "\xe3\x80", "\xc0\x80", "\xed\xa0\x80"}) {
        expect_unusable(failure_of([&] { multibyte2wide(text); }), text);
    }
}

TEST(LDIF_Util, Utf8TextIsAnUnusableInputInThePosixLocale) {
    if (cfg32::tests::locale_is_utf8()) {
        GTEST_SKIP() << "the locale's text is UTF-8";
    }
    expect_unusable(failure_of([] { multibyte2wide(accented); }), accented);
    EXPECT_EQ(summary(failure_of([] { wide2multibyte(wide_accented); })), "163/163 wcstombs()");
}

TEST(LDIF_Util, CharacterOutsideTheCharacterSetCannotBePrinted) {
    for (const std::wstring& text : {std::wstring(1, static_cast<wchar_t>(0xdc80)),
                                     L"ab" + std::wstring(1, static_cast<wchar_t>(0xd800))}) {
        const LDIF_Exception e = failure_of([&] { wide2multibyte(text); });
        EXPECT_EQ(summary(e), "163/163 wcstombs()");
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Util");
        EXPECT_GT(e.srcLine, 0);
        EXPECT_EQ(e.value, "");
    }
}

TEST(LDIF_Util, EveryHelperThatConvertsPassesTheFailureOn) {
    for (const char* bad : bad_bytes) {
        std::string text = bad;
        char out = '?';
        expect_unusable(failure_of([&] { isBlank(text); }), bad);
        expect_unusable(failure_of([&] { stripLeading(text); }), bad);
        expect_unusable(failure_of([&] { stripTrailing(text); }), bad);
        expect_unusable(failure_of([&] { hex2byte(text, out); }), bad);
        EXPECT_EQ(text, bad) << "the text is left as it was";
        EXPECT_EQ(out, '?');
    }
    std::string hex = "41\xff";
    char out = '?';
    expect_unusable(failure_of([&] { hex2byte(hex, out); }), "41\xff");
}

// The rest is not of the fixed names.

TEST(LDIF_Util, PlainIsAsciiWithoutNul) {
    EXPECT_TRUE(cfg32::is_plain(""));
    EXPECT_TRUE(cfg32::is_plain("\x01 ~\x7f"));
    EXPECT_FALSE(cfg32::is_plain("a\0b"s));
    EXPECT_FALSE(cfg32::is_plain("\x80"));
    EXPECT_FALSE(cfg32::is_plain(std::string(100, 'a') + "\xff" + std::string(100, 'a')));
    for (int c = 0; c < 256; ++c) {
        const bool ascii = c >= 1 && c <= 127;
        EXPECT_EQ(cfg32::is_plain(std::string(1, static_cast<char>(c))), ascii) << c;
        EXPECT_EQ(cfg32::is_ascii(static_cast<wchar_t>(c)), ascii) << c;
        EXPECT_EQ(cfg32::is_ascii(static_cast<char>(c)), ascii) << c;
    }
}

TEST(LDIF_Util, AsciiWhitespaceIsThatOfTheLocale) {
    for (int c = 1; c < 128; ++c) {
        EXPECT_EQ(cfg32::is_ascii_space(static_cast<char>(c)), isspace(c) != 0) << c;
        EXPECT_EQ(cfg32::is_ascii_space(static_cast<char>(c)),
                  w_my_isspace(static_cast<unsigned int>(c)))
            << c;
    }
}

TEST(LDIF_Util, ViewsWithoutSpaceArePartsOfTheText) {
    const std::string_view text = " \ta b\r ";
    EXPECT_EQ(cfg32::without_leading_space(text), "a b\r ");
    EXPECT_EQ(cfg32::without_leading_space(text).data(), text.data() + 2);
    EXPECT_EQ(cfg32::without_trailing_space(text), " \ta b");
    EXPECT_EQ(cfg32::without_trailing_space(text).data(), text.data());
    EXPECT_EQ(cfg32::without_leading_space("  "), "");
    EXPECT_EQ(cfg32::without_trailing_space("  "), "");
    EXPECT_EQ(cfg32::without_leading_space(""), "");
    EXPECT_EQ(cfg32::without_trailing_space(""), "");
}

TEST(LDIF_Util, ViewsWithoutSpaceTakeWholeCharacters) {
    REQUIRE_UTF8();
    const std::string_view text = WIDE_SPACE "\xc3\xa9 " WIDE_SPACE;
    EXPECT_EQ(cfg32::without_leading_space(text), "\xc3\xa9 " WIDE_SPACE);
    EXPECT_EQ(cfg32::without_trailing_space(text), WIDE_SPACE "\xc3\xa9");
    EXPECT_EQ(cfg32::without_leading_space(WIDE_SPACE), "");
    EXPECT_EQ(cfg32::without_trailing_space(WIDE_SPACE), "");
}

TEST(LDIF_Util, FirstCharacterIsAWholeOneOrASingleByte) {
    const auto expect = [](std::string_view text, size_t length, wchar_t code, bool is_valid) {
        const cfg32::character first = cfg32::first_character(text);
        EXPECT_EQ(first.bytes, text.substr(0, length));
        EXPECT_EQ(first.bytes.data(), text.data());
        EXPECT_EQ(first.is_valid, is_valid);
        if (is_valid) {
            EXPECT_EQ(first.code, code);
        }
    };
    expect("ab", 1, L'a', true);
    expect("\xff?", 1, 0, false);
    expect("\xff", 1, 0, false);
    if (cfg32::tests::locale_is_utf8()) {
        expect("\xc3\xa9z", 2, L'\u00e9', true);
        expect("\xc3", 1, 0, false);
        expect("\xe3\x80", 1, 0, false);
        expect("\xc3z", 1, 0, false);
    }
}

TEST(LDIF_Util, HashDoesNotSeeCase) {
    EXPECT_EQ(cfg32::hash_without_case("cn=Configuration"),
              cfg32::hash_without_case("CN=CONFIGURATION"));
    EXPECT_NE(cfg32::hash_without_case("ab"), cfg32::hash_without_case("ba"));
    EXPECT_EQ(cfg32::hash_without_case("B", cfg32::hash_without_case("a")),
              cfg32::hash_without_case("Ab"));
}

// Else all names of one length would have one hash where no name is ASCII.
TEST(LDIF_Util, NamesBeyondAsciiHaveHashesOfTheirOwn) {
    REQUIRE_UTF8();
    EXPECT_NE(cfg32::hash_without_case("名前"), cfg32::hash_without_case("場所"));
    EXPECT_NE(cfg32::hash_without_case("ä"), cfg32::hash_without_case("ö"));
}

TEST(LDIF_Util, HashesOfAFileAreNotThoseOfWhoWroteIt) {
    constexpr size_t start_of_fnv_1a = 0xcbf29ce484222325;
    EXPECT_NE(cfg32::hash_seed, start_of_fnv_1a);
    EXPECT_NE(cfg32::hash_seed, 0u);
    EXPECT_EQ(cfg32::hash_of_text("cn=A"), cfg32::hash_of_text("cn=A"));
    EXPECT_NE(cfg32::hash_of_text("cn=A"), cfg32::hash_of_text("cn=a"));
}

TEST(LDIF_Util, MixedHashesDifferInTheirLowestBits) {
    std::set<size_t> lowest;
    for (size_t i = 0; i < 1000; ++i) {
        lowest.insert(cfg32::mixed_hash()(i << 32) & 0xffff);
        lowest.insert(cfg32::mixed_hash()(i * 0x10001) & 0xffff);
    }
    EXPECT_GT(lowest.size(), 1500u);
}

TEST(LDIF_Util, HexDigitHasItsValue) {
    std::set<int> found;
    for (wchar_t c = 0; c < 256; ++c) {
        const size_t pos = c < 128 ? hexChar.find(static_cast<char>(c)) : std::string::npos;
        if (pos == std::string::npos) {
            EXPECT_EQ(cfg32::hex_digit(c), -1) << static_cast<int>(c);
        } else {
            EXPECT_EQ(cfg32::hex_digit(c), static_cast<int>(pos < 16 ? pos : pos - 6));
            found.insert(cfg32::hex_digit(c));
        }
    }
    EXPECT_EQ(found.size(), 16u);
}

}  // namespace

TEST(LDIF_Util, TextsAreComparedUpToTheirNul) {
    using namespace std::string_view_literals;
    EXPECT_EQ(cfg32::compare_without_case("a\0b"sv, "A\0"sv), 0);
    EXPECT_EQ(cfg32::compare_without_case("a\0"sv, "A\0b"sv), 0);
    EXPECT_EQ(cfg32::compare_without_case("a\0b"sv, "A"sv), 0);
    EXPECT_EQ(cfg32::compare_without_case("ab\0"sv, "A"sv), 1);
    EXPECT_EQ(cfg32::compare_without_case("a"sv, "Ab\0"sv), -1);
}
