#pragma once

#include <gtest/gtest.h>
#include <pthread.h>

#include <cstddef>

namespace cfg32::tests {

/// Runs body on a stack that is too small for a recursion down a deep tree.
inline void on_a_small_stack(void (*body)()) {
    constexpr size_t stack_size = 256 * 1024;
    pthread_attr_t attributes;
    ASSERT_EQ(pthread_attr_init(&attributes), 0);
    ASSERT_EQ(pthread_attr_setstacksize(&attributes, stack_size), 0);
    pthread_t thread;
    const auto start = [](void* argument) -> void* {
        (*static_cast<void (**)()>(argument))();
        return nullptr;
    };
    ASSERT_EQ(pthread_create(&thread, &attributes, start, &body), 0);
    EXPECT_EQ(pthread_join(thread, nullptr), 0);
    pthread_attr_destroy(&attributes);
}

}  // namespace cfg32::tests
