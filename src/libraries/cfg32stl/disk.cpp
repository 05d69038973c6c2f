#include "disk.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <thread>

#include "retry.h"

namespace cfg32 {

namespace {

using namespace std::chrono_literals;

constexpr size_t read_ahead = 4096;

bool write_all(int file, std::string_view text, size_t offset) {
    while (!text.empty()) {
        const ssize_t written = retry_interrupted(
            [&] { return pwrite(file, text.data(), text.size(), static_cast<off_t>(offset)); });
        if (written == 0) {
            errno = EIO;
        }
        if (written <= 0) {
            return false;
        }
        offset += static_cast<size_t>(written);
        text.remove_prefix(static_cast<size_t>(written));
    }
    return true;
}

bool resize(int file, size_t size) {
    return retry_interrupted([=] { return ftruncate(file, static_cast<off_t>(size)); }) == 0;
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

/// Takes room by writing, for file systems that can't reserve: line feeds, of which no file gets
/// another meaning at its end.
bool write_blank_lines(int file, size_t from, size_t to) {
    if (write_all(file, std::string(to - from, '\n'), from)) {
        return true;
    }
    const int error = errno;
    resize(file, from);
    errno = error;
    return false;
}

bool is_later(const timespec& time, const timespec& than) {
    return time.tv_sec != than.tv_sec ? time.tv_sec > than.tv_sec : time.tv_nsec > than.tv_nsec;
}

timespec later(const timespec& time, std::chrono::nanoseconds step) {
    constexpr long second = 1'000'000'000;
    const long nanoseconds = time.tv_nsec + static_cast<long>(step.count());
    return {time.tv_sec + nanoseconds / second, nanoseconds % second};
}

bool has_later_time(int file, const timespec& before, bool& is_so) {
    struct stat status;
    if (fstat(file, &status) != 0) {
        return false;
    }
    is_so = is_later(status.st_mtim, before);
    return true;
}

/// For files of somebody else: only their owner may choose the time, but who may write may set it
/// to the present one.
bool wait_for_later_time(int file, const timespec& before) {
    constexpr auto coarsest_clock = 2s;  // of FAT
    const auto deadline = std::chrono::steady_clock::now() + coarsest_clock;
    for (bool done = false; !done;) {
        if (std::chrono::steady_clock::now() > deadline) {
            errno = EPERM;
            return false;
        }
        std::this_thread::sleep_for(1ms);
        if (futimens(file, nullptr) != 0 || !has_later_time(file, before, done)) {
            return false;
        }
    }
    return true;
}

}  // namespace

bool read_all(int file, size_t expected, std::string& text) {
    size_t length = 0;
    for (;;) {
        // One more than expected, so that the last read finds the end without growing the text.
        text.resize(length < expected ? expected + 1 : length + read_ahead + length / 2);
        const ssize_t count = retry_interrupted([&] {
            return pread(file, text.data() + length, text.size() - length,
                         static_cast<off_t>(length));
        });
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

bool reserve(int file, size_t present, size_t wanted) {
    if (!is_within_limit(wanted)) {
        return false;
    }
    if (wanted <= present) {
        return true;
    }
    const auto missing = static_cast<off_t>(wanted - present);
    const int result = retry_interrupted(
        [=] { return fallocate(file, FALLOC_FL_KEEP_SIZE, static_cast<off_t>(present), missing); });
    const bool is_possible = result == 0 || (errno != EOPNOTSUPP && errno != ENOSYS);
    return is_possible ? result == 0 : write_blank_lines(file, present, wanted);
}

bool overwrite(int file, std::string_view text, std::string_view mark) {
    if (text.size() < mark.size()) {
        mark = {};
    }
    // The mark is less than what the system writes at once: it is there, or it isn't.
    return write_all(file, mark, 0) && write_all(file, text.substr(mark.size()), mark.size()) &&
           resize(file, text.size()) && write_all(file, text.substr(0, mark.size()), 0) &&
           retry_interrupted([=] { return fdatasync(file); }) == 0;
}

bool make_later(int file, const timespec& before) {
    bool done = false;
    if (!has_later_time(file, before, done)) {
        return false;
    }
    // File systems round times down, some of them to two seconds.
    for (const std::chrono::nanoseconds step : {1ns, 1'000ns, 1'000'000'000ns, 2'000'000'000ns}) {
        if (done) {
            return true;
        }
        const timespec times[2] = {{0, UTIME_OMIT}, later(before, step)};
        if (futimens(file, times) != 0) {
            return errno == EPERM && wait_for_later_time(file, before);
        }
        if (!has_later_time(file, before, done)) {
            return false;
        }
    }
    if (!done) {
        errno = EOVERFLOW;
    }
    return done;
}

}  // namespace cfg32
