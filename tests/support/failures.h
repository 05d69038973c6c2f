#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "LDIF_Exception.h"

namespace cfg32::tests {

/// Runs body and returns the LDIF_Exception that it throws. A body that throws nothing fails the
/// test and gives an exception without codes.
template <class Body>
LDIF_Exception failure_of(Body&& body) {
    try {
        body();
    } catch (const LDIF_Exception& e) {
        return e;
    }
    ADD_FAILURE() << "no LDIF_Exception was thrown";
    return LDIF_Exception("", 0, 0, 0, "");
}

/// "ldapErr/extErr msg", for a comparison that shows all three at once.
inline std::string summary(const LDIF_Exception& e) {
    return std::to_string(e.ldapErr) + "/" + std::to_string(e.extErr) + " " + e.msg;
}

/// The innermost exception of a chain: the one that was thrown first.
inline const LDIF_Exception& first_cause(const LDIF_Exception& e) {
    const LDIF_Exception* innermost = &e;
    while (innermost->cause) {
        innermost = innermost->cause.get();
    }
    return *innermost;
}

}  // namespace cfg32::tests
