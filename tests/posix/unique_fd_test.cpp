#include "unique_fd.h"

#include <fcntl.h>
#include <gtest/gtest.h>

#include "call_faults.h"

namespace cfg32 {
namespace {

bool is_open(int fd) { return ::fcntl(fd, F_GETFD) >= 0; }

TEST(UniqueFd, ClosesWhatItOwnsAndKeepsErrno) {
    const int fd = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    ASSERT_GE(fd, 0);
    {
        const call_fault fault(watched_call::close, 1, EIO);
        const unique_fd owner(fd);
        errno = EDOM;
    }
    EXPECT_EQ(errno, EDOM);
    EXPECT_FALSE(is_open(fd));
}

TEST(UniqueFd, MovingLeavesOneOwner) {
    unique_fd first(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    const int fd = first.get();
    {
        const unique_fd second(std::move(first));
        EXPECT_EQ(second.get(), fd);
        EXPECT_TRUE(is_open(fd));
    }
    EXPECT_FALSE(first);
    EXPECT_FALSE(is_open(fd));
}

TEST(UniqueFd, ClosesOnceAndReportsItsFailure) {
    unique_fd fd(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    call_fault fault(watched_call::close, 1, EIO);
    EXPECT_FALSE(fd.close());
    EXPECT_TRUE(fd.close());
    EXPECT_EQ(fault.calls(), 1);
}

TEST(UniqueFd, AnInterruptedCloseIsAClose) {
    unique_fd fd(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    const call_fault fault(watched_call::close, 1, EINTR);
    EXPECT_TRUE(fd.close());
}

}  // namespace
}  // namespace cfg32
