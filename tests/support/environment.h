#pragma once

#include <cstdlib>

namespace cfg32::tests {

/// The number of a variable of the environment, or what is usual.
inline unsigned long number_from_environment(const char* name, unsigned long usual) {
    const char* text = getenv(name);
    return text && *text ? strtoul(text, nullptr, 10) : usual;
}

}  // namespace cfg32::tests
