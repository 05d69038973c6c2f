// The calls that only the command makes; see faulty_calls.h.

#include <stdlib.h>
#include <sys/mman.h>
#include <unistd.h>

#include "passed_call.h"

using namespace cfg32::tests;

extern "C" {

int memfd_create(const char* name, unsigned flags) noexcept {
    static const auto real = next<decltype(&::memfd_create)>("memfd_create");
    return simple("memfd_create", about(name), [=] { return real(name, flags); });
}

char* mkdtemp(char* pattern) noexcept {
    static const auto real = next<decltype(&::mkdtemp)>("mkdtemp");
    return passed(
        "mkdtemp", about(pattern), false, [=](share) { return real(pattern); },
        [](int error) -> char* {
            errno = error;
            return nullptr;
        });
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
