#include "LDIF_Util.h"

#include <strings.h>
#include <sys/auxv.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <cwchar>
#include <cwctype>

#include "failure.h"

const std::string ALPHA = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz";
const std::string DIGIT = "0123456789";
const std::string hexChar = DIGIT + "ABCDEFabcdef";
const std::string keyChar = ALPHA + DIGIT + "-";
const std::string oidChar = DIGIT + ".";
const std::string special = ",=+<>#;\\\"";

namespace cfg32 {
const character_set letters(ALPHA);
const character_set digits(DIGIT);
const character_set hex_digits(hexChar);
const character_set key_characters(keyChar);
const character_set oid_characters(oidChar);
const character_set special_characters(special);
}  // namespace cfg32

const char* const empty_str = "";

using namespace cfg32;

namespace {

constexpr failure not_multibyte{162, 162, "mbstowcs( "};
constexpr failure not_representable{163, 163, "wcstombs()"};

constexpr auto invalid = static_cast<size_t>(-1);

template <class Text>
size_t leading_spaces(const Text& text) {
    size_t count = 0;
    while (count < text.size() && is_space(text[count])) {
        ++count;
    }
    return count;
}

template <class Text>
size_t length_without_trailing_spaces(const Text& text) {
    size_t length = text.size();
    while (length > 0 && is_space(text[length - 1])) {
        --length;
    }
    return length;
}

}  // namespace

bool w_my_isspace(unsigned int wc) { return iswspace(wc) != 0; }

bool w_isBlank(const std::wstring& text) { return leading_spaces(text) == text.size(); }

bool isBlank(const std::string& text) {
    return is_plain(text) ? leading_spaces(text) == text.size() : w_isBlank(multibyte2wide(text));
}

std::wstring& w_stripLeading(std::wstring& text) { return text.erase(0, leading_spaces(text)); }

std::wstring& w_stripTrailing(std::wstring& text) {
    return text.erase(length_without_trailing_spaces(text));
}

std::string& stripLeading(std::string& text) {
    if (is_plain(text)) {
        return text.erase(0, leading_spaces(text));
    }
    std::wstring wide = multibyte2wide(text);
    return text = wide2multibyte(w_stripLeading(wide));
}

std::string& stripTrailing(std::string& text) {
    if (is_plain(text)) {
        return text.erase(length_without_trailing_spaces(text));
    }
    std::wstring wide = multibyte2wide(text);
    return text = wide2multibyte(w_stripTrailing(wide));
}

void w_stripCarriageReturn(std::wstring& text) { std::erase(text, L'\r'); }

bool w_hex2byte(std::wstring& text, char& out) {
    if (text.size() < 2 || hex_digit(text[0]) < 0 || hex_digit(text[1]) < 0) {
        return false;
    }
    out = static_cast<char>(16 * hex_digit(text[0]) + hex_digit(text[1]));
    text.erase(0, 2);
    return true;
}

bool hex2byte(std::string& text, char& out) {
    std::wstring wide = multibyte2wide(text);
    if (!w_hex2byte(wide, out)) {
        return false;
    }
    text = wide2multibyte(wide);
    return true;
}

std::string& byte2hex(unsigned int b, std::string& out) {
    const auto digit = [](unsigned int nibble) {
        return static_cast<char>(nibble < 10 ? '0' + nibble : 'A' + nibble - 10);
    };
    out += digit(b >> 4 & 0xF);
    out += digit(b & 0xF);
    return out;
}

std::wstring multibyte2wide(const std::string& text) {
    const size_t length = mbstowcs(nullptr, text.c_str(), 0);
    if (length == 0) {
        return {};
    }
    std::wstring wide(length == invalid ? 0 : length, L'\0');
    if (length == invalid || mbstowcs(wide.data(), text.c_str(), length + 1) != length) {
        raise_with(not_multibyte, text + " )", [&](LDIF_Exception& e) { e.value = text; });
    }
    return wide;
}

std::string wide2multibyte(const std::wstring& text) {
    const size_t length = wcstombs(nullptr, text.c_str(), 0);
    if (length == 0) {
        return {};
    }
    std::string narrow(length == invalid ? 0 : length, '\0');
    if (length == invalid || wcstombs(narrow.data(), text.c_str(), length + 1) != length) {
        raise(not_representable);
    }
    return narrow;
}

