#pragma once

// Exhausted memory on demand: the operators new of the test program can be told to fail. They are
// weak, so that every test file may include this header.

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <new>
#include <utility>

namespace cfg32::tests {

/// While it lives, the allocation number `which` (from 0) of this thread fails: once, or with all
/// that follow.
class failing_allocation {
  public:
    enum extent { once, from_then_on };

    explicit failing_allocation(long which, extent how_long = once) {
        left_ = which;
        is_lasting_ = how_long == from_then_on;
        is_over_ = false;
        count_ = 0;
    }
    failing_allocation(const failing_allocation&) = delete;
    failing_allocation& operator=(const failing_allocation&) = delete;
    ~failing_allocation() { left_ = never; }

    bool happened() const { return is_over_; }

    /// Keeps what a test does itself in the middle of the calls out of it.
    class pause {
      public:
        pause() = default;
        pause(const pause&) = delete;
        pause& operator=(const pause&) = delete;
        ~pause() {
            left_ = left;
            count_ = count;
        }

      private:
        const long left = std::exchange(left_, never);
        const long count = count_;
    };

    /// Allocations since the object was made.
    static long count() { return count_; }
    /// Bytes that this thread has asked for in all.
    static size_t bytes() { return bytes_; }
    /// The most that this thread has asked for at once since this was asked before.
    static size_t take_largest() { return std::exchange(largest_, 0); }

    /// For the operators new.
    static void* allocate(size_t size) {
        ++count_;
        bytes_ += size;
        largest_ = std::max(largest_, size);
        if (left_ == 0) {
            is_over_ = true;
            left_ = is_lasting_ ? 0 : never;
            return nullptr;
        }
        left_ -= left_ != never ? 1 : 0;
        return malloc(size != 0 ? size : 1);
    }

  private:
    static constexpr long never = -1;
    static inline thread_local long left_ = never;
    static inline thread_local long count_ = 0;
    static inline thread_local size_t bytes_ = 0;
    static inline thread_local size_t largest_ = 0;
    static inline thread_local bool is_lasting_ = false;
    static inline thread_local bool is_over_ = false;
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
