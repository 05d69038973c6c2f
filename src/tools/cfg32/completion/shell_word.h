#pragma once

// Words of a command line as bash has them while one is typed, and as it takes them.

#include <string>
#include <string_view>

namespace cfg32::tool {

/// A word that is being typed.
struct typed_word {
    std::string text;   ///< without quotes and backslashes
    std::string kept;   ///< the front of the text that a completion leaves as it is
    char quote = '\0';  ///< the quote that is still open, or NUL
};

/// Reads a word. A completion replaces what follows an open quote, or the last of the characters at
/// which the shell breaks words.
typed_word read_typed_word(std::string_view raw, std::string_view breaks);

/// The text as the shell takes it within that quote; after NUL, with backslashes.
std::string quoted_for_shell(std::string_view text, char quote);

}  // namespace cfg32::tool
