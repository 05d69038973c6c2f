// The administrator's command.

#include "command_line.h"

int main(int argc, char** argv) { return cfg32::tool::run_command_line(argc, argv); }
