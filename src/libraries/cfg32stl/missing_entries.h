#pragma once

#include <cstddef>
#include <functional>
#include <list>
#include <set>
#include <string>

#include "LDIF_DN.h"

class LDIF_Entry;

namespace cfg32 {

/// The DNs that a tree lacks between its entries, each once, in the order of DNs. One entry may
/// lack thousands above it: they share the entry's DN.
class missing_entries {
  public:
    missing_entries() = default;
    missing_entries(const missing_entries&) = delete;
    missing_entries(missing_entries&&) noexcept = default;
    missing_entries& operator=(const missing_entries&) = delete;
    missing_entries& operator=(missing_entries&&) noexcept = default;
    ~missing_entries() = default;

    /// Adds what is missing between an entry and its parent in the tree.
    void add_above(const LDIF_Entry& entry);

    bool empty() const { return found_.empty(); }

    /// Calls use(text) with the printed form of each.
    void for_each(const std::function<void(const std::string&)>& use) const;

    void copy_to(std::set<LDIF_DN>& dns) const;

  private:
    /// What so many RDNs of a DN name, counted from the root.
    struct ancestor {
        const LDIF_DN* of;
        size_t size;

        bool operator<(const ancestor& other) const;
    };

    std::list<LDIF_DN> below_;  // what the others are ancestors of
    std::set<ancestor> found_;
};

}  // namespace cfg32
