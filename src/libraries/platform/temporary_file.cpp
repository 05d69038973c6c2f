#include "temporary_file.h"

#include <fcntl.h>
#include <sys/random.h>
#include <sys/stat.h>

#include <cstdint>
#include <cstdio>

#include "retry.h"

namespace cfg32::platform {

namespace {

constexpr int create_attempts = 16;
constexpr mode_t private_mode = 0600;

int create_exclusively(int directory, const char* name) {
    return retry_interrupted([=] {
        return ::openat(directory, name, O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC,
                        private_mode);
    });
}

}  // namespace

temporary_file::temporary_file(int directory)
    : directory_(directory), fd_(create()), named_(static_cast<bool>(fd_)) {}

temporary_file::~temporary_file() {
    if (named_) {
        const int saved = errno;
        ::unlinkat(directory_, name_.data(), 0);
        errno = saved;
    }
}

int temporary_file::create() {
    for (int attempt = 0; attempt < create_attempts && choose_name(); ++attempt) {
        const int fd = create_exclusively(directory_, name_.data());
        if (fd >= 0 || errno != EEXIST) {
            return fd;
        }
    }
    return -1;
}

bool temporary_file::choose_name() {
    std::uint64_t random = 0;
    const auto got =
        retry_interrupted([&random] { return ::getrandom(&random, sizeof random, 0); });
    if (got != static_cast<ssize_t>(sizeof random)) {
        return false;
    }
    std::snprintf(name_.data(), name_.size(), ".cfg32-%016llx.tmp",
                  static_cast<unsigned long long>(random));
    return true;
}

bool temporary_file::move_to(const char* name) {
    // Some file systems report a failed write no earlier than at the close.
    if (!fd_.close() || ::renameat(directory_, name_.data(), directory_, name) != 0) {
        return false;
    }
    named_ = false;
    return true;
}

}  // namespace cfg32::platform
