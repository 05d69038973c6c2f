// The syntaxes of texts: ces, cis, enum, time.

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Util.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"

using namespace cfg32;

namespace {

constexpr failure bad_length{21, 1018, ""};
constexpr failure not_a_word{21, 1017, "value not one of attrType.enumValues"};
constexpr failure not_a_time{21, 1017, "value for time not valid"};
// KEPT: the time syntax reports a missing type in the words of enum.
constexpr failure words_undefined{80, 1000, "Enumerated values undefined"};
constexpr failure no_binary{92, 1008, "Binary representation undefined for syntax: "};
constexpr failure no_string{92, 1009, "String representation undefined for syntax: "};

length_bounds bounds_of(const _AttrType& type) {
    const long lower = std::max<long>(type.minimum, 0);
    return {lower, type.maximum >= lower ? type.maximum : 0};
}

int compare_texts_without_case(std::string_view left, std::string_view right) {
    if (left.empty() || right.empty()) {
        return static_cast<int>(right.empty()) - static_cast<int>(left.empty());
    }
    return compare_without_case(left, right);
}

/// A two-digit field of a time: -1 when it is no number. KEPT: read as atoi does, so that "1x" is
/// 1 while "0x" is refused.
int time_field(std::string_view text, size_t position) {
    const std::string field(text.substr(position, 2));
    if (field == "00") {
        return 0;
    }
    const long number = strtol(field.c_str(), nullptr, 10);
    return number == 0 ? -1 : static_cast<int>(number);
}

bool is_time_of_day(std::string_view text) {
    if (text.size() != 7 || (text[0] != 'T' && text[0] != 't')) {
        return false;
    }
    const int hour = time_field(text, 1);
    const int minute = time_field(text, 3);
    const int second = time_field(text, 5);
    return hour >= 0 && hour <= 23 && minute >= 0 && minute <= 59 && second >= 0 && second <= 59;
}

[[noreturn]] void not_implemented(const failure& kind, const throw_site& site, const char* family,
                                  const _AttrType* type, std::string_view value) {
    const auto details = [&](LDIF_Exception& e) {
        e.attrType = type;
        e.value = value;
    };
    raise_with(kind, family, details, site);
}

}  // namespace

namespace cfg32 {

void refuse(const failure& kind, const LDIF_Value& value, std::string_view text,
            const throw_site& site) {
    refuse_with_message(kind, kind.text, value, text, site);
}

void refuse_with_message(const failure& kind, const char* message, const LDIF_Value& value,
                         std::string_view text, const throw_site& site) {
    not_implemented({kind.ldap, kind.ext, message}, site, "", value.attrType, text);
}

const match_support ces_match{
    [](std::string_view left, std::string_view right) { return left == right; },
    [](const LDIF_Value& value, hash_kind) { return hash_of_text(value.shown()); }, nullptr};

const match_support cis_match{[](std::string_view left, std::string_view right) {
                                  return left.empty() == right.empty() &&
                                         equal_without_case(left, right);
                              },
                              [](const LDIF_Value& value, hash_kind kind) {
                                  return hash_without_case(value.shown(), hash_seed, kind);
                              },
                              nullptr};

}  // namespace cfg32

void BinarySyntaxNotImplemented(const throw_site& site, const char* family, const _AttrType* type,
                                const std::string& value) {
    not_implemented(no_binary, site, family, type, value);
}

void StringSyntaxNotImplemented(const throw_site& site, const char* family, const _AttrType* type,
                                const std::string& value) {
    not_implemented(no_string, site, family, type, value);
}

int cesCompare(const LDIF_Value& left, const LDIF_Value& right) {
    return left.shown().compare(right.shown());
}

void cesFromStr(LDIF_Value& value, const given_text& text) {
    if (const _AttrType* type = value.attrType) {
        const length_bounds bounds = bounds_of(*type);
        if (!bounds.allow(text.size())) {
            char message[80];
            nuv_snprintf(message, sizeof message, "%s%slength must be %ld to %ld characters",
                         type->name ? type->name : "", type->name ? " " : "", bounds.lower,
                         bounds.upper);
            refuse_with_message(bad_length, message, value, text);
        }
    }
    value.text = text;
}

void cesFromBin(LDIF_Value& value, const char* bytes, int length) {
    if (length >= 1 && bytes) {
        BinarySyntaxNotImplemented({}, "ces", value.attrType, "<binary>");
    }
}

std::string cesToStr(const LDIF_Value& value) { return value.text.str(); }

const char* cesToBin(const LDIF_Value& value, int& length) {
    length = value.binaryLength;
    if (!value.binary) {
        BinarySyntaxNotImplemented({}, "ces", value.attrType, value.text.str());
    }
    return value.binary.get();
}

int cisCompare(const LDIF_Value& left, const LDIF_Value& right) {
    return compare_texts_without_case(left.shown(), right.shown());
}

void enumFromStr(LDIF_Value& value, const given_text& text) {
    const _AttrType* type = value.attrType;
    if (!type || !type->enumValues) {
        refuse(words_undefined, value, text);
    }
    cisFromStr(value, text);
    const std::string_view word = value.text;
    // A configuration that names the masking scheme can be read when no key is at hand.
    if (!value.key && type->name && equal_without_case(type->name, "oru-slapdPwEncryption") &&
        equal_without_case(word, "imask")) {
        return;
    }
    for (const char* const* allowed = type->enumValues; *allowed; ++allowed) {
        if (equal_without_case(*allowed, word)) {
            return;
        }
    }
    refuse(not_a_word, value, text);
}

void timeFromStr(LDIF_Value& value, const given_text& text) {
    if (!value.attrType) {
        refuse(words_undefined, value, text);
    }
    cisFromStr(value, text);
    if (!is_time_of_day(value.text)) {
        refuse(not_a_time, value, text);
    }
}
