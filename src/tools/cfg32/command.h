#pragma once

// The commands. Each has a file of its own in commands/, which describes its arguments and carries
// it out; the table in commands.cpp drives parsing, help, completion and the manual.

#include <functional>
#include <span>
#include <string>
#include <utility>
#include <vector>

#include "outcome.h"
#include "settings.h"

namespace CLI {
class App;
}

namespace cfg32::tool {

/// Carries the command out, after its arguments were parsed. Returns the exit status.
using action = std::function<int()>;

struct command {
    const char* name;
    const char* summary;
    /// Adds the command's own arguments and options to the parser.
    action (*define)(CLI::App& parser, settings& options);
};

std::span<const command> commands();

// Options that several commands have.
void add_json_option(CLI::App& parser, settings& options);
void add_dry_run_option(CLI::App& parser, settings& options);

#define COMMAND(name, summary) action define_##name(CLI::App& parser, settings& options);
#include "commands.def"
#undef COMMAND

}  // namespace cfg32::tool
