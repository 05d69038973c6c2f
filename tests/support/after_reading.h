#pragma once

#include <gtest/gtest.h>
#include <poll.h>
#include <sys/inotify.h>
#include <unistd.h>

#include <functional>
#include <string>
#include <thread>
#include <utility>

#include "unique_fd.h"

namespace cfg32::tests {

/// Does something in another thread as soon as somebody has read a file and closed it.
class after_reading {
  public:
    after_reading(const std::string& file, std::function<void()> act)
        : watch_(inotify_init1(IN_CLOEXEC)), act_(std::move(act)) {
        EXPECT_GE(inotify_add_watch(watch_.get(), file.c_str(), IN_CLOSE_NOWRITE), 0);
        thread_ = std::thread([this] { wait(); });
    }
    after_reading(const after_reading&) = delete;
    after_reading& operator=(const after_reading&) = delete;
    ~after_reading() { thread_.join(); }

  private:
    void wait() {
        constexpr int patience_ms = 10'000;
        pollfd readable{watch_.get(), POLLIN, 0};
        if (poll(&readable, 1, patience_ms) == 1) {
            act_();
        }
    }

    const unique_fd watch_;
    const std::function<void()> act_;
    std::thread thread_;
};

}  // namespace cfg32::tests
