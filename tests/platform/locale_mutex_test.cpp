#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "cfg32_platform.h"

namespace {

// Runs before main, perhaps before the mutex's own file is initialised.
const int locked_before_main = pthread_mutex_lock(&set_locale_mutex);
const int unlocked_before_main = pthread_mutex_unlock(&set_locale_mutex);

TEST(LocaleMutex, IsUsableBeforeItIsInitialised) {
    EXPECT_EQ(locked_before_main, 0);
    EXPECT_EQ(unlocked_before_main, 0);
}

TEST(LocaleMutex, InitialisingDoesNotDisturbAHolder) {
    initLocaleMutex();
    ASSERT_EQ(pthread_mutex_lock(&set_locale_mutex), 0);
    initLocaleMutex();
    EXPECT_EQ(pthread_mutex_trylock(&set_locale_mutex), EBUSY);
    EXPECT_EQ(pthread_mutex_unlock(&set_locale_mutex), 0);
}

TEST(LocaleMutex, ExcludesThreadsThatAllInitialiseIt) {
    constexpr int threads = 8;
    constexpr int rounds = 2000;
    int counter = 0;  // not atomic: the mutex is what protects it
    std::atomic<int> errors = 0;
    std::vector<std::thread> running;
    for (int i = 0; i < threads; ++i) {
        running.emplace_back([&] {
            for (int round = 0; round < rounds; ++round) {
                initLocaleMutex();
                errors += pthread_mutex_lock(&set_locale_mutex) != 0;
                ++counter;
                errors += pthread_mutex_unlock(&set_locale_mutex) != 0;
            }
        });
    }
    for (auto& thread : running)
        thread.join();
    EXPECT_EQ(errors, 0);
    EXPECT_EQ(counter, threads * rounds);
}

}  // namespace
