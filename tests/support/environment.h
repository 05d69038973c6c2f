#pragma once

#include <cstdlib>

namespace cfg32::tests {

/// The number of a variable of the environment, or what is usual.
inline unsigned long number_from_environment(const char* name, unsigned long usual) {
    const char* text = getenv(name);
    return text && *text ? strtoul(text, nullptr, 10) : usual;
}

/// True in a build that is several times slower for its checks, and takes memory of its own.
constexpr bool is_sanitized() {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    return true;
#else
    return false;
#endif
}

}  // namespace cfg32::tests
