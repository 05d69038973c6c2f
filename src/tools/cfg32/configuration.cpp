// Reading a configuration, also a broken one, without ever changing it.

#include "configuration.h"

#include <fmt/format.h>

#include <algorithm>

#include "LDIF_File.h"
#include "cfg32.h"
#include "handle.h"
#include "message.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

using result_nodes = std::unique_ptr<CfgMessage, int (*)(CfgMessage*)>;
const char* text_of(const CfgMessage& node) { return node.text ? node.text : ""; }

/// An entry of a result. The interface looks for each attribute's values from the first one on.
entry entry_of(const CfgMessage& node) {
    entry read{text_of(node), {}};
    for (const CfgMessage* name = node.child; name; name = name->next) {
        attribute& added = read.attributes.emplace_back(attribute{text_of(*name), {}});
        for (const CfgMessage* value = name->child; value; value = value->next) {
            added.values.emplace_back(text_of(*value));
        }
    }
    return read;
}

bool is_read_differently(const problem& found) {
    return found.outcome() != consequence::none || found.first_left_out > 0;
}

/// What becomes of a line that is not used as it stands.
const char* fate_of(const problem& found) {
    if (found.broken == &kind::missing_final_newline) {
        return "";  // the text tells it
    }
    switch (found.outcome()) {
        case consequence::kept_aside:
            return ", kept as oru-slapdInvalidLine";
        case consequence::loses_text:
            return ", cut off there";
        default:
            return ", left out";
    }
}

/// False when an entry has a DN that nobody could name it by.
bool is_printable(const LDIF_Entry& root) try {
    for_each_in_preorder(root, [](const LDIF_Entry& each) {
        if (!each.is_root()) {
            each.dn().str();
        }
    });
    return true;
} catch (const LDIF_Exception&) {
    return false;
}

}  // namespace

configuration::configuration(const settings& options, const std::string& file_name)
    : configuration(options, file_name, read_configuration(file_name)) {}

configuration::configuration(const settings& options, std::string file_name, std::string text)
    : name_(std::move(file_name)),
      text_(std::move(text)),
      key_(options),
      copy_(text_),
      handle_(cfg_init(), cfg_unbind) {
    const progress loading("Loading " + name_);
    cfg_set_option(handle_.get(), CFG_OPT_KEY_DATA, key_.get());
    if (!is_loaded(text_) || !is_printable(root())) {
        note_left_out();
        load(loadable_part(text_, left_out_));
    } else if (copy_.text() != text_) {
        note_left_out();
        load(text_);
    } else if (loses_text(text_)) {
        note_left_out();
    }
}

/// Tries to load a text.
bool configuration::is_loaded(std::string_view text) {
    copy_ = memory_file(text);
    cfg_set_option(handle_.get(), CFG_OPT_CONFIG_FILE, copy_.name().c_str());
    return cfg_bind_s(handle_.get(), nullptr, nullptr, CFG_AUTH_SIMPLE) == CFG_SUCCESS;
}

/// Loads what can be loaded. Lines that are put aside are read as the next load will read them.
void configuration::load(std::string_view text) {
    if (!is_loaded(text) || !is_loaded(copy_.text())) {
        fail(handle_.get(), cfg_get_errno(handle_.get()), name_);
    }
}

configuration::configuration(const settings& options)
    : configuration(options, options.file_name()) {
    bind(options);
}

void configuration::bind(const settings& options) {
    if (options.bind_dn.empty()) {
        return;
    }
    const int code = cfg_bind_s(handle_.get(), options.bind_dn.c_str(),
                                options.bind_password().c_str(), CFG_AUTH_SIMPLE);
    if (code != CFG_SUCCESS) {
        fail(handle_.get(), code, name_);
    }
}

void configuration::note_left_out() {
    left_out_ = unused_lines(text_, key_.get());
    if (!left_out_.empty()) {
        tell_unused(name_, "read from a private copy, because not all of it can be used",
                    left_out_);
    }
}

bool loses_text(std::string_view text) {
    return text.find('\0') != std::string_view::npos || (!text.empty() && text.back() != '\n');
}

std::vector<problem> unused_lines(std::string_view text, aes_key_data* key) {
    std::vector<problem> found = find_problems(text, key);
    std::erase_if(found, [](const problem& each) { return !is_read_differently(each); });
    return found;
}

void tell_unused(const std::string& name, std::string_view what,
                 const std::vector<problem>& unused) {
    std::string message = fmt::format("{}: {} (`cfg32 check` tells more):", name, what);
    for (const problem& found : unused) {
        message += fmt::format("\n  line {}: {}{}", found.line, found.text, fate_of(found));
    }
    complain(message);
}

std::vector<entry> configuration::search(const std::string& base, int scope,
                                         const std::string& filter) const {
    CfgMessage* found = nullptr;
    // Without names of attributes passwords come as they are stored.
    const int code =
        cfg_search_s(handle_.get(), base.c_str(), scope, filter.c_str(), nullptr, 0, &found);
    const result_nodes owner(found, cfg_msgfree);
    if (code == CFG_NO_SUCH_OBJECT) {
        throw ended(answer_is_no, with_result(name_ + ": no entry " + base, code));
    }
    if (code != CFG_SUCCESS) {
        fail(handle_.get(), code, name_);
    }
    std::vector<entry> entries;
    for (const CfgMessage* node = found; node; node = node->next) {
        entries.push_back(entry_of(*node));
    }
    return entries;
}

void require_bind(const settings& options, const std::string& file_name) {
    if (!options.bind_dn.empty()) {
        configuration(options, file_name).bind(options);
    }
}

const LDIF_Entry& configuration::root() const { return handle_->file->root(); }

const LDIF_Entry& configuration::entry_at(const std::string& dn) const {
    const LDIF_Entry* found = root().find(LDIF_DN(cisString(dn)));
    if (!found) {
        throw ended(answer_is_no, with_result(name_ + ": no entry " + dn, CFG_NO_SUCH_OBJECT));
    }
    return *found;
}

entry entry_of(const LDIF_Entry& node) {
    entry read{shown(node.dn()), {}};
    for (const LDIF_Attribute& each : node.attributes()) {
        attribute& added = read.attributes.emplace_back(attribute{each.name().text(), {}});
        for (const LDIF_Value& value : each.values()) {
            added.values.push_back(value.str());
        }
    }
    return read;
}

std::vector<entry> entries_below(const LDIF_Entry& base, int scope) {
    std::vector<entry> entries;
    const auto add = [&](const LDIF_Entry& node) {
        if (!node.is_root()) {
            entries.push_back(entry_of(node));
        }
    };
    if (scope == CFG_SCOPE_SUBTREE) {
        for_each_in_preorder(base, add);
    } else if (scope == CFG_SCOPE_BASE) {
        add(base);
    } else {
        std::for_each(base.children().begin(), base.children().end(), add);
    }
    return entries;
}

}  // namespace cfg32::tool
