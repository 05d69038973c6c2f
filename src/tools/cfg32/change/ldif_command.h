#pragma once

// What the commands share that take changes as LDIF.

#include <memory>
#include <string>

#include "change/change_record.h"
#include "change/update.h"
#include "command.h"

namespace cfg32::tool {

/// The options of such a command.
struct ldif_options {
    std::string file;  ///< -l; empty for standard input
    update_options how;
};

/// Adds -l and -c. The result lives as long as the command's action keeps it.
std::shared_ptr<ldif_options> add_ldif_options(CLI::App& parser);

/// Reads the LDIF text, carries its records out and prints the result. only_default: records of
/// another kind are errors. Returns the exit status.
int update_from_ldif(const settings& options, const ldif_options& given,
                     change_record::operation default_kind, bool only_default = false);

}  // namespace cfg32::tool
