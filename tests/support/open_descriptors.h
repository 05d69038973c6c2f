#pragma once

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <chrono>
#include <thread>

namespace cfg32::tests {

/// How many descriptors of this process lead to the file, with that access mode.
inline int open_descriptors(const struct stat& file, int access) {
    constexpr int most = 1024;
    int count = 0;
    for (int number = 0; number < most; ++number) {
        struct stat status;
        const int flags = fcntl(number, F_GETFL);
        // The thread sanitizer takes an fstat() of what another thread has just opened for a race.
        count += flags != -1 && (flags & O_ACCMODE) == access &&
                         fstatat(number, "", &status, AT_EMPTY_PATH) == 0 &&
                         status.st_dev == file.st_dev && status.st_ino == file.st_ino
                     ? 1
                     : 0;
    }
    return count;
}

/// Returns once another thread has the file open, too: one that can't lock it is waiting then.
inline void wait_for_open_descriptors(const struct stat& file, int access, int count) {
    using namespace std::chrono_literals;
    const auto deadline = std::chrono::steady_clock::now() + 60s;
    while (open_descriptors(file, access) < count) {
        if (std::chrono::steady_clock::now() > deadline) {
            ADD_FAILURE() << "nobody opened the file";
            return;
        }
        std::this_thread::sleep_for(1ms);
    }
}

}  // namespace cfg32::tests
