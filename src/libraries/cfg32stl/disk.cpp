#include "disk.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <thread>

#include "retry.h"

namespace cfg32 {

namespace {

using namespace std::chrono_literals;

constexpr size_t read_ahead = 4096;
constexpr size_t compared_at_once = 65536;

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
    return write_all(file, std::string(to - from, '\n'), from) && sync_content(file);
}

/// Asks the file system for room from one place to another.
bool allocate(int file, int mode, size_t from, size_t to) {
    return retry_interrupted([=] {
               return fallocate(file, FALLOC_FL_KEEP_SIZE | mode, static_cast<off_t>(from),
                                static_cast<off_t>(to - from));
           }) == 0;
}

bool is_unsupported(int error) { return error == EOPNOTSUPP || error == ENOSYS || error == EINVAL; }

/// A copy of the file may share its blocks: the backup does, where the file system can. What is
/// overwritten then takes new ones.
bool unshare(int file, size_t size) {
    return size == 0 || allocate(file, FALLOC_FL_UNSHARE_RANGE, 0, size) || is_unsupported(errno);
}

bool extend(int file, size_t from, size_t to) {
    return from >= to || allocate(file, 0, from, to) ||
           (is_unsupported(errno) && write_blank_lines(file, from, to));
}

bool is_equal(const timespec& left, const timespec& right) {
    return left.tv_sec == right.tv_sec && left.tv_nsec == right.tv_nsec;
}

bool is_later(const timespec& time, const timespec& than) {
    return time.tv_sec != than.tv_sec ? time.tv_sec > than.tv_sec : time.tv_nsec > than.tv_nsec;
}

timespec later(const timespec& time, std::chrono::nanoseconds step) {
    constexpr long second = 1'000'000'000;
    const long nanoseconds = time.tv_nsec + static_cast<long>(step.count());
    return {time.tv_sec + nanoseconds / second, nanoseconds % second};
}

/// For files of somebody else: only their owner may choose the time, but who may write may set it
/// to the present one.
bool wait_for_another_time(int file, const timespec& before, struct stat& status) {
    constexpr auto coarsest_clock = 2s;  // of FAT
    const auto deadline = std::chrono::steady_clock::now() + coarsest_clock;
    while (is_equal(status.st_mtim, before)) {
        if (std::chrono::steady_clock::now() > deadline) {
            errno = EPERM;
            return false;
        }
        std::this_thread::sleep_for(1ms);
        if (futimens(file, nullptr) != 0 || fstat(file, &status) != 0) {
            return false;
        }
    }
    return true;
}

}  // namespace

bool read_all(int file, size_t expected, std::string& text) {
    size_t length = 0;
    // One more than expected, so that the last read finds the end without growing the text.
    text.resize(expected + 1);
    for (;;) {
        if (length == text.size()) {
            text.resize(length + read_ahead + length / 2);
        }
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

std::string first_bytes(int file, size_t count) {
    std::string bytes(count, '\0');
    const ssize_t got =
        retry_interrupted([&] { return pread(file, bytes.data(), bytes.size(), 0); });
    bytes.resize(got < 0 ? 0 : static_cast<size_t>(got));
    return bytes;
}

bool reserve(int file, size_t present, size_t wanted) {
    if (!is_within_limit(wanted)) {
        return false;
    }
    if (unshare(file, std::min(present, wanted)) && extend(file, present, wanted)) {
        return true;
    }
    const int error = errno;
    resize(file, present);  // gives back what was got
    errno = error;
    return false;
}

bool replace_content(int file, std::string_view text, std::string_view mark) {
    // The mark, and what takes its place, is less than the system writes at once: it is there, or
    // it isn't. Blank lines fill the place when the text is shorter.
    std::array<char, longest_mark> head;
    head.fill('\n');
    const size_t place = std::min(mark.size(), head.size());
    const size_t shared = std::min(text.size(), place);
    text.copy(head.data(), shared);
    return write_all(file, mark, 0) && write_all(file, text.substr(shared), place) &&
           resize(file, std::max(text.size(), place)) && write_all(file, {head.data(), place}, 0) &&
           (text.size() >= place || resize(file, text.size()));
}

bool is_content(int file, std::string_view text, bool& is_so) {
    std::array<char, compared_at_once> part;  // no memory is asked for, which might not be there
    size_t offset = 0;
    for (is_so = true; is_so;) {
        const ssize_t count = retry_interrupted(
            [&] { return pread(file, part.data(), part.size(), static_cast<off_t>(offset)); });
        if (count <= 0) {
            is_so = offset == text.size();
            return count == 0;
        }
        const std::string_view expected = text.substr(offset, static_cast<size_t>(count));
        is_so = std::string_view(part.data(), static_cast<size_t>(count)) == expected;
        offset += static_cast<size_t>(count);
    }
    return true;
}

bool sync_content(int file) {
    return retry_interrupted([=] { return fdatasync(file); }) == 0;
}

bool make_later(int file, const timespec& before, struct stat& status) {
    if (fstat(file, &status) != 0) {
        return false;
    }
    // File systems round times down, some of them to two seconds.
    for (const std::chrono::nanoseconds step : {1ns, 1'000ns, 1'000'000'000ns, 2'000'000'000ns}) {
        if (is_later(status.st_mtim, before)) {
            return true;
        }
        const timespec times[2] = {{0, UTIME_OMIT}, later(before, step)};
        if (futimens(file, times) != 0) {
            return errno == EPERM && wait_for_another_time(file, before, status);
        }
        if (fstat(file, &status) != 0) {
            return false;
        }
    }
    errno = EOVERFLOW;
    return is_later(status.st_mtim, before);
}

}  // namespace cfg32
