// What follows from the options that every command shares.

#include "settings.h"

#include <memory>

#include "cfg32.h"
#include "input.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

/// The server's own configuration file.
std::string default_file_name() {
    const std::unique_ptr<CfgHandle, int (*)(CfgHandle*)> handle(cfg_init(), cfg_unbind);
    const char* name = cfg_get_file_name(handle.get());
    if (!name) {
        throw ended(usage_error, "where the server is installed is not known: name a file with -f");
    }
    return name;
}

}  // namespace

std::string settings::file_name() const { return file.empty() ? default_file_name() : file; }

std::string settings::backup_name() const {
    return has_no_backup ? "" : backup_option.empty() ? file_name() + ".bak" : backup_option;
}

secret settings::bind_password() const {
    if (asks_password) {
        return ask_secret("Password of " + bind_dn + ": ");
    }
    if (password_file.empty()) {
        throw ended(usage_error, "-D needs a password: add -W or -y FILE");
    }
    return input_password(password_file);
}

}  // namespace cfg32::tool
