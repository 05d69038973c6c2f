// cfg32 set: gives an attribute these values.

#include <memory>

#include "arguments.h"
#include "change/attribute_change.h"
#include "command.h"
#include "outcome.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

struct arguments : attribute_of_entry {
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
    add_attribute_of_entry(parser, *given);
    add_values(parser, "all the values it is to have; \"--\" goes before one like \"-x\"",
               given->values, presence::required);
    add_flag(parser, "--unknown-attribute", "take a name that the server does not know",
             given->takes_any_name);
    return [&options, given] { return set(options, *given); };
}

}  // namespace cfg32::tool
