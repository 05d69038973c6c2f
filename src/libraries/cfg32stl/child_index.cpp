#include "child_index.h"

#include <algorithm>

namespace cfg32 {

namespace {

/// True when the child's relative DN begins with the RDNs of dn from `from` to `to`.
bool begins_with(const LDIF_Entry& child, const LDIF_DN& dn, size_t from, size_t to) {
    const auto part = dn.rdns().begin();
    const auto relative = child.dn().rdns().begin() + static_cast<ptrdiff_t>(child.depth());
    const auto equal = [](const LDIF_RDN& l, const LDIF_RDN& r) { return l == r; };
    return child.relative_size() >= to - from &&
           std::equal(part + static_cast<ptrdiff_t>(from), part + static_cast<ptrdiff_t>(to),
                      relative, equal);
}

/// Calls use(hash) with the hash of each root-side part of the child's relative DN but the whole.
template <class Use>
void for_each_ancestor(const LDIF_Entry& child, Use use) {
    const std::vector<LDIF_RDN>& rdns = child.dn().rdns();
    size_t hash = 0;
    for (size_t i = child.depth(); i + 1 < rdns.size(); ++i) {
        hash = rdns[i].hash(hash);
        use(hash);
    }
}

/// The hash of the child's relative DN.
size_t hash_of(const LDIF_Entry& child) {
    const std::vector<LDIF_RDN>& rdns = child.dn().rdns();
    size_t hash = 0;
    for (size_t i = child.depth(); i < rdns.size(); ++i) {
        hash = rdns[i].hash(hash);
    }
    return hash;
}

}  // namespace

void child_index::insert(position child) {
    const uint64_t order = next_order_++;
    by_dn_.emplace(hash_of(*child), numbered_child{child, order});
    for_each_ancestor(*child, [&](size_t hash) { by_ancestor_[{hash, order}] = child; });
}

void child_index::erase(position child) {
    const auto entry = entry_of(*child);
    const uint64_t order = entry->second.order;
    by_dn_.erase(entry);
    for_each_ancestor(*child, [&](size_t hash) { by_ancestor_.erase({hash, order}); });
}

child_index::position child_index::position_of(const LDIF_Entry& child) const {
    return entry_of(child)->second.child;
}

child_index::dn_map::const_iterator child_index::entry_of(const LDIF_Entry& child) const {
    const auto [first, last] = by_dn_.equal_range(hash_of(child));
    return std::find_if(first, last,
                        [&](const auto& entry) { return &*entry.second.child == &child; });
}

LDIF_Entry* child_index::equal_or_ancestor(const LDIF_DN& dn, size_t from) const {
    size_t hash = 0;
    for (size_t to = from + 1; to <= dn.rdns().size(); ++to) {
        hash = dn.rdns()[to - 1].hash(hash);
        const auto [first, last] = by_dn_.equal_range(hash);
        for (auto entry = first; entry != last; ++entry) {
            const position child = entry->second.child;
            if (child->relative_size() == to - from && begins_with(*child, dn, from, to)) {
                return &*child;
            }
        }
    }
    return nullptr;
}

std::vector<child_index::position> child_index::descendants(const LDIF_Entry& sibling) const {
    std::vector<position> found;
    if (by_ancestor_.empty()) {
        return found;
    }
    const size_t hash = hash_of(sibling);
    for (auto entry = by_ancestor_.lower_bound({hash, 0});
         entry != by_ancestor_.end() && entry->first.first == hash; ++entry) {
        if (begins_with(*entry->second, sibling.dn(), sibling.depth(),
                        sibling.dn().rdns().size())) {
            found.push_back(entry->second);
        }
    }
    return found;
}

}  // namespace cfg32
