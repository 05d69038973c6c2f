// cfg_search_s: searches the store and turns what it finds into plain C nodes.

#include <strings.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>
#include <string_view>
#include <vector>

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

/// The names of the wanted attributes; none means all.
class wanted_attributes {
  public:
    explicit wanted_attributes(char** names) {
        for (; names && *names; ++names) {
            names_.emplace_back(*names);
        }
    }

    bool are_all() const { return names_.empty(); }
    bool have(const LDIF_Attribute& attribute) const {
        const attribute_name& name = attribute.values().typed_name();
        return std::ranges::any_of(
            names_, [&](const attribute_name& own) { return own.compare(name) == 0; });
    }

  private:
    std::vector<attribute_name> names_;
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

/// strdup: up to the first NUL.
char* copy_of(std::string_view text) {
    const size_t length = strnlen(text.data(), text.size());
    auto* copy = static_cast<char*>(malloc(length + 1));
    if (!copy) {
        throw std::bad_alloc();
    }
    memcpy(copy, text.data(), length);
    copy[length] = '\0';
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
                const wanted_attributes& wanted) {
    const auto begins_name = [&](const char* prefix) {
        return strncasecmp(attribute.name().c_str(), prefix, strlen(prefix)) == 0;
    };
    return !attribute.values().empty() && file.getAuthentication() != 0 && is_password(attribute) &&
           wanted.have(attribute) &&
           std::any_of(std::begin(decoded_names), std::end(decoded_names), begins_name);
}

/// The password in clear, allocated by the password routine with malloc.
char* decoded(const std::string& stored, const LDIF_Attribute& attribute, aes_key_data* key,
              const char* dn, const char* name) {
    const std::string input = stored.empty() ? stored : decoder_input(stored);
    char* clear = nullptr;
    if (input.size() >= decode_buffer_size ||
        !unformat_password(input.c_str(), &clear, key, CFG32_PASSWORD_FLAG) || !clear) {
        raise_with(not_decoded, {}, [&](LDIF_Exception& e) {
            e.value = stored;
            e.entryDn = dn;
            e.attribute = name;
            e.attrType = attribute.values().type();
        });
    }
    return clear;
}

/// Builds the nodes of a result.
class result_builder {
  public:
    result_builder(const LDIF_File& file, const wanted_attributes& wanted, aes_key_data* key)
        : file_(file), wanted_(wanted), key_(key) {}

    void add(const std::vector<const LDIF_Entry*>& found, CfgMessage** first) const {
        message_chain entries(first);
        for (const LDIF_Entry* entry : found) {
            CfgMessage& node = entries.append(entry_message);
            const kept_dn& dn = entry->named_dn();
            node.text = dn.is_simple() ? copy_of(dn.text()) : copy_of(dn.parsed().str());
            add_attributes(*entry, node);
        }
    }

  private:
    void add_attributes(const LDIF_Entry& entry, CfgMessage& parent) const {
        message_chain attributes(&parent.child);
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            if (!wanted_.are_all() && !wanted_.have(attribute)) {
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
        for (const kept_text& text : attribute.values().texts()) {
            CfgMessage& node = values.append(value_message);
            node.text =
                is_clear ? decoded(text.str(), attribute, key_, dn, parent.text) : copy_of(text);
            node.is_secret = is_clear;
        }
    }

    const LDIF_File& file_;
    const wanted_attributes& wanted_;
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
        const wanted_attributes wanted(attrs);
        const std::vector<const LDIF_Entry*> found =
            file.matches(dn, scope_of(scope), wanted_entries);
        return build(result_builder(file, wanted, handle->keyData), found, result);
    });
}
