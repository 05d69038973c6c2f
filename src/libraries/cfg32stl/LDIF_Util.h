#pragma once

// Text helpers. Whitespace is judged on wide characters, so that multibyte text of the current
// locale is classified right; stored text is narrow. Text that is plain ASCII reads the same in
// every character set a locale can have here (POSIX, XBD 6.1), so it is never converted.

#include <array>
#include <string>
#include <string_view>

// Character classes of the DN grammar (RFC 1779; RFC 4514 is its successor).
extern const std::string ALPHA;
extern const std::string DIGIT;
extern const std::string hexChar;  ///< DIGIT, A to F, a to f
extern const std::string keyChar;  ///< letters, digits, "-"
extern const std::string oidChar;  ///< digits, "."
extern const std::string special;  ///< the nine characters that a plain DN value must escape

/// What the C interface returns where a value is absent but a string is expected.
extern const char* const empty_str;

/// The one whitespace test of the library.
bool w_my_isspace(unsigned int wc);

/// True when every character is whitespace, also for the empty string.
bool w_isBlank(const std::wstring& text);
bool isBlank(const std::string& text);

// These change their argument and return it.
std::wstring& w_stripLeading(std::wstring& text);
std::wstring& w_stripTrailing(std::wstring& text);
std::string& stripLeading(std::string& text);
std::string& stripTrailing(std::string& text);

/// Removes every carriage return, not only the one before a line's end.
void w_stripCarriageReturn(std::wstring& text);

/// Takes two hexadecimal digits from the front of text into out. False, with text unchanged, when
/// it does not begin with two.
bool w_hex2byte(std::wstring& text, char& out);
bool hex2byte(std::string& text, char& out);

/// Appends two upper-case hexadecimal digits for the byte b; returns out.
std::string& byte2hex(unsigned int b, std::string& out);

/// Converts text of the locale's character set, up to its first NUL. Throws LDIF_Exception 162/162
/// (with the text as its value) when it is not valid there.
std::wstring multibyte2wide(const std::string& text);

/// Converts back, up to the first NUL. Throws LDIF_Exception 163/163 for a character that the
/// locale's character set does not have.
std::string wide2multibyte(const std::wstring& text);

namespace cfg32 {

/// True when text is ASCII without NUL: converting it would change nothing.
bool is_plain(std::string_view text);

/// True for the ASCII characters but NUL.
template <class Char>
constexpr bool is_ascii(Char c) {
    return static_cast<unsigned long>(c) - 1 < 0x7f;
}

/// A set of ASCII characters, in which one is found at once.
class character_set {
  public:
    explicit character_set(std::string_view characters) {
        for (const char c : characters) {
            has_[static_cast<unsigned char>(c)] = true;
        }
    }

    template <class Char>
    bool has(Char c) const {
        return is_ascii(c) && has_[static_cast<unsigned char>(c)];
    }

  private:
    std::array<bool, 128> has_{};
};

// The character classes as sets.
extern const character_set letters;
extern const character_set digits;
extern const character_set hex_digits;
extern const character_set key_characters;
extern const character_set oid_characters;
extern const character_set special_characters;

/// Whitespace test for ASCII characters.
constexpr bool is_ascii_space(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

/// The text without the whitespace at its front, or at its end, as a part of it.
std::string_view without_leading_space(std::string_view text);
std::string_view without_trailing_space(std::string_view text);

/// The same of text of which it is known that it is plain.
inline std::string_view without_leading_ascii_space(std::string_view text) {
    while (!text.empty() && is_ascii_space(text.front())) {
        text.remove_prefix(1);
    }
    return text;
}
inline std::string_view without_trailing_ascii_space(std::string_view text) {
    while (!text.empty() && is_ascii_space(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

/// The first character of a text in the locale's character set.
struct character {
    std::string_view bytes;  ///< never empty; a byte that begins no valid character stands alone
    wchar_t code;
    bool is_valid;
};

/// text must not be empty.
character first_character(std::string_view text);

/// strcasecmp of two texts: each ends at its first NUL, if it has one.
int compare_without_case(std::string_view left, std::string_view right);

/// False for ASCII characters that are not equal without regard to case.
inline bool may_be_equal_without_case(char left, char right) {
    constexpr int case_bit = 0x20;
    return !is_ascii(left) || !is_ascii(right) || ((left ^ right) & ~case_bit) == 0;
}

/// True when that comparison gives 0. Most texts that are not equal differ in their first letters.
inline bool equal_without_case(std::string_view left, std::string_view right) {
    return (left.empty() || right.empty() ||
            may_be_equal_without_case(left.front(), right.front())) &&
           compare_without_case(left, right) == 0;
}

/// What the locale of the moment leaves of a text in its hash. In a character set of several bytes
/// only ASCII letters have a case that strcasecmp() sees; in one of single bytes any byte beyond
/// ASCII may be a letter.
enum class hash_kind { of_ascii_letters, of_every_byte };
hash_kind present_hash_kind();

/// Where hashes begin, in each process somewhere else: nobody shall write a file of names that have
/// one hash.
extern const size_t hash_seed;

/// A hash that is the same for texts that are equal without regard to case in whichever locale of
/// that kind; seed continues another hash. Hashes that are kept are all made of one kind: another
/// thread may change the locale between two of them.
size_t hash_without_case(std::string_view text, size_t seed = hash_seed,
                         hash_kind kind = present_hash_kind());

/// A hash of a text as it stands.
size_t hash_of_text(std::string_view text);

/// Makes all of a hash count in its lowest bits, by which tables find a place.
struct mixed_hash {
    size_t operator()(size_t hash) const {
        hash = (hash ^ hash_seed ^ (hash >> 32)) * 0x9e3779b97f4a7c15;
        return hash ^ (hash >> 32);
    }
};

/// The value of a hexadecimal digit, or -1.
int hex_digit(wchar_t c);

// A text of either width as the grammars need it: the same algorithm reads plain ASCII as it is
// and everything else in its wide form.
inline bool is_space(char c) { return is_ascii_space(c); }
inline bool is_space(wchar_t c) { return w_my_isspace(static_cast<unsigned int>(c)); }
inline std::string narrowed(std::string_view text) { return std::string(text); }
inline std::string narrowed(std::wstring_view text) { return wide2multibyte(std::wstring(text)); }

}  // namespace cfg32
