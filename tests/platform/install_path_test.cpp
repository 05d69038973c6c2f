#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "call_faults.h"
#include "cfg32_platform.h"

namespace {

class InstallPath : public testing::Test {
  protected:
    void SetUp() override {
        if (const char* value = std::getenv("NUV_INSTALL_PATH"))
            saved_ = value;
        was_set_ = std::getenv("NUV_INSTALL_PATH") != nullptr;
    }
    void TearDown() override {
        if (was_set_)
            ::setenv("NUV_INSTALL_PATH", saved_.c_str(), 1);
        else
            ::unsetenv("NUV_INSTALL_PATH");
    }

    // The routine's answer, "(null)" for null.
    static std::string ask() {
        char* path = getNUVInstallPath();
        const std::string text = path == nullptr ? "(null)" : path;
        std::free(path);
        return text;
    }
    static std::string configured() {
        return *CFG32_INSTALL_PATH == '\0' ? "(null)" : CFG32_INSTALL_PATH;
    }

  private:
    std::string saved_;
    bool was_set_ = false;
};

TEST_F(InstallPath, IsTheEnvironmentVariableIfSet) {
    ::setenv("NUV_INSTALL_PATH", "/srv/some where", 1);
    EXPECT_EQ(ask(), "/srv/some where");
}

TEST_F(InstallPath, IsTheConfiguredPrefixWithoutTheVariable) {
    ::unsetenv("NUV_INSTALL_PATH");
    EXPECT_EQ(ask(), configured());
}

TEST_F(InstallPath, AnEmptyVariableCountsAsNotSet) {
    ::setenv("NUV_INSTALL_PATH", "", 1);
    EXPECT_EQ(ask(), configured());
}

TEST_F(InstallPath, IsACopyThatTheCallerOwns) {
    ::setenv("NUV_INSTALL_PATH", "/srv/x", 1);
    char* first = getNUVInstallPath();
    ASSERT_NE(first, nullptr);
    first[1] = 'X';
    EXPECT_EQ(ask(), "/srv/x");
    std::free(first);
}

TEST_F(InstallPath, IsNullWithoutMemory) {
    ::setenv("NUV_INSTALL_PATH", "/srv/x", 1);
    const call_fault fault(watched_call::allocate, 1, ENOMEM);
    EXPECT_EQ(getNUVInstallPath(), nullptr);
}

}  // namespace
