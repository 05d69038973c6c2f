// cfg32 add: adds entries from LDIF.

#include "arguments.h"
#include "change/ldif_command.h"

namespace cfg32::tool {

action define_add(CLI::App& parser, settings& options) {
    const auto given = add_ldif_options(parser);
    add_flag(parser, "--merge", "give an entry that is there already what it lacks",
             given->how.merges);
    return [&options, given] { return update_from_ldif(options, *given, change_record::add); };
}

}  // namespace cfg32::tool
