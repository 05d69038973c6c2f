// Changing the store.

#include <cerrno>
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
bool reads_back(const cisString& name, const std::string& value) {
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
            if (!reads_back(attribute.name(), value.str())) {
                raise(not_readable);
            }
        };
        with_context(body, naming(attribute, value));
    }
}

/// Throws when the attribute, merged into the present one, would give a single-valued attribute
/// another value than it has. What is there already is no second value.
void require_single(const LDIF_Attribute& added, const LDIF_Attribute* present) {
    if (!added.values().type()->isSingle) {
        return;
    }
    bool has_one = present && !present->values().empty();
    for (const LDIF_Value& value : added.values()) {
        if (present && present->values().find(value.str()) != present->values().end()) {
            continue;
        }
        if (has_one) {
            raise_with(second_value, {}, naming(added, value));
        }
        has_one = true;
    }
}

/// The attribute of that name, or null.
LDIF_Attribute* find(LDIF_Attributes& attributes, const cisString& name) {
    const auto found = attributes.find(name);
    return found == attributes.end() ? nullptr : &*found;
}

void erase(LDIF_Attributes& attributes, const LDIF_Attribute& attribute) {
    attributes.erase(attributes.find(attribute.name()));
}

void delete_values(LDIF_Attributes& attributes, const modification& mod) {
    LDIF_Attribute* found = find(attributes, cisString(mod.name));
    if (!found) {
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
        erase(attributes, *found);
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
    require_single(attribute, find(entry.attributes(), attribute.name()));
    entry += std::move(attribute);
}

void replace_values(LDIF_Entry& entry, const modification& mod, aes_key_data* key) {
    LDIF_Attribute* present = find(entry.attributes(), cisString(mod.name));
    if (!present) {
        return add_values(entry, mod, key);
    }
    if (mod.values.empty()) {
        return erase(entry.attributes(), *present);
    }
    const auto attribute = [&] {
        try {
            return attribute_of(mod, key);
        } catch (const LDIF_Exception&) {
            // KEPT: the old values go before the new ones are looked at by their syntax.
            present->values().clear();
            throw;
        }
    }();
    require_readable(attribute);
    require_single(attribute, nullptr);
    present->values().clear();
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

/// The nearest ancestor of dn that is there; the root if there is no other.
LDIF_Entry& nearest_ancestor(LDIF_Entry& root, LDIF_DN dn) {
    LDIF_Entry* found = nullptr;
    while (!found && !dn.empty()) {
        dn.remove_leaf();
        found = root.find(dn);
    }
    return found ? *found : root;
}

}  // namespace

/// Completes the report of a failed change. Exhausted memory may have left it half done: the next
/// refresh reads the file again.
void LDIF_File::note_failure(LDIF_Exception& e, const LDIF_DN& dn) {
    name_file(e);
    e.entryDn = shown(dn);
    is_loaded_ = is_loaded_ && e.sysErrno != ENOMEM;
}

void LDIF_File::modify(const LDIF_DN& dn, ldapmod** mods) {
    const auto body = [&] {
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
    };
    with_boundary(in("LDIF_File::modify()"), body, [&](LDIF_Exception& e) { note_failure(e, dn); });
}

void LDIF_File::add(const LDIF_DN& dn, ldapmod** mods) {
    const auto body = [&] {
        LDIF_Entry added(dn);
        // KEPT: whatever a modification is to do with its values, here it adds them.
        for (; mods && *mods; ++mods) {
            add_values(added, modification(**mods), key_);
        }
        // An entry that is there already takes over the attributes.
        if (LDIF_Entry* present = root_.find(dn)) {
            for (const LDIF_Attribute& attribute : added.attributes()) {
                require_single(attribute, find(present->attributes(), attribute.name()));
            }
        }
        root_ += std::move(added);
    };
    with_boundary(in("LDIF_File::add()"), body, [&](LDIF_Exception& e) { note_failure(e, dn); });
}

void LDIF_File::erase(const LDIF_DN& dn, bool deleteNonLeaves) {
    const auto body = [&] {
        LDIF_Entry& parent = nearest_ancestor(root_, dn);
        LDIF_DN name = dn;
        LDIF_Entry* entry = parent.child(name -= parent.dn());
        if (!entry) {
            raise(no_entry);
        }
        if (!entry->children().empty() && !deleteNonLeaves) {
            raise(not_a_leaf);
        }
        parent.erase(*entry);
    };
    with_boundary(in("LDIF_File::erase()"), body, [&](LDIF_Exception& e) { note_failure(e, dn); });
}
