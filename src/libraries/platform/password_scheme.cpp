#include "password_scheme.h"

#include <algorithm>
#include <iterator>

namespace cfg32::platform {

namespace {

// strncasecmp follows the locale, and in a Turkish one "{IMASK}" would be another tag.
constexpr char ascii_lower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

bool begins_with_tag(std::string_view text, std::string_view tag) {
    return text.size() > tag.size() &&
           std::equal(tag.begin(), tag.end(), text.begin(),
                      [](char a, char b) { return ascii_lower(a) == ascii_lower(b); });
}

template <typename Predicate>
const password_scheme* find_scheme(Predicate matches) {
    const auto* found =
        std::find_if(std::begin(password_schemes), std::end(password_schemes), matches);
    return found == std::end(password_schemes) ? nullptr : found;
}

}  // namespace

const password_scheme* scheme_of(std::string_view text) {
    return find_scheme([text](const auto& scheme) { return begins_with_tag(text, scheme.tag); });
}

const password_scheme* scheme_for_key(std::size_t key_size) {
    return find_scheme([key_size](const auto& scheme) {
        return scheme.kind == scheme_kind::encrypted && scheme.key_size == key_size;
    });
}

}  // namespace cfg32::platform
