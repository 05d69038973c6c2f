#pragma once

#include <string>

namespace cfg32::tool {

// The first ones end the command when the system can't tell.

/// True when a file has that name.
bool is_there(const std::string& name);

/// True when both names are there and mean the same file.
bool is_same(const std::string& left, const std::string& right);

/// True when the one is there and was made after the other, or the other is not there.
bool is_newer(const std::string& one, const std::string& other);

/// The name that a name means, if it is of a symbolic link, also of one to nothing.
std::string target_of(const std::string& name);

/// Copies a file, complete and durable, with its owner, group and mode. Ends the command when that
/// can't be done.
void copy_file(const std::string& from, const std::string& to);

/// Puts a text in the place of the configuration file's, if that still is what is expected (see
/// LDIF_File::replace). Signals wait until it is done. Throws LDIF_Exception.
void replace_file(const std::string& name, const std::string& backup_name,
                  const std::string& content, const std::string& expected);

}  // namespace cfg32::tool
