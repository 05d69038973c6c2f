#include "child_index.h"

#include <algorithm>
#include <utility>

#include "dn_path.h"

namespace cfg32 {

namespace {

/// Calls use(hash) with the hash of each root-side part of the child's relative DN but the whole;
/// returns the hash of that.
template <class Use>
size_t for_each_ancestor(const LDIF_Entry& child, const dn_path& path, hash_kind kind, Use use) {
    size_t hash = 0;
    for (size_t i = child.depth(); i < path.size(); ++i) {
        if (i > child.depth()) {
            use(hash);
        }
        hash = path.hash(i, hash, kind);
    }
    return hash;
}

size_t hash_of(const LDIF_Entry& child, const dn_path& path, hash_kind kind) {
    return for_each_ancestor(child, path, kind, [](size_t) {});
}

}  // namespace

void hashed_children::insert(size_t hash, position child) {
    if (3 * slots_.size() <= 4 * count_) {
        grow();
    }
    put({mark_of(hash), child});
    ++count_;
}

void hashed_children::put(const slot& taken) {
    size_t place = home_of(taken.mark);
    while (slots_[place].mark != 0) {
        place = next(place);
    }
    slots_[place] = taken;
}

void hashed_children::grow() {
    const std::vector<slot> before =
        std::exchange(slots_, std::vector<slot>(std::max<size_t>(4, 2 * slots_.size())));
    for (const slot& each : before) {
        if (each.mark != 0) {
            put(each);
        }
    }
}

void hashed_children::erase(size_t hash, const LDIF_Entry& child) {
    const auto is_child = [&](const LDIF_Entry& own) { return &own == &child; };
    size_t free = home_of(mark_of(hash));
    while (slots_[free].mark != mark_of(hash) || !is_child(*slots_[free].child)) {
        free = next(free);
    }
    // What was put behind it for want of room moves up.
    for (size_t place = next(free); slots_[place].mark != 0; place = next(place)) {
        const auto distance = [&](size_t from) { return (place - from) & (slots_.size() - 1); };
        if (distance(home_of(slots_[place].mark)) >= distance(free)) {
            slots_[free] = slots_[place];
            free = place;
        }
    }
    slots_[free].mark = 0;
    --count_;
}

void child_index::insert(position child, const dn_path& path) {
    const size_t hash = for_each_ancestor(*child, path, kind_, [&](size_t ancestor) {
        by_ancestor_.emplace(ancestor_place(ancestor, next_ordinal_), child);
    });
    by_dn_.insert(hash, child);
    if (child->relative_size() > 1) {
        ordinals_.emplace(&*child, next_ordinal_++);
    }
}

void child_index::erase(position child) {
    const dn_path path(child->named_dn());
    const auto ordinal = ordinals_.find(&*child);
    const size_t hash = for_each_ancestor(*child, path, kind_, [&](size_t ancestor) {
        by_ancestor_.erase(ancestor_place(ancestor, ordinal->second));
    });
    by_dn_.erase(hash, *child);
    if (ordinal != ordinals_.end()) {
        ordinals_.erase(ordinal);
    }
}

child_index::position child_index::position_of(const LDIF_Entry& child) const {
    const auto is_child = [&](const LDIF_Entry& own) { return &own == &child; };
    return *by_dn_.find(hash_of(child, dn_path(child.named_dn()), kind_), is_child);
}

LDIF_Entry* child_index::equal_or_ancestor(const dn_path& dn, size_t from) const {
    size_t hash = 0;
    for (size_t to = from + 1; to <= dn.size(); ++to) {
        hash = dn.hash(to - 1, hash, kind_);
        const auto is_wanted = [&](const LDIF_Entry& child) {
            return dn.is_relative_dn(from, to, child);
        };
        if (const position* found = by_dn_.find(hash, is_wanted)) {
            return &**found;
        }
    }
    return nullptr;
}

std::vector<child_index::position> child_index::descendants(const LDIF_Entry& sibling,
                                                            const dn_path& path) const {
    std::vector<position> found;
    if (by_ancestor_.empty()) {
        return found;
    }
    const size_t hash = hash_of(sibling, path, kind_);
    for (auto entry = by_ancestor_.lower_bound({hash, 0});
         entry != by_ancestor_.end() && entry->first.first == hash; ++entry) {
        const LDIF_Entry& child = *entry->second;
        if (dn_path(child.named_dn())
                .has_equal_part(child.depth(), path, sibling.depth(), sibling.relative_size())) {
            found.push_back(entry->second);
        }
    }
    return found;
}

}  // namespace cfg32
