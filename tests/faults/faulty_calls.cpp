#include "faulty_calls.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <grp.h>
#include <pwd.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/random.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <utility>

#include "failing_new.h"
#include "passed_call.h"

namespace cfg32::tests {

namespace {

/// More than any call makes that ends, also one that waits its longest for a lock.
constexpr size_t most_calls = 200'000;

/// So little is taken at once or not at all: the system copies a page at a time.
constexpr size_t indivisible = 512;

template <class Call>
ssize_t transfer(const char* name, int file, size_t size, size_t available, Call call) {
    const size_t most = std::min(size, available);
    const bool is_divisible = most > indivisible;
    const auto cut = [&](share part) {
        return call(part == half && is_divisible ? (most + 1) / 2 : size);
    };
    return passed(name, about(file, size), is_divisible, cut, with_errno);
}

/// How much is left of a file to be read.
size_t available(int file, off_t position) {
    struct stat status;
    static const auto fstat = next<decltype(&::fstat)>("fstat");
    const bool is_known = current && position >= 0 && fstat(file, &status) == 0;
    return is_known && status.st_size > position ? static_cast<size_t>(status.st_size - position)
                                                 : 0;
}

size_t available(int file) { return current ? available(file, lseek(file, 0, SEEK_CUR)) : 0; }

/// For the look-ups of users and groups, which return their error.
template <class Found, class Call>
int look_up(const char* name, Found** found, Call call) {
    return passed(
        name, "", false, [&](share) { return call(); },
        [&](int error) {
            *found = nullptr;
            return error;
        });
}

}  // namespace

watched_calls::watched_calls(std::vector<fault> faults) : faults_(std::move(faults)) {
    current = this;
}

watched_calls::~watched_calls() { current = nullptr; }

const fault* watched_calls::note(const char* name, const std::string& about, bool is_transfer) {
    // What is done here for the list shall not be seen itself.
    const failing_allocation::pause pause;
    current = nullptr;
    seen_.push_back({name, about, is_transfer, false});
    if (seen_.size() > most_calls) {
        seen_.resize(100);
        fprintf(stderr, "the calls do not end:\n%s", listed(seen_).c_str());
        abort();
    }
    const auto found = std::find_if(faults_.begin(), faults_.end(), [&](const fault& planned) {
        return (planned.nth == 0 || planned.nth == seen_.size()) &&
               (planned.name.empty() || planned.name == name);
    });
    seen_.back().has_fault = found != faults_.end();
    current = this;
    return found == faults_.end() ? nullptr : &*found;
}

std::string listed(const std::vector<seen_call>& calls) {
    std::string text;
    for (size_t i = 0; i < calls.size(); ++i) {
        text += (calls[i].has_fault ? "* " : "  ") + std::to_string(i + 1) + " " + calls[i].name +
                "(" + calls[i].about + ")\n";
    }
    return text;
}

const std::vector<std::string>& wrapped_names() {
    static const std::vector<std::string> names = {
        "close",     "copy_file_range", "fallocate",    "fchmod",     "fchown",     "fdatasync",
        "flock",     "fgetxattr",       "fremovexattr", "fstat",      "fstat64",    "fsync",
        "ftruncate", "futimens",        "getgrgid_r",   "getgrnam_r", "getpwnam_r", "getpwuid_r",
        "getrandom", "getrlimit",       "nanosleep",    "open",       "open64",     "openat",
        "openat64",  "pread",           "pwrite",       "read",       "renameat",   "stat",
        "stat64",    "unlinkat",        "write",
    };
    return names;
}

}  // namespace cfg32::tests

using namespace cfg32::tests;

