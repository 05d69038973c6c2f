// Carrying out change records on a loaded configuration.

#include "change/record_changes.h"

#include <algorithm>
#include <deque>
#include <span>

#include "LDIF_File.h"
#include "cfg32.h"
#include "change/former_attributes.h"
#include "failure.h"
#include "outcome.h"
#include "password.h"

namespace cfg32::tool {

namespace {

constexpr failure no_entry{32, 32, "Entry not found"};
constexpr failure entry_is_there{68, 68, "The entry is there already"};
constexpr failure has_children{66, 66, "Entries stand below it: -r deletes them as well"};
constexpr failure no_dn{34, 34, "The lines above all entries can only be modified"};

/// The line of what a failure tells of: a value, an attribute, or the whole record.
int line_of(const change_record& record, const LDIF_Exception& e) {
    int line = record.line;
    for (const modification& change : record.modifications) {
        if (cisString(change.attribute) != cisString(e.attribute)) {
            continue;
        }
        const auto value = std::find(change.values.begin(), change.values.end(), e.value);
        const auto number = static_cast<size_t>(value - change.values.begin());
        if (number < change.value_lines.size()) {
            return change.value_lines[number];
        }
        line = line == record.line ? change.line : line;
    }
    return line;
}

/// Runs body; what the library refuses is told with its line. is_half_done: what body says of it.
template <class Body>
auto with_place(const record_source& source, const change_record& record, Body body,
                const bool& is_half_done = false) {
    try {
        return body();
    } catch (const LDIF_Exception& e) {
        LDIF_Exception placed(e);
        placed.configLine = source.text.empty() ? 0 : line_of(record, e);
        if (placed.entryDn.empty()) {
            placed.entryDn = record.dn;
        }
        throw refused_record{
            report(placed, source.text.empty() ? source.configuration : source.text),
            is_half_done || e.sysErrno != 0};
    }
}

LDIF_DN dn_of(const change_record& record) {
    LDIF_DN dn{cisString(record.dn)};
    if (dn.empty() && record.kind != change_record::modify) {
        raise(no_dn);
    }
    return dn;
}

/// Lets the attribute's syntax judge a value.
void check_value(const std::string& attribute, const std::string& value, aes_key_data* key) {
    const _AttrType* type = getAttrType(attribute.c_str());
    with_context([&] { LDIF_Value(type, value, key); },
                 [&](LDIF_Exception& e) {
                     e.attribute = attribute;
                     e.attrType = type;
                 });
}

int library_operation(modification::operation kind) {
    return kind == modification::add      ? LDAP_MOD_ADD
           : kind == modification::remove ? LDAP_MOD_DELETE
                                          : LDAP_MOD_REPLACE;
}

/// Modifications in the form that the library takes. The texts stay the record's: none of them, and
/// so no password, is copied.
class library_changes {
  public:
    explicit library_changes(std::span<const modification> changes) {
        for (const modification& change : changes) {
            add(change);
        }
    }
    library_changes(const library_changes&) = delete;
    library_changes& operator=(const library_changes&) = delete;

    ldapmod** records() { return records_.data(); }

  private:
    void add(const modification& change) {
        std::vector<char*>& values = values_.emplace_back();
        for (const std::string& value : change.values) {
            values.push_back(const_cast<char*>(value.c_str()));
        }
        values.push_back(nullptr);
        ldapmod& record = owned_.emplace_back();
        record.mod_op = library_operation(change.kind);
        record.mod_type = const_cast<char*>(change.attribute.c_str());
        record.mod_values = values.data();
        records_.back() = &record;
        records_.push_back(nullptr);
    }

