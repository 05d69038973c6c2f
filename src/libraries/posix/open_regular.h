#pragma once

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>

#include "retry.h"
#include "unique_fd.h"

namespace cfg32 {

// Opens a regular file and takes the status of what was opened. Anything else is refused (errno
// EISDIR for a directory, else EINVAL), without ever waiting for the other end of a FIFO and
// without making a terminal the controlling one. mode is for O_CREAT.
inline unique_fd open_regular(const char* path, struct stat& status, int flags = O_RDONLY,
                              mode_t mode = 0) {
    // O_NONBLOCK means nothing to a regular file; it keeps open(2) from blocking on the others.
    const int all_flags = flags | O_NONBLOCK | O_NOCTTY | O_CLOEXEC;
    unique_fd fd(retry_interrupted([=] { return ::open(path, all_flags, mode); }));
    if (!fd || ::fstat(fd.get(), &status) != 0) {
        return unique_fd();
    }
    if (!S_ISREG(status.st_mode)) {
        errno = S_ISDIR(status.st_mode) ? EISDIR : EINVAL;
        return unique_fd();
    }
    return fd;
}

}  // namespace cfg32
