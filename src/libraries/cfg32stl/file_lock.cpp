#include "file_lock.h"

#include <cerrno>
#include <thread>

#include "open_regular.h"

namespace cfg32 {

namespace {

using namespace std::chrono_literals;
using deadline = std::chrono::steady_clock::time_point;

/// A lock can't be waited for with a time limit, so it is asked for again and again: often enough
/// that one who gives it back and wants it again at once does not always come first.
constexpr auto between_attempts = 500us;

bool is_too_late(deadline end) { return std::chrono::steady_clock::now() >= end; }

/// Answers of flock(2) that mean that there are no locks here: network file systems without them,
/// or without this kind on a file that is open for reading only.
bool is_without_locks(int error) {
    return error == ENOLCK || error == EOPNOTSUPP || error == ENOSYS || error == EINVAL ||
           error == EBADF;
}

bool lock(int file, int operation, deadline end) {
    while (flock(file, operation | LOCK_NB) != 0) {
        if (errno == EINTR) {
            continue;
        }
        if (errno != EWOULDBLOCK) {
            return is_without_locks(errno);
        }
        if (is_too_late(end)) {
            errno = EWOULDBLOCK;
            return false;
        }
        std::this_thread::sleep_for(between_attempts);
    }
    return true;
}

}  // namespace

locked_file::locked_file(const char* path, int flags, int operation,
                         std::chrono::milliseconds wait) {
    const deadline end = std::chrono::steady_clock::now() + wait;
    struct stat opened;
    do {
        file_ = open_regular(path, opened, flags);
        if (!file_) {
            return;
        }
        if (!lock(file_.get(), operation, end) || stat(path, &status_) != 0) {
            file_ = unique_fd();
            return;
        }
        if (is_same_file(opened, status_)) {
            return;
        }
        // It was replaced while the lock was waited for.
    } while (!is_too_late(end));
    file_ = unique_fd();
    errno = EWOULDBLOCK;
}

/// Closing the file would leave the lock to a child process that was forked meanwhile.
locked_file::~locked_file() {
    if (file_) {
        const int saved = errno;
        flock(file_.get(), LOCK_UN);
        errno = saved;
    }
}

}  // namespace cfg32
