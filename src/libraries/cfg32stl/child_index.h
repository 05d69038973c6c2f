#pragma once

#include <cstddef>
#include <map>
#include <memory>
#include <unordered_map>
#include <utility>
#include <vector>

#include "LDIF_Entry.h"
#include "LDIF_Util.h"

namespace cfg32 {

/// Children by the hashes of their relative DNs, in one piece of memory: a hash table with linear
/// probing.
class hashed_children {
  public:
    using position = LDIF_Entry::list::iterator;

    void insert(size_t hash, position child);
    void erase(size_t hash, const LDIF_Entry& child);

    /// The child of that hash for which is_wanted(child) is true; null for none.
    template <class Predicate>
    const position* find(size_t hash, Predicate is_wanted) const;

  private:
    struct slot {
        size_t mark = 0;  // of a taken one the hash, with the lowest bit set
        position child;
    };

    static size_t mark_of(size_t hash) { return hash | 1; }
    size_t home_of(size_t mark) const { return mixed_hash()(mark) & (slots_.size() - 1); }
    size_t next(size_t place) const { return (place + 1) & (slots_.size() - 1); }
    void put(const slot& taken);
    void grow();

    std::vector<slot> slots_;  // none, or a power of two of which some are free
    size_t count_ = 0;
};

/// Finds an entry's children by relative DN, so that a wide tree costs no more than a narrow one.
///
/// No two siblings are equal and none is another's ancestor, so at most one child can be equal to a
/// given DN or an ancestor of it; it is found by looking up the DN's root-side parts. Children that
/// have ancestors missing (relative DNs of more than one RDN) are also kept by their root-side
/// parts, so that they are found when such an ancestor turns up.
///
/// The ancestor takes them over with what is known of them: its own hash is where the hashes of its
/// children begin, so these stay what they are, and of the two indexes only the smaller one is made
/// anew. Thousands of entries may be moved thousands of times.
class child_index {
  public:
    using position = LDIF_Entry::list::iterator;

    child_index() = default;

    /// False when the process has chosen a locale of another kind: then it must be made anew.
    bool is_good() const { return kind_ == present_hash_kind(); }

    /// Enters a child under its relative DN, as the last in order. path is its DN.
    void insert(position child, const dn_path& path);
    void erase(position child);

    /// Where a child that was entered stands.
    position position_of(const LDIF_Entry& child) const;

    /// The child whose relative DN equals the DN, or is an ancestor of it, when the first `from`
    /// RDNs of it are left out; null for none.
    LDIF_Entry* equal_or_ancestor(const dn_path& dn, size_t from) const;

    /// The children that are descendants of an entry that is to be their sibling, in order. path is
    /// its DN.
    std::vector<position> descendants(const LDIF_Entry& sibling, const dn_path& path) const;

    /// Makes these the children of that entry: returns the index that they have there. They still
    /// have the depth that they had here.
    std::unique_ptr<child_index> split(const LDIF_Entry& sibling, const dn_path& path,
                                       const std::vector<position>& descendants);

  private:
    // The hash of an ancestor, and the ordinal of the child.
    using ancestor_place = std::pair<size_t, size_t>;
    using places_by_ancestor = std::map<ancestor_place, position>;

    /// Of a child that has ancestors missing.
    struct late_child {
        size_t ordinal;  ///< they stand in that order
        size_t hash;     ///< of its relative DN
    };
    using late_children = std::unordered_map<const LDIF_Entry*, late_child>;

    child_index(hash_kind kind, size_t seed, size_t next_ordinal)
        : kind_(kind), seed_(seed), next_ordinal_(next_ordinal) {}

    template <class Use>
    size_t for_each_ancestor(const LDIF_Entry& child, const dn_path& path, Use use) const;
    size_t hash_of(const LDIF_Entry& child, const dn_path& path) const;
    std::vector<ancestor_place> places_of(const late_children& children, size_t passed,
                                          const late_children& but) const;

    hash_kind kind_ = present_hash_kind();
    size_t seed_ = hash_seed;  // where the hash of each relative DN begins
    hashed_children by_dn_;
    places_by_ancestor by_ancestor_;
    late_children late_;
    size_t next_ordinal_ = 0;
};

template <class Predicate>
const hashed_children::position* hashed_children::find(size_t hash, Predicate is_wanted) const {
    if (slots_.empty()) {
        return nullptr;
    }
    const size_t mark = mark_of(hash);
    for (size_t place = home_of(mark); slots_[place].mark != 0; place = next(place)) {
        if (slots_[place].mark == mark && is_wanted(*slots_[place].child)) {
            return &slots_[place].child;
        }
    }
    return nullptr;
}

}  // namespace cfg32
