#pragma once

#include <string>

#include "secret.h"

namespace cfg32::tool {

// What is given to the command besides the configuration: not only from regular files, also from
// pipes (a shell's `<(...)` is one) and terminals. All of these end the command when it can't be
// read.

/// How standard input is called in messages.
inline constexpr const char* standard_input = "standard input";

/// The text of a file of that name.
std::string input_text(const std::string& name);

/// The text of standard input.
std::string input_text();

/// The first line of a file, which one ends with or without a newline.
secret input_password(const std::string& name);

}  // namespace cfg32::tool
