// How a command ends when it is not simply done.

#include "outcome.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstring>
#include <iterator>

#include "LDIF_AttrType.h"
#include "LDIF_Exception.h"
#include "cfg32.h"
#include "hidden_passwords.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

/// What is known of a failure.
struct facts {
    std::string file;
    int line = 0;
    std::string message;
    int system_error = 0;
    int code = 0;
    int extended = 0;
    std::string entry;
    std::string attribute;
    std::string value;
    const _AttrType* violated = nullptr;
};

/// What is more than a line is left out: of a refused filter the library tells a whole entry.
void append_line(std::string& text, std::string_view label, std::string_view what) {
    if (!what.empty() && what.find('\n') == std::string_view::npos) {
        text += fmt::format("\n  {}: {}", label, what);
    }
}

/// Extended code of an attribute that would not read back as it is written.
constexpr int unreadable = 1005;

/// For the results that are about the value.
std::string accepted_instead(const facts& known) {
    switch (known.code) {
        case CFG_CONSTRAINT_VIOLATION:
            return "one value";
        case CFG_INVALID_SYNTAX:
        case CFG_INVALID_DN_SYNTAX:
            if (known.extended == unreadable) {
                return "what can stand in a line: no blanks at the ends, no line feed";
            }
            return known.violated && known.violated->name ? accepted_values(*known.violated) : "";
        default:
            return {};
    }
}

std::string told(const facts& known) {
    std::string text;
    if (!known.file.empty()) {
        text = known.line > 0 ? fmt::format("{}:{}: ", known.file, known.line) : known.file + ": ";
    }
    text +=
        with_result(known.message.empty() ? cfg_err2string(known.code) : known.message, known.code);
    if (known.system_error != 0) {
        append_line(text, "system error", strerror(known.system_error));
    }
    append_line(text, "entry", known.entry == "<root>" ? "above all entries" : known.entry);
    const bool has_line = known.code != CFG_NO_SUCH_ATTRIBUTE && !known.value.empty() &&
                          known.value.find('\n') == std::string::npos;
    if (has_line && !known.attribute.empty()) {
        append_line(text, known.attribute, shown_value(known.attribute, known.value));
    } else {
        append_line(text, "attribute", known.attribute);
    }
    append_line(text, "accepted", accepted_instead(known));
    return text;
}

constexpr int unusable_character = 162;

/// Where the library's message quotes a text that may be a password, or names its own parts.
struct own_message {
    int code;
    const char* text;
};
constexpr own_message own_messages[] = {
    {CFG_NO_SUCH_ATTRIBUTE, "there is no such attribute to delete"},
    {CFG_INVALID_CREDENTIALS, "not the administrator's DN and password"},
    {CFG_DECODING_ERROR, "a stored password can't be decoded with this key, or without one"},
    {unusable_character, "text that is not of the locale's character set"},
};

const char* own_message_for(int code) {
    const auto found = std::find_if(std::begin(own_messages), std::end(own_messages),
                                    [&](const own_message& each) { return each.code == code; });
    return found == std::end(own_messages) ? nullptr : found->text;
}

}  // namespace

ended::ended(exit_status status, std::string message)
    : status_(status), message_(std::move(message)) {}

std::string with_result(std::string_view text, int code) {
    const std::string_view result = cfg_err2string(code);
    return text.ends_with(result) ? fmt::format("{} ({})", text, code)
                                  : fmt::format("{} [{} ({})]", text, result, code);
}

void fail(int code, std::string_view text) { throw ended(failed, with_result(text, code)); }

void fail_for_system(std::string_view what, int error) {
    throw ended(failed, fmt::format("{}: {}", what, strerror(error)));
}

std::string message_of(const LDIF_Exception& e) {
    const LDIF_Exception* inner = &e;
    while (inner->cause) {
        inner = inner->cause.get();
    }
    const char* own = own_message_for(inner->ldapErr);
    return own ? own : inner->msg;
}

std::string report(const LDIF_Exception& e, std::string_view file_name) {
    facts known;
    known.file = file_name.empty() ? e.configFile : file_name;
    known.line = e.configLine;
    known.message = message_of(e);
    known.system_error = e.sysErrno;
    known.code = e.ldapErr;
    known.extended = e.extErr;
    known.entry = e.entryDn;
    known.attribute = e.attribute;
    known.value = e.value;
    known.violated = e.attrType;
    return told(known);
}

void fail(CfgHandle* handle, int code, std::string_view file_name) {
    facts known;
    known.file = file_name;
    known.code = code;
    const int extended = cfg_get_exterror(handle);
    const char* own = own_message_for(code);
    known.message = own ? own : cfg_err2string(extended != 0 ? extended : code);
    if (cfg_dump_exception(handle)) {
        known.line = cfg_get_file_line(handle);
        known.entry = cfg_get_entry(handle);
        known.attribute = cfg_get_attribute(handle) ? cfg_get_attribute(handle) : "";
        known.value = cfg_get_value(handle);
        known.violated = find_attribute(known.attribute);
    }
    throw ended(failed, told(known));
}

}  // namespace cfg32::tool
