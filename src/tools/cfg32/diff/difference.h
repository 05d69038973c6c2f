#pragma once

// What differs between two configurations, entry by entry and value by value. Their order and the
// comments make no difference, nor does what an attribute's own comparison takes for equal.

#include <string>
#include <vector>

#include "LDIF_Entry.h"
#include "change/change_record.h"

namespace cfg32::tool {

struct attribute_difference {
    std::string name;
    std::vector<std::string> removed;  ///< values, as stored
    std::vector<std::string> added;
};

struct entry_difference {
    enum kind { added, removed, changed };

    kind change;
    const LDIF_Entry* entry;  ///< where it is; of the former tree, unless it was added
    std::vector<attribute_difference> attributes;
};

/// What makes one tree out of the other: removed entries with their content, each after those below
/// it; then changed ones; then new ones, each before those below it. They point into the trees.
std::vector<entry_difference> differences(const LDIF_Entry& from, const LDIF_Entry& to);

/// What of the differences no change record can say, because its name would be read as another: the
/// first such name, or nothing.
std::string unspeakable_name(const std::vector<entry_difference>& found);

/// The same as changes that can be carried out. An entry that stays below one that goes is removed
/// with it and added again.
std::vector<change_record> changes_between(const LDIF_Entry& from, const LDIF_Entry& to);

}  // namespace cfg32::tool
