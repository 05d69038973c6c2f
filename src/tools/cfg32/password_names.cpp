// Names of passwords, and names that may be meant for one.

#include "password_names.h"

#include <algorithm>

#include "LDIF_AttrType.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

/// What names of passwords have in them; of those that begin alike the longest first.
constexpr std::string_view marks[] = {"password", "passwort", "passphrase", "passwd",
                                      "pass",     "pwd",      "pw",         "secret"};

}  // namespace

bool is_password_attribute(std::string_view name) {
    return getAttrType(std::string(name).c_str())->fromStr == pwFromStr;
}

std::string lower(std::string_view text) {
    std::string small(text);
    std::transform(small.begin(), small.end(), small.begin(), [](char c) { return lower(c); });
    return small;
}

std::optional<size_t> end_of_mark(std::string_view small) {
    size_t begin = std::string_view::npos;
    size_t end = 0;
    for (const std::string_view mark : marks) {
        const size_t found = small.find(mark);
        if (found < begin) {
            begin = found;
            end = found + mark.size();
        }
    }
    return begin == std::string_view::npos ? std::nullopt : std::optional(end);
}

const std::vector<std::string>& known_passwords() {
    static const std::vector<std::string> all = [] {
        constexpr std::string_view beginning = "oru-slapd";
        std::vector<std::string> names;
        for (const _AttrType* row : all_attributes()) {
            if (is_password_attribute(row->name)) {
                names.push_back(lower(row->name).substr(beginning.size()));
            }
        }
        return names;
    }();
    return all;
}

bool is_password_name(std::string_view name) {
    if (name.empty() || find_attribute(name)) {
        return is_password_attribute(name);
    }
    const std::vector<std::string_view> near = near_attributes(name);
    return end_of_mark(lower(name)) || std::any_of(near.begin(), near.end(), is_password_attribute);
}

size_t length_of_name(std::string_view name) {
    const std::string small = lower(name);
    for (const std::string& known : known_passwords()) {
        const size_t found = small.find(known);
        if (found != std::string::npos) {
            return found + known.size();
        }
    }
    return nearest_attribute(name) ? name.size() : end_of_mark(small).value_or(name.size());
}

}  // namespace cfg32::tool
