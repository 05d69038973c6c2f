// What the attribute table says, in words.

#include "schema/attribute_words.h"

#include <fmt/format.h>
#include <fmt/ranges.h>

#include <algorithm>
#include <limits>
#include <span>

#include "LDIF_AttrType.h"

namespace cfg32::tool {

namespace {

enum class kind { text, word, time, integer, large, mask, name, password };

/// A syntax. Bounds are told before the comma of its words; what follows "usually" is not enforced.
/// The example is for an attribute that has none of its own.
struct syntax {
    const char* name;
    from_str_operation* from_str;
    kind of;
    const char* words;
    const char* example;
};

// clang-format off
constexpr syntax syntaxes[] = {
    {"ces",    cesFromStr,    kind::text,     "text",                               "example"},
    {"cis",    cisFromStr,    kind::text,     "text, upper and lower case alike",   "example"},
    {"enum",   enumFromStr,   kind::word,     "one of a list of words",             ""},
    {"time",   timeFromStr,   kind::time,     "a time of day, Thhmmss",             "T023000"},
    {"int",    intFromStr,    kind::integer,  "an integer",                         "100"},
    {"kilo",   kiloFromStr,   kind::large,    "a large integer",                    "1024"},
    {"mask",   maskFromStr,   kind::mask,     "an integer made of permitted bits",  "12288"},
    {"oid",    oidFromStr,    kind::text,     "text, usually an object identifier", "1.3.6.1.4.1"},
    {"dn",     dnFromStr,     kind::name,     "a distinguished name",               "ou=people, dc=example, dc=com"},
    {"dc",     dcFromStr,     kind::text,     "text, usually a domain name",        "example.com"},
    {"url",    urlFromStr,    kind::text,     "text, usually a URL",                "ldap://ldap.example.com:389"},
    {"krbdn",  krbdnFromStr,  kind::text,     "text, usually a Kerberos DN",        "krbPrincipalName=admin@EXAMPLE.COM"},
    {"env",    envFromStr,    kind::text,     "text, usually NAME=value",           "TZ=Europe/Berlin"},
    {"pw",     pwFromStr,     kind::password, "a password",                         "correct horse battery staple"},
    {"path",   pathFromStr,   kind::text,     "text, usually a path",               "/srv/oruslapd"},
    {"file",   fileFromStr,   kind::text,     "text, usually a file name",          "/srv/oruslapd/schema.ldif"},
    {"plugin", pluginFromStr, kind::text,     "text, usually a plug-in directive",  "preoperation libunique.so uniqueInit"},
};
// clang-format on

constexpr int count_of_syntaxes = 0
#define SYNTAX(...) +1
#include "syntaxes.def"
#undef SYNTAX
    ;
static_assert(std::size(syntaxes) == count_of_syntaxes);

struct attribute_example {
    const char* name;
    const char* value;
};

constexpr attribute_example examples[] = {
#define EXAMPLE(name, value) {name, value},
#include "schema/attribute_examples.def"
#undef EXAMPLE
};

constexpr const char* names[] = {
#define ATTRIBUTE(name, ...) name,
#include "attributes.def"
#undef ATTRIBUTE
};

constexpr bool is_in_table(const char* name) {
    for (const char* known : names) {
        if (__builtin_strcmp(known, name) == 0) {
            return true;
        }
    }
    return false;
}

constexpr bool are_in_table() {
    for (const attribute_example& each : examples) {
        if (!is_in_table(each.name)) {
            return false;
        }
    }
    return true;
}

static_assert(are_in_table());

const syntax& syntax_of(const _AttrType& type) {
    const auto is_of_type = [&](const syntax& row) { return row.from_str == type.fromStr; };
    const auto found = std::find_if(std::begin(syntaxes), std::end(syntaxes), is_of_type);
    return found == std::end(syntaxes) ? syntaxes[0] : *found;
}

std::span<const char* const> words_of(const _AttrType& type) {
    const char* const* end = type.enumValues;
    while (end && *end) {
        ++end;
    }
    return {type.enumValues, end};
}

/// Bounds of a number that the row and its syntax allow together.
value_bounds number_bounds(const _AttrType& type, int64_t least, int64_t greatest) {
    if (type.minimum == 0 && type.maximum == 0) {
        return {bounded::number, least, greatest};
    }
    return {bounded::number, std::max(type.minimum, least), std::min(type.maximum, greatest)};
}

value_bounds length_bounds(int64_t minimum, int64_t maximum) {
    const int64_t least = std::max<int64_t>(minimum, 0);
    const int64_t greatest = maximum >= least ? maximum : 0;
    return {least == 0 && greatest == 0 ? bounded::nothing : bounded::length, least, greatest};
}

value_bounds password_bounds(const _AttrType& type) {
    constexpr int64_t longest = 1024;
    const int64_t least = type.minimum > 0 ? type.minimum : 1;
    return length_bounds(least, type.maximum >= least ? type.maximum : longest);
}

/// " from 1 to 65535", " of at most 4096 bytes", or nothing.
std::string in_words(const value_bounds& bounds) {
    if (bounds.what == bounded::nothing) {
        return "";
    }
    if (bounds.what == bounded::number) {
        return bounds.minimum == bounds.maximum
                   ? fmt::format(" that is {}", bounds.minimum)
                   : fmt::format(" from {} to {}", bounds.minimum, bounds.maximum);
    }
    if (bounds.maximum == 0) {
        return fmt::format(" of at least {} byte{}", bounds.minimum,
                           bounds.minimum == 1 ? "" : "s");
    }
    return bounds.minimum == 0 ? fmt::format(" of at most {} bytes", bounds.maximum)
                               : fmt::format(" of {} to {} bytes", bounds.minimum, bounds.maximum);
}

/// The syntax's words with the bounds before what is only usual.
std::string bounded_words(const _AttrType& type) {
    std::string words = syntax_of(type).words;
    return words.insert(std::min(words.find(','), words.size()), in_words(bounds_of(type)));
}

/// A text whose words are usual: the beginnings of URLs, or whole values.
std::string text_in_words(const _AttrType& type) {
    std::string words = bounded_words(type);
    if (words_of(type).empty()) {
        return words;
    }
    return type.fromStr == urlFromStr
               ? fmt::format("{} that begins with {}://", words,
                             fmt::join(words_of(type), ":// or "))
               : fmt::format("{}: {}", words, fmt::join(words_of(type), " or "));
}

std::string words_in_words(const _AttrType& type) {
    std::string words = fmt::format("one of: {}", fmt::join(words_of(type), ", "));
    const bool names_schemes = type.name && type.compare("oru-slapdPwEncryption") == 0;
    return names_schemes ? words + "; without a key also imask" : words;
}

std::string example_number(const _AttrType& type) {
    const value_bounds bounds = bounds_of(type);
    const int64_t usual = std::stoll(syntax_of(type).example);
    return std::to_string(std::clamp(usual, bounds.minimum, bounds.maximum));
}

std::string example_mask(const _AttrType& type) {
    const int64_t usual = std::stoll(syntax_of(type).example) & type.bitmask;
    return std::to_string(usual != 0 ? usual : type.bitmask);
}

std::string example_of_syntax(const _AttrType& type) {
    switch (syntax_of(type).of) {
        case kind::integer:
        case kind::large:
            return example_number(type);
        case kind::mask:
            return example_mask(type);
        case kind::word:
            return words_of(type).empty() ? "" : words_of(type).front();
        default:
            return syntax_of(type).example;
    }
}

}  // namespace

const _AttrType* find_attribute(std::string_view name) {
    const _AttrType* row = getAttrType(std::string(name).c_str());
    return row->name ? row : nullptr;
}

std::vector<const _AttrType*> all_attributes() {
    std::vector<const _AttrType*> rows;
    getAttrType(nullptr);  // the first look-up counts and sorts the rows
    for (int i = 0; i < numAttrs; ++i) {
        const _AttrType& row = attrMap[i];
        if (rows.empty() || row.compare(rows.back()->name) != 0) {
            rows.push_back(&row);
        }
    }
    return rows;
}

std::string_view syntax_name(const _AttrType& type) { return syntax_of(type).name; }

std::string_view syntax_in_words(const _AttrType& type) { return syntax_of(type).words; }

value_bounds bounds_of(const _AttrType& type) {
    constexpr int64_t greatest_kilo = 18014398509481982;
    switch (syntax_of(type).of) {
        case kind::integer:
            return number_bounds(type, std::numeric_limits<int32_t>::min(),
                                 std::numeric_limits<int32_t>::max());
        case kind::large:
            return number_bounds(type, -greatest_kilo, greatest_kilo);
        case kind::text:
            return length_bounds(type.minimum, type.maximum);
        case kind::password:
            return password_bounds(type);
        default:
            return {};
    }
}

bool enforces_words(const _AttrType& type) { return syntax_of(type).of == kind::word; }

std::string accepted_values(const _AttrType& type) {
    switch (syntax_of(type).of) {
        case kind::text:
            return text_in_words(type);
        case kind::word:
            return words_in_words(type);
        case kind::time:
            return "a time of day as Thhmmss, from T000000 to T235959";
        case kind::mask:
            return fmt::format("an integer made of the bits {:#x}, such as {}", type.bitmask,
                               example_mask(type));
        case kind::name:
            return fmt::format("a distinguished name{}",
                               type.minimum > 0 ? ", usually not an empty one" : "");
        case kind::password:
            return bounded_words(type) + ", or one that is encoded already";
        default:
            return bounded_words(type);
    }
}

std::string example_value(const _AttrType& type) {
    const auto is_of_type = [&](const attribute_example& each) {
        return type.name && type.compare(each.name) == 0;
    };
    const auto found = std::find_if(std::begin(examples), std::end(examples), is_of_type);
    return found == std::end(examples) ? example_of_syntax(type) : found->value;
}

}  // namespace cfg32::tool
