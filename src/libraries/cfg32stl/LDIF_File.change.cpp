// Changing the store.

#include <cerrno>
#include <iterator>
#include <string>
#include <vector>

#include "LDIF_File.h"
#include "LDIF_Line.h"
#include "LDIF_Util.h"
#include "cfg32.h"
#include "cfg32_platform.h"
#include "failure.h"
#include "line_source.h"

using namespace cfg32;

namespace {

constexpr failure no_entry{32, 32, "Entry not found"};
constexpr failure no_attribute{16, 16, "Target attribute of MOD_DELETE not found"};
constexpr failure unknown_operation{89, 1010, ""};
constexpr failure second_value{19, 1006, "Attribute may not have multiple values."};
constexpr failure not_readable{21, 1005, "Attribute would not read back as it is written"};
constexpr failure not_a_leaf{66, 66, "Use CFG_OPT_DELETE_NON_LEAVES to enable subtree delete"};

/// What a modification record (RFC 1823, 4.8) says.
struct modification {
    explicit modification(const ldapmod& mod);

    int code;  ///< the operation, flag included
    const char* name;
    std::vector<const char*> values;

    int operation() const { return code & ~LDAP_MOD_BVALUES; }
    bool is_binary() const { return (code & LDAP_MOD_BVALUES) != 0; }
};

modification::modification(const ldapmod& mod)
    : code(mod.mod_op), name(mod.mod_type ? mod.mod_type : empty_str) {
    if (!is_binary()) {
        for (char* const* value = mod.mod_values; value && *value; ++value) {
            values.push_back(*value);
        }
        return;
    }
    // KEPT: a binary value is a text, too; its length is not looked at.
    for (berval* const* value = mod.mod_bvalues; value && *value; ++value) {
        values.push_back((*value)->bv_val ? (*value)->bv_val : empty_str);
    }
}

/// True when the line of a value reads back, below another, as that value of that attribute.
bool line_reads_back(const cisString& name, const std::string& value) {
    const std::string text = "cn: x\n" + name.text() + ": " + value + "\n";
    line_source source(text);
    LDIF_Line above;
    LDIF_Line line;
    above.next(source, 0);
    line.next(source, 1);
    return above.value == "x" && source.position() == text.size() && line.hasSeparator &&
           line.type == LDIF_Line::attr && line.attribute == name.text() && line.value == value;
}

auto naming(const LDIF_Attribute& attribute, const LDIF_Value& value) {
    return [&](LDIF_Exception& e) {
        e.attribute = attribute.name().text();
        e.value = value.str();
        e.attrType = attribute.values().type();
    };
}

/// Callers choose names and values that no line of a file could have.
void require_readable(const LDIF_Attribute& attribute) {
    for (const LDIF_Value& value : attribute.values()) {
        const auto body = [&] {
            if (!line_reads_back(attribute.name(), value.str())) {
                raise(not_readable);
            }
        };
        with_context(body, naming(attribute, value));
    }
}

/// Takes out of the attribute what the present one has already.
void drop_duplicates(LDIF_Attribute& added, const LDIF_Attribute& present) {
    LDIF_Values& values = added.values();
    for (auto value = values.begin(); value != values.end();) {
        const bool is_there =
            with_context([&] { return present.values().find(*value) != present.values().end(); },
                         naming(added, *value));
        value = is_there ? values.erase(value) : std::next(value);
    }
}

/// Throws when the entry may not have the values besides the present ones of that attribute, of
/// which there are so many.
void require_fit(const LDIF_Attribute& added, size_t present, const LDIF_Entry& entry) {
    const LDIF_Values& values = added.values();
    const bool is_one = present + values.size() <= 1;
    if (values.empty()) {
        return;
    }
    if (values.type()->isSingle && !is_one) {
        const auto second = std::next(values.begin(), present == 0 ? 1 : 0);
        raise_with(second_value, {}, naming(added, *second));
    }
    if (entry.is_root() && !(is_of_root(added) && is_one)) {
        raise_with(not_readable, {}, naming(added, *values.begin()));
    }
}

/// Prepares the attribute to be merged into the entry. Throws when it does not fit.
void fit(LDIF_Attribute& added, const LDIF_Entry& entry) {
    const auto present = entry.attributes().find(added.name());
    const bool is_there = present != entry.attributes().end();
    if (is_there) {
        drop_duplicates(added, *present);
    }
    require_fit(added, is_there ? present->values().size() : 0, entry);
}

void delete_values(LDIF_Attributes& attributes, const modification& mod) {
    const auto found = attributes.find(cisString(mod.name));
    if (found == attributes.end()) {
        raise_with(no_attribute, {}, [&](LDIF_Exception& e) {
            e.attribute = mod.name;
            // KEPT: where a value is expected, the name of the attribute stands again.
            e.value = mod.values.empty() ? "<NULL>" : mod.is_binary() ? "<binary>" : mod.name;
        });
    }
    LDIF_Values& present = found->values();
    for (size_t i = 0; i < mod.values.size() && !present.empty(); ++i) {
        present -= mod.values[i];
    }
    if (mod.values.empty() || present.empty()) {
        attributes.erase(found);
    }
}

/// The attribute that a modification brings, its values checked by their syntax.
LDIF_Attribute attribute_of(const modification& mod, aes_key_data* key) {
    LDIF_Attribute attribute(key, mod.name, {});
    for (const char* value : mod.values) {
        attribute += std::string(value);
    }
    return attribute;
}

void add_values(LDIF_Entry& entry, const modification& mod, aes_key_data* key) {
    if (mod.values.empty()) {
        return;
    }
    LDIF_Attribute attribute = attribute_of(mod, key);
    require_readable(attribute);
    fit(attribute, entry);
    entry += std::move(attribute);
}

/// The values that are to take the place of the present ones. KEPT: when their syntax refuses one,
/// the present ones are gone already.
LDIF_Attribute replacement_of(LDIF_Values& present, const modification& mod, aes_key_data* key) {
    try {
        return attribute_of(mod, key);
    } catch (const LDIF_Exception&) {
        present.clear();
        throw;
    }
}

void replace_values(LDIF_Entry& entry, const modification& mod, aes_key_data* key) {
    const auto found = entry.attributes().find(cisString(mod.name));
    if (found == entry.attributes().end()) {
        return add_values(entry, mod, key);
    }
    if (mod.values.empty()) {
        entry.attributes().erase(found);
        return;
    }
    const LDIF_Attribute attribute = replacement_of(found->values(), mod, key);
    require_readable(attribute);
    require_fit(attribute, 0, entry);
    found->values().clear();
    entry += attribute;
}

void apply(LDIF_Entry& entry, const modification& mod, aes_key_data* key) {
    switch (mod.operation()) {
        case LDAP_MOD_ADD:
            return add_values(entry, mod, key);
        case LDAP_MOD_DELETE:
            return delete_values(entry.attributes(), mod);
        case LDAP_MOD_REPLACE:
            return replace_values(entry, mod, key);
        default:
            char message[32];
            nuv_snprintf(message, sizeof message, "Unknown mod_op: %u",
                         static_cast<unsigned int>(mod.code));
            raise(unknown_operation, message);
    }
}

}  // namespace