    std::deque<std::vector<char*>> values_;
    std::deque<ldapmod> owned_;
    std::vector<ldapmod*> records_ = {nullptr};
};

/// How a password is stored: its tag. A masked one that is now to be encrypted is another.
std::string scheme_of(const std::string& stored) {
    const std::string encoded = stored.empty() ? stored : decoder_input(stored);
    return encoded.substr(0, encoded.find('}'));
}

/// Compares what is stored, or passwords by what they decode to. What can't be decoded differs.
bool is_same_value(const LDIF_Value& present, const LDIF_Value& given) {
    if (present.str() == given.str()) {
        return true;
    }
    if (present.attrType->fromStr != pwFromStr ||
        cisString(scheme_of(present.str())) != scheme_of(given.str())) {
        return false;
    }
    try {
        return present.compare(given) == 0;
    } catch (const LDIF_Exception&) {
        return false;
    }
}

/// The library's own search. What it says of passwords that can't be decoded is for the change
/// itself to tell.
bool has_value(const LDIF_Values& present, const std::string& value, bool if_unknown) {
    try {
        return present.find(value) != present.end();
    } catch (const LDIF_Exception&) {
        return if_unknown;
    }
}

bool is_replaced_by_itself(const LDIF_Values& present, const modification& change,
                           aes_key_data* key) {
    LDIF_Values given(change.attribute, key);
    for (const std::string& value : change.values) {
        given += value;
    }
    return std::equal(present.begin(), present.end(), given.begin(), given.end(), is_same_value);
}

/// Tells whether the modification would change the entry. may_be_gone: an attribute to remove that
/// is not there needs nothing; else the library refuses that.
bool is_needed(const LDIF_Entry& entry, const modification& change, bool may_be_gone,
               aes_key_data* key) {
    const auto found = entry.attributes().find(cisString(change.attribute));
    const bool is_there = found != entry.attributes().end();
    const auto is_present = [&](const std::string& value) {
        return is_there && has_value(found->values(), value, change.kind == modification::remove);
    };
    const auto& values = change.values;
    switch (change.kind) {
        case modification::add:
            return !std::all_of(values.begin(), values.end(), is_present);
        case modification::remove:
            return is_there
                       ? values.empty() || std::any_of(values.begin(), values.end(), is_present)
                       : !may_be_gone;
        case modification::replace:
            break;
    }
    return is_there ? values.empty() || !is_replaced_by_itself(found->values(), change, key)
                    : !values.empty();
}

/// Carries out the modifications that are needed: all of them or, unless is_half_done is set, none.
bool modify(LDIF_File& file, const LDIF_DN& dn, const change_record& record,
            const update_options& how, aes_key_data* key, bool& is_half_done) {
    const LDIF_Entry* entry = file.root().find(dn);
    if (!entry) {
        raise(no_entry);
    }
    // The tree is not constant; it is only not given away.
    former_attributes former(const_cast<LDIF_Entry&>(*entry).attributes());
    bool is_changed = false;
    try {
        for (const modification& change : record.modifications) {
            if (is_needed(*entry, change, how.may_be_gone, key)) {
                if (how.goes_on) {
                    former.keep(change, &change == &record.modifications.back());
                }
                file.modify(dn, library_changes({&change, 1}).records());
                is_changed = true;
            }
        }
    } catch (const LDIF_Exception&) {
        is_half_done = !how.goes_on || !former.put_back();
        throw;
    }
    return is_changed;
}

/// Adds the entry, or what it lacks to the one that is there.
bool add(LDIF_File& file, const LDIF_DN& dn, const change_record& record, bool merges,
         aes_key_data* key) {
    const LDIF_Entry* entry = file.root().find(dn);
    if (entry && !merges) {
        raise(entry_is_there);
    }
    const auto is_lacking = [&](const modification& change) {
        return is_needed(*entry, change, true, key);
    };
    const auto& changes = record.modifications;
    if (entry && std::none_of(changes.begin(), changes.end(), is_lacking)) {
        return false;
    }
    file.add(dn, library_changes(changes).records());
    return true;
}

bool erase(LDIF_File& file, const LDIF_DN& dn, bool deletes_trees) {
    const LDIF_Entry* entry = file.root().find(dn);
    if (entry && !entry->children().empty() && !deletes_trees) {
        raise(has_children);
    }
    file.erase(dn, deletes_trees);
    return true;
}

}  // namespace

void check_record(const change_record& record, const record_source& source, aes_key_data* key) {
    with_place(source, record, [&] {
        dn_of(record);
        for (const modification& change : record.modifications) {
            for (const std::string& value : change.values) {
                check_value(change.attribute, value, key);
            }
        }
    });
}

bool carry_out(LDIF_File& file, const change_record& record, const update_options& how,
               const record_source& source, aes_key_data* key) {
    bool is_half_done = false;
    const auto body = [&] {
        const LDIF_DN dn = dn_of(record);
        switch (record.kind) {
            case change_record::add:
                return add(file, dn, record, how.merges, key);
            case change_record::modify:
                return modify(file, dn, record, how, key, is_half_done);
            case change_record::remove:
                break;
        }
        return erase(file, dn, how.deletes_trees);
    };
    return with_place(source, record, body, is_half_done);
}

}  // namespace cfg32::tool
