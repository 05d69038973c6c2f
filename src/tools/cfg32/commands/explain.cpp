// cfg32 explain: what an attribute takes.

#include <fmt/format.h>

#include <memory>
#include <utility>

#include "LDIF_AttrType.h"
#include "arguments.h"
#include "command.h"
#include "outcome.h"
#include "schema/attribute_json.h"
#include "schema/attribute_words.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

void print_explained(const _AttrType& row) {
    fmt::print("{}\n", styled(stdout, style::place, row.name));
    fmt::print("  syntax:   {} ({})\n", syntax_in_words(row), syntax_name(row));
    fmt::print("  accepts:  {}\n", accepted_values(row));
    if (enforces_words(row)) {
        fmt::print("            in upper or lower case\n");
    }
    fmt::print("  values:   {}\n", row.isSingle ? "one" : "one or several");
    fmt::print("  example:  {}\n", example_value(row));
}

void complain_of_unknown(const std::string& name) {
    const std::optional<std::string> nearest = nearest_attribute(name);
    complain(nearest ? fmt::format("no attribute is called {}: did you mean {}?", name, *nearest)
                     : fmt::format("no attribute is called {}", name));
}

int explain(const std::vector<std::string>& names, bool is_json) {
    std::vector<const _AttrType*> rows;
    for (const std::string& name : names) {
        if (const _AttrType* row = find_attribute(name)) {
            rows.push_back(row);
        } else {
            complain_of_unknown(name);
        }
    }
    if (is_json) {
        print_attributes_json(rows);
    } else {
        const char* between = "";
        for (const _AttrType* row : rows) {
            fmt::print("{}", std::exchange(between, "\n"));
            print_explained(*row);
        }
    }
    return rows.size() == names.size() ? done : answer_is_no;
}

}  // namespace

action define_explain(CLI::App& parser, settings& options) {
    const auto names = std::make_shared<std::vector<std::string>>();
    add_argument(parser, "attributes", "ATTR", "names of attributes, in upper or lower case",
                 *names, presence::required);
    return [names, &options] { return explain(*names, options.is_json); };
}

}  // namespace cfg32::tool
