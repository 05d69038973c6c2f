#include "property.h"

#include "LDIF_Exception.h"
#include "failure.h"

namespace cfg32::fuzz {

void require(bool holds, std::string_view promise) {
    if (!holds) {
        throw broken_promise(std::string(promise));
    }
}

bool is_surprise(int ldap, int extended) {
    return ldap == system_error.ldap && extended == system_error.ext;
}

void require_refusal(const LDIF_Exception& e) {
    require(!is_surprise(e.ldapErr, e.extErr), "a text is refused for what it is: " + e.dump());
}

std::vector<std::string> parts_of(std::string_view input, size_t most) {
    constexpr std::string_view separator = "\n%\n";
    std::vector<std::string> parts;
    while (parts.size() + 1 < most) {
        const size_t end = input.find(separator);
        if (end == std::string_view::npos) {
            break;
        }
        parts.emplace_back(input.substr(0, end));
        input.remove_prefix(end + separator.size());
    }
    parts.emplace_back(input);
    return parts;
}

}  // namespace cfg32::fuzz
