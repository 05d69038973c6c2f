#include "dn_path.h"

#include <algorithm>
#include <limits>

#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "LDIF_Util.h"

namespace cfg32 {

namespace {

constexpr std::string_view separator = ", ";

/// The canonical form; nothing when the DN can't be printed.
std::optional<std::string> printed(const LDIF_DN& dn) {
    try {
        return dn.str();
    } catch (const LDIF_Exception&) {
        return std::nullopt;
    }
}

/// What plain values are made of: ASCII without the characters that need an escape.
constexpr auto plain_characters = [] {
    std::array<bool, 256> is_plain{};
    for (size_t c = 1; c < 0x80; ++c) {
        is_plain[c] =
            std::string_view(",=+<>#;\\\"").find(static_cast<char>(c)) == std::string_view::npos;
    }
    return is_plain;
}();

/// The length of the simple RDN at the front of the text; 0 if there is none.
size_t simple_rdn_length(std::string_view text) {
    if (text.empty() || !letters.has(text.front())) {
        return 0;
    }
    size_t at = 1;
    while (at < text.size() && key_characters.has(text[at])) {
        ++at;
    }
    if (at == text.size() || text[at] != '=') {
        return 0;
    }
    const size_t value = ++at;
    while (at < text.size() && plain_characters[static_cast<unsigned char>(text[at])]) {
        ++at;
    }
    const bool is_plain =
        at > value && !is_ascii_space(text[value]) && !is_ascii_space(text[at - 1]);
    return is_plain ? at : 0;
}

}  // namespace

kept_dn::kept_dn(const given_text& text) {
    dn_path::places begins;
    if (const std::optional<size_t> count = dn_path::read_simple(text, begins)) {
        text_ = text;
        size_ = *count;
    } else {
        *this = kept_dn(LDIF_DN(cisString(text.str())));
    }
}

kept_dn::kept_dn(LDIF_DN dn) : size_(dn.rdns().size()) {
    const std::optional<std::string> text =
        size_ <= dn_path::most_rdns ? printed(dn) : std::nullopt;
    dn_path::places begins;
    if (text && dn_path::read_simple(*text, begins)) {
        text_ = given_text(*text);
    } else {
        parsed_ = std::make_unique<LDIF_DN>(std::move(dn));
    }
}

bool kept_dn::is_simple(std::string_view text) {
    dn_path::places begins;
    return dn_path::read_simple(text, begins).has_value();
}

kept_dn::kept_dn(const kept_dn& other)
    : text_(other.text_),
      parsed_(other.parsed_ ? std::make_unique<LDIF_DN>(*other.parsed_) : nullptr),
      size_(other.size_) {}

LDIF_DN kept_dn::dn() const { return parsed_ ? *parsed_ : LDIF_DN(cisString(text_.str())); }

bool kept_dn::ends_with(const kept_dn& other) const {
    if (!is_simple() || !other.is_simple() || other.text_.empty() ||
        text_.size() < other.text_.size()) {
        return false;
    }
    const std::string_view before = text().substr(0, text_.size() - other.text_.size());
    return before.ends_with(separator) && text().ends_with(other.text());
}

void kept_dn::append_to(std::string& out) const {
    parsed_ ? parsed_->append_to(out) : static_cast<void>(out += text_.view());
}

dn_path::dn_path(const LDIF_DN& dn) : size_(dn.rdns().size()), dn_(&dn) {
    if (size_ > most_rdns) {
        return;
    }
    if (std::optional<std::string> text = printed(dn)) {
        own_text_ = std::move(*text);
        text_ = read_simple(own_text_, begins_) ? own_text_ : std::string_view();
    }
}

dn_path::dn_path(const kept_dn& dn) : size_(dn.size()) {
    if (dn.is_simple()) {
        text_ = dn.text();
        find_rdns();
    } else {
        dn_ = &dn.parsed();
    }
}

dn_path::dn_path(std::string_view text) {
    if (const std::optional<size_t> count = read_simple(text, begins_)) {
        text_ = text;
        size_ = *count;
    } else {
        own_dn_ = std::make_unique<LDIF_DN>(cisString(std::string(text)));
        dn_ = own_dn_.get();
        size_ = dn_->rdns().size();
    }
}

/// The number of RDNs of a DN that is written in the simplest way, and where each begins. Behind
/// them stands where another would begin.
std::optional<size_t> dn_path::read_simple(std::string_view text, places& begins) {
    size_t begin = 0;
    begins[0] = 0;
    if (text.empty()) {
        return 0;
    }
    for (size_t count = 1; count <= most_rdns; ++count) {
        begin += simple_rdn_length(text.substr(begin));
        const bool is_rdn = begin > begins[count - 1];
        if (!is_rdn || begin > std::numeric_limits<uint32_t>::max() - separator.size()) {
            return std::nullopt;
        }
        begins[count] = static_cast<uint32_t>(begin + separator.size());
        if (begin == text.size()) {
            return count;
        }
        if (!text.substr(begin).starts_with(separator)) {
            return std::nullopt;
        }
        begin += separator.size();
    }
    return std::nullopt;
}

/// The same of a text that is known to be simple: there a comma is that of a separator.
void dn_path::find_rdns() {
    size_t begin = 0;
    begins_[0] = 0;
    for (size_t count = 1; count <= size_; ++count) {
        begin = std::min(text_.find(separator.front(), begin), text_.size()) + separator.size();
        begins_[count] = static_cast<uint32_t>(begin);
    }
}

/// The text of the RDNs from `from` up to `to`, of a simple DN.
std::string_view dn_path::part(size_t from, size_t to) const {
    const size_t begin = begins_[size_ - to];
    return text_.substr(begin, begins_[size_ - from] - separator.size() - begin);
}

const LDIF_DN& dn_path::dn() const {
    if (!dn_) {
        own_dn_ = std::make_unique<LDIF_DN>(cisString(std::string(text_)));
        dn_ = own_dn_.get();
    }
    return *dn_;
}

int dn_path::compare(const dn_path& other) const {
    if (!is_simple() || !other.is_simple()) {
        return dn().compare(other.dn());
    }
    const size_t common = std::min(size_, other.size_);
    for (size_t i = 0; i < common; ++i) {
        if (const int order = compare_rdn(i, other); order != 0) {
            return order;
        }
    }
    // An ancestor is greater than its descendants.
    return static_cast<int>(size_ < other.size_) - static_cast<int>(size_ > other.size_);
}

int dn_path::compare_rdn(size_t i, const dn_path& other) const {
    const std::string_view left = part(i, i + 1);
    const std::string_view right = other.part(i, i + 1);
    const size_t left_name = left.find('=');
    const size_t right_name = right.find('=');
    const int order = compare_without_case(left.substr(0, left_name), right.substr(0, right_name));
    return order != 0 ? order
                      : compare_without_case(left.substr(left_name), right.substr(right_name));
}

size_t dn_path::hash(size_t i, size_t seed) const {
    if (last_hashed_.i != i || last_hashed_.seed != seed) {
        const size_t hash = is_simple()
                                ? hash_without_case(",", hash_without_case(part(i, i + 1), seed))
                                : dn_->rdns()[i].hash(seed);
        last_hashed_ = {i, seed, hash};
    }
    return last_hashed_.hash;
}

bool dn_path::is_relative_dn(size_t from, size_t to, const LDIF_Entry& entry) const {
    if (entry.relative_size() != to - from) {
        return false;
    }
    const kept_dn& other = entry.named_dn();
    if (!is_simple() || !other.is_simple()) {
        return has_equal_part(from, dn_path(other), entry.depth(), to - from);
    }
    const std::string_view own = part(from, to);
    const std::string_view text = other.text();
    const bool may_be = text.size() == own.size() ||
                        (text.size() > own.size() && text[own.size()] == separator.front());
    return may_be && compare_without_case(own, text.substr(0, own.size())) == 0;
}

bool dn_path::has_equal_part(size_t from, const dn_path& other, size_t other_from,
                             size_t count) const {
    if (size_ < from + count || other.size_ < other_from + count) {
        return false;
    }
    if (count == 0) {
        return true;
    }
    if (is_simple() && other.is_simple()) {
        return compare_without_case(part(from, from + count),
                                    other.part(other_from, other_from + count)) == 0;
    }
    const auto own_rdns = dn().rdns().begin() + static_cast<ptrdiff_t>(from);
    const auto other_rdns = other.dn().rdns().begin() + static_cast<ptrdiff_t>(other_from);
    const auto equal = [](const LDIF_RDN& l, const LDIF_RDN& r) { return l == r; };
    return std::equal(own_rdns, own_rdns + static_cast<ptrdiff_t>(count), other_rdns, equal);
}

}  // namespace cfg32
