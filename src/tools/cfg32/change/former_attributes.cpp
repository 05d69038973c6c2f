// Undoing modifications of an entry.

#include "change/former_attributes.h"

#include <iterator>
#include <utility>

namespace cfg32::tool {

namespace {

/// A list of so many values is copied at once.
constexpr size_t longest_copied = 100;

}  // namespace

void former_attributes::keep(const modification& change, bool is_last) {
    const cisString name(change.attribute);
    const bool is_addition = change.kind == modification::add;
    const bool removes_some = change.kind == modification::remove && !change.values.empty();
    // One value is removed or not.
    if ((is_last && removes_some && change.values.size() == 1) || copied_.contains(name) ||
        (is_addition && counted_.contains(name))) {
        return;
    }
    const auto found = present_.find(name);
    const bool is_there = found != present_.end();
    if (is_there && removes_some && found->values().size() > longest_copied) {
        is_complete_ = false;
        return;
    }
    former& kept = former_.emplace_back(
        former{name, is_there, is_there ? found->values().size() : 0, std::nullopt});
    if (is_there && !is_addition) {
        kept.copy = *found;
    }
    (is_there && is_addition ? counted_ : copied_).insert(name);
}

bool former_attributes::put_back() {
    if (!is_complete_) {
        return false;
    }
    for (auto kept = former_.rbegin(); kept != former_.rend(); ++kept) {
        const auto found = present_.find(kept->name);
        if (kept->is_there && !kept->copy) {
            LDIF_Values& values = found->values();
            auto added = std::next(values.begin(), static_cast<ptrdiff_t>(kept->count));
            while (added != values.end()) {
                added = values.erase(added);
            }
            continue;
        }
        if (found != present_.end()) {
            present_.erase(found);
        }
        if (kept->copy) {
            present_ += std::move(*kept->copy);
        }
    }
    return true;
}

}  // namespace cfg32::tool
