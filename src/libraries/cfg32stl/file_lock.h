#pragma once

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>

#include <chrono>

#include "unique_fd.h"

namespace cfg32 {

/// How long a lock is waited for.
inline constexpr std::chrono::seconds longest_wait{10};

/// An open file and the advisory lock on it (flock(2)), which other processes respect that use
/// this library, and other handles of this one. The lock goes with the object.
class locked_file {
  public:
    /// Nothing.
    locked_file() = default;
    /// Opens the regular file that the path names, as open_regular() does, and locks it (operation
    /// is LOCK_SH or LOCK_EX); when both are done, the path still names that file. On a file system
    /// that has no locks it goes without. False, with the reason in errno, when that fails;
    /// EWOULDBLOCK when somebody else had the lock all the time.
    locked_file(const char* path, int flags, int operation,
                std::chrono::milliseconds wait = longest_wait);
    locked_file(locked_file&&) noexcept = default;
    locked_file& operator=(locked_file&&) noexcept = default;
    ~locked_file();

    explicit operator bool() const { return static_cast<bool>(file_); }
    int get() const { return file_.get(); }

    /// The file's status when it was locked.
    const struct stat& status() const { return status_; }

  private:
    bool take(const char* path, int flags, int operation);

    unique_fd file_;
    struct stat status_ {};
};

inline bool is_same_file(const struct stat& left, const struct stat& right) {
    return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

}  // namespace cfg32
