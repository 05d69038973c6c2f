// Words of a command line as bash has them while one is typed, and as it takes them.

#include "completion/shell_word.h"

#include <cctype>

namespace cfg32::tool {

namespace {

constexpr std::string_view special_in_double_quotes = "$`\"\\";
constexpr std::string_view harmless = "_-./:@%+=,";

bool is_harmless(char c) {
    const auto byte = static_cast<unsigned char>(c);
    return byte >= 0x80 || isalnum(byte) || harmless.find(c) != std::string_view::npos;
}

/// A backslash takes the next character's meaning; in double quotes only that of some, and in
/// single quotes of none.
bool is_escape(char quote, std::string_view rest) {
    return rest.front() == '\\' && rest.size() > 1 && quote != '\'' &&
           (quote == '\0' || special_in_double_quotes.find(rest[1]) != std::string_view::npos);
}

}  // namespace

typed_word read_typed_word(std::string_view raw, std::string_view breaks) {
    typed_word word;
    for (size_t i = 0; i < raw.size(); ++i) {
        const char c = raw[i];
        const bool opens = word.quote == '\0' && (c == '"' || c == '\'');
        const bool closes = word.quote != '\0' && c == word.quote;
        if (is_escape(word.quote, raw.substr(i))) {
            word.text += raw[++i];
            continue;
        }
        if (opens || closes) {
            word.quote = opens ? c : '\0';
            word.kept = word.text;
            continue;
        }
        word.text += c;
        if (word.quote == '\0' && breaks.find(c) != std::string_view::npos) {
            word.kept = word.text;
        }
    }
    return word;
}

std::string quoted_for_shell(std::string_view text, char quote) {
    std::string out;
    for (const char c : text) {
        if (quote == '\'' && c == '\'') {
            out += "'\\'";
        } else if ((quote == '"' && special_in_double_quotes.find(c) != std::string_view::npos) ||
                   (quote == '\0' && !is_harmless(c))) {
            out += '\\';
        }
        out += c;
    }
    return out;
}

}  // namespace cfg32::tool
