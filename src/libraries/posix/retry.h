#pragma once

#include <cerrno>

namespace cfg32 {

// Repeats a system call for as long as a signal interrupts it.
template <typename Call>
auto retry_interrupted(Call call) {
    auto result = call();
    while (result < 0 && errno == EINTR) {
        result = call();
    }
    return result;
}

}  // namespace cfg32