namespace cfg32 {

bool is_plain(std::string_view text) {
    // No early exit: a loop without one is done many bytes at a time.
    unsigned char all = 0;
    for (const char c : text) {
        all |= static_cast<unsigned char>(c);
    }
    return all < 0x80 && text.find('\0') == std::string_view::npos;
}

std::string_view without_leading_space(std::string_view text) {
    // Most texts begin with an ASCII character that tells at once.
    if (!text.empty() && is_ascii(text.front()) && !is_ascii_space(text.front())) {
        return text;
    }
    if (is_plain(text)) {
        return text.substr(leading_spaces(text));
    }
    std::string copy(text);
    return text.substr(text.size() - stripLeading(copy).size());
}

std::string_view without_trailing_space(std::string_view text) {
    if (is_plain(text)) {
        return text.substr(0, length_without_trailing_spaces(text));
    }
    std::string copy(text);
    return text.substr(0, stripTrailing(copy).size());
}

character first_character(std::string_view text) {
    if (text.front() >= '\0') {
        return {text.substr(0, 1), static_cast<wchar_t>(text.front()), true};
    }
    wchar_t code = L'\0';
    mbstate_t state{};
    const size_t length = mbrtowc(&code, text.data(), text.size(), &state);
    const bool is_valid = length >= 1 && length <= text.size();
    return {text.substr(0, is_valid ? length : 1), code, is_valid};
}

int compare_without_case(std::string_view left, std::string_view right) {
    const size_t common = std::min(left.size(), right.size());
    const int order = common == 0 ? 0 : strncasecmp(left.data(), right.data(), common);
    if (order != 0 || left.size() == right.size()) {
        return order;
    }
    const std::string_view longer = left.size() > common ? left : right;
    const size_t end = longer.find('\0');
    if (end <= common) {
        return 0;
    }
    return left.size() > common ? 1 : -1;
}

namespace {

using byte_classes = std::array<unsigned char, 256>;

/// For each byte one of those that strcasecmp() takes for equal in some locale of the kind. Hashes
/// are kept while the process may change its locale: they must fit the equality of each. Turkish
/// has an I with and one without a dot, and the character sets of one byte have letters beyond
/// ASCII.
constexpr auto classes_of = [](hash_kind kind) {
    constexpr unsigned char any_letter = 0x80;
    byte_classes classes{};
    for (size_t c = 0; c < 256; ++c) {
        const bool is_upper = c >= 'A' && c <= 'Z';
        const size_t lower = is_upper ? c - 'A' + 'a' : c;
        const bool may_be_any = kind == hash_kind::of_every_byte && (lower == 'i' || c > 0x7f);
        classes[c] = may_be_any ? any_letter : static_cast<unsigned char>(lower);
    }
    return classes;
};

constexpr size_t hash_factor = 0x100000001b3;  // of FNV-1a

constexpr byte_classes classes_by_kind[] = {classes_of(hash_kind::of_ascii_letters),
                                            classes_of(hash_kind::of_every_byte)};

}  // namespace

hash_kind present_hash_kind() {
    return MB_CUR_MAX > 1 ? hash_kind::of_ascii_letters : hash_kind::of_every_byte;
}

namespace {

/// The system gives each process some random bytes (getauxval(3), AT_RANDOM).
size_t random_start() {
    size_t start = 0xcbf29ce484222325;
    // NOLINTNEXTLINE(performance-no-int-to-ptr): getauxval() returns pointers, too, as numbers
    if (const auto* bytes = reinterpret_cast<const void*>(getauxval(AT_RANDOM))) {
        memcpy(&start, bytes, sizeof start);
    }
    return start * hash_factor + 1;
}

}  // namespace

const size_t hash_seed = random_start();

size_t hash_of_text(std::string_view text) {
    size_t hash = hash_seed;
    for (const char c : text) {
        hash = (hash ^ static_cast<unsigned char>(c)) * hash_factor;
    }
    return hash;
}

size_t hash_without_case(std::string_view text, size_t seed, hash_kind kind) {
    const byte_classes& classes = classes_by_kind[static_cast<size_t>(kind)];
    for (const char c : text) {
        if (c == '\0') {
            break;
        }
        seed = (seed ^ classes[static_cast<unsigned char>(c)]) * hash_factor;
    }
    return seed;
}

int hex_digit(wchar_t c) {
    if (c >= L'0' && c <= L'9') {
        return c - L'0';
    }
    if (c >= L'A' && c <= L'F') {
        return c - L'A' + 10;
    }
    return c >= L'a' && c <= L'f' ? c - L'a' + 10 : -1;
}

}  // namespace cfg32
