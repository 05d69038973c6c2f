#include "command.h"
namespace cfg32::tool {
#define COMMAND(name, summary)                                         \
    __attribute__((weak)) action define_##name(CLI::App&, settings&) { \
        return [] { return 3; };                                       \
    }
#include "commands.def"
#undef COMMAND
}  // namespace cfg32::tool
