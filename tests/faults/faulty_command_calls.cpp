// The calls that only the command makes; see faulty_calls.h.

#include <dirent.h>
#include <stdlib.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include "passed_call.h"

using namespace cfg32::tests;

namespace {

template <class Result>
Result* with_null(int error) {
    errno = error;
    return nullptr;
}

}  // namespace

const std::vector<std::string>& cfg32::tests::names_wrapped_for_the_command() {
    static const std::vector<std::string> names = {"fdopendir", "lstat",  "memfd_create", "mkdtemp",
                                                   "readlink",  "system", "unlink"};
    return names;
}

extern "C" {

DIR* fdopendir(int folder) {
    static const auto real = next<decltype(&::fdopendir)>("fdopendir");
    return passed(
        "fdopendir", about(folder), false, [=](share) { return real(folder); }, with_null<DIR>);
}

int lstat(const char* path, struct stat* status) noexcept {
    static const auto real = next<int (*)(const char*, struct stat*)>("lstat");
    return simple("lstat", about(path), [=] { return real(path, status); });
}

int memfd_create(const char* name, unsigned flags) noexcept {
    static const auto real = next<decltype(&::memfd_create)>("memfd_create");
    return simple("memfd_create", about(name), [=] { return real(name, flags); });
}

char* mkdtemp(char* pattern) noexcept {
    static const auto real = next<decltype(&::mkdtemp)>("mkdtemp");
    return passed(
        "mkdtemp", about(pattern), false, [=](share) { return real(pattern); }, with_null<char>);
}

ssize_t readlink(const char* path, char* buffer, size_t size) noexcept {
    static const auto real = next<decltype(&::readlink)>("readlink");
    return simple("readlink", about(path), [=] { return real(path, buffer, size); });
}

int system(const char* command) {
    static const auto real = next<decltype(&::system)>("system");
    return simple("system", about(command), [=] { return real(command); });
}

int unlink(const char* path) noexcept {
    static const auto real = next<decltype(&::unlink)>("unlink");
    return simple("unlink", about(path), [=] { return real(path); });
}

}  // extern "C"
