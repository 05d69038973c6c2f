#include "key_data.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "cfg32_platform.h"
#include "open_regular.h"
#include "retry.h"

namespace cfg32::platform {

namespace {

constexpr mode_t access_of_others = S_IRWXG | S_IRWXO;

// One byte more than the largest key, so that a file that is too long shows.
using key_file_content = wiped_buffer<aes_key_data::largest_size + 1>;

bool is_key_size(std::size_t size) { return size == 16 || size == 24 || size == 32; }

bool read_content(int fd, key_file_content& content) {
    std::size_t size = 0;
    while (size < content.capacity()) {
        const ssize_t got = retry_interrupted(
            [&] { return ::read(fd, content.data() + size, content.capacity() - size); });
        if (got < 0) {
            return false;
        }
        if (got == 0) {
            break;
        }
        size += static_cast<std::size_t>(got);
    }
    content.resize(size);
    return true;
}

aes_key_data* fail(int error) {
    errno = error;
    return nullptr;
}

}  // namespace

}  // namespace cfg32::platform

using namespace cfg32;
using namespace cfg32::platform;

aes_key_data* aes_key_data_from_bytes(const unsigned char* bytes, size_t size) noexcept {
    if (bytes == nullptr || !is_key_size(size)) {
        return fail(EINVAL);
    }
    auto* key = static_cast<aes_key_data*>(std::calloc(1, sizeof(aes_key_data)));
    if (key == nullptr) {
        return fail(ENOMEM);
    }
    key->size = size;
    std::memcpy(key->bytes, bytes, size);
    return key;
}

aes_key_data* aes_key_data_from_file(const char* path) noexcept {
    if (path == nullptr) {
        return fail(EINVAL);
    }
    struct stat status;
    const unique_fd fd = open_regular(path, status);
    if (!fd) {
        // A directory is just one more thing that is no key file.
        return errno == EISDIR ? fail(EINVAL) : nullptr;
    }
    if ((status.st_mode & access_of_others) != 0) {
        return fail(EACCES);
    }
    key_file_content content;
    if (!read_content(fd.get(), content)) {
        return nullptr;
    }
    return aes_key_data_from_bytes(content.data(), content.size());
}

void aes_key_data_free(aes_key_data* key) noexcept {
    if (key == nullptr) {
        return;
    }
    explicit_bzero(key, sizeof *key);
    std::free(key);
}
