#include "dn_path.h"

#include <algorithm>
#include <limits>
#include <optional>

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

/// Calls use(place) for the place of each RDN in a DN that is written in the simplest way, but not
/// for the first, and for the one behind them where another would begin. Their number; nothing for
/// another text.
template <class Use>
std::optional<size_t> read_rdns(std::string_view text, Use use) {
    constexpr size_t last_place = std::numeric_limits<uint32_t>::max();
    size_t count = 0;
    for (size_t begin = 0; begin < text.size(); ++count) {
        const size_t length = simple_rdn_length(text.substr(begin));
        const std::string_view rest = text.substr(begin + length);
        begin += length + separator.size();
        const bool is_last = rest.empty();
        const bool is_followed = rest.size() > separator.size() && rest.starts_with(separator);
        if (length == 0 || begin > last_place || !(is_last || is_followed)) {
            return std::nullopt;
        }
        use(begin);
    }
    return count;
}

}  // namespace

kept_dn::kept_dn(const given_text& text) {
    if (const std::optional<size_t> count = read_rdns(text, [](size_t) {})) {
        text_ = text;
        size_ = *count;
    } else {
        *this = kept_dn(LDIF_DN(cisString(text.str())));
    }
}

kept_dn::kept_dn(LDIF_DN dn) : size_(dn.rdns().size()) {
    const std::optional<std::string> text = printed(dn);
    if (text && is_simple(*text)) {
        text_ = given_text(*text);
    } else {
        parsed_ = std::make_unique<LDIF_DN>(std::move(dn));
    }
}

bool kept_dn::is_simple(std::string_view text) {
    return read_rdns(text, [](size_t) {}).has_value();
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

/// The text of the RDNs but the first `from`, counted from the root, of a simple DN.
std::string_view kept_dn::leaf_side(size_t from) const {
    size_t end = 0;
    for (size_t count = from; count < size_; ++count) {
        end = std::min(text().find(separator.front(), end), text_.size()) + separator.size();
    }
    return text().substr(0, end - std::min(end, separator.size()));
}

LDIF_DN kept_dn::without_root_side(size_t count) const {
    if (!parsed_) {
        return LDIF_DN(cisString(std::string(leaf_side(count))));
    }
    LDIF_DN dn = *parsed_;
    dn.remove_root_side(count);
    return dn;
}

std::span<const LDIF_RDN> kept_dn::rdns_from(size_t from, LDIF_DN& memory) const {
    if (parsed_) {
        return std::span(parsed_->rdns()).subspan(from);
    }
    memory = without_root_side(from);
    return memory.rdns();
}

void kept_dn::append_to(std::string& out) const {
    parsed_ ? parsed_->append_to(out) : static_cast<void>(out += text_.view());
}

dn_path::dn_path(const LDIF_DN& dn) : size_(dn.rdns().size()), dn_(&dn) {
    if (std::optional<std::string> text = printed(dn)) {
        own_text_ = std::move(*text);
        read_simple(own_text_);
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
    if (!read_simple(text)) {
        own_dn_ = std::make_unique<LDIF_DN>(cisString(std::string(text)));
        dn_ = own_dn_.get();
        size_ = dn_->rdns().size();
    }
}

/// Takes the text if it is a DN written in the simplest way.
bool dn_path::read_simple(std::string_view text) {
    begins_.add(0);
    const std::optional<size_t> count = read_rdns(text, [&](size_t begin) { begins_.add(begin); });
    if (count) {
        text_ = text;
        size_ = *count;
    }
    return count.has_value();
}

/// Takes one that is known to be so: there a comma is that of a separator.
void dn_path::find_rdns() {
    size_t begin = 0;
    begins_.add(0);
    for (size_t count = 1; count <= size_; ++count) {
        begin = std::min(text_.find(separator.front(), begin), text_.size()) + separator.size();
        begins_.add(begin);
    }
}

/// The text of the RDNs from `from` up to `to`, of a simple DN.
std::string_view dn_path::part(size_t from, size_t to) const {
    const size_t begin = begins_[size_ - to];
    return text_.substr(begin, begins_[size_ - from] - separator.size() - begin);
}

/// The RDNs from `from` up to `to`. Those of a simple DN are read into memory.
std::span<const LDIF_RDN> dn_path::rdns(size_t from, size_t to, LDIF_DN& memory) const {
    if (!is_simple()) {
        return std::span(dn_->rdns()).subspan(from, to - from);
    }
    memory = LDIF_DN(cisString(std::string(part(from, to))));
    return memory.rdns();
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

size_t dn_path::hash(size_t i, size_t seed, hash_kind kind) const {
    if (last_hashed_.i != i || last_hashed_.seed != seed || last_hashed_.kind != kind) {
        const size_t hash =
            is_simple()
                ? hash_without_case(",", hash_without_case(part(i, i + 1), seed, kind), kind)
                : dn_->rdns()[i].hash(seed, kind);
        last_hashed_ = {i, seed, kind, hash};
    }
    return last_hashed_.hash;
}

bool dn_path::is_relative_dn(size_t from, size_t to, const LDIF_Entry& entry) const {
    if (entry.relative_size() != to - from) {
        return false;
    }
    const kept_dn& other = entry.named_dn();
    if (!is_simple() || !other.is_simple()) {
        // Only so much of a long DN is read as there is to be compared.
        LDIF_DN own_memory;
        LDIF_DN other_memory;
        return std::ranges::equal(rdns(from, to, own_memory),
                                  other.rdns_from(entry.depth(), other_memory));
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
    LDIF_DN own_memory;
    LDIF_DN other_memory;
    return std::ranges::equal(rdns(from, from + count, own_memory),
                              other.rdns(other_from, other_from + count, other_memory));
}

}  // namespace cfg32
