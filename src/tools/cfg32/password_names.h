#pragma once

// Names of passwords, and names that may be meant for one.

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace cfg32::tool {

/// True for the attributes whose values are passwords.
bool is_password_attribute(std::string_view name);

/// ASCII letters in lower case.
constexpr char lower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c | 0x20) : c; }
std::string lower(std::string_view text);

/// Where the first word ends that names of passwords have in them; none without one. The text is in
/// lower case.
std::optional<size_t> end_of_mark(std::string_view small);

/// What tells the names of the table's passwords apart, in lower case: "adminpw" and the like.
const std::vector<std::string>& known_passwords();

/// Rather true than false: what is no attribute's name may be meant for a password's.
bool is_password_name(std::string_view name);

/// How much of a password's name is one: the password may follow it without a separator.
size_t length_of_name(std::string_view name);

}  // namespace cfg32::tool
