#pragma once

// The grammar of distinguished names, read from the front of a text.

#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include "LDIF_DN.h"
#include "LDIF_Util.h"
#include "failure.h"

namespace cfg32 {

namespace dn_failure {
inline constexpr failure missing_attribute{34, 1011, "Missing RDN attribute"};
inline constexpr failure empty_attribute{34, 1011, "Missing RDN attribute: <NULL>="};
inline constexpr failure invalid_attribute{34, 1012, "Invalid attribute sytax: "};
inline constexpr failure invalid_after_attribute{34, 1012, "Invalid character in RDN attribute: "};
inline constexpr failure missing_value{34, 1013, "Missing RDN value: "};
inline constexpr failure empty_value{34, 1013, "Missing RDN attribute value"};
inline constexpr failure invalid_escape{34, 1014, "Invalid escape sequence: "};
inline constexpr failure invalid_after_value{34, 1014, "Invalid character in RDN value: "};
inline constexpr failure bad_separator{80, 1000, "Unexpected syntax error"};
}  // namespace dn_failure

/// Char is char for plain ASCII and wchar_t for every other text.
template <class Char>
class dn_parser {
  public:
    explicit dn_parser(std::basic_string_view<Char> text) : text_(text) {}

    /// The RDNs of a whole DN, leaf first, are appended to rdns.
    void dn(std::vector<LDIF_RDN>& rdns);
    LDIF_RDN rdn();
    LDIF_RDN_pair pair();
    std::string attribute();
    LDIF_RDN_value value();

    /// What is not parsed yet, in narrow text.
    std::string rest() const { return narrowed(text_); }

  private:
    bool at_end() const { return text_.empty(); }
    bool at(Char c) const { return !at_end() && text_.front() == c; }
    bool at_separator() const { return at(',') || at(';'); }
    void skip(size_t count) { text_.remove_prefix(count); }
    void skip_space();
    std::string front(size_t count) const { return narrowed(text_.substr(0, count)); }
    bool is_one_of(const character_set& characters, size_t position) const {
        return position < text_.size() && characters.has(text_[position]);
    }
    size_t count_of(const character_set& characters) const;
    bool has_oid_prefix() const;

    LDIF_RDN_value hex_value();
    LDIF_RDN_value quoted_value();
    LDIF_RDN_value plain_value();
    bool take_byte(std::string& bytes);
    void take_escape(std::string& bytes);
    void take_character(std::string& bytes);
    void take_ordinary(std::string& bytes, size_t& spaces);

