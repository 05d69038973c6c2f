#pragma once

// What the options that every command shares say.

#include <string>

#include "secret.h"

namespace cfg32::tool {

enum class color_choice { automatic, always, never };

struct settings {
    std::string file;            ///< -f, or the server's own
    std::string bind_dn;         ///< -D; empty for an anonymous bind
    bool asks_password = false;  ///< -W
    std::string password_file;   ///< -y
    std::string key_file;        ///< --key-file
    std::string backup_option;   ///< --backup
    bool has_no_backup = false;  ///< --no-backup
    color_choice color = color_choice::automatic;
    bool is_json = false;     ///< --json, of commands that print data
    bool is_dry_run = false;  ///< -n, of commands that change something

    /// The configuration file. Throws `ended` when none is named and the server's is not known.
    std::string file_name() const;
    /// Where a change puts the file of before; empty for --no-backup.
    std::string backup_name() const;
    /// The password that goes with bind_dn, from the prompt or the file.
    secret bind_password() const;
};

}  // namespace cfg32::tool
