// cfg32 delete: deletes entries.

#include <CLI/CLI.hpp>

#include "change/ldif_command.h"

namespace cfg32::tool {

namespace {

int delete_entries(const settings& options, const std::vector<std::string>& dns,
                   const update_options& how) {
    std::vector<change_record> records;
    records.reserve(dns.size());
    for (const std::string& dn : dns) {
        records.push_back({change_record::remove, dn, {}});
    }
    return print_result(options, update(options, records, how));
}

}  // namespace

action define_delete(CLI::App& parser, settings& options) {
    const auto given = add_ldif_options(parser);
    const auto dns = std::make_shared<std::vector<std::string>>();
    parser.add_flag("-r,--recursive", given->how.deletes_trees,
                    "delete an entry with everything below it");
    parser.add_option("dn", *dns, "the entries to delete; without any, LDIF names them")
        ->type_name("DN")
        ->excludes(parser.get_option("--ldif"));
    return [&options, given, dns] {
        return dns->empty() ? update_from_ldif(options, *given, change_record::remove, true)
                            : delete_entries(options, *dns, given->how);
    };
}

}  // namespace cfg32::tool
