#include "account_names.h"

#include <grp.h>
#include <pwd.h>

#include <cerrno>
#include <cstddef>
#include <memory>
#include <new>

namespace cfg32::platform {

namespace {

// A group's record lists all its members and has no upper bound; most fit the first buffer.
constexpr std::size_t first_buffer_size = 2048;
constexpr std::size_t last_buffer_size = std::size_t{16} << 20;

// Runs one of the getXXnam_r routines with a buffer that grows until the record fits.
template <typename Record, typename Number>
bool find_number(int (*lookup)(const char*, Record*, char*, std::size_t, Record**),
                 const char* name, Number Record::*member, Number& number) {
    for (std::size_t size = first_buffer_size; size <= last_buffer_size; size *= 2) {
        const std::unique_ptr<char[]> buffer(new (std::nothrow) char[size]);
        if (!buffer) {
            errno = ENOMEM;
            return false;
        }
        Record record;
        Record* found = nullptr;
        const int error = lookup(name, &record, buffer.get(), size, &found);
        if (error == ERANGE) {
            continue;
        }
        if (found == nullptr) {
            // POSIX asks for 0 when there is no such name; ENOENT, ESRCH, EBADF and EPERM are seen
            // as well, see getpwnam(3).
            const bool real = error == EINTR || error == EIO || error == EMFILE ||
                              error == ENFILE || error == ENOMEM;
            errno = real ? error : EINVAL;
            return false;
        }
        number = found->*member;
        return true;
    }
    errno = ERANGE;
    return false;
}

}  // namespace

bool find_owner(const char* name, uid_t& owner) {
    owner = unchanged_owner;
    return name == nullptr || find_number(&::getpwnam_r, name, &passwd::pw_uid, owner);
}

bool find_group(const char* name, gid_t& group) {
    group = unchanged_group;
    return name == nullptr || find_number(&::getgrnam_r, name, &::group::gr_gid, group);
}

}  // namespace cfg32::platform
