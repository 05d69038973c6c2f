#include "LDIF_DN.h"

#include <algorithm>
#include <iterator>
#include <ostream>

#include "LDIF_DN.parser.h"
#include "LDIF_Util.h"
#include "failure.h"

using namespace cfg32;

namespace {

/// Calls use(parser) with the parser for the width that text needs.
template <class Use>
decltype(auto) parsing(const std::string& text, Use use) {
    if (is_plain(text)) {
        return use(dn_parser<char>(text));
    }
    const std::wstring wide = multibyte2wide(text);
    return use(dn_parser<wchar_t>(wide));
}

/// Parses from the front of text and leaves in it what is not parsed, also after a failure.
template <class Parse>
auto consume(cisString& text, Parse parse) {
    const std::string whole = text.text();
    return parsing(whole, [&](auto parser) {
        try {
            auto result = parse(parser);
            text = parser.rest();
            return result;
        } catch (const LDIF_Exception&) {
            text = parser.rest();
            throw;
        }
    });
}

/// The order of RDNs and DNs: the first difference decides. KEPT: where one sequence is the
/// beginning of the other it is the greater one, so that a sorted container of DNs holds an
/// ancestor after its descendants.
template <class Step>
int compare_steps(const std::vector<Step>& left, const std::vector<Step>& right) {
    const size_t common = std::min(left.size(), right.size());
    for (size_t i = 0; i < common; ++i) {
        if (const int order = left[i].compare(right[i]); order != 0) {
            return order;
        }
    }
    if (left.size() == right.size()) {
        return 0;
    }
    return left.size() < right.size() ? 1 : -1;
}

/// How many steps the two DNs have in common from the root.
size_t common_root_side(const std::vector<LDIF_RDN>& left, const std::vector<LDIF_RDN>& right) {
    const auto equal = [](const LDIF_RDN& l, const LDIF_RDN& r) { return !(l != r); };
    const auto end = std::mismatch(left.begin(), left.end(), right.begin(), right.end(), equal);
    return static_cast<size_t>(end.first - left.begin());
}

/// Appends the parts' texts.
template <class Parts>
void append_joined(Parts first, Parts last, const char* separator, std::string& out) {
    for (Parts part = first; part != last; ++part) {
        part->append_to(part == first ? out : out += separator);
    }
}

/// What append_to() appends.
template <class Printable>
std::string text_of(const Printable& printable) {
    std::string text;
    printable.append_to(text);
    return text;
}

void append_escaped_bytes(std::string_view bytes, std::string& out) {
    for (const char byte : bytes) {
        byte2hex(static_cast<unsigned char>(byte), out += '\\');
    }
}

/// Appends the characters of text; the ones in escaped are preceded by a backslash. A NUL, at which
/// every reader would stop, and a byte that is no character in the locale are written in
/// hexadecimal, so that the line stays readable.
void append_characters(std::string_view text, const character_set& escaped, std::string& out) {
    while (!text.empty()) {
        const auto is_ordinary = [&](char c) { return c > '\0' && !escaped.has(c); };
        const auto end = std::find_if_not(text.begin(), text.end(), is_ordinary);
        const auto count = static_cast<size_t>(end - text.begin());
        out.append(text.substr(0, count));
        text.remove_prefix(count);
        if (text.empty()) {
            return;
        }
        const character next = first_character(text);
        if (!next.is_valid || next.code == 0) {
            append_escaped_bytes(next.bytes, out);
        } else {
            out.append(escaped.has(next.bytes.front()) ? "\\" : "").append(next.bytes);
        }
        text.remove_prefix(next.bytes.size());
    }
}

void append_hex(const std::string& bytes, std::string& out) {
    out += '#';
    for (const char byte : bytes) {
        byte2hex(static_cast<unsigned char>(byte), out);
    }
}

void append_quoted(const std::string& value, std::string& out) {
    static const character_set escaped("\\\"");
    out += '"';
    append_characters(value, escaped, out);
    out += '"';
}

/// The part of a text from its first character that is not whitespace to its last.
std::string_view without_space_around(std::string_view text) {
    if (is_plain(text)) {
        return without_trailing_space(without_leading_space(text));
    }
    size_t begin = text.size();
    size_t end = begin;
    for (size_t at = 0; at < text.size();) {
        const character next = first_character(text.substr(at));
        const bool is_whitespace = next.is_valid && is_space(next.code);
        if (!is_whitespace) {
            begin = std::min(begin, at);
            end = at + next.bytes.size();
        }
        at += next.bytes.size();
    }
    return text.substr(begin, end - begin);
}

/// Whitespace at either end is written in hexadecimal, whitespace in the middle as it is.
void append_plain(const std::string& value, std::string& out) {
    const std::string_view text = value;
    const std::string_view middle = without_space_around(text);
    const auto begin = static_cast<size_t>(middle.data() - text.data());
    append_escaped_bytes(text.substr(0, begin), out);
    append_characters(middle, special_characters, out);
    append_escaped_bytes(text.substr(begin + middle.size()), out);
}

size_t last_character_length(std::string_view text) {
    size_t length = 0;
    while (!text.empty()) {
        length = first_character(text).bytes.size();
        text.remove_prefix(length);
    }
    return length;
}

}  // namespace

