// cfg32 get: prints the values of an attribute.

#include <fmt/format.h>

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>

#include "cfg32.h"
#include "command.h"
#include "configuration.h"
#include "hidden_passwords.h"
#include "json_text.h"
#include "outcome.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string dn;
    std::string attribute;
};

/// The entry with that attribute alone; without attributes when it has it not.
entry asked_for(const configuration& file, const arguments& given) {
    entry read = entry_of(file.entry_at(given.dn));
    std::erase_if(read.attributes,
                  [&](const attribute& each) { return cisString(each.name) != given.attribute; });
    return read;
}

[[noreturn]] void tell_missing(const configuration& file, const arguments& given) {
    const auto meant =
        find_attribute(given.attribute) ? std::nullopt : nearest_attribute(given.attribute);
    throw ended(
        answer_is_no,
        with_result(fmt::format("{}: {} has no attribute {}{}", file.name(), given.dn,
                                given.attribute, meant ? "; did you mean " + *meant + "?" : ""),
                    CFG_NO_SUCH_ATTRIBUTE));
}

int get(const settings& options, const arguments& given) {
    const configuration file(options);
    const entry read = asked_for(file, given);
    if (options.is_json) {
        print_json({{"file", utf8(file.name())},
                    {"entries", {json_of(read)}},
                    {"leftOut", json_of(file.left_out())}});
    }
    if (read.attributes.empty()) {
        tell_missing(file, given);
    }
    if (!options.is_json) {
        for (const std::string& value : read.attributes.front().values) {
            fmt::print("{}\n", shown_value(given.attribute, value));
        }
    }
    return done;
}

}  // namespace

action define_get(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    parser.add_option("dn", given->dn, "the entry")->type_name("DN")->required();
    parser.add_option("attribute", given->attribute, "the attribute")
        ->type_name("ATTR")
        ->required();
    return [given, &options] { return get(options, *given); };
}

}  // namespace cfg32::tool
