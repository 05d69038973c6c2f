// cfg32 delete: deletes entries.

#include <memory>

#include "arguments.h"
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
    add_flag(parser, "-r,--recursive", "delete an entry with everything below it",
             given->how.deletes_trees);
    add_argument(parser, "dn", "DN", "the entries to delete; without any, LDIF names them", *dns);
    exclude(parser, "dn", "--ldif");
    return [&options, given, dns] {
        return dns->empty() ? update_from_ldif(options, *given, change_record::remove, true)
                            : delete_entries(options, *dns, given->how);
    };
}

}  // namespace cfg32::tool
