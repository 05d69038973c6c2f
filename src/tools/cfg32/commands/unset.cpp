// cfg32 unset: removes an attribute, or some of its values.

#include <CLI/CLI.hpp>

#include "change/attribute_change.h"
#include "command.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string dn;
    std::string attribute;
    std::vector<std::string> values;
};

}  // namespace

action define_unset(CLI::App& parser, settings& options) {
    auto given = std::make_shared<arguments>();
    parser.add_option("dn", given->dn, "the entry")->type_name("DN")->required();
    parser.add_option("attribute", given->attribute, "the attribute")
        ->type_name("ATTR")
        ->required();
    parser.add_option("value", given->values, "the values to remove; without any, all of them")
        ->type_name("VALUE");
    return [&options, given] {
        require_no_secrets(given->attribute, given->values);
        return change_attribute(options, given->dn,
                                {modification::remove, given->attribute, given->values});
    };
}

}  // namespace cfg32::tool
