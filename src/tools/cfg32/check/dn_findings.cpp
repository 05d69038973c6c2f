// What is to be said of a distinguished name's text.

#include "check/dn_findings.h"

#include <fmt/format.h>

#include <vector>

#include "LDIF_DN.parser.h"
#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "LDIF_Util.h"

namespace cfg32::tool {

namespace {

template <class Char>
std::string rest_after_failure(std::basic_string_view<Char> text) {
    dn_parser<Char> parser(text);
    std::vector<LDIF_RDN> parsed;
    try {
        parser.dn(parsed);
    } catch (const LDIF_Exception&) {
        // Where it stopped is all that is asked for.
    }
    return parser.rest();
}

/// The DN without the spaces that end a value and are not escaped.
std::string without_ending_spaces(std::string_view text) {
    std::string out;
    size_t end = 0;  // behind the last character that is not such a space
    bool is_quoted = false;
    while (!text.empty()) {
        const std::string_view next = first_character(text).bytes;
        text.remove_prefix(next.size());
        is_quoted ^= next == "\"";
        if (!is_quoted && (next == "," || next == ";" || next == "+")) {
            out.resize(end);
        }
        out += next;
        if (next == "\\" && !text.empty()) {
            const std::string_view escaped = first_character(text).bytes;
            out += escaped;
            text.remove_prefix(escaped.size());
        }
        end = next == " " && !is_quoted ? end : out.size();
    }
    out.resize(end);
    return out;
}

}  // namespace

std::optional<LDIF_DN> parsed_dn(const std::string& text) {
    try {
        return LDIF_DN(cisString(text));
    } catch (const LDIF_Exception&) {
        return {};
    }
}

size_t parsed_length(const std::string& text) {
    if (is_plain(text)) {
        return text.size() - rest_after_failure<char>(text).size();
    }
    return text.size() - rest_after_failure<wchar_t>(multibyte2wide(text)).size();
}

std::string change_of(const LDIF_DN& dn, const std::string& written) {
    if (is_unprintable(dn)) {
        return {};
    }
    const std::string printed = dn.str();
    const std::optional<LDIF_DN> again = parsed_dn(printed);
    if (!again || *again != dn) {
        return fmt::format("DN would be printed as \"{}\", which reads back as {}", printed,
                           again ? "\"" + shown(*again) + "\"" : "no DN");
    }
    const std::optional<LDIF_DN> meant = parsed_dn(without_ending_spaces(written));
    if (!meant || *meant != dn) {
        return fmt::format(
            "a space at the end of a value takes the character before it: DN is read as \"{}\"",
            printed);
    }
    return {};
}

bool is_unprintable(const LDIF_DN& dn) {
    try {
        return breaks_line(dn.str());
    } catch (const LDIF_Exception&) {
        return true;
    }
}

bool breaks_line(std::string_view text) {
    return text.find_first_of(std::string("\n\r\0", 3)) != std::string::npos;
}

}  // namespace cfg32::tool
