#pragma once

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

namespace cfg32::tests {

/// Runs body, which returns 0 for success, in a child process that may do no more than anybody
/// else; returns what body returned. What it writes to standard error explains a failure.
template <class Body>
int as_nobody(Body&& body) {
    constexpr unsigned nobody = 65534;
    const pid_t child = fork();
    EXPECT_NE(child, -1);
    if (child == 0) {
        if (geteuid() == 0 && (setgid(nobody) != 0 || setuid(nobody) != 0)) {
            _exit(99);
        }
        _exit(body());
    }
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace cfg32::tests