// KEPT: unescaped spaces at the end of a plain value cut the character before them and leave one
// space: "ab " is "a ". Whole characters go, never a part of one.
void cfg32::cut_before_trailing_spaces(std::string& bytes, size_t spaces) {
    if (spaces == 0 || spaces == bytes.size()) {
        return;
    }
    const size_t text = bytes.size() - spaces;
    const size_t cut = last_character_length(std::string_view(bytes).substr(0, text));
    bytes.erase(text - cut, cut + spaces - 1);
}

LDIF_RDN_attribute::LDIF_RDN_attribute(cisString& text)
    : cisString(consume(text, [](auto& parser) { return parser.attribute(); })) {}

LDIF_RDN_value::LDIF_RDN_value(cisString& text)
    : LDIF_RDN_value(consume(text, [](auto& parser) { return parser.value(); })) {}

std::string LDIF_RDN_value::str() const { return text_of(*this); }

void LDIF_RDN_value::append_to(std::string& out) const {
    if (text_.empty()) {
        raise(dn_failure::empty_value);
    }
    switch (form) {
        case hex:
            return append_hex(text_, out);
        case quoted:
            return append_quoted(text_, out);
        default:
            return append_plain(text_, out);
    }
}

LDIF_RDN_pair::LDIF_RDN_pair(cisString& text)
    : LDIF_RDN_pair(consume(text, [](auto& parser) { return parser.pair(); })) {}

LDIF_RDN_pair::LDIF_RDN_pair(LDIF_RDN_attribute&& attribute, LDIF_RDN_value&& value)
    : attribute(std::move(attribute)), value(std::move(value)) {
    if (this->attribute.empty()) {
        raise(dn_failure::empty_attribute, this->value.str());
    }
}

int LDIF_RDN_pair::compare(const LDIF_RDN_pair& other) const {
    const int order = attribute.compare(other.attribute);
    return order != 0 ? order : value.compare(other.value);
}

std::string LDIF_RDN_pair::str() const { return text_of(*this); }

void LDIF_RDN_pair::append_to(std::string& out) const {
    value.append_to(out.append(attribute.text()).append("="));
}

LDIF_RDN::LDIF_RDN(cisString& text)
    : LDIF_RDN(consume(text, [](auto& parser) { return parser.rdn(); })) {}

LDIF_RDN::LDIF_RDN(std::vector<LDIF_RDN_pair>&& pairs) : pairs_(std::move(pairs)) {
    if (pairs_.size() == 1) {
        return;
    }
    const auto less = [](const LDIF_RDN_pair& l, const LDIF_RDN_pair& r) { return l < r; };
    const auto equal = [](const LDIF_RDN_pair& l, const LDIF_RDN_pair& r) { return l == r; };
    std::stable_sort(pairs_.begin(), pairs_.end(), less);
    pairs_.erase(std::unique(pairs_.begin(), pairs_.end(), equal), pairs_.end());
}

