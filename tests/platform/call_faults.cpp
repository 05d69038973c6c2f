#include "call_faults.h"

#include <malloc.h>
#include <pwd.h>
#include <sys/types.h>

#include <cerrno>
#include <cstddef>
#include <new>

namespace {

struct armed_fault {
    bool armed = false;
    watched_call call{};
    int nth = 0;
    int error = 0;
    int calls = 0;
};

struct armed_watch {
    std::string_view secret;
    int blocks = 0;
    int leaks = 0;
};

// Faults hit the thread that armed them only.
thread_local armed_fault fault;
thread_local armed_watch watch;

bool fails(watched_call call) {
    if (!fault.armed || fault.call != call)
        return false;
    if (++fault.calls != fault.nth && fault.nth != every_call)
        return false;
    errno = fault.error;
    return true;
}

}  // namespace

call_fault::call_fault(watched_call call, int nth, int error) {
    fault = {true, call, nth, error, 0};
}
call_fault::~call_fault() { fault = {}; }
int call_fault::calls() const { return fault.calls; }
bool call_fault::happened() const { return fault.calls >= fault.nth; }

free_watch::free_watch(std::string_view secret) { watch = {secret, 0, 0}; }
free_watch::~free_watch() { watch = {}; }
int free_watch::blocks() const { return watch.blocks; }
int free_watch::leaks() const { return watch.leaks; }

// NOLINTBEGIN(bugprone-reserved-identifier): the names that --wrap prescribes
extern "C" {

void* __real_malloc(size_t);
void* __wrap_malloc(size_t size) {
    return fails(watched_call::allocate) ? nullptr : __real_malloc(size);
}

void* __real_calloc(size_t, size_t);
void* __wrap_calloc(size_t count, size_t size) {
    return fails(watched_call::allocate) ? nullptr : __real_calloc(count, size);
}

char* __real_strdup(const char*);
char* __wrap_strdup(const char* text) {
    return fails(watched_call::allocate) ? nullptr : __real_strdup(text);
}

void* __real__ZnamRKSt9nothrow_t(size_t, const std::nothrow_t&);
void* __wrap__ZnamRKSt9nothrow_t(size_t size, const std::nothrow_t& tag) {
    return fails(watched_call::allocate) ? nullptr : __real__ZnamRKSt9nothrow_t(size, tag);
}

void __real_free(void*);
void __wrap_free(void* block) {
    if (block != nullptr && !watch.secret.empty()) {
        ++watch.blocks;
        const std::string_view content(static_cast<char*>(block), ::malloc_usable_size(block));
        watch.leaks += content.find(watch.secret) != std::string_view::npos ? 1 : 0;
    }
    __real_free(block);
}

int __real_fchmod(int, mode_t);
int __wrap_fchmod(int fd, mode_t mode) {
    return fails(watched_call::chmod) ? -1 : __real_fchmod(fd, mode);
}

int __real_fchown(int, uid_t, gid_t);
int __wrap_fchown(int fd, uid_t owner, gid_t group) {
    return fails(watched_call::chown) ? -1 : __real_fchown(fd, owner, group);
}

int __real_close(int);
int __wrap_close(int fd) {
    const bool failing = fails(watched_call::close);
    const int error = errno;
    const int result = __real_close(fd);
    if (failing)
        errno = error;
    return failing ? -1 : result;
}

ssize_t __real_copy_file_range(int, off_t*, int, off_t*, size_t, unsigned);
ssize_t __wrap_copy_file_range(int from, off_t* from_at, int to, off_t* to_at, size_t size,
                               unsigned flags) {
    if (fails(watched_call::copy_range))
        return -1;
    return __real_copy_file_range(from, from_at, to, to_at, size, flags);
}

int __real_getpwnam_r(const char*, passwd*, char*, size_t, passwd**);
int __wrap_getpwnam_r(const char* name, passwd* record, char* buffer, size_t size, passwd** found) {
    *found = nullptr;
    return fails(watched_call::look_up) ? fault.error
                                        : __real_getpwnam_r(name, record, buffer, size, found);
}

ssize_t __real_read(int, void*, size_t);
ssize_t __wrap_read(int fd, void* data, size_t size) {
    return fails(watched_call::read) ? -1 : __real_read(fd, data, size);
}

ssize_t __real_getrandom(void*, size_t, unsigned);
ssize_t __wrap_getrandom(void* buffer, size_t size, unsigned flags) {
    return fails(watched_call::random) ? -1 : __real_getrandom(buffer, size, flags);
}

int __real_renameat(int, const char*, int, const char*);
int __wrap_renameat(int from, const char* from_name, int to, const char* to_name) {
    return fails(watched_call::rename) ? -1 : __real_renameat(from, from_name, to, to_name);
}

ssize_t __real_write(int, const void*, size_t);
ssize_t __wrap_write(int fd, const void* data, size_t size) {
    if (fails(watched_call::write))
        return fault.error == 0 ? 0 : -1;
    return __real_write(fd, data, size);
}

int __real_fsync(int);
int __wrap_fsync(int fd) { return fails(watched_call::sync) ? -1 : __real_fsync(fd); }

}  // extern "C"
// NOLINTEND(bugprone-reserved-identifier)
