// cfg32 get: prints the values of an attribute.

#include <fmt/format.h>
#include <unistd.h>
#include <memory>

#include "arguments.h"
#include "cfg32.h"
#include "command.h"
#include "configuration.h"
#include "hidden_passwords.h"
#include "json_text.h"
#include "outcome.h"
#include "schema/attribute_words.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

/// The entry with that attribute alone; without attributes when it has it not.
entry asked_for(const configuration& file, const attribute_of_entry& given) {
    entry read = entry_of(file.entry_at(given.dn));
    std::erase_if(read.attributes,
                  [&](const attribute& each) { return cisString(each.name) != given.attribute; });
    return read;
}

[[noreturn]] void tell_missing(const configuration& file, const attribute_of_entry& given) {
    const auto meant =
        find_attribute(given.attribute) ? std::nullopt : nearest_attribute(given.attribute);
    throw ended(
        answer_is_no,
        with_result(fmt::format("{}: {} has no attribute {}{}", file.name(), given.dn,
                                given.attribute, meant ? "; did you mean " + *meant + "?" : ""),
                    CFG_NO_SUCH_ATTRIBUTE));
}

int get(const settings& options, const attribute_of_entry& given) {
    const configuration file(options);
    const entry read = asked_for(file, given);
    if (options.is_json) {
        print_entries({read}, file);
    }
    if (read.attributes.empty()) {
        tell_missing(file, given);
    }
    if (!options.is_json) {
        for (const std::string& value : read.attributes.front().values) {
            const std::string shown = shown_value(given.attribute, value);
            fmt::print("{}\n", isatty(STDOUT_FILENO) ? printable(shown) : shown);
        }
    }
    return done;
}

}  // namespace

action define_get(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<attribute_of_entry>();
    add_attribute_of_entry(parser, *given);
    return [given, &options] { return get(options, *given); };
}

}  // namespace cfg32::tool
