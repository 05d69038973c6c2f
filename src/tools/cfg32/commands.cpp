// The table of commands, and the options that several of them have.

#include <CLI/CLI.hpp>

#include "command.h"

namespace cfg32::tool {

namespace {

constexpr command table[] = {
#define COMMAND(name, summary) {#name, summary, define_##name},
#include "commands.def"
#undef COMMAND
};

}  // namespace

std::span<const command> commands() { return table; }

void add_json_option(CLI::App& parser, settings& options) {
    parser.add_flag("--json", options.is_json, "print JSON");
}

void add_dry_run_option(CLI::App& parser, settings& options) {
    parser.add_flag("-n,--dry-run", options.is_dry_run,
                    "print the change as a diff and leave the file alone");
}

}  // namespace cfg32::tool
