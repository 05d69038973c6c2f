#pragma once

// How a tree keeps the DNs of its entries, and finds entries by them.
//
// Nearly every DN is written in the simplest way: of single "attribute=value" pairs, of plain
// values without escapes, joined by ", ". There the text tells all of the DN, and it is its
// canonical form too. Such a DN is not taken apart: two of them are equal when their texts are,
// without regard to case.

#include <array>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "LDIF_DN.h"
#include "kept_text.h"

class LDIF_Entry;

namespace cfg32 {

/// A DN as an entry keeps it.
class kept_dn {
  public:
    kept_dn() : text_(given_text::lasting("")) {}
    explicit kept_dn(LDIF_DN dn);
    /// Throws what parsing a DN throws.
    explicit kept_dn(const given_text& text);
    kept_dn(const kept_dn& other);
    kept_dn(kept_dn&& other) noexcept = default;
    kept_dn& operator=(const kept_dn& other) { return *this = kept_dn(other); }
    kept_dn& operator=(kept_dn&& other) noexcept = default;
    ~kept_dn() = default;

    /// True for a text that is a DN written in the simplest way.
    static bool is_simple(std::string_view text);

    LDIF_DN dn() const;
    /// The number of RDNs.
    size_t size() const { return size_; }
    bool is_simple() const { return !parsed_; }
    /// Of a simple one.
    std::string_view text() const { return text_; }
    /// Of another.
    const LDIF_DN& parsed() const { return *parsed_; }
    /// True when both are simple and the other stands at the end of this one, with an RDN before
    /// it.
    bool ends_with(const kept_dn& other) const;
    /// What is left of the DN without so many RDNs on the root side.
    LDIF_DN without_root_side(size_t count) const;
    /// The RDNs of that. Those of a simple DN are read into memory.
    std::span<const LDIF_RDN> rdns_from(size_t count, LDIF_DN& memory) const;
    /// Appends the canonical form; throws what LDIF_DN::str() throws.
    void append_to(std::string& out) const;

  private:
    std::string_view leaf_side(size_t from) const;

    kept_text text_;
    std::unique_ptr<LDIF_DN> parsed_;  // of a DN that is not simple
    size_t size_ = 0;
};

/// Where the RDNs of a simple DN stand in its text, from the leaf on, and behind them where another
/// would. Only a long DN has them on the heap.
class rdn_places {
  public:
    void add(size_t place) {
        const auto narrow = static_cast<uint32_t>(place);
        if (count_ < first_.size()) {
            first_[count_++] = narrow;
        } else {
            others_.push_back(narrow);
        }
    }
    size_t operator[](size_t i) const {
        return i < first_.size() ? first_[i] : others_[i - first_.size()];
    }

  private:
    std::array<uint32_t, 25> first_;  // as far as they are there
    size_t count_ = 0;
    std::vector<uint32_t> others_;
};

/// A DN as a tree is searched for it. What it is made of must outlive it.
class dn_path {
  public:
    explicit dn_path(const LDIF_DN& dn);
    explicit dn_path(const kept_dn& dn);
    /// Throws what parsing a DN throws.
    explicit dn_path(std::string_view text);
    dn_path(const dn_path&) = delete;
    dn_path& operator=(const dn_path&) = delete;

    /// The number of RDNs.
    size_t size() const { return size_; }

    /// As LDIF_DN::compare.
    int compare(const dn_path& other) const;

    /// Continues a hash of the RDNs on the root side of the i-th, counted from the root, with that.
    size_t hash(size_t i, size_t seed, hash_kind kind = present_hash_kind()) const;

    /// True when the RDNs from `from` up to `to` are the relative DN of the entry.
    bool is_relative_dn(size_t from, size_t to, const LDIF_Entry& entry) const;

    /// True when so many RDNs of this and the other path are equal, from those places on.
    bool has_equal_part(size_t from, const dn_path& other, size_t other_from, size_t count) const;

  private:
    bool read_simple(std::string_view text);
    void find_rdns();
    std::string_view part(size_t from, size_t to) const;
    int compare_rdn(size_t i, const dn_path& other) const;
    std::span<const LDIF_RDN> rdns(size_t from, size_t to, LDIF_DN& memory) const;
    bool is_simple() const { return text_.data(); }
    const LDIF_DN& dn() const;

    std::string own_text_;
    std::string_view text_;  // of a simple DN
    rdn_places begins_;
    size_t size_ = 0;
    struct hashed_rdn {
        size_t i;
        size_t seed;
        hash_kind kind;
        size_t hash;
    };

    mutable hashed_rdn last_hashed_{~size_t{}, 0, {}, 0};  // it is mostly asked for twice
    mutable const LDIF_DN* dn_ = nullptr;  // of another, or once it is compared with one
    mutable std::unique_ptr<LDIF_DN> own_dn_;
};

}  // namespace cfg32