/// Carries out a change of the tree, and completes the report of its failure. A failure of the
/// system may leave it half done, and may end the report too: then the next refresh reads the file
/// again.
template <class Body>
void LDIF_File::change(const char* operation, const LDIF_DN& dn, Body body) {
    const bool was_loaded = std::exchange(is_loaded_, false);
    with_boundary(in(operation), body, [&](LDIF_Exception& e) {
        name_file(e);
        e.entryDn = shown(dn);
        is_loaded_ = was_loaded && e.sysErrno == 0;
    });
    is_loaded_ = was_loaded;
}

void LDIF_File::modify(const LDIF_DN& dn, ldapmod** mods) {
    change("LDIF_File::modify()", dn, [&] {
        if (!mods || !*mods) {
            return;
        }
        LDIF_Entry* entry = root_.find(dn);
        if (!entry) {
            raise(no_entry);
        }
        for (; *mods; ++mods) {
            apply(*entry, modification(**mods), key_);
        }
    });
}

void LDIF_File::add(const LDIF_DN& dn, ldapmod** mods) {
    change("LDIF_File::add()", dn, [&] {
        LDIF_Entry added(dn);
        // KEPT: whatever a modification is to do with its values, here it adds them.
        for (; mods && *mods; ++mods) {
            add_values(added, modification(**mods), key_);
        }
        // An entry that is there already takes over the attributes.
        if (const LDIF_Entry* present = root_.find(dn)) {
            for (LDIF_Attribute& attribute : added.attributes()) {
                fit(attribute, *present);
            }
        }
        root_ += std::move(added);
    });
}

void LDIF_File::erase(const LDIF_DN& dn, bool deleteNonLeaves) {
    change("LDIF_File::erase()", dn, [&] {
        LDIF_Entry* entry = root_.find(dn);
        LDIF_Entry* parent = entry ? root_.parent_of(*entry) : nullptr;
        if (!parent) {
            raise(no_entry);
        }
        if (!entry->children().empty() && !deleteNonLeaves) {
            raise(not_a_leaf);
        }
        parent->erase(*entry);
    });
}
