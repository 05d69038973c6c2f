#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <unordered_map>
#include <utility>
#include <vector>

#include "LDIF_Entry.h"

namespace cfg32 {

/// Finds an entry's children by relative DN, so that a wide tree costs no more than a narrow one.
///
/// No two siblings are equal and none is another's ancestor, so at most one child can be equal to a
/// given DN or an ancestor of it; it is found by looking up the DN's root-side parts. Children that
/// have ancestors missing (relative DNs of more than one RDN) are also kept by their root-side
/// parts, so that they are found when such an ancestor turns up.
class child_index {
  public:
    using position = LDIF_Entry::list::iterator;

    /// Enters a child under its relative DN, as the last in order.
    void insert(position child);
    void erase(position child);

    /// Where a child that was entered stands.
    position position_of(const LDIF_Entry& child) const;

    /// The child whose relative DN equals dn, or is an ancestor of it, when the first `from` RDNs
    /// of dn are left out; null for none.
    LDIF_Entry* equal_or_ancestor(const LDIF_DN& dn, size_t from) const;

    /// The children that are descendants of an entry that is to be their sibling, in order.
    std::vector<position> descendants(const LDIF_Entry& sibling) const;

  private:
    struct numbered_child {
        position child;
        uint64_t order;
    };
    using dn_map = std::unordered_multimap<size_t, numbered_child>;

    dn_map::const_iterator entry_of(const LDIF_Entry& child) const;

    // Of children below the same missing ancestor the order tells which came first.
    using hash_and_order = std::pair<size_t, uint64_t>;

    dn_map by_dn_;
    std::map<hash_and_order, position> by_ancestor_;
    uint64_t next_order_ = 0;
};

}  // namespace cfg32
