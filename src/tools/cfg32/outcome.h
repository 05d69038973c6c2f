#pragma once

// How a command ends when it is not simply done.

#include <exception>
#include <string>
#include <string_view>

class LDIF_Exception;
struct CfgHandle;

namespace cfg32::tool {

enum exit_status {
    done = 0,
    answer_is_no = 1,  ///< problems found, not found, differs
    usage_error = 2,
    failed = 3  ///< the message names the LDAP result, where there is one
};

/// Ends the command with a message on standard error and an exit status.
class ended : public std::exception {
  public:
    ended(exit_status status, std::string message);

    exit_status status() const { return status_; }
    const char* what() const noexcept override { return message_.c_str(); }

  private:
    exit_status status_;
    std::string message_;
};

/// "<text> [<the result's name> (<code>)]", without repeating a name that the text ends with.
std::string with_result(std::string_view text, int code);

/// Ends the command with an LDAP result.
[[noreturn]] void fail(int code, std::string_view text);

/// Ends the command with what the system said (an errno) of a file or another thing.
[[noreturn]] void fail_for_system(std::string_view what, int error);

/// What the innermost cause says, which is the most; or what this program says in its place.
std::string message_of(const LDIF_Exception& e);

/// What a failure of the library says: file and line, message, result, and below it the entry, the
/// attribute with its value (as far as it may be seen) and what would have been accepted.
/// file_name takes the place of the file's name, unless it is empty.
std::string report(const LDIF_Exception& e, std::string_view file_name = {});

/// Ends the command with the failure of a handle's last call, which returned that code.
[[noreturn]] void fail(CfgHandle* handle, int code, std::string_view file_name);

}  // namespace cfg32::tool
