// A configuration's text, from the disk and in memory.

#include "memory_file.h"

#include <fmt/format.h>
#include <sys/mman.h>

#include <cerrno>
#include <cstring>

#include "cfg32.h"
#include "disk.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

constexpr const char* name_in_messages = "a private copy in memory";

[[noreturn]] void fail_with_errno(const std::string& name, int code) {
    const int error = errno;
    fail(code, name + ": " + strerror(error));
}

std::string content_of(int file, size_t expected, const std::string& name) {
    std::string text;
    if (!read_all(file, expected, text)) {
        fail_with_errno(name, CFG_OTHER);
    }
    return text;
}

locked_file opened(const std::string& name, int operation) {
    // Reading leaves not even the time of access behind; others' files do not allow that.
    locked_file file(name.c_str(), O_RDONLY | O_NOATIME, operation);
    if (!file && errno == EPERM) {
        file = locked_file(name.c_str(), O_RDONLY, operation);
    }
    if (!file && errno == EWOULDBLOCK) {
        fail(CFG_BUSY, name + ": in use by another process");
    }
    if (!file) {
        fail_with_errno(name, CFG_CONNECT_ERROR);
    }
    return file;
}

}  // namespace

locked_file locked_configuration(const std::string& name) { return opened(name, LOCK_SH); }

std::string text_of(const locked_file& file, const std::string& name) {
    return content_of(file.get(), static_cast<size_t>(file.status().st_size), name);
}

memory_file::memory_file(std::string_view text)
    : file_(memfd_create("configuration", MFD_CLOEXEC)),
      name_(fmt::format("/proc/self/fd/{}", file_.get())) {
    if (!file_ || !replace_content(file_.get(), text)) {
        fail_with_errno(name_in_messages, CFG_OTHER);
    }
}

std::string memory_file::text() const { return content_of(file_.get(), 0, name_in_messages); }

std::string read_configuration(const std::string& name) {
    const progress reading("Reading " + name);
    return text_of(locked_configuration(name), name);
}

std::string read_without_waiting(const std::string& name) {
    return text_of(opened(name, without_lock), name);
}

}  // namespace cfg32::tool
