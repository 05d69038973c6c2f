#include "disk.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "retry.h"

namespace cfg32 {

namespace {

constexpr size_t read_ahead = 4096;

bool write_all(int file, std::string_view text) {
    off_t offset = 0;
    while (!text.empty()) {
        const ssize_t written =
            retry_interrupted([&] { return pwrite(file, text.data(), text.size(), offset); });
        if (written == 0) {
            errno = EIO;
        }
        if (written <= 0) {
            return false;
        }
        offset += written;
        text.remove_prefix(static_cast<size_t>(written));
    }
    return true;
}

/// The process may be limited in how large its files get (setrlimit, POSIX); a reservation that
/// keeps the size does not look at that.
bool is_within_limit(size_t size) {
    rlimit limit;
    if (getrlimit(RLIMIT_FSIZE, &limit) == 0 && limit.rlim_cur != RLIM_INFINITY &&
        size > limit.rlim_cur) {
        errno = EFBIG;
        return false;
    }
    return true;
}

/// Reserves the room between the file's size and the wanted one. A file system that can't reserve
/// is no failure: the write finds out.
bool reserve(int file, size_t size) {
    struct stat status;
    if (!is_within_limit(size) || fstat(file, &status) != 0) {
        return false;
    }
    const off_t missing = static_cast<off_t>(size) - status.st_size;
    return missing <= 0 || retry_interrupted([&] {
                               return fallocate(file, FALLOC_FL_KEEP_SIZE, status.st_size, missing);
                           }) == 0 ||
           errno == EOPNOTSUPP || errno == ENOSYS;
}

}  // namespace

bool read_all(int file, size_t expected, std::string& text) {
    size_t length = 0;
    for (;;) {
        // One more than expected, so that the last read finds the end without growing the text.
        text.resize(length < expected ? expected + 1 : length + read_ahead + length / 2);
        const ssize_t count = retry_interrupted(
            [&] { return read(file, text.data() + length, text.size() - length); });
        if (count < 0) {
            return false;
        }
        length += static_cast<size_t>(count);
        if (count == 0) {
            text.resize(length);
            return true;
        }
    }
}

bool overwrite(int file, std::string_view text) {
    return reserve(file, text.size()) && write_all(file, text) &&
           ftruncate(file, static_cast<off_t>(text.size())) == 0 && fdatasync(file) == 0;
}

}  // namespace cfg32
