#pragma once

// What of passwords may be seen: one that is encrypted or hashed as it is stored, of others
// nothing.

#include <string>
#include <string_view>
#include <vector>

#include "password_names.h"

namespace cfg32::tool {

/// What takes the place of text that is not to be seen.
inline constexpr std::string_view hidden_text = "********";

/// A value as people and programs may see it. Like a line's, it is hidden as well where the name
/// looks like a password's and the table does not know it as another attribute.
std::string shown_value(std::string_view attribute, std::string_view value);

/// A line of a file, or the name at its front, as it may be seen: what follows the name of a
/// password is hidden, also where the name is mistyped, the colon is missing, the line is a
/// comment, or one that was kept because it can't be used. Only the end of the line differs.
std::string shown_line(std::string_view line);

/// The values of an attribute, each as it may be seen below the one before.
std::vector<std::string> shown_values(std::string_view attribute,
                                      const std::vector<std::string>& values);

/// A message or a name as it may be seen: in each of its lines what stands behind a password's name
/// and a colon is hidden.
std::string shown_text(std::string_view text);

/// True when the line is the password of the line above it, which has its name and no value: an
/// editor may have broken it there.
bool is_password_below(std::string_view above, std::string_view line);

/// True when all that follows this line's name is a password.
bool is_password_line(std::string_view line);

/// True for such a line, and for one of which shown_line hides something.
bool hides_something(std::string_view line);

}  // namespace cfg32::tool
