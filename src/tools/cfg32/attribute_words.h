#pragma once

// What the attribute table says, in words.

#include <optional>
#include <string>
#include <string_view>

struct _AttrType;

namespace cfg32::tool {

/// The row of that name, in any case; null when the table has none.
const _AttrType* find_attribute(std::string_view name);

/// The name of the syntax's family, as in "int".
std::string_view syntax_name(const _AttrType& type);

/// The syntax alone, in a few words: "an integer", "a distinguished name".
std::string_view syntax_in_words(const _AttrType& type);

/// What a value must be, in one line: "an integer from 1 to 65535", "one of: true, false".
std::string accepted_values(const _AttrType& type);

/// A value that is accepted.
std::string example_value(const _AttrType& type);

/// The name in the table that the text most likely means; none when nothing is near.
std::optional<std::string> nearest_attribute(std::string_view name);

}  // namespace cfg32::tool
