// cfg32 passwd: sets a password from a prompt.

#include <memory>

#include "LDIF_Value.h"
#include "arguments.h"
#include "change/attribute_change.h"
#include "command.h"
#include "hidden_passwords.h"
#include "key.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

/// The password, typed twice.
secret ask_new_password(const std::string& attribute) {
    secret first = ask_secret("New " + attribute + ": ");
    if (first.empty()) {
        throw ended(answer_is_no, "an empty password is not set");
    }
    const secret second = ask_secret("Again: ");
    if (first.text() != second.text()) {
        throw ended(answer_is_no, "the two passwords differ");
    }
    return first;
}

/// The password as it is stored. From here on nothing holds the clear text.
std::string encoded(const std::string& attribute, const secret& password, const key& encoding) {
    const _AttrType* type = getAttrType(attribute.c_str());
    std::string clear(password.text());
    try {
        std::string stored = LDIF_Value(type, clear, encoding.get()).str();
        wipe(clear);
        return stored;
    } catch (...) {
        wipe(clear);
        throw;
    }
}

int passwd(const settings& options, const attribute_of_entry& given) {
    if (!is_password_attribute(given.attribute)) {
        throw ended(usage_error, given.attribute + " is no password: use `cfg32 set`");
    }
    const std::string attribute = spelled_name(given.attribute);
    const key encoding(options);
    if (!encoding.get()) {
        complain(
            "without --key-file the password is only masked, which hides it from nobody who "
            "tries");
    }
    std::string stored = encoded(attribute, ask_new_password(attribute), encoding);
    return change_attribute(options, given.dn,
                            {modification::replace, attribute, {std::move(stored)}});
}

}  // namespace

action define_passwd(CLI::App& parser, settings& options) {
    auto given = std::make_shared<attribute_of_entry>();
    add_attribute_of_entry(parser, *given);
    return [&options, given] { return passwd(options, *given); };
}

}  // namespace cfg32::tool
