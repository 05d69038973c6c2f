// The routine as it is compiled when no prefix was configured.
#undef CFG32_INSTALL_PATH
#define CFG32_INSTALL_PATH ""
#define getNUVInstallPath unconfigured_install_path
#include "install_path.cpp"

#include <gtest/gtest.h>

namespace {

TEST(UnconfiguredInstallPath, IsNullWithoutTheVariable) {
    const char* value = std::getenv("NUV_INSTALL_PATH");
    char* saved = value == nullptr ? nullptr : ::strdup(value);
    ::unsetenv("NUV_INSTALL_PATH");
    EXPECT_EQ(unconfigured_install_path(), nullptr);
    ::setenv("NUV_INSTALL_PATH", "", 1);
    EXPECT_EQ(unconfigured_install_path(), nullptr);
    ::setenv("NUV_INSTALL_PATH", "/srv/x", 1);
    char* path = unconfigured_install_path();
    EXPECT_STREQ(path, "/srv/x");
    std::free(path);
    if (saved != nullptr)
        ::setenv("NUV_INSTALL_PATH", saved, 1);
    else
        ::unsetenv("NUV_INSTALL_PATH");
    std::free(saved);
}

}  // namespace
