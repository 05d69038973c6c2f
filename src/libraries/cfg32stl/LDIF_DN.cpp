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

template <class Parts, class Text>
std::string joined(Parts first, Parts last, const char* separator, Text text) {
    std::string out;
    for (Parts part = first; part != last; ++part) {
        out.append(part == first ? "" : separator).append(text(*part));
    }
    return out;
}

void append_escaped_bytes(std::string_view bytes, std::string& out) {
    for (const char byte : bytes) {
        byte2hex(static_cast<unsigned char>(byte), out += '\\');
    }
}

/// Appends the characters of text; the ones in escaped are preceded by a backslash. A byte that
/// is no character in the locale is written in hexadecimal, so that the line stays readable.
void append_characters(std::string_view text, std::string_view escaped, std::string& out) {
    while (!text.empty()) {
        const character next = first_character(text);
        if (!next.is_valid) {
            append_escaped_bytes(next.bytes, out);
        } else {
            const bool is_escaped = next.bytes.size() == 1 &&
                                    escaped.find(next.bytes.front()) != std::string_view::npos;
            out.append(is_escaped ? "\\" : "").append(next.bytes);
        }
        text.remove_prefix(next.bytes.size());
    }
}

std::string hex_text(const std::string& bytes) {
    std::string out = "#";
    for (const char byte : bytes) {
        byte2hex(static_cast<unsigned char>(byte), out);
    }
    return out;
}

std::string quoted_text(const std::string& value) {
    std::string out = "\"";
    append_characters(value, "\\\"", out);
    return out += '"';
}

/// Whitespace at either end is written in hexadecimal, whitespace in the middle as it is.
std::string plain_text(const std::string& value) {
    size_t begin = value.size();  // of the first character that is not whitespace
    size_t end = begin;           // of the last one
    for (size_t at = 0; at < value.size();) {
        const character next = first_character(std::string_view(value).substr(at));
        const bool is_whitespace = next.is_valid && is_space(next.code);
        if (!is_whitespace) {
            begin = std::min(begin, at);
            end = at + next.bytes.size();
        }
        at += next.bytes.size();
    }
    std::string out;
    const std::string_view text = value;
    append_escaped_bytes(text.substr(0, begin), out);
    append_characters(text.substr(begin, end - begin), special, out);
    append_escaped_bytes(text.substr(end), out);
    return out;
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

std::string LDIF_RDN_value::str() const {
    if (text_.empty()) {
        raise(dn_failure::empty_value);
    }
    switch (form) {
        case hex:
            return hex_text(text_);
        case quoted:
            return quoted_text(text_);
        default:
            return plain_text(text_);
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

std::string LDIF_RDN_pair::str() const { return attribute.str() + "=" + value.str(); }

LDIF_RDN::LDIF_RDN(cisString& text)
    : LDIF_RDN(consume(text, [](auto& parser) { return parser.rdn(); })) {}

LDIF_RDN::LDIF_RDN(std::vector<LDIF_RDN_pair>&& pairs) : pairs_(std::move(pairs)) {
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

std::string LDIF_RDN::str() const {
    return joined(pairs_.begin(), pairs_.end(), " + ",
                  [](const LDIF_RDN_pair& pair) { return pair.str(); });
}

int LDIF_RDN::compare(const LDIF_RDN& other) const { return compare_steps(pairs_, other.pairs_); }

size_t LDIF_RDN::hash(size_t seed) const {
    for (const LDIF_RDN_pair& pair : pairs_) {
        seed = hash_without_case("+", hash_without_case(pair.attribute.c_str(), seed));
        seed = hash_without_case("=", hash_without_case(pair.value.c_str(), seed));
    }
    return hash_without_case(",", seed);
}

LDIF_DN& LDIF_DN::operator=(const cisString& text) {
    const auto body = [&]() -> LDIF_DN& {
        std::vector<LDIF_RDN> parsed;  // leaf first
        const auto keep = [&] {
            rdns_.insert(rdns_.begin(), std::make_move_iterator(parsed.rbegin()),
                         std::make_move_iterator(parsed.rend()));
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

std::string LDIF_DN::str() const {
    return joined(rdns_.rbegin(), rdns_.rend(), ", ",
                  [](const LDIF_RDN& rdn) { return rdn.str(); });
}

size_t LDIF_DN::hash() const {
    size_t hash = 0;
    for (const LDIF_RDN& rdn : rdns_) {
        hash = rdn.hash(hash);
    }
    return hash;
}

int LDIF_DN::compare(const LDIF_DN& other) const { return compare_steps(rdns_, other.rdns_); }

std::ostream& operator<<(std::ostream& out, const LDIF_RDN_pair& pair) { return out << pair.str(); }
std::ostream& operator<<(std::ostream& out, const LDIF_RDN& rdn) { return out << rdn.str(); }
std::ostream& operator<<(std::ostream& out, const LDIF_DN& dn) { return out << dn.str(); }
