// The entries of a file that is checked, put together as a load does it.

#include "check/checked_entries.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "check/dn_findings.h"
#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

const cisString configuration_dn = "cn=Configuration";

std::string in_quotes(const std::string& text) { return "\"" + text + "\""; }

/// " on line 3", where the line is known.
std::string on_line(int line) { return line > 0 ? fmt::format(" on line {}", line) : ""; }

}  // namespace

void checked_entries::add(entry_section& section, LDIF_Attribute&& attribute, int line,
                          bool is_told) {
    const auto known = section.attributes.find(attribute.name());
    if (known == section.attributes.end()) {
        value_lines_[attribute.values().texts().front().view().data()] = line;
        section.attributes.emplace(attribute.name(), std::move(attribute));
        return;
    }
    LDIF_Attribute& present = known->second;
    const size_t before = present.values().size();
    present += attribute;
    if (present.values().size() > before) {
        value_lines_[present.values().texts().back().view().data()] = line;
        if (is_told) {
            report_second_value(present, line, section.written);
        }
    } else if (is_told) {
        // Read again, as the load does it: the text of a DN may be that of another one.
        const LDIF_Value first = *present.values().find(attribute.values().begin()->str());
        problem& found = found_.add(kind::duplicate_value, file_.value_place(line),
                                    "value stands twice, the first one" + on_line(line_of(first)) +
                                        "; the next rewrite drops this one");
        found.entry = section.written;
        found.attribute = attribute.name().text();
        found.other_line = line_of(first);
    }
}

void checked_entries::report_second_value(const LDIF_Attribute& attribute, int line,
                                          const shared_text& entry) {
    if (!attribute.values().type()->isSingle || attribute.values().size() < 2) {
        return;
    }
    const std::string& name = attribute.name().text();
    problem& found =
        found_.add(kind::second_value, file_.value_place(line),
                   fmt::format("another value of {}, which takes only one; the first one stands{}",
                               name, on_line(line_of(*attribute.values().begin()))));
    found.other_line = line_of(*attribute.values().begin());
    found.entry = entry;
    found.attribute = name;
    found.accepted = "one value";
}

int checked_entries::line_of(const LDIF_Value& value) const {
    const auto known = value_lines_.find(value.text.view().data());
    return known == value_lines_.end() ? 0 : known->second;
}

checked_entries::checked_entry* checked_entries::find(const LDIF_DN& dn) {
    return find(dn, dn.hash());
}

checked_entries::checked_entry* checked_entries::find(const LDIF_DN& dn, size_t hash) {
    const auto [first, last] = by_dn_.equal_range(hash);
    const auto same =
        std::find_if(first, last, [&](const auto& row) { return row.second->dn() == dn; });
    return same == last ? nullptr : same->second;
}

void checked_entries::add_header(LDIF_Attribute&& attribute, int line) {
    entry_section header;
    value_lines_[attribute.values().texts().front().view().data()] = line;
    header.attributes.emplace(attribute.name(), std::move(attribute));
    close(std::move(header));
}

void checked_entries::close(entry_section&& section) {
    if (!section.is_left_out) {
        if (checked_entry* known = find(section.dn)) {
            merge(*known, section);
        } else {
            entries_.push_back({section.written,
                                section.where,
                                std::move(section.attributes),
                                {{section.where, section.first, section.last}}});
            by_dn_.emplace(section.dn.hash(), &entries_.back());
        }
    }
    is_rewritten_ |= section.has_kept_line && !section.is_left_out;
    for (problem* each : section.stopping) {
        each->first_left_out = section.first;
        each->last_left_out = section.last;
    }
}

void checked_entries::merge(checked_entry& known, entry_section& section) {
    const bool is_entry = !section.dn.empty();
    try {
        for (auto& [name, attribute] : section.attributes) {
            const auto same = known.attributes.find(name);
            if (same == known.attributes.end()) {
                known.attributes.emplace(name, std::move(attribute));
            } else {
                merge(same->second, attribute, section);
            }
        }
    } catch (const LDIF_Exception& e) {
        problem& found =
            found_.add(kind::unmergeable_entry, section.where,
                       fmt::format("entry stands twice, the first one on line {}, and the values "
                                   "of {} can't be compared{}",
                                   known.sections.front().first, e.attribute,
                                   is_password_attribute(e.attribute) ? " without the key" : ""));
        found.entry = section.written;
        found.attribute = e.attribute;
        found.other_line = known.sections.front().first;
        take_codes(found, e);
        section.stopping.push_back(&found);
        section.is_left_out = true;
        return;
    }
    known.sections.push_back({section.where, section.first, section.last});
    if (is_entry) {
        const int first = known.sections.front().first;
        problem& found = found_.add(kind::duplicate_entry, section.where,
                                    fmt::format("entry stands twice, the first one on line {}; "
                                                "the next rewrite merges them",
                                                first));
        found.entry = section.written;
        found.other_line = first;
    }
}

