#pragma once

#include <string>

namespace cfg32::tool {

/// What differs between two versions of a configuration file, in the unified format, with three
/// lines of context; empty when nothing does. Passwords are hidden, also where they changed.
/// Coloured if standard output is, unless it is for a program.
std::string unified_diff(const std::string& before, const std::string& after,
                         const std::string& name, bool is_for_people = true);

}  // namespace cfg32::tool
