#pragma once

#include <sys/stat.h>

#include "unique_fd.h"

namespace cfg32::platform {

// Opens a regular file for reading and takes the status of what was opened. Anything else is
// refused (errno EISDIR for a directory, else EINVAL), without ever waiting for the other end of a
// FIFO and without making a terminal the controlling one.
unique_fd open_regular(const char* path, struct stat& status);

}  // namespace cfg32::platform
