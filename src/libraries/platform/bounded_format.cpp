#include <cstdarg>
#include <cstdio>

#include "cfg32_platform.h"

int nuv_snprintf(char* buffer, size_t size, const char* format, ...) noexcept {
    va_list arguments;
    va_start(arguments, format);
    // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): va_start has initialised it
    const int length = std::vsnprintf(buffer, size, format, arguments);
    va_end(arguments);
    return length;
}
