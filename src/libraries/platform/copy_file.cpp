#include <fcntl.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <array>
#include <climits>
#include <cstddef>
#include <cstring>

#include "account_names.h"
#include "cfg32_platform.h"
#include "open_regular.h"
#include "retry.h"
#include "temporary_file.h"
#include "unique_fd.h"

namespace cfg32::platform {

namespace {

constexpr mode_t permission_bits = 07777;
constexpr mode_t group_bits = S_IRWXG;

bool fail(int error) {
    errno = error;
    return false;
}

// A path taken apart into the directory to open and the name within it.
struct target_name {
    std::array<char, PATH_MAX> directory;
    const char* base;
};

bool split_target(const char* target, target_name& name) {
    const char* slash = std::strrchr(target, '/');
    name.base = slash == nullptr ? target : slash + 1;
    if (*name.base == '\0') {
        return fail(*target == '\0' ? ENOENT : EISDIR);
    }
    if (slash == nullptr) {
        name.directory[0] = '.';
        name.directory[1] = '\0';
        return true;
    }
    // The slash stays: it makes the root directory "/" and does no harm elsewhere.
    const std::size_t length = static_cast<std::size_t>(slash - target) + 1;
    if (length >= name.directory.size()) {
        return fail(ENAMETOOLONG);
    }
    std::memcpy(name.directory.data(), target, length);
    name.directory[length] = '\0';
    return true;
}

// rename(2) would replace a device or a FIFO as readily as a file, and a name of the source itself.
bool may_replace(const char* target, const struct stat& source) {
    struct stat status;
    if (::stat(target, &status) != 0) {
        return errno == ENOENT;
    }
    if (S_ISDIR(status.st_mode)) {
        return fail(EISDIR);
    }
    const bool same = status.st_dev == source.st_dev && status.st_ino == source.st_ino;
    return !same && S_ISREG(status.st_mode) ? true : fail(EINVAL);
}

bool write_all(int fd, const char* data, std::size_t size) {
    while (size > 0) {
        const ssize_t written = retry_interrupted([=] { return ::write(fd, data, size); });
        if (written == 0) {
            return fail(EIO);
        }
        if (written < 0) {
            return false;
        }
        data += written;
        size -= static_cast<std::size_t>(written);
    }
    return true;
}

// Copies from the one file's position to its end. What copy_file_range(2) can't do, or does only in
// part (another file system, an old kernel, a file without a true size), is left to read(2) and
// write(2): both ways move the same positions, and a true error comes up again there.
bool copy_content(int from, int to) {
    constexpr std::size_t largest_range = std::size_t{1} << 30;
    while (::copy_file_range(from, nullptr, to, nullptr, largest_range, 0) > 0) {
    }
    std::array<char, 32768> buffer;
    for (;;) {
        const ssize_t got =
            retry_interrupted([&] { return ::read(from, buffer.data(), buffer.size()); });
        if (got <= 0) {
            return got == 0;
        }
        if (!write_all(to, buffer.data(), static_cast<std::size_t>(got))) {
            return false;
        }
    }
}

// A source that was written to meanwhile may have been copied in half.
bool is_unchanged(int fd, const struct stat& before) {
    struct stat now;
    if (::fstat(fd, &now) != 0) {
        return false;
    }
    const bool same = now.st_size == before.st_size &&
                      now.st_mtim.tv_sec == before.st_mtim.tv_sec &&
                      now.st_mtim.tv_nsec == before.st_mtim.tv_nsec;
    return same || fail(EAGAIN);
}

// In the permission bits of a file with an access control list, the group's are the list's mask:
// what any of those whom it names may do at most, and not what the group may (acl(5)).
mode_t without_mask(int from, mode_t mode) {
    return ::fgetxattr(from, "system.posix_acl_access", nullptr, 0) > 0 ? mode & ~group_bits : mode;
}

// The directory's default access control list would let others in as soon as the group bits, which
// are its mask, are set (acl(5)).
bool drop_inherited_access_list(int fd) {
    return ::fremovexattr(fd, "system.posix_acl_access") == 0 || errno == ENODATA ||
           errno == ENOTSUP || errno == ENOSYS;
}

bool give_owner(int fd, uid_t owner, gid_t group) {
    struct stat status;
    if (::fstat(fd, &status) != 0) {
        return false;
    }
    if (owner == status.st_uid) {
        owner = unchanged_owner;
    }
    if (group == status.st_gid) {
        group = unchanged_group;
    }
    if (owner == unchanged_owner && group == unchanged_group) {
        return true;
    }
    return ::fchown(fd, owner, group) == 0;
}

// Keeps an owner and a group that have no name by their numbers, where that is allowed. A group
// that can't be kept leaves its access to no other. Returns the permission bits that remain.
mode_t keep_unnamed(int fd, const struct stat& source, bool owner, bool group, mode_t mode) {
    const bool has_group = !group || give_owner(fd, unchanged_owner, source.st_gid);
    if (owner) {
        give_owner(fd, source.st_uid, unchanged_group);
    }
    return has_group ? mode : mode & ~group_bits;
}

// The permission bits come last: chown(2) clears the set-ID bits, and until the owner is right
// nobody else may get in.
bool give_access(int fd, uid_t owner, gid_t group, mode_t mode) {
    return drop_inherited_access_list(fd) && give_owner(fd, owner, group) &&
           ::fchmod(fd, mode & permission_bits) == 0;
}

// A file system that can't sync a directory says EINVAL (fsync(2)); it has no better promise to
// give, so that is no failure.
bool sync_directory(int directory) {
    return retry_interrupted([=] { return ::fsync(directory); }) == 0 || errno == EINVAL;
}

bool copy_file(const char* source, const char* target, const char* owner, const char* group,
               mode_t mode) {
    if (source == nullptr || target == nullptr) {
        return fail(EINVAL);
    }
    uid_t owner_id;
    gid_t group_id;
    target_name name;
    if (!find_owner(owner, owner_id) || !find_group(group, group_id) ||
        !split_target(target, name)) {
        return false;
    }

    struct stat source_status;
    const unique_fd from = open_regular(source, source_status);
    if (!from || !may_replace(target, source_status)) {
        return false;
    }
    // Opened before anything is written, so that the sync at the end can't fail for lack of it.
    const unique_fd directory(retry_interrupted(
        [&name] { return ::open(name.directory.data(), O_RDONLY | O_DIRECTORY | O_CLOEXEC); }));
    if (!directory) {
        return false;
    }

    temporary_file copy(directory.get());
    if (!copy || !copy_content(from.get(), copy.fd()) || !is_unchanged(from.get(), source_status)) {
        return false;
    }
    mode = keep_unnamed(copy.fd(), source_status, owner == nullptr, group == nullptr, mode);
    return give_access(copy.fd(), owner_id, group_id, without_mask(from.get(), mode)) &&
           retry_interrupted([&copy] { return ::fsync(copy.fd()); }) == 0 &&
           copy.move_to(name.base) && sync_directory(directory.get());
}

}  // namespace

}  // namespace cfg32::platform

bool copyFile(const char* source, const char* target, const char* owner, const char* group,
              mode_t mode) noexcept {
    return cfg32::platform::copy_file(source, target, owner, group, mode);
}
