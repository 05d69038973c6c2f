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

/// What is the same for many commands.
enum traits : unsigned {
    none = 0,
    binds = 1,    ///< works on the configuration as whoever -D names
    changes = 2,  ///< has -n, which only shows the change
    prints = 4    ///< has --json
};

struct command {
    const char* name;
    unsigned traits;
    const char* summary;
    /// Adds the command's own arguments and options to the parser.
    action (*define)(CLI::App& parser, settings& options);
};

std::span<const command> commands();

#define COMMAND(name, traits, summary) action define_##name(CLI::App& parser, settings& options);
#include "commands.def"
#undef COMMAND

}  // namespace cfg32::tool
