// cfg_search_s: searches the store and turns what it finds into plain C nodes.

#include <strings.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "LDIF_File.h"
#include "LDIF_Search.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "handle.h"
#include "message.h"
#include "password.h"

using namespace cfg32;

namespace {

constexpr failure not_decoded{84, 1000, "unformat_password();"};

constexpr size_t decode_buffer_size = 1024;

/// Passwords that the administrator reads in clear; names that begin so, in any case.
constexpr std::string_view decoded_names[] = {
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
        if (names_.size() == 1) {
            only_.emplace(names_.front());
        }
    }

    bool are_all() const { return names_.empty(); }
    /// The lines of the only one, if there is but one.
    const std::optional<line_start>& only() const { return only_; }
    bool have(std::string_view name) const {
        return std::ranges::any_of(names_, [&](std::string_view own) {
            return own.size() == name.size() && equal_without_case(own, name);
        });
    }

  private:
    std::vector<std::string_view> names_;
    std::optional<line_start> only_;
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

bool is_password(const _AttrType* type) {
    static const _AttrType* const password_type = getAttrType("oru-slapdAdminPW");
    return type && type->match == password_type->match;
}

/// True for a password that is returned in clear: the file was opened by a bind, and the
/// attribute is one of the few and was asked for by name.
bool is_decoded(std::string_view name, const LDIF_File& file, const wanted_attributes& wanted) {
    const auto begins_name = [&](std::string_view prefix) {
        return equal_without_case(name.substr(0, prefix.size()), prefix);
    };
    return !wanted.are_all() && std::ranges::any_of(decoded_names, begins_name) &&
           file.getAuthentication() != 0 && wanted.have(name) &&
           is_password(attribute_name(name).type());
}

/// The password in clear, allocated by the password routine with malloc.
char* decoded(std::string_view text, aes_key_data* key, const char* dn, const char* name) {
    const std::string stored(text);
    const std::string input = stored.empty() ? stored : decoder_input(stored);
    char* clear = nullptr;
    if (input.size() >= decode_buffer_size ||
        !unformat_password(input.c_str(), &clear, key, CFG32_PASSWORD_FLAG) || !clear) {
        raise_with(not_decoded, {}, [&](LDIF_Exception& e) {
            e.value = stored;
            e.entryDn = dn;
            e.attribute = name;
            e.attrType = getAttrType(name);
        });
    }
    return clear;
}

/// Whose result it is, and what is wanted of it.
struct search_context {
    const LDIF_File& file;
    const wanted_attributes& wanted;
    aes_key_data* key;
};

/// Builds the nodes of an entry's attributes: begin() for each, and add() for its values.
class attribute_builder {
  public:
    attribute_builder(const search_context& context, CfgMessage& entry)
        : context_(context), dn_(entry.text), attributes_(&entry.child) {}

    void begin(std::string_view name) {
        is_wanted_ = context_.wanted.are_all() || context_.wanted.have(name);
        if (is_wanted_) {
            attribute_ = &attributes_.append(attribute_message);
            attribute_->text = copy_of(name);
            values_ = message_chain(&attribute_->child);
            is_clear_ = is_decoded(name, context_.file, context_.wanted);
        }
    }

    void add(std::string_view value) {
        if (is_wanted_) {
            CfgMessage& node = values_.append(value_message);
            node.text =
                is_clear_ ? decoded(value, context_.key, dn_, attribute_->text) : copy_of(value);
            node.is_secret = is_clear_;
        }
    }

  private:
    const search_context& context_;
    const char* dn_;
    message_chain attributes_;
    bool is_wanted_ = false;
    CfgMessage* attribute_ = nullptr;
    message_chain values_{nullptr};
    bool is_clear_ = false;
};

void add_lines(const unread_attributes& lines, const wanted_attributes& wanted,
               attribute_builder builder) {
    std::string_view last;
    const auto add = [&](std::string_view name, std::string_view value) {
        if (name != last) {
            builder.begin(name);
            last = name;
        }
        builder.add(value);
        return false;
    };
    if (wanted.only()) {
        lines.for_each_value_of(*wanted.only(), add);
    } else {
        lines.for_each_value(add);
    }
}

void add_attributes(const LDIF_Entry& entry, attribute_builder builder) {
    for (const LDIF_Attribute& attribute : entry.attributes()) {
        builder.begin(attribute.name().text());
        for (const kept_text& text : attribute.values().texts()) {
            builder.add(text);
        }
    }
}

void add_entries(const found_entries& found, const search_context& context, CfgMessage** first) {
    message_chain entries(first);
    for (const LDIF_Entry* entry : found) {
        CfgMessage& node = entries.append(entry_message);
        const kept_dn& dn = entry->named_dn();
        node.text = dn.is_simple() ? copy_of(dn.text()) : copy_of(dn.parsed().str());
        const attribute_builder builder(context, node);
        if (const unread_attributes* lines = entry->printed_lines()) {
            add_lines(*lines, context.wanted, builder);
        } else {
            add_attributes(*entry, builder);
        }
    }
}

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
int build(const found_entries& found, const search_context& context, CfgMessage** result) {
    const auto release = [&] {
        cfg_msgfree(*result);
        *result = nullptr;
    };
    try {
        add_entries(found, context, result);
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
        const dn_path dn{std::string_view(base)};
        const LDIF_Filter wanted_entries{std::string(filter ? filter : "")};
        const wanted_attributes wanted(attrs);
        const found_entries& found = file.matches(dn, scope_of(scope), wanted_entries);
        return build(found, {file, wanted, handle->keyData}, result);
    });
}
