// Texts from files of every kind.

#include "input.h"

#include <fcntl.h>
#include <fmt/format.h>
#include <sodium.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <span>

#include "cfg32_platform.h"
#include "outcome.h"
#include "retry.h"
#include "unique_fd.h"

namespace cfg32::tool {

namespace {

unique_fd opened(const std::string& name) {
    unique_fd file(
        retry_interrupted([&] { return open(name.c_str(), O_RDONLY | O_NOCTTY | O_CLOEXEC); }));
    if (!file) {
        fail_for_system(name, errno);
    }
    return file;
}

/// Reads what comes next, as much as there is: 0 at the end, negative after a failure.
ssize_t read_on(int file, std::span<char> buffer) {
    return retry_interrupted([=] { return read(file, buffer.data(), buffer.size()); });
}

std::string text_of(int file, const std::string& name) {
    std::string text;
    std::array<char, 65536> buffer;
    ssize_t count = 0;
    while ((count = read_on(file, buffer)) > 0) {
        text.append(buffer.data(), static_cast<size_t>(count));
    }
    if (count < 0) {
        fail_for_system(name, errno);
    }
    return text;
}

/// Reads until the buffer has a whole line, is full, or there is no more.
bool read_line(int file, std::span<char> buffer, std::string_view& line) {
    size_t length = 0;
    for (;;) {
        const std::string_view text(buffer.data(), length);
        line = text.substr(0, text.find('\n'));
        if (line.size() < length || length == buffer.size()) {
            return true;
        }
        const ssize_t count = read_on(file, buffer.subspan(length));
        if (count <= 0) {
            return count == 0;
        }
        length += static_cast<size_t>(count);
    }
}

}  // namespace

std::string input_text(const std::string& name) { return text_of(opened(name).get(), name); }

std::string input_text() { return text_of(STDIN_FILENO, standard_input); }

secret input_password(const std::string& name) {
    const unique_fd file = opened(name);
    std::array<char, CFG32_PASSWORD_MAX + 1> buffer;  // no part of it stays where a text has grown
    std::string_view line;
    const bool is_read = read_line(file.get(), buffer, line);
    const int error = errno;
    secret password(line);
    sodium_memzero(buffer.data(), buffer.size());
    if (!is_read) {
        fail_for_system(name, error);
    }
    if (password.text().size() > CFG32_PASSWORD_MAX) {
        throw ended(failed,
                    fmt::format("{}: a password has at most {} bytes", name, CFG32_PASSWORD_MAX));
    }
    return password;
}

}  // namespace cfg32::tool
