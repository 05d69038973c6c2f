// cfg32 add: adds entries from LDIF.

#include <CLI/CLI.hpp>

#include "change/ldif_command.h"

namespace cfg32::tool {

action define_add(CLI::App& parser, settings& options) {
    const auto given = add_ldif_options(parser);
    parser.add_flag("--merge", given->how.merges,
                    "give an entry that is there already what it lacks");
    return [&options, given] { return update_from_ldif(options, *given, change_record::add); };
}

}  // namespace cfg32::tool
