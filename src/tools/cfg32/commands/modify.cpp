// cfg32 modify: carries out the changes of an LDIF text.

#include "change/ldif_command.h"

namespace cfg32::tool {

action define_modify(CLI::App& parser, settings& options) {
    const auto given = add_ldif_options(parser);
    return [&options, given] { return update_from_ldif(options, *given, change_record::modify); };
}

}  // namespace cfg32::tool