    std::basic_string_view<Char> text_;
};

/// Erases what the end of a plain value loses when unescaped spaces stand there.
void cut_before_trailing_spaces(std::string& bytes, size_t spaces);

template <class Char>
void dn_parser<Char>::skip_space() {
    while (!at_end() && is_space(text_.front())) {
        skip(1);
    }
}

/// How many characters at the front are of that class.
template <class Char>
size_t dn_parser<Char>::count_of(const character_set& characters) const {
    size_t count = 0;
    while (is_one_of(characters, count)) {
        ++count;
    }
    return count;
}

template <class Char>
void dn_parser<Char>::dn(std::vector<LDIF_RDN>& rdns) {
    skip_space();
    if (at_end()) {
        return;
    }
    for (;;) {
        rdns.push_back(rdn());
        if (at_end()) {
            return;
        }
        if (!at_separator()) {
            raise(dn_failure::bad_separator);  // UNREACHABLE: an RDN ends nowhere else
        }
        skip(1);
        skip_space();
    }
}

template <class Char>
LDIF_RDN dn_parser<Char>::rdn() {
    const auto what = [this] { return "parsing rdn: " + rest(); };
    const auto body = [this] {
        if (at_end()) {
            raise(dn_failure::missing_attribute);
        }
        std::vector<LDIF_RDN_pair> pairs;
        for (;;) {
            pairs.push_back(pair());
            if (at_end() || at_separator()) {
                return LDIF_RDN(std::move(pairs));
            }
            if (!at('+')) {
                raise(dn_failure::invalid_after_value, front(1));
            }
            skip(1);
            skip_space();
        }
    };
    return with_boundary(what, body, no_details);
}

template <class Char>
LDIF_RDN_pair dn_parser<Char>::pair() {
    const auto what = [this] { return "parsing rdn: " + rest(); };
    const auto body = [this] {
        std::string name = attribute();
        if (at_end()) {
            raise(dn_failure::missing_value, name);
        }
        if (!at('=')) {
            raise(dn_failure::invalid_after_attribute, front(1));
        }
        skip(1);
        skip_space();
        return LDIF_RDN_pair(LDIF_RDN_attribute(std::move(name)), value());
    };
    return with_boundary(what, body, no_details);
}

/// "oid." or "OID." before a number.
template <class Char>
bool dn_parser<Char>::has_oid_prefix() const {
    if (!is_one_of(digits, 4) || text_[3] != Char('.')) {
        return false;
    }
    const std::string prefix = front(4);
    return prefix == "oid." || prefix == "OID.";
}

template <class Char>
std::string dn_parser<Char>::attribute() {
    if (at_end()) {
        raise(dn_failure::missing_attribute);
    }
    if (has_oid_prefix()) {
        skip(4);
    }
    if (!is_one_of(letters, 0) && !is_one_of(digits, 0)) {
        const size_t equals = text_.find(Char('='));
        raise(dn_failure::invalid_attribute, front(equals != text_.npos ? equals : 20));
    }
    const size_t length = count_of(is_one_of(letters, 0) ? key_characters : oid_characters);
    std::string name = front(length);
    skip(length);
    skip_space();
    return name;
}

template <class Char>
LDIF_RDN_value dn_parser<Char>::value() {
    const auto what = [this] { return "parsing rdn value: " + rest(); };
    const auto body = [this] {
        LDIF_RDN_value value = at_end()  ? LDIF_RDN_value()
                               : at('#') ? hex_value()
                               : at('"') ? quoted_value()
                                         : plain_value();
        skip_space();
        return value;
    };
    return with_boundary(what, body, no_details);
}

/// "#" and hexadecimal pairs; what forms no pair is left for the caller to judge.
template <class Char>
LDIF_RDN_value dn_parser<Char>::hex_value() {
    std::string bytes;
    skip(1);
    while (take_byte(bytes)) {
    }
    return {std::move(bytes), LDIF_RDN_value::hex};
}

/// A quoted value ends at the closing quote, or with the text.
template <class Char>
LDIF_RDN_value dn_parser<Char>::quoted_value() {
    std::string bytes;
    skip(1);
    while (!at_end() && !at('"')) {
        at('\\') ? take_escape(bytes) : take_character(bytes);
    }
    if (at('"')) {
        skip(1);
    }
    return {std::move(bytes), LDIF_RDN_value::quoted};
}

template <class Char>
LDIF_RDN_value dn_parser<Char>::plain_value() {
    std::string bytes;
    size_t spaces = 0;  // unescaped ones since the last other character
    while (!at_end()) {
        if (at('\\')) {
            take_escape(bytes);
            spaces = 0;
        } else if (is_one_of(special_characters, 0)) {
            break;
        } else {
            take_ordinary(bytes, spaces);
        }
    }
    cut_before_trailing_spaces(bytes, spaces);
    return {std::move(bytes), LDIF_RDN_value::plain};
}

/// Takes the characters before the next special one; counts the spaces at the end.
template <class Char>
void dn_parser<Char>::take_ordinary(std::string& bytes, size_t& spaces) {
    size_t count = 0;
    for (; count < text_.size() && !is_one_of(special_characters, count); ++count) {
        spaces = text_[count] == Char(' ') ? spaces + 1 : 0;
    }
    bytes += front(count);
    skip(count);
}

/// Takes two hexadecimal digits as one byte, if they stand at the front.
template <class Char>
bool dn_parser<Char>::take_byte(std::string& bytes) {
    if (!is_one_of(hex_digits, 0) || !is_one_of(hex_digits, 1)) {
        return false;
    }
    bytes += static_cast<char>(16 * hex_digit(text_[0]) + hex_digit(text_[1]));
    skip(2);
    return true;
}

template <class Char>
void dn_parser<Char>::take_escape(std::string& bytes) {
    const std::basic_string_view<Char> escape = text_;
    skip(1);
    if (at_end()) {
        text_ = escape;
        raise(dn_failure::invalid_escape, "\\");
    }
    if (take_byte(bytes)) {
        return;
    }
    if (!is_one_of(special_characters, 0) && !at(' ')) {
        text_ = escape;
        raise(dn_failure::invalid_escape, front(3));
    }
    take_character(bytes);
}

template <class Char>
void dn_parser<Char>::take_character(std::string& bytes) {
    if constexpr (std::is_same_v<Char, char>) {
        bytes += text_.front();
    } else {
        bytes += front(1);
    }
    skip(1);
}

}  // namespace cfg32
