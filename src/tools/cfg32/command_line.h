#pragma once

namespace cfg32::tool {

/// What main() does with its arguments; returns the exit status.
int run_command_line(int argc, char** argv);

}  // namespace cfg32::tool
