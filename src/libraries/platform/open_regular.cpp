#include "open_regular.h"

#include <fcntl.h>

#include "retry.h"

namespace cfg32::platform {

unique_fd open_regular(const char* path, struct stat& status) {
    // O_NONBLOCK means nothing to a regular file; it keeps open(2) from blocking on the others.
    unique_fd fd(retry_interrupted(
        [path] { return ::open(path, O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC); }));
    if (!fd || ::fstat(fd.get(), &status) != 0)
        return unique_fd();
    if (!S_ISREG(status.st_mode)) {
        errno = S_ISDIR(status.st_mode) ? EISDIR : EINVAL;
        return unique_fd();
    }
    return fd;
}

}  // namespace cfg32::platform
