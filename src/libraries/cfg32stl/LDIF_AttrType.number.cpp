// The syntaxes of numbers: int, kilo, mask.

#include <cstring>
#include <limits>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Util.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"

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
    const char* format;
};

constexpr integer_family int_family{214748364, 2147483647, 2147483648, "%ld"};
constexpr uint64_t kilo_limit = 18014398509481982;
// KEPT: a negative kilo would print as the unsigned number with the same bits.
constexpr integer_family kilo_family{kilo_limit, kilo_limit, kilo_limit, "%lu"};

void set_number(LDIF_Value& value, int64_t number, const char* format) {
    char text[24];
    nuv_snprintf(text, sizeof text, format, number);
    value.text = text;
    value.set_binary(&number, sizeof number);
}

int64_t number_of(const LDIF_Value& value, const throw_site& site = {}) {
    int64_t number = 0;
    if (!value.binary || value.binaryLength != sizeof number) {
        refuse(not_comparable, value, value.text, site);
    }
    memcpy(&number, value.binary.get(), sizeof number);
    return number;
}

/// Digits with an optional sign, whitespace around them.
int64_t parse_integer(const LDIF_Value& value, const std::string& text,
                      const integer_family& family) {
    std::string digits = text;
    stripLeading(stripTrailing(digits));
    const bool is_negative = digits.starts_with('-');
    if (is_negative || digits.starts_with('+')) {
        digits.erase(0, 1);
    }
    if (digits.empty() || digits.find_first_not_of(DIGIT) != std::string::npos) {
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

void number_from_str(LDIF_Value& value, const std::string& text, const integer_family& family) {
    const int64_t number = parse_integer(value, text, family);
    const _AttrType* type = value.attrType;
    const bool is_bounded = type && (type->minimum != 0 || type->maximum != 0);
    if (is_bounded && (number < type->minimum || number > type->maximum)) {
        refuse(out_of_range, value, text);
    }
    set_number(value, number, family.format);
}

void require_bitmask(const LDIF_Value& value, const std::string& text,
                     const throw_site& site = {}) {
    if (!value.attrType || value.attrType->bitmask == 0) {
        refuse(no_bitmask, value, text, site);
    }
}

void check_bits(const LDIF_Value& value, const std::string& text, const throw_site& site = {}) {
    if ((number_of(value) & ~value.attrType->bitmask) != 0) {
        refuse(bits_outside_mask, value, text, site);
    }
}

}  // namespace

size_t cfg32::intHash(const LDIF_Value& value) { return static_cast<size_t>(number_of(value)); }

// KEPT: the sign is that of right minus left, the reverse of every other syntax.
int intCompare(const LDIF_Value& left, const LDIF_Value& right) {
    const int64_t l = number_of(left);
    const int64_t r = number_of(right);
    return static_cast<int>(r > l) - static_cast<int>(r < l);
}

void intFromStr(LDIF_Value& value, const std::string& text) {
    number_from_str(value, text, int_family);
}

void intFromBin(LDIF_Value& value, const char* bytes, int) {
    int64_t number = 0;
    if (bytes) {
        memcpy(&number, bytes, sizeof number);
    }
    set_number(value, number, int_family.format);
    // KEPT: the bounds hold here also when both are 0.
    const _AttrType* type = value.attrType;
    if (type && (number < type->minimum || number > type->maximum)) {
        refuse(out_of_range, value, value.text);
    }
}

void kiloFromStr(LDIF_Value& value, const std::string& text) {
    number_from_str(value, text, kilo_family);
}

void maskFromStr(LDIF_Value& value, const std::string& text) {
    require_bitmask(value, text);
    intFromStr(value, text);
    check_bits(value, text);
}

void maskFromBin(LDIF_Value& value, const char* bytes, int length) {
    require_bitmask(value, "<binary>");
    intFromBin(value, bytes, length);
    check_bits(value, value.text);
}
