#include "disk.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <span>
#include <thread>

#include "retry.h"

namespace cfg32 {

namespace {

using namespace std::chrono_literals;

constexpr size_t read_ahead = 4096;

/// For what is read in parts: no memory is asked for, which might not be there.
using part_buffer = std::array<char, 65536>;

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

/// The part of a file from there on: what the buffer takes, or less at the end. Null data after a
/// failure.
std::string_view read_part(int file, size_t offset, std::span<char> buffer) {
    size_t length = 0;
    while (length < buffer.size()) {
        const ssize_t count = retry_interrupted([&] {
            return pread(file, buffer.data() + length, buffer.size() - length,
                         static_cast<off_t>(offset + length));
        });
        if (count < 0) {
            return {};
        }
        if (count == 0) {
            break;
        }
        length += static_cast<size_t>(count);
    }
    return {buffer.data(), length};
}

bool copy_from(int other, int file, size_t offset) {
    part_buffer buffer;
    for (;;) {
        const std::string_view part = read_part(other, offset, buffer);
        if (part.empty()) {
            return part.data() != nullptr;
        }
        if (!write_all(file, part, offset)) {
            return false;
        }
        offset += part.size();
    }
}

bool resize(int file, size_t size) {
    return retry_interrupted([=] { return ftruncate(file, static_cast<off_t>(size)); }) == 0;
}

/// Cuts off what was to be had in vain; always false, with the errno of before.
bool give_back(int file, size_t size) {
    const int error = errno;
    resize(file, size);
    errno = error;
    return false;
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
    part_buffer lines;
    lines.fill('\n');
    while (from < to) {
        const size_t part = std::min(to - from, lines.size());
        if (!write_all(file, {lines.data(), part}, from)) {
            return false;
        }
        from += part;
    }
    return sync_content(file);
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

bool extend(int file, size_t from, size_t to, bool is_marked) {
    return from >= to || allocate(file, 0, from, to) ||
           (is_unsupported(errno) && (is_marked || write_blank_lines(file, from, to)));
}

/// A size may come to the disk later than what is written beyond the old one: a file that is
/// shorter than the mark grows before, so that the mark has no part missing.
bool make_place_for(std::string_view mark, int file, size_t size) {
    return size >= mark.size() || write_blank_lines(file, size, mark.size());
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

/// What is written and not synced may be on the disk after a power cut, or not, in any order. So
/// the mark is there before anything else is written, and goes when everything else is there.
bool is_in_order(int file, std::string_view mark) { return mark.empty() || sync_content(file); }

bool write_mark(int file, std::string_view mark) {
    if (mark.empty()) {
        return true;
    }
    struct stat status;
    if (fstat(file, &status) != 0) {
        return false;
    }
    return make_place_for(mark, file, static_cast<size_t>(status.st_size)) &&
           write_all(file, mark, 0) && is_in_order(file, mark);
}

/// Puts the head in the place of the mark, and cuts the file to its size.
bool finish_content(int file, std::string_view head, std::string_view mark, size_t size) {
    // The mark, and what takes its place, is less than the system writes at once: it is there, or
    // it isn't. Blank lines fill the place when the text is shorter.
    const size_t place = mark.size();
    std::array<char, longest_mark> filled;
    filled.fill('\n');
    head.copy(filled.data(), filled.size());
    return resize(file, std::max(size, place)) && is_in_order(file, mark) &&
           write_all(file, {filled.data(), place}, 0) &&
           (size >= place || (is_in_order(file, mark) && resize(file, size)));
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

bool read_first(int file, size_t count, std::string& bytes) {
    bytes.resize(count);
    const std::string_view part = read_part(file, 0, bytes);
    bytes.resize(part.size());
    return part.data() != nullptr;
}

bool reserve(int file, size_t present, size_t wanted, std::string_view mark) {
    const size_t needed = std::max(wanted, mark.size());
    if (!is_within_limit(needed)) {
        return false;
    }
    return (unshare(file, std::min(present, needed)) &&
            extend(file, present, needed, !mark.empty()) && make_place_for(mark, file, present)) ||
           give_back(file, present);
}

bool replace_content(int file, std::string_view text, std::string_view mark) {
    const size_t place = mark.size();
    const std::string_view head = text.substr(0, place);
    return write_mark(file, mark) && write_all(file, text.substr(head.size()), place) &&
           finish_content(file, head, mark, text.size());
}

bool replace_content(int file, int other, std::string_view mark) {
    std::array<char, longest_mark> buffer;
    const size_t place = mark.size();
    const std::string_view head = read_part(other, 0, std::span(buffer).first(place));
    struct stat status;
    if (head.data() == nullptr || fstat(other, &status) != 0) {
        return false;
    }
    return write_mark(file, mark) && copy_from(other, file, place) &&
           finish_content(file, head, mark, static_cast<size_t>(status.st_size));
}

bool is_content(int file, std::string_view text, bool& is_so) {
    part_buffer buffer;
    size_t offset = 0;
    for (is_so = true; is_so;) {
        const std::string_view part = read_part(file, offset, buffer);
        if (part.empty()) {
            is_so = offset == text.size();
            return part.data() != nullptr;
        }
        is_so = part == text.substr(offset, part.size());
        offset += part.size();
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
