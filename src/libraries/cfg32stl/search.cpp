// cfg_search_s: searches the store and turns what it finds into plain C nodes.

#include <strings.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

#include "LDIF_File.h"
#include "LDIF_Search.h"
#include "cfg32_platform.h"
#include "handle.h"
#include "message.h"
#include "password.h"

using namespace cfg32;

namespace {

constexpr failure not_decoded{84, 1000, "unformat_password();"};

constexpr size_t decode_buffer_size = 1024;

/// Passwords that the administrator reads in clear; names that begin so, in any case.
constexpr const char* decoded_names[] = {
    "oru-slapdSslKeyDatabasePW",
    "oru-slapdMasterPW",
    "oru-slapdProxyPw",
};

/// Appends nodes to a chain.
class message_chain {
  public:
    explicit message_chain(CfgMessage** first) : end_(first) {}

    CfgMessage& append(message_kind kind) {
        auto* node = static_cast<CfgMessage*>(calloc(1, sizeof(CfgMessage)));
        if (!node) {
            throw std::bad_alloc();
        }
        node->kind = kind;
        *end_ = node;
        end_ = &node->next;
        return *node;
    }

  private:
    CfgMessage** end_;
};

char* copy_of(const std::string& text) {
    char* copy = strdup(text.c_str());
    if (!copy) {
        throw std::bad_alloc();
    }
    return copy;
}

bool is_password(const LDIF_Attribute& attribute) {
    static const _AttrType* const password_type = getAttrType("oru-slapdAdminPW");
    const _AttrType* type = attribute.values().type();
    return type && type->match == password_type->match;
}

/// True for a password that is returned in clear: the file was opened by a bind, and the
/// attribute is one of the few and was asked for by name.
bool is_decoded(const LDIF_Attribute& attribute, const LDIF_File& file,
                const LDIF_AttrFilter& wanted) {
    const auto begins_name = [&](const char* prefix) {
        return strncasecmp(attribute.name().c_str(), prefix, strlen(prefix)) == 0;
    };
    return !attribute.values().empty() && file.getAuthentication() != 0 && is_password(attribute) &&
           wanted.contains(attribute.name()) &&
           std::any_of(std::begin(decoded_names), std::end(decoded_names), begins_name);
}

/// The password in clear, allocated by the password routine with malloc.
char* decoded(const LDIF_Value& value, aes_key_data* key, const char* dn, const char* name) {
    const std::string stored = value.str();
    const std::string input = stored.empty() ? stored : decoder_input(stored);
    char* clear = nullptr;
    if (input.size() >= decode_buffer_size ||
        !unformat_password(input.c_str(), &clear, key, CFG32_PASSWORD_FLAG) || !clear) {
        raise_with(not_decoded, {}, [&](LDIF_Exception& e) {
            e.value = stored;
            e.entryDn = dn;
            e.attribute = name;
            e.attrType = value.attrType;
        });
    }
    return clear;
}

/// Builds the nodes of a result.
class result_builder {
  public:
    result_builder(const LDIF_File& file, const LDIF_AttrFilter& wanted, aes_key_data* key)
        : file_(file), wanted_(wanted), key_(key) {}

    void add(const std::vector<const LDIF_Entry*>& found, CfgMessage** first) const {
        message_chain entries(first);
        std::string dn;
        for (const LDIF_Entry* entry : found) {
            CfgMessage& node = entries.append(entry_message);
            dn.clear();
            entry->dn().append_to(dn);
            node.text = copy_of(dn);
            add_attributes(*entry, node);
        }
    }

  private:
    void add_attributes(const LDIF_Entry& entry, CfgMessage& parent) const {
        message_chain attributes(&parent.child);
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            if (!wanted_.empty() && !wanted_.contains(attribute.name())) {
                continue;
            }
            CfgMessage& node = attributes.append(attribute_message);
            node.text = copy_of(attribute.name().text());
            add_values(attribute, parent.text, node);
        }
    }

    void add_values(const LDIF_Attribute& attribute, const char* dn, CfgMessage& parent) const {
        const bool is_clear = is_decoded(attribute, file_, wanted_);
        message_chain values(&parent.child);
        for (const LDIF_Value& value : attribute.values()) {
            CfgMessage& node = values.append(value_message);
            node.text = is_clear ? decoded(value, key_, dn, parent.text) : copy_of(value.str());
            node.is_secret = is_clear;
        }
    }

    const LDIF_File& file_;
    const LDIF_AttrFilter& wanted_;
    aes_key_data* key_;
};

LDIF_Search_Results::Scope scope_of(int number) {
    switch (number) {
        case CFG_SCOPE_ONELEVEL:
            return LDIF_Search_Results::OneLevel;
        case CFG_SCOPE_SUBTREE:
            return LDIF_Search_Results::Subtree;
        default:
            return LDIF_Search_Results::Base;
    }
}

LDIF_AttrFilter wanted_attributes(char** names) {
    LDIF_AttrFilter wanted;
    for (; names && *names; ++names) {
        wanted.insert(cisString(*names));
    }
    return wanted;
}

/// Builds the result, or releases what was built of it.
int build(const result_builder& builder, const std::vector<const LDIF_Entry*>& found,
          CfgMessage** result) {
    const auto release = [&] {
        cfg_msgfree(*result);
        *result = nullptr;
    };
    try {
        builder.add(found, result);
        return CFG_SUCCESS;
    } catch (const LDIF_Exception&) {
        release();
        throw;
    } catch (...) {
        release();
        return CFG_NO_MEMORY;
    }
}

}  // namespace

int cfg_search_s(CfgHandle* handle, const char* base, int scope, const char* filter, char** attrs,
                 int, CfgMessage** result) noexcept {
    // cppcheck-suppress throwInNoexceptFunction  ; bound_call lets nothing through
    return bound_call(handle, "cfg_search_s()", [&](LDIF_File& file) -> int {
        if (!result || !base) {
            return CFG_PARAM_ERROR;
        }
        *result = nullptr;
        file.refresh();
        const LDIF_DN dn{cisString(base)};
        const LDIF_Filter wanted_entries{std::string(filter ? filter : "")};
        const LDIF_AttrFilter wanted = wanted_attributes(attrs);
        const std::vector<const LDIF_Entry*> found =
            file.matches(dn, scope_of(scope), wanted_entries);
        return build(result_builder(file, wanted, handle->keyData), found, result);
    });
}
