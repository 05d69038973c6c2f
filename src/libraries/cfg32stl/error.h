#pragma once

namespace cfg32 {

/// One row of an error table.
struct error_text {
    int code;
    const char* text;
};

}  // namespace cfg32

extern const cfg32::error_text ldap_errlist[];  ///< ends with the code -1
extern const cfg32::error_text cfg_errlist[];   ///< ends with the code 0
