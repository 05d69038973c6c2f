#pragma once

// Exhausted memory on demand: the operators new of the test program can be told to fail. They are
// weak, so that every test file may include this header.

#include <cstddef>
#include <cstdlib>
#include <new>

namespace cfg32::tests {

/// While it lives, the allocation number `which` (from 0) of this thread fails, once.
class failing_allocation {
  public:
    explicit failing_allocation(long which) {
        left_ = which;
        count_ = 0;
    }
    failing_allocation(const failing_allocation&) = delete;
    failing_allocation& operator=(const failing_allocation&) = delete;
    ~failing_allocation() { left_ = never; }

    bool happened() const { return left_ == never; }

    /// Allocations since the object was made.
    static long count() { return count_; }

    /// For the operators new.
    static void* allocate(size_t size) {
        ++count_;
        if (left_ != never && left_-- == 0) {
            return nullptr;
        }
        return malloc(size != 0 ? size : 1);
    }

  private:
    static constexpr long never = -1;
    static inline thread_local long left_ = never;
    static inline thread_local long count_ = 0;
};

}  // namespace cfg32::tests

#define CFG32_REPLACEABLE __attribute__((weak, visibility("default")))

CFG32_REPLACEABLE void* operator new(size_t size) {
    void* memory = cfg32::tests::failing_allocation::allocate(size);
    if (!memory) {
        throw std::bad_alloc();
    }
    return memory;
}
CFG32_REPLACEABLE void* operator new(size_t size, const std::nothrow_t&) noexcept {
    return cfg32::tests::failing_allocation::allocate(size);
}
CFG32_REPLACEABLE void operator delete(void* memory) noexcept { free(memory); }
CFG32_REPLACEABLE void operator delete(void* memory, size_t) noexcept { free(memory); }
CFG32_REPLACEABLE void operator delete(void* memory, const std::nothrow_t&) noexcept {
    free(memory);
}

#undef CFG32_REPLACEABLE
