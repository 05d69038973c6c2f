// A host program that has a routine of its own under one of the platform's names.
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>

#include "cfg32_platform.h"

extern "C" {
int caller_check_format(const char* text);
char* caller_install_path(void);
}

char* getNUVInstallPath() noexcept { return ::strdup("/the/host's/own"); }

namespace {

TEST(Interposition, TheHostsRoutineTakesPrecedenceInOtherLibraries) {
    char* path = caller_install_path();
    EXPECT_STREQ(path, "/the/host's/own");
    std::free(path);
}

TEST(Interposition, TheOtherRoutinesAreTheDefaultOnes) {
    EXPECT_EQ(caller_check_format("{SHA}x"), 0);
    EXPECT_EQ(caller_check_format("secret"), 1);
}

}  // namespace