extern "C" {

// Files are opened

int open(const char* path, int flags, ...) {
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = flags & O_CREAT ? va_arg(rest, mode_t) : 0;
    va_end(rest);
    static const auto real = next<decltype(&::open)>("open");
    return simple("open", about(path), [=] { return real(path, flags, mode); });
}

int open64(const char* path, int flags, ...) {
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = flags & O_CREAT ? va_arg(rest, mode_t) : 0;
    va_end(rest);
    static const auto real = next<decltype(&::open64)>("open64");
    return simple("open64", about(path), [=] { return real(path, flags, mode); });
}

int openat(int folder, const char* path, int flags, ...) {
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = flags & O_CREAT ? va_arg(rest, mode_t) : 0;
    va_end(rest);
    static const auto real = next<decltype(&::openat)>("openat");
    return simple("openat", about(path), [=] { return real(folder, path, flags, mode); });
}

int openat64(int folder, const char* path, int flags, ...) {
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = flags & O_CREAT ? va_arg(rest, mode_t) : 0;
    va_end(rest);
    static const auto real = next<decltype(&::openat64)>("openat64");
    return simple("openat64", about(path), [=] { return real(folder, path, flags, mode); });
}

/// One that fails has closed the file nevertheless, as on Linux.
int close(int file) {
    static const auto real = next<decltype(&::close)>("close");
    return passed(
        "close", about(file), false, [=](share) { return real(file); },
        [=](int error) {
            real(file);
            return with_errno(error);
        });
}

int flock(int file, int operation) noexcept {
    static const auto real = next<decltype(&::flock)>("flock");
    return simple("flock", about(file), [=] { return real(file, operation); });
}

// Their content

ssize_t read(int file, void* buffer, size_t size) {
    static const auto real = next<decltype(&::read)>("read");
    return transfer("read", file, size, available(file),
                    [=](size_t part) { return real(file, buffer, part); });
}

ssize_t pread(int file, void* buffer, size_t size, off_t offset) {
    static const auto real = next<decltype(&::pread)>("pread");
    return transfer("pread", file, size, available(file, offset),
                    [=](size_t part) { return real(file, buffer, part, offset); });
}

ssize_t write(int file, const void* buffer, size_t size) {
    static const auto real = next<decltype(&::write)>("write");
    return transfer("write", file, size, size,
                    [=](size_t part) { return real(file, buffer, part); });
}

ssize_t pwrite(int file, const void* buffer, size_t size, off_t offset) {
    static const auto real = next<decltype(&::pwrite)>("pwrite");
    return transfer("pwrite", file, size, size,
                    [=](size_t part) { return real(file, buffer, part, offset); });
}

ssize_t copy_file_range(int from, off64_t* from_at, int to, off64_t* to_at, size_t size,
                        unsigned flags) {
    static const auto real = next<decltype(&::copy_file_range)>("copy_file_range");
    return transfer("copy_file_range", from, size, available(from),
                    [=](size_t part) { return real(from, from_at, to, to_at, part, flags); });
}

int ftruncate(int file, off_t size) noexcept {
    static const auto real = next<decltype(&::ftruncate)>("ftruncate");
    return simple("ftruncate", about(file, static_cast<size_t>(size)),
                  [=] { return real(file, size); });
}

int fallocate(int file, int mode, off_t offset, off_t size) {
    static const auto real = next<decltype(&::fallocate)>("fallocate");
    return simple("fallocate", about(file, static_cast<size_t>(size)),
                  [=] { return real(file, mode, offset, size); });
}

int fsync(int file) {
    static const auto real = next<decltype(&::fsync)>("fsync");
    return simple("fsync", about(file), [=] { return real(file); });
}

int fdatasync(int file) {
    static const auto real = next<decltype(&::fdatasync)>("fdatasync");
    return simple("fdatasync", about(file), [=] { return real(file); });
}

// Their status

int stat(const char* path, struct stat* status) noexcept {
    static const auto real = next<int (*)(const char*, struct stat*)>("stat");
    return simple("stat", about(path), [=] { return real(path, status); });
}

int stat64(const char* path, struct stat64* status) noexcept {
    static const auto real = next<int (*)(const char*, struct stat64*)>("stat64");
    return simple("stat64", about(path), [=] { return real(path, status); });
}

int fstat(int file, struct stat* status) noexcept {
    static const auto real = next<decltype(&::fstat)>("fstat");
    return simple("fstat", about(file), [=] { return real(file, status); });
}

int fstat64(int file, struct stat64* status) noexcept {
    static const auto real = next<decltype(&::fstat64)>("fstat64");
    return simple("fstat64", about(file), [=] { return real(file, status); });
}

int futimens(int file, const struct timespec times[2]) noexcept {
    static const auto real = next<decltype(&::futimens)>("futimens");
    return simple("futimens", about(file), [=] { return real(file, times); });
}

int fchmod(int file, mode_t mode) noexcept {
    static const auto real = next<decltype(&::fchmod)>("fchmod");
    return simple("fchmod", about(file), [=] { return real(file, mode); });
}

int fchown(int file, uid_t owner, gid_t group) noexcept {
    static const auto real = next<decltype(&::fchown)>("fchown");
    return simple("fchown", about(file), [=] { return real(file, owner, group); });
}

ssize_t fgetxattr(int file, const char* name, void* value, size_t size) noexcept {
    static const auto real = next<decltype(&::fgetxattr)>("fgetxattr");
    return simple("fgetxattr", about(file), [=] { return real(file, name, value, size); });
}
int fremovexattr(int file, const char* name) noexcept {
    static const auto real = next<decltype(&::fremovexattr)>("fremovexattr");
    return simple("fremovexattr", about(file), [=] { return real(file, name); });
}

// Their names

int renameat(int from, const char* old_name, int to, const char* new_name) noexcept {
    static const auto real = next<decltype(&::renameat)>("renameat");
    return simple("renameat", about(new_name), [=] { return real(from, old_name, to, new_name); });
}

int unlinkat(int folder, const char* name, int flags) noexcept {
    static const auto real = next<decltype(&::unlinkat)>("unlinkat");
    return simple("unlinkat", about(name), [=] { return real(folder, name, flags); });
}

// The rest of the system

int getpwuid_r(uid_t id, passwd* record, char* buffer, size_t size, passwd** found) {
    static const auto real = next<decltype(&::getpwuid_r)>("getpwuid_r");
    return look_up("getpwuid_r", found, [=] { return real(id, record, buffer, size, found); });
}

int getgrgid_r(gid_t id, group* record, char* buffer, size_t size, group** found) {
    static const auto real = next<decltype(&::getgrgid_r)>("getgrgid_r");
    return look_up("getgrgid_r", found, [=] { return real(id, record, buffer, size, found); });
}

int getpwnam_r(const char* name, passwd* record, char* buffer, size_t size, passwd** found) {
    static const auto real = next<decltype(&::getpwnam_r)>("getpwnam_r");
    return look_up("getpwnam_r", found, [=] { return real(name, record, buffer, size, found); });
}

int getgrnam_r(const char* name, group* record, char* buffer, size_t size, group** found) {
    static const auto real = next<decltype(&::getgrnam_r)>("getgrnam_r");
    return look_up("getgrnam_r", found, [=] { return real(name, record, buffer, size, found); });
}

ssize_t getrandom(void* buffer, size_t size, unsigned flags) {
    static const auto real = next<decltype(&::getrandom)>("getrandom");
    return simple("getrandom", "", [=] { return real(buffer, size, flags); });
}

int getrlimit(__rlimit_resource_t resource, struct rlimit* limit) noexcept {
    static const auto real = next<decltype(&::getrlimit)>("getrlimit");
    return simple("getrlimit", "", [=] { return real(resource, limit); });
}

int nanosleep(const struct timespec* wanted, struct timespec* left) {
    static const auto real = next<decltype(&::nanosleep)>("nanosleep");
    return simple("nanosleep", "", [=] { return real(wanted, left); });
}

}  // extern "C"
