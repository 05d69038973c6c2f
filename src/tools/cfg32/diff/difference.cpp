// Comparing two trees.

#include "diff/difference.h"

#include <algorithm>
#include <functional>
#include <unordered_set>

#include "LDIF_AttrType.h"
#include "LDIF_Exception.h"
#include "change/ldif_lines.h"

namespace cfg32::tool {

namespace {

using change_list = std::vector<entry_difference>;

std::string text_of(const kept_dn& dn) {
    std::string text;
    dn.append_to(text);
    return text;
}

/// The entry of that name in the other tree, null if it has none.
const LDIF_Entry* counterpart_of(const LDIF_Entry& entry, const LDIF_Entry& other) {
    return other.find(dn_path(entry.named_dn()));
}

bool has_text(const LDIF_Values& values, const LDIF_Value& wanted) {
    return std::any_of(values.begin(), values.end(),
                       [&](const LDIF_Value& each) { return each.str() == wanted.str(); });
}

/// By the attribute's comparison; a password that can't be decoded is compared as it is stored.
bool has(const LDIF_Values& values, const LDIF_Value& wanted) {
    try {
        return values.find(wanted) != values.end();
    } catch (const LDIF_Exception&) {
        return has_text(values, wanted);
    }
}

std::vector<std::string> values_missing_in(const LDIF_Values& searched, const LDIF_Values& wanted) {
    std::vector<std::string> missing;
    for (const LDIF_Value& value : wanted) {
        if (!has(searched, value)) {
            missing.push_back(value.str());
        }
    }
    return missing;
}

/// The attribute's values in an entry, none when it has it not.
const LDIF_Values& values_of(const LDIF_Entry& node, const cisString& name) {
    static const LDIF_Values none({}, nullptr);
    const auto found = node.attributes().find(name);
    return found == node.attributes().end() ? none : found->values();
}

std::vector<attribute_difference> attribute_differences(const LDIF_Entry& from,
                                                        const LDIF_Entry& to) {
    std::vector<attribute_difference> found;
    const auto compare = [&](const LDIF_Attribute& named) {
        const LDIF_Values& before = values_of(from, named.name());
        const LDIF_Values& after = values_of(to, named.name());
        attribute_difference difference{named.name().text(), values_missing_in(after, before),
                                        values_missing_in(before, after)};
        if (!difference.removed.empty() || !difference.added.empty()) {
            found.push_back(std::move(difference));
        }
    };
    for (const LDIF_Attribute& each : from.attributes()) {
        compare(each);
    }
    for (const LDIF_Attribute& each : to.attributes()) {
        if (from.attributes().find(each.name()) == from.attributes().end()) {
            compare(each);
        }
    }
    return found;
}

/// Finds the differences; which entries count as being in both trees can be narrowed.
change_list compare(const LDIF_Entry& from, const LDIF_Entry& to,
                    const std::function<bool(const LDIF_Entry&)>& may_stay) {
    const LDIF_Entry nothing;
    change_list removed;
    change_list changed;
    change_list added;
    const auto append = [](change_list& list, entry_difference::kind kind, const LDIF_Entry& node,
                           std::vector<attribute_difference> attributes) {
        list.push_back({kind, &node, std::move(attributes)});
    };
    for_each_in_preorder(from, [&](const LDIF_Entry& node) {
        const LDIF_Entry* counterpart = may_stay(node) ? counterpart_of(node, to) : nullptr;
        auto attributes = attribute_differences(node, counterpart ? *counterpart : nothing);
        if (!counterpart) {
            append(removed, entry_difference::removed, node, std::move(attributes));
        } else if (!attributes.empty()) {
            append(changed, entry_difference::changed, node, std::move(attributes));
        }
    });
    for_each_in_preorder(to, [&](const LDIF_Entry& node) {
        const LDIF_Entry* counterpart = counterpart_of(node, from);
        if (!counterpart || !may_stay(*counterpart)) {
            append(added, entry_difference::added, node, attribute_differences(nothing, node));
        }
    });
    std::reverse(removed.begin(), removed.end());
    removed.insert(removed.end(), std::make_move_iterator(changed.begin()),
                   std::make_move_iterator(changed.end()));
    removed.insert(removed.end(), std::make_move_iterator(added.begin()),
                   std::make_move_iterator(added.end()));
    return removed;
}

/// An attribute's values are replaced where they are one, or all change, or are passwords: two
/// encoded forms of a password have nothing in common.
std::vector<modification> modifications_for(const attribute_difference& difference,
                                            const LDIF_Entry& to) {
    const LDIF_Values& after = values_of(to, cisString(difference.name));
    const _AttrType& type = *after.type();
    if (after.empty()) {
        return {{modification::remove, difference.name, {}, 0}};
    }
    if (type.isSingle || type.fromStr == pwFromStr || difference.added.size() == after.size()) {
        std::vector<std::string> values;
        for (const LDIF_Value& value : after) {
            values.push_back(value.str());
        }
        return {{modification::replace, difference.name, std::move(values), 0}};
    }
    std::vector<modification> changes;
    if (!difference.removed.empty()) {
        changes.push_back({modification::remove, difference.name, difference.removed, 0});
    }
    if (!difference.added.empty()) {
        changes.push_back({modification::add, difference.name, difference.added, 0});
    }
    return changes;
}

change_record record_of(const entry_difference& difference, const LDIF_Entry& to) {
    change_record record;
    record.dn = text_of(difference.entry->named_dn());
    switch (difference.change) {
        case entry_difference::removed:
            record.kind = change_record::remove;
            return record;
        case entry_difference::added:
            record.kind = change_record::add;
            for (const attribute_difference& each : difference.attributes) {
                record.modifications.push_back({modification::add, each.name, each.added, 0});
            }
            return record;
        case entry_difference::changed:
            break;
    }
    for (const attribute_difference& each : difference.attributes) {
        for (modification& change :
             modifications_for(each, *counterpart_of(*difference.entry, to))) {
            record.modifications.push_back(std::move(change));
        }
    }
    return record;
}

bool is_read_as_another(const std::string& dn) { return LDIF_DN(cisString(dn)).str() != dn; }

std::string unspeakable_name(const attribute_difference& attribute) {
    if (!is_attribute_name(attribute.name)) {
        return attribute.name;
    }
    if (getAttrType(attribute.name.c_str())->fromStr != dnFromStr) {
        return {};
    }
    for (const auto* values : {&attribute.removed, &attribute.added}) {
        const auto found = std::find_if(values->begin(), values->end(), is_read_as_another);
        if (found != values->end()) {
            return *found;
        }
    }
    return {};
}

}  // namespace

std::vector<entry_difference> differences(const LDIF_Entry& from, const LDIF_Entry& to) {
    return compare(from, to, [](const LDIF_Entry&) { return true; });
}

std::string unspeakable_name(const std::vector<entry_difference>& found) {
    for (const entry_difference& each : found) {
        std::string dn = text_of(each.entry->named_dn());
        if (is_read_as_another(dn)) {
            return dn;
        }
        for (const attribute_difference& attribute : each.attributes) {
            std::string name = unspeakable_name(attribute);
            if (!name.empty()) {
                return name;
            }
        }
    }
    return {};
}

std::vector<change_record> changes_between(const LDIF_Entry& from, const LDIF_Entry& to) {
    // From the root down, because whatever is below one that goes goes with it.
    std::unordered_set<const LDIF_Entry*> staying = {&from};
    for_each_in_preorder(from, [&](const LDIF_Entry& node) {
        for (const LDIF_Entry& child : node.children()) {
            if (staying.count(&node) != 0 && counterpart_of(child, to)) {
                staying.insert(&child);
            }
        }
    });
    const auto may_stay = [&](const LDIF_Entry& node) { return staying.count(&node) != 0; };
    std::vector<change_record> records;
    for (const entry_difference& each : compare(from, to, may_stay)) {
        records.push_back(record_of(each, to));
    }
    return records;
}

}  // namespace cfg32::tool
