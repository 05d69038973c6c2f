#include "child_index.h"

#include <algorithm>
#include <utility>

#include "dn_path.h"

namespace cfg32 {

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

/// Calls use(hash) with the hash of each root-side part of the child's relative DN but the whole;
/// returns the hash of that.
template <class Use>
size_t child_index::for_each_ancestor(const LDIF_Entry& child, const dn_path& path, Use use) const {
    size_t hash = seed_;
    for (size_t i = child.depth(); i < path.size(); ++i) {
        if (i > child.depth()) {
            use(hash);
        }
        hash = path.hash(i, hash, kind_);
    }
    return hash;
}

size_t child_index::hash_of(const LDIF_Entry& child, const dn_path& path) const {
    return for_each_ancestor(child, path, [](size_t) {});
}

void child_index::insert(position child, const dn_path& path) {
    const size_t hash = for_each_ancestor(*child, path, [&](size_t ancestor) {
        by_ancestor_.emplace(ancestor_place(ancestor, next_ordinal_), child);
    });
    by_dn_.insert(hash, child);
    if (child->relative_size() > 1) {
        late_.emplace(&*child, late_child{next_ordinal_++, hash});
    }
}

void child_index::erase(position child) {
    const dn_path path(child->named_dn());
    const auto late = late_.find(&*child);
    const size_t hash = for_each_ancestor(*child, path, [&](size_t ancestor) {
        by_ancestor_.erase(ancestor_place(ancestor, late->second.ordinal));
    });
    by_dn_.erase(hash, *child);
    if (late != late_.end()) {
        late_.erase(late);
    }
}

child_index::position child_index::position_of(const LDIF_Entry& child) const {
    const auto is_child = [&](const LDIF_Entry& own) { return &own == &child; };
    return *by_dn_.find(hash_of(child, dn_path(child.named_dn())), is_child);
}

LDIF_Entry* child_index::equal_or_ancestor(const dn_path& dn, size_t from) const {
    size_t hash = seed_;
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
    const auto is_below = [&](const LDIF_Entry& child) {
        // Mostly it is written alike, and need not be taken apart.
        return (child.depth() == sibling.depth() &&
                child.named_dn().ends_with(sibling.named_dn())) ||
               dn_path(child.named_dn())
                   .has_equal_part(child.depth(), path, sibling.depth(), sibling.relative_size());
    };
    const size_t hash = hash_of(sibling, path);
    for (auto entry = by_ancestor_.lower_bound({hash, 0});
         entry != by_ancestor_.end() && entry->first.first == hash; ++entry) {
        if (is_below(*entry->second)) {
            found.push_back(entry->second);
        }
    }
    return found;
}

std::unique_ptr<child_index> child_index::split(const LDIF_Entry& sibling, const dn_path& path,
                                                const std::vector<position>& descendants) {
    const size_t passed = sibling.relative_size();
    std::vector<size_t> no_longer_missing;
    const auto pass = [&](size_t ancestor) { no_longer_missing.push_back(ancestor); };
    const size_t hash = for_each_ancestor(sibling, path, pass);
    pass(hash);

    std::unique_ptr<child_index> below(new child_index(kind_, hash, next_ordinal_));
    size_t moved = 0;
    for (const position child : descendants) {
        const late_child& late = late_.at(&*child);
        below->by_dn_.insert(late.hash, child);
        below->late_.emplace(&*child, late);
        moved += child->relative_size() - passed - 1;
    }
    const size_t all = by_ancestor_.size() - passed * descendants.size();
    const bool is_most = 2 * moved > all;
    const std::vector<ancestor_place> places =
        is_most ? places_of(late_, 0, below->late_) : places_of(below->late_, passed, {});

    // What needs memory is done: from here on nothing fails.
    for (const position child : descendants) {
        const late_child late = late_.at(&*child);
        for (const size_t ancestor : no_longer_missing) {
            by_ancestor_.erase({ancestor, late.ordinal});
        }
        by_dn_.erase(late.hash, *child);
        late_.erase(&*child);
        if (child->relative_size() - passed == 1) {
            below->late_.erase(&*child);
        }
    }
    if (is_most) {
        by_ancestor_.swap(below->by_ancestor_);
    }
    places_by_ancestor& from = is_most ? below->by_ancestor_ : by_ancestor_;
    places_by_ancestor& to = is_most ? by_ancestor_ : below->by_ancestor_;
    for (const ancestor_place& place : places) {
        to.insert(from.extract(place));
    }
    return below;
}

/// Where the children, but some, stand by their missing ancestors, without the first ones.
std::vector<child_index::ancestor_place> child_index::places_of(const late_children& children,
                                                                size_t passed,
                                                                const late_children& but) const {
    std::vector<ancestor_place> places;
    for (const auto& [child, late] : children) {
        if (but.count(child) != 0) {
            continue;
        }
        size_t size = 0;
        const auto add = [&, ordinal = late.ordinal](size_t ancestor) {
            if (++size > passed) {
                places.emplace_back(ancestor, ordinal);
            }
        };
        for_each_ancestor(*child, dn_path(child->named_dn()), add);
    }
    return places;
}

}  // namespace cfg32
