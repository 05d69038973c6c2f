// For builds with a sanitizer, whose own operators new would not call the test's malloc.

#include <cstdlib>
#include <new>

#define VISIBLE __attribute__((visibility("default")))

VISIBLE void *operator new(size_t size) {
    void *block = malloc(size != 0 ? size : 1);
    if (!block) {
        throw std::bad_alloc();
    }
    return block;
}
VISIBLE void *operator new[](size_t size) { return operator new(size); }
VISIBLE void *operator new(size_t size, const std::nothrow_t &) noexcept {
    return malloc(size != 0 ? size : 1);
}
VISIBLE void *operator new[](size_t size, const std::nothrow_t &nothrow) noexcept {
    return operator new(size, nothrow);
}
VISIBLE void operator delete(void *block) noexcept { free(block); }
VISIBLE void operator delete[](void *block) noexcept { free(block); }
VISIBLE void operator delete(void *block, size_t) noexcept { free(block); }
VISIBLE void operator delete[](void *block, size_t) noexcept { free(block); }
