// cfg32 set: gives an attribute these values.

#include <CLI/CLI.hpp>

#include "change/attribute_change.h"
#include "command.h"
#include "outcome.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string dn;
    std::string attribute;
    std::vector<std::string> values;
    bool takes_any_name = false;
};

/// The configuration takes every name: a mistyped one would go unnoticed.
void require_known(const std::string& attribute) {
    if (find_attribute(attribute)) {
        return;
    }
    const auto nearest = nearest_attribute(attribute);
    throw ended(usage_error, "the server knows no attribute \"" + attribute + "\"" +
                                 (nearest ? "; is it " + *nearest + "?" : "") +
                                 "\n  hint: --unknown-attribute sets it all the same");
}

int set(const settings& options, const arguments& given) {
    if (!given.takes_any_name) {
        require_known(given.attribute);
    }
    require_no_secrets(given.attribute, given.values);
    return change_attribute(options, given.dn,
                            {modification::replace, spelled_name(given.attribute), given.values});
}

}  // namespace

action define_set(CLI::App& parser, settings& options) {
    auto given = std::make_shared<arguments>();
    parser.add_option("dn", given->dn, "the entry")->type_name("DN")->required();
    parser.add_option("attribute", given->attribute, "the attribute to set")
        ->type_name("ATTR")
        ->required();
    parser
        .add_option("value", given->values,
                    "all the values it is to have; \"--\" goes before one like \"-x\"")
        ->type_name("VALUE")
        ->required();
    parser.add_flag("--unknown-attribute", given->takes_any_name,
                    "take a name that the server does not know");
    return [&options, given] { return set(options, *given); };
}

}  // namespace cfg32::tool
