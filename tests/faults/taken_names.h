#pragma once

#include <set>
#include <string>

// The names by which a program or a library takes what is elsewhere: none of them may reach a file
// past the tests of this folder.

namespace cfg32::tests {

/// The undefined names of a library or a program, save those that the project's libraries give each
/// other and the command; of object files ("' '" between them) without nm's option for the others.
std::set<std::string> taken_names(const std::string& files, const std::string& option = "-D");

/// True of a name that can't lose a file.
bool is_harmless(const std::string& name);

/// The program or library that something is defined in.
std::string home_of(void* definition);

}  // namespace cfg32::tests
