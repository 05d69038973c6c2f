#include "file_lock.h"

#include <cerrno>
#include <thread>

#include "open_regular.h"
#include "retry.h"

namespace cfg32 {

namespace {

using namespace std::chrono_literals;

/// A lock can't be waited for with a time limit, so it is asked for again and again: often enough
/// that one who gives it back and wants it again at once does not always come first.
constexpr auto between_attempts = 500us;

/// Answers of flock(2) that mean that there are no locks here: network file systems without them,
/// or without this kind on a file that is open for reading only.
bool is_without_locks(int error) {
    return error == ENOLCK || error == EOPNOTSUPP || error == ENOSYS || error == EINVAL ||
           error == EBADF;
}

bool lock(int file, int operation) {
    return retry_interrupted([=] { return flock(file, operation | LOCK_NB); }) == 0 ||
           is_without_locks(errno);
}

}  // namespace

locked_file::locked_file(const char* path, int flags, int operation,
                         std::chrono::milliseconds wait) {
    const auto end = std::chrono::steady_clock::now() + wait;
    while (!take(path, flags, operation)) {
        if (errno != EWOULDBLOCK || std::chrono::steady_clock::now() >= end) {
            give_back();
            return;
        }
        std::this_thread::sleep_for(between_attempts);
    }
}

/// One attempt. A file that was replaced meanwhile counts as one that somebody else has.
bool locked_file::take(const char* path, int flags, int operation) {
    if (!file_ && !(file_ = open_regular(path, status_, flags))) {
        return false;
    }
    const bool is_locked = lock(file_.get(), operation);
    const int error = errno;
    struct stat named;
    if (stat(path, &named) != 0) {
        return false;
    }
    if (!is_same_file(named, status_)) {
        give_back();
        errno = EWOULDBLOCK;
        return false;
    }
    status_ = named;
    errno = error;
    return is_locked;
}

locked_file::~locked_file() { give_back(); }

/// Closing the file would leave the lock to a child process that was forked meanwhile.
void locked_file::give_back() {
    if (file_) {
        const int saved = errno;
        flock(file_.get(), LOCK_UN);
        file_.close();
        errno = saved;
    }
}

}  // namespace cfg32
