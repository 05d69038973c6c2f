// cfg32 schema: all attributes that the server understands.

#include <fmt/format.h>

#include <algorithm>
#include <memory>

#include "LDIF_AttrType.h"
#include "arguments.h"
#include "command.h"
#include "outcome.h"
#include "schema/attribute_json.h"
#include "schema/attribute_words.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

using row_list = std::vector<const _AttrType*>;

size_t longest_name(const row_list& rows) {
    size_t longest = 0;
    for (const _AttrType* row : rows) {
        longest = std::max(longest, std::string_view(row->name).size());
    }
    return longest;
}

const char* number_of_values(const _AttrType& row) { return row.isSingle ? "one" : "several"; }

void print_table(const row_list& rows) {
    const size_t width = longest_name(rows);
    const std::string heading =
        fmt::format("{:{}}  {:6}  {:7}  {}", "ATTRIBUTE", width, "SYNTAX", "VALUES", "ACCEPTS");
    fmt::print("{}\n", styled(stdout, style::place, heading));
    for (const _AttrType* row : rows) {
        fmt::print("{:{}}  {:6}  {:7}  {}\n", row->name, width, syntax_name(*row),
                   number_of_values(*row), accepted_values(*row));
    }
}

void print_markdown(const row_list& rows) {
    fmt::print("| attribute | syntax | values | accepts | example |\n|---|---|---|---|---|\n");
    for (const _AttrType* row : rows) {
        fmt::print("| `{}` | {} | {} | {} | `{}` |\n", row->name, syntax_name(*row),
                   number_of_values(*row), accepted_values(*row), example_value(*row));
    }
}

}  // namespace

action define_schema(CLI::App& parser, settings& options) {
    using printer = void (*)(const row_list& rows);
    const auto print = std::make_shared<printer>(print_table);
    add_format(
        parser, "how to print the list; else as a table", *print,
        {{"table", print_table}, {"json", print_attributes_json}, {"markdown", print_markdown}});
    return [print, &options] {
        (options.is_json ? print_attributes_json : *print)(all_attributes());
        return done;
    };
}

}  // namespace cfg32::tool
