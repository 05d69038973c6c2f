// The syntaxes of numbers: int, kilo, mask.

#include <algorithm>
#include <charconv>
#include <cstring>
#include <iterator>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Util.h"
#include "LDIF_Value.h"

using namespace cfg32;

namespace {

constexpr failure not_an_integer{21, 1016, "Value is not valid integer syntax"};
constexpr failure out_of_range{21, 1015, "Integer value out of range"};
constexpr failure not_comparable{18, 1000, "integer compare on non-integer value"};
constexpr failure no_bitmask{80, 1000, "Bitmask undefined"};
constexpr failure bits_outside_mask{21, 1019, "Bits in value are not within bitmask constraint"};

/// What a family of integers can hold, and how it prints a number.
struct integer_family {
    uint64_t before_last_digit;  ///< limit for the digits up to the one before
    uint64_t positive;           ///< limit of the magnitude
    uint64_t negative;
    bool is_unsigned;  ///< in print
};

constexpr integer_family int_family{214748364, 2147483647, 2147483648, false};
constexpr uint64_t kilo_limit = 18014398509481982;
constexpr integer_family kilo_family{kilo_limit, kilo_limit, kilo_limit, true};

/// True for a text that is a number as it is printed: without sign, leading zeros and whitespace.
bool is_normalised(std::string_view text) {
    return text.front() >= '1' && text.front() <= '9' && text.back() >= '0' && text.back() <= '9';
}

/// Sets the number and its text; given is what it was read from, if it was.
void set_number(LDIF_Value& value, int64_t number, const integer_family& family,
                const given_text& given) {
    value.set_binary(&number, sizeof number);
    if (!given.empty() && is_normalised(given)) {
        value.text = given;
        return;
    }
    char buffer[24];
    // KEPT: a negative kilo prints as the unsigned number with the same bits.
    const auto end = family.is_unsigned
                         ? std::to_chars(buffer, std::end(buffer), static_cast<uint64_t>(number))
                         : std::to_chars(buffer, std::end(buffer), number);
    const std::string_view normalised(buffer, static_cast<size_t>(end.ptr - buffer));
    value.text = normalised == given.view() ? given : given_text(normalised);
}

int64_t number_of(const LDIF_Value& value, const throw_site& site = {}) {
    int64_t number = 0;
    if (!value.binary || value.binaryLength != sizeof number) {
        refuse(not_comparable, value, value.text, site);
    }
    memcpy(&number, value.binary.get(), sizeof number);
    return number;
}

/// Digits with an optional sign; text is what they stand in.
int64_t parse_digits(std::string_view digits, const LDIF_Value& value, std::string_view text,
                     const integer_family& family) {
    const bool is_negative = digits.starts_with('-');
    if (is_negative || digits.starts_with('+')) {
        digits.remove_prefix(1);
    }
    const auto is_digit = [](char c) { return c >= '0' && c <= '9'; };
    if (digits.empty() || !std::ranges::all_of(digits, is_digit)) {
        refuse(not_an_integer, value, text);
    }
    uint64_t magnitude = 0;
    for (const char digit : digits) {
        if (magnitude > family.before_last_digit) {
            refuse(out_of_range, value, text);
        }
        magnitude = 10 * magnitude + static_cast<uint64_t>(digit - '0');
    }
    if (magnitude > (is_negative ? family.negative : family.positive)) {
        refuse(out_of_range, value, text);
    }
    return is_negative ? -static_cast<int64_t>(magnitude) : static_cast<int64_t>(magnitude);
}

/// The same with whitespace around them.
int64_t parse_integer(const LDIF_Value& value, std::string_view text,
                      const integer_family& family) {
    if (is_plain(text)) {
        return parse_digits(without_leading_ascii_space(without_trailing_ascii_space(text)), value,
                            text, family);
    }
    std::string digits(text);
    return parse_digits(stripLeading(stripTrailing(digits)), value, text, family);
}

void number_from_str(LDIF_Value& value, const given_text& text, const integer_family& family) {
    const int64_t number = parse_integer(value, text, family);
    const _AttrType* type = value.attrType;
    const bool is_bounded = type && (type->minimum != 0 || type->maximum != 0);
    if (is_bounded && (number < type->minimum || number > type->maximum)) {
        refuse(out_of_range, value, text);
    }
    set_number(value, number, family, text);
}

void require_bitmask(const LDIF_Value& value, std::string_view text, const throw_site& site = {}) {
    if (!value.attrType || value.attrType->bitmask == 0) {
        refuse(no_bitmask, value, text, site);
    }
}

void check_bits(const LDIF_Value& value, std::string_view text, const throw_site& site = {}) {
    if ((number_of(value) & ~value.attrType->bitmask) != 0) {
        refuse(bits_outside_mask, value, text, site);
    }
}

}  // namespace

namespace {

/// Reads the text, in which the number was printed, again.
void complete_number(LDIF_Value& value) {
    const std::string_view text = value.text;
    const bool is_negative = text.starts_with('-');
    uint64_t magnitude = 0;
    std::from_chars(text.data() + is_negative, text.data() + text.size(), magnitude);
    const uint64_t number = is_negative ? 0 - magnitude : magnitude;
    value.set_binary(&number, sizeof number);
}

}  // namespace

const match_support cfg32::int_match{
    [](std::string_view left, std::string_view right) { return left == right; },
    [](const LDIF_Value& value, hash_kind) { return static_cast<size_t>(number_of(value)); },
    complete_number};

// KEPT: the sign is that of right minus left, the reverse of every other syntax.
int intCompare(const LDIF_Value& left, const LDIF_Value& right) {
    const int64_t l = number_of(left);
    const int64_t r = number_of(right);
    return static_cast<int>(r > l) - static_cast<int>(r < l);
}

void intFromStr(LDIF_Value& value, const given_text& text) {
    number_from_str(value, text, int_family);
}

void intFromBin(LDIF_Value& value, const char* bytes, int) {
    int64_t number = 0;
    if (bytes) {
        memcpy(&number, bytes, sizeof number);
    }
    set_number(value, number, int_family, "");
    // KEPT: the bounds hold here also when both are 0.
    const _AttrType* type = value.attrType;
    if (type && (number < type->minimum || number > type->maximum)) {
        refuse(out_of_range, value, value.text);
    }
}

void kiloFromStr(LDIF_Value& value, const given_text& text) {
    number_from_str(value, text, kilo_family);
}

void maskFromStr(LDIF_Value& value, const given_text& text) {
    require_bitmask(value, text);
    intFromStr(value, text);
    check_bits(value, text);
}

void maskFromBin(LDIF_Value& value, const char* bytes, int length) {
    require_bitmask(value, "<binary>");
    intFromBin(value, bytes, length);
    check_bits(value, value.text);
}
