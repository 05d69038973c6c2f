#include "temporary_file.h"

#include <fcntl.h>
#include <gtest/gtest.h>

#include <regex>

#include "call_faults.h"
#include "test_directory.h"

namespace cfg32::platform {
namespace {

class TemporaryFile : public testing::Test {
  protected:
    test_directory directory_;
    unique_fd fd_{::open(directory_.path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)};
};

TEST_F(TemporaryFile, IsPrivateFromItsFirstInstant) {
    const mode_t mask = ::umask(0);
    const temporary_file file(fd_.get());
    ::umask(mask);
    ASSERT_TRUE(file);
    struct stat status;
    ASSERT_EQ(::fstat(file.fd(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u);
}

TEST_F(TemporaryFile, HasANameThatTellsWhatItIs) {
    const temporary_file file(fd_.get());
    const auto names = directory_.names();
    ASSERT_EQ(names.size(), 1u);
    EXPECT_TRUE(std::regex_match(*names.begin(), std::regex("\\.cfg32-[0-9a-f]{16}\\.tmp")));
}

TEST_F(TemporaryFile, HasANameOfItsOwn) {
    const temporary_file first(fd_.get());
    const temporary_file second(fd_.get());
    ASSERT_TRUE(first);
    ASSERT_TRUE(second);
    EXPECT_EQ(directory_.names().size(), 2u);
}

TEST_F(TemporaryFile, IsRemovedAndKeepsErrno) {
    {
        const temporary_file file(fd_.get());
        ASSERT_EQ(directory_.names().size(), 1u);
        errno = EDOM;
    }
    EXPECT_EQ(errno, EDOM);
    EXPECT_TRUE(directory_.names().empty());
}

TEST_F(TemporaryFile, StaysUnderItsFinalName) {
    {
        temporary_file file(fd_.get());
        EXPECT_TRUE(file.move_to("final"));
    }
    EXPECT_EQ(directory_.names(), std::set<std::string>{"final"});
}

TEST_F(TemporaryFile, IsRemovedWhenItCouldNotMove) {
    ASSERT_EQ(::mkdir(directory_.file("taken").c_str(), 0700), 0);
    {
        temporary_file file(fd_.get());
        EXPECT_FALSE(file.move_to("taken"));
    }
    EXPECT_EQ(directory_.names(), std::set<std::string>{"taken"});
}

TEST_F(TemporaryFile, DoesNotExistWithoutRandomData) {
    const call_fault fault(watched_call::random, 1, ENOSYS);
    const temporary_file file(fd_.get());
    EXPECT_FALSE(file);
    EXPECT_EQ(errno, ENOSYS);
}

TEST_F(TemporaryFile, DoesNotExistWithoutADirectory) {
    const temporary_file file(-1);
    EXPECT_FALSE(file);
    EXPECT_EQ(errno, EBADF);
}

}  // namespace
}  // namespace cfg32::platform
