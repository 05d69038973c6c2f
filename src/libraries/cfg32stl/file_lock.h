#pragma once

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>

#include <chrono>

#include "unique_fd.h"

namespace cfg32 {

/// How long a lock is waited for.
inline constexpr std::chrono::seconds longest_wait{10};

/// For a file that is opened like the others, but not locked.
inline constexpr int without_lock = LOCK_UN;

/// An open file and the advisory lock on it (flock(2)), which other processes respect that use
/// this library, and other handles of this one. The lock goes with the object.
class locked_file {
  public:
    /// Nothing.
    locked_file() = default;
    /// Opens the regular file that the path names, as open_regular() does, and locks it (operation
    /// is LOCK_SH, LOCK_EX or without_lock); when both are done, the path still names that file. On
    /// a file system that has no locks it goes without. False, with the reason in errno, when that
    /// fails; EWOULDBLOCK when somebody else had the lock all the time.
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
    void give_back();
    bool take(const char* path, int flags, int operation);

    unique_fd file_;
    struct stat status_ {};
};

inline bool is_same_file(const struct stat& left, const struct stat& right) {
    return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

/// The same, and not modified in between.
inline bool is_same_version(const struct stat& left, const struct stat& right) {
    return is_same_file(left, right) && left.st_mtim.tv_sec == right.st_mtim.tv_sec &&
           left.st_mtim.tv_nsec == right.st_mtim.tv_nsec;
}

}  // namespace cfg32
