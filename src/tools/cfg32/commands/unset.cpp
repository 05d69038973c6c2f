// cfg32 unset: removes an attribute, or some of its values.

#include <memory>

#include "arguments.h"
#include "change/attribute_change.h"
#include "command.h"

namespace cfg32::tool {

namespace {

struct arguments : attribute_of_entry {
    std::vector<std::string> values;
};

}  // namespace

action define_unset(CLI::App& parser, settings& options) {
    auto given = std::make_shared<arguments>();
    add_attribute_of_entry(parser, *given);
    add_values(parser, "the values to remove; without any, all of them", given->values);
    return [&options, given] {
        require_no_secrets(given->attribute, given->values);
        return change_attribute(options, given->dn,
                                {modification::remove, given->attribute, given->values});
    };
}

}  // namespace cfg32::tool
