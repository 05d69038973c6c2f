#include "open_regular.h"

#include <fcntl.h>
#include <gtest/gtest.h>

#include "test_directory.h"

namespace cfg32 {
namespace {

TEST(OpenRegular, OpensAFileAndTakesItsStatus) {
    const test_directory directory;
    const std::string path = directory.write("file", "12345", 0640);
    struct stat status;
    const unique_fd fd = open_regular(path.c_str(), status);
    ASSERT_TRUE(fd);
    EXPECT_EQ(status.st_size, 5);
    EXPECT_EQ(status.st_mode & 07777, 0640u);
    EXPECT_NE(::fcntl(fd.get(), F_GETFD) & FD_CLOEXEC, 0) << "must not leak into child processes";
}

TEST(OpenRegular, FollowsASymbolicLink) {
    const test_directory directory;
    directory.write("file", "12345");
    ASSERT_EQ(::symlink("file", directory.file("link").c_str()), 0);
    struct stat status;
    EXPECT_TRUE(open_regular(directory.file("link").c_str(), status));
}

TEST(OpenRegular, RefusesWhatIsNoRegularFile) {
    const test_directory directory;
    ASSERT_EQ(::mkfifo(directory.file("fifo").c_str(), 0600), 0);
    const struct {
        std::string path;
        int error;
    } rows[] = {
        {directory.path(), EISDIR},
        {directory.file("fifo"), EINVAL},  // would block if it were
                                           // opened like a file
        {"/dev/null", EINVAL},
        {directory.file("missing"), ENOENT},
        {"", ENOENT},
    };
    for (const auto& row : rows) {
        struct stat status;
        errno = 0;
        EXPECT_FALSE(open_regular(row.path.c_str(), status)) << row.path;
        EXPECT_EQ(errno, row.error) << row.path;
    }
}

}  // namespace
}  // namespace cfg32