LDIF_RDN& LDIF_RDN::operator+=(const LDIF_RDN_pair& pair) {
    const auto less = [](const LDIF_RDN_pair& l, const LDIF_RDN_pair& r) { return l < r; };
    const auto place = std::lower_bound(pairs_.begin(), pairs_.end(), pair, less);
    if (place == pairs_.end() || pair != *place) {
        pairs_.insert(place, pair);
    }
    return *this;
}

std::string LDIF_RDN::str() const { return text_of(*this); }

void LDIF_RDN::append_to(std::string& out) const {
    append_joined(pairs_.begin(), pairs_.end(), " + ", out);
}

int LDIF_RDN::compare(const LDIF_RDN& other) const { return compare_steps(pairs_, other.pairs_); }

size_t LDIF_RDN::hash(size_t seed, hash_kind kind) const {
    const auto take = [&](std::string_view text) { seed = hash_without_case(text, seed, kind); };
    // As of the text, where that is no more than attribute and value.
    for (const LDIF_RDN_pair& pair : pairs_) {
        take(&pair == pairs_.data() ? "" : "+");
        take(pair.attribute.text());
        take("=");
        take(pair.value.text());
    }
    take(",");
    return seed;
}

LDIF_DN& LDIF_DN::operator=(const cisString& text) {
    const auto body = [&]() -> LDIF_DN& {
        std::vector<LDIF_RDN> parsed;  // leaf first
        const auto is_separator = [](char c) { return c == ',' || c == ';'; };
        parsed.reserve(static_cast<size_t>(
            1 + std::count_if(text.text().begin(), text.text().end(), is_separator)));
        const auto keep = [&] {
            std::reverse(parsed.begin(), parsed.end());
            std::move(rdns_.begin(), rdns_.end(), std::back_inserter(parsed));
            rdns_ = std::move(parsed);
        };
        try {
            parsing(text.text(), [&](auto parser) { parser.dn(parsed); });
        } catch (...) {
            keep();
            throw;
        }
        keep();
        return *this;
    };
    return with_boundary([] { return "parsing dn"; }, body,
                         [&](LDIF_Exception& e) { e.value = text.text(); });
}

LDIF_DN& LDIF_DN::operator+=(const LDIF_RDN& rdn) {
    rdns_.push_back(rdn);
    return *this;
}

LDIF_DN LDIF_DN::intersection(const LDIF_DN& other) const {
    LDIF_DN common;
    const auto end = rdns_.begin() + static_cast<ptrdiff_t>(common_root_side(rdns_, other.rdns_));
    common.rdns_.assign(rdns_.begin(), end);
    return common;
}

LDIF_DN& LDIF_DN::operator-=(const LDIF_DN& ancestor) {
    remove_root_side(common_root_side(rdns_, ancestor.rdns_));
    return *this;
}

void LDIF_DN::remove_root_side(size_t count) {
    rdns_.erase(rdns_.begin(), rdns_.begin() + static_cast<ptrdiff_t>(count));
}

std::string LDIF_DN::str() const { return text_of(*this); }

void LDIF_DN::append_to(std::string& out) const {
    append_joined(rdns_.rbegin(), rdns_.rend(), ", ", out);
}

size_t LDIF_DN::hash() const {
    const hash_kind kind = present_hash_kind();
    size_t hash = hash_seed;
    for (const LDIF_RDN& rdn : rdns_) {
        hash = rdn.hash(hash, kind);
    }
    return hash;
}

int LDIF_DN::compare(const LDIF_DN& other) const { return compare_steps(rdns_, other.rdns_); }

std::ostream& operator<<(std::ostream& out, const LDIF_RDN_pair& pair) { return out << pair.str(); }
std::ostream& operator<<(std::ostream& out, const LDIF_RDN& rdn) { return out << rdn.str(); }
std::ostream& operator<<(std::ostream& out, const LDIF_DN& dn) { return out << dn.str(); }
