// The table of commands.

#include "command.h"

namespace cfg32::tool {

namespace {

constexpr command table[] = {
#define COMMAND(name, traits, summary) {#name, traits, summary, define_##name},
#include "commands.def"
#undef COMMAND
};

}  // namespace

std::span<const command> commands() { return table; }

}  // namespace cfg32::tool
