#pragma once

#include <unistd.h>

#include <cerrno>
#include <utility>

namespace cfg32 {

// An owned file descriptor. Closing it on the way out of a failure leaves errno as it was.
class unique_fd {
  public:
    unique_fd() = default;
    explicit unique_fd(int fd) : fd_(fd) {}
    unique_fd(unique_fd&& other) noexcept : fd_(std::exchange(other.fd_, -1)) {}
    unique_fd& operator=(unique_fd&& other) noexcept {
        std::swap(fd_, other.fd_);
        return *this;
    }
    ~unique_fd() {
        const int saved = errno;
        close();
        errno = saved;
    }

    explicit operator bool() const { return fd_ >= 0; }
    int get() const { return fd_; }

    // Linux frees the descriptor whatever close(2) reports, so it is never closed twice.
    bool close() {
        const int fd = std::exchange(fd_, -1);
        return fd < 0 || ::close(fd) == 0 || errno == EINTR;
    }

  private:
    int fd_ = -1;
};

}  // namespace cfg32