/// Values that both sections have are not worth a word: the entry stands twice. As in a load, each
/// value is read again from its text.
void checked_entries::merge(LDIF_Attribute& known, const LDIF_Attribute& again,
                            const entry_section& section) {
    for (const LDIF_Value& value : again.values()) {
        const size_t before = known.values().size();
        known.values() += value;
        if (known.values().size() > before) {
            value_lines_[known.values().texts().back().view().data()] = line_of(value);
            if (line_of(value) > 0) {
                report_second_value(known, line_of(value), section.written);
            }
        }
    }
}

void checked_entries::finish() {
    for (const checked_entry& entry : entries_) {
        const LDIF_DN dn = entry.dn();
        check_ancestors(entry, dn);
        check_writing(entry, dn);
    }
    if (!find(LDIF_DN(configuration_dn))) {
        const int last = std::max(file_.line_count(), 1);
        found_.add(kind::missing_configuration, {last, 1, 1},
                   "no entry \"cn=Configuration\": nobody can bind as administrator");
    }
}

/// Below the nearest ancestor that is there, the others are missing. Where none is there, the entry
/// is the topmost of its tree.
void checked_entries::check_ancestors(const checked_entry& entry, const LDIF_DN& dn) {
    constexpr int named = 3;
    std::string missing;
    int count = 0;
    std::vector<size_t> hashes;  // of the ancestors from the root down, and of the DN
    for (const LDIF_RDN& rdn : dn.rdns()) {
        hashes.push_back(rdn.hash(hashes.empty() ? hash_seed : hashes.back()));
    }
    LDIF_DN ancestor = dn;
    while (ancestor.rdns().size() > 1) {
        ancestor.remove_leaf();
        if (find(ancestor, hashes[ancestor.rdns().size() - 1])) {
            break;
        }
        if (++count <= named) {
            missing.append(missing.empty() ? "" : " and ").append(in_quotes(shown(ancestor)));
        }
        if (ancestor.rdns().size() == 1) {
            return;
        }
    }
    if (count > named) {
        missing += fmt::format(" and {} more", count - named);
    }
    if (count > 0) {
        found_.add(kind::missing_ancestor, entry.where, "no entry " + missing + " above this one")
            .entry = entry.written;
    }
}

/// A rewrite fails for the whole file when one entry would not read back.
void checked_entries::check_writing(const checked_entry& entry, const LDIF_DN& dn) {
    const std::string reason = why_unwritable(entry, dn);
    if (reason.empty()) {
        return;
    }
    for (const auto& [where, first, last] : entry.sections) {
        if (first == 0) {
            continue;  // version and charset
        }
        if (!is_rewritten_ && dn.empty()) {
            return;  // said of its DN line
        }
        problem& found =
            is_rewritten_
                ? found_.add(kind::blocked_repair, where,
                             "unusable lines are to be kept aside, but this entry can't be "
                             "written: " +
                                 reason)
                : found_.add(kind::unwritable_entry, where,
                             "no change of the file can be made, because this entry can't be "
                             "written: " +
                                 reason);
        found.entry = entry.written;
        found.first_left_out = first;
        found.last_left_out = last;
    }
}

std::string checked_entries::why_unwritable(const checked_entry& entry, const LDIF_DN& dn) const {
    if (is_unprintable(dn)) {
        return "a value of its DN is empty, or has a line break";
    }
    for (const auto& [name, attribute] : entry.attributes) {
        const bool is_header = is_of_root(attribute) && attribute.values().size() <= 1;
        if (dn.empty() && !is_header) {
            return fmt::format("it has no DN, but the attribute {}", attribute.name().text());
        }
        std::string reason = why_unwritable(attribute);
        if (!reason.empty()) {
            return reason;
        }
    }
    return {};
}

std::string checked_entries::why_unwritable(const LDIF_Attribute& attribute) const {
    const std::string& name = attribute.name().text();
    // After a comment such a line is no continuation, after another value it is.
    if (attribute.values().size() > 1 && without_leading_space(name).size() < name.size()) {
        return fmt::format("the name \"{}\" begins with a blank and has several values",
                           shown_line(name));
    }
    const bool is_dn = attribute.values().type()->fromStr == dnFromStr;
    for (const LDIF_Value& value : attribute.values()) {
        if (is_dn && breaks_line(value.text)) {
            return fmt::format("a value of {}{} has a line break", name, on_line(line_of(value)));
        }
    }
    return {};
}

}  // namespace cfg32::tool
