#pragma once

// What the attribute table says, in words.

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

struct _AttrType;

namespace cfg32::tool {

/// The row of that name, in any case; null when the table has none.
const _AttrType* find_attribute(std::string_view name);

/// Every row, sorted by name; one that the table has twice, alike, is there once.
std::vector<const _AttrType*> all_attributes();

/// The name of the syntax's family, as in "int".
std::string_view syntax_name(const _AttrType& type);

/// The syntax alone, in a few words: "an integer", "a distinguished name".
std::string_view syntax_in_words(const _AttrType& type);

/// What a value must be, in one line: "an integer from 1 to 65535", "one of: true, false".
std::string accepted_values(const _AttrType& type);

/// What the bounds of a row are about.
enum class bounded { nothing, number, length };

/// The bounds as they are enforced: of a number, or of a text's length in bytes.
struct value_bounds {
    bounded what = bounded::nothing;
    int64_t minimum = 0;
    int64_t maximum = 0;  ///< of a length: 0 for none
};

value_bounds bounds_of(const _AttrType& type);

/// True for a row whose words are the only values, false for one where they are merely usual.
bool enforces_words(const _AttrType& type);

/// A value that is accepted.
std::string example_value(const _AttrType& type);

/// The name in the table that the text most likely means, also without its beginning
/// "oru-slapd"; none when nothing is near.
std::optional<std::string> nearest_attribute(std::string_view name);

/// Every name in the table that the text may mean, the nearest one first.
std::vector<std::string_view> near_attributes(std::string_view name);

}  // namespace cfg32::tool
