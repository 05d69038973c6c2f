#pragma once

// How the library throws. A failure is a constant {LDAP code, extended code, text} beside the code
// that throws it; raise() throws it, with_context() adds what a passing layer knows, and
// with_boundary() turns what nobody expected into the layer's own system error. Outside of these
// and of the C interface there is hardly a try in the library.

#include <cerrno>
#include <new>
#include <string>
#include <utility>

#include "LDIF_Exception.h"

namespace cfg32 {

/// A kind of failure: what its exceptions have in common.
struct failure {
    int ldap;          ///< LDAP result code
    int ext;           ///< extended code (1000 and up), or ldap again
    const char* text;  ///< the message, or its fixed beginning
};

/// Where a throw stands. The compiler fills the default arguments in with the caller's position.
struct throw_site {
    const char* path;
    int line;

    constexpr throw_site(const char* path = __builtin_FILE(), int line = __builtin_LINE())
        : path(path), line(line) {}

    /// The source file as reports name it: the library's folder and the file's base name.
    std::string source() const;
};

/// Makes the exception for a failure; detail is appended to its text.
LDIF_Exception make_exception(const failure& kind, const std::string& detail = {},
                              const throw_site& site = {});

/// Throws a failure without further context.
[[noreturn]] void raise(const failure& kind, const std::string& detail = {},
                        const throw_site& site = {});

/// For what(): a fixed text.
inline constexpr auto in(const char* operation) {
    return [operation] { return std::string("in ") + operation; };
}

inline constexpr failure system_error{80, 1000, "System error "};

/// Details with an error number of the C library before them.
template <class Details>
auto with_errno(int error, Details&& details) {
    return [error, &details](LDIF_Exception& e) {
        e.sysErrno = error;
        details(e);
    };
}

/// For details(LDIF_Exception&) when there is nothing to add but the source position.
inline constexpr auto no_details = [](LDIF_Exception&) {};

/// Throws a failure after details(LDIF_Exception&) has filled in what is known.
template <class Details>
[[noreturn]] void raise_with(const failure& kind, const std::string& detail, Details&& details,
                             const throw_site& site = {}) {
    LDIF_Exception e = make_exception(kind, detail, site);
    details(e);
    throw e;
}

/// Runs body; an LDIF_Exception that leaves it is chained to a new one, which
/// details(LDIF_Exception&) completes. Anything else passes.
template <class Body, class Details>
decltype(auto) with_context(Body&& body, Details&& details, const throw_site& site = {}) {
    try {
        return body();
    } catch (LDIF_Exception& e) {
        LDIF_Exception outer(site.source().c_str(), site.line, std::move(e));
        details(outer);
        throw outer;
    }
}

/// Runs body; turns every exception that is not an LDIF_Exception into "System error " and what()
/// (80/1000), completed by details; exhausted memory shows in its errno. What is mostly "in " and
/// the operation's name.
template <class What, class Body, class Details>
decltype(auto) with_system_error(What&& what, Body&& body, Details&& details,
                                 const throw_site& site = {}) {
    try {
        return body();
    } catch (const LDIF_Exception&) {
        throw;
    } catch (const std::bad_alloc&) {
        raise_with(system_error, what(), with_errno(ENOMEM, details), site);
    } catch (...) {
        raise_with(system_error, what(), details, site);
    }
}

/// Both: chains an LDIF_Exception, turns anything else into the layer's system error.
template <class What, class Body, class Details>
decltype(auto) with_boundary(What&& what, Body&& body, Details&& details,
                             const throw_site& site = {}) {
    return with_system_error(
        what, [&]() -> decltype(auto) { return with_context(body, details, site); }, details, site);
}

}  // namespace cfg32
