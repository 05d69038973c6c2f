// A locked file is the one that its name leads to, and is waited for no longer than asked.

#include "file_lock.h"

#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <string>
#include <thread>
#include <utility>

#include "open_descriptors.h"
#include "temporary_folder.h"
#include "unprivileged.h"

using namespace cfg32;
using namespace cfg32::tests;
using namespace std::chrono_literals;

namespace {

constexpr auto short_wait = 5ms;

struct file_lock : testing::Test {
    temporary_folder folder;
    const std::string path = folder.write("f", "text");

    locked_file locked(int operation, int flags = O_RDONLY) const {
        return locked_file(path.c_str(), flags, operation, short_wait);
    }

    /// errno of an attempt to lock the file, 0 when it is locked.
    static int refusal(const std::string& file, int operation, int flags = O_RDONLY) {
        errno = 0;
        return locked_file(file.c_str(), flags, operation, short_wait) ? 0 : errno;
    }
    int refusal(int operation) const { return refusal(path, operation); }

    struct stat status(const std::string& file) const {
        struct stat found {};
        EXPECT_EQ(stat(file.c_str(), &found), 0);
        return found;
    }
};

}  // namespace

TEST_F(file_lock, NothingIsFalse) {
    EXPECT_FALSE(locked_file());
    EXPECT_EQ(locked_file().get(), -1);
}

TEST_F(file_lock, LocksKeepOutWhatTheyShould) {
    const struct {
        int held;
        int wanted;
        int expected;
    } rows[] = {
        {LOCK_SH, LOCK_SH, 0},           {LOCK_SH, LOCK_EX, EWOULDBLOCK},
        {LOCK_EX, LOCK_SH, EWOULDBLOCK}, {LOCK_EX, LOCK_EX, EWOULDBLOCK},
        {LOCK_UN, LOCK_EX, 0},           {LOCK_EX, LOCK_UN, 0},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::to_string(row.held) + " " + std::to_string(row.wanted));
        const locked_file holder = locked(row.held);
        ASSERT_TRUE(holder);
        EXPECT_EQ(refusal(row.wanted), row.expected);
    }
}

TEST_F(file_lock, LockedFileIsOpenAndItsStatusIsKnown) {
    const locked_file file = locked(LOCK_EX, O_RDWR);
    ASSERT_TRUE(file);
    char text[5] = {};
    EXPECT_EQ(pread(file.get(), text, 4, 0), 4);
    EXPECT_STREQ(text, "text");
    EXPECT_EQ(pwrite(file.get(), "T", 1, 0), 1);
    EXPECT_TRUE(is_same_file(file.status(), status(path)));
    EXPECT_EQ(file.status().st_size, 4);
    EXPECT_TRUE(fcntl(file.get(), F_GETFD) & FD_CLOEXEC);
}

TEST_F(file_lock, FileThatWasNotLockedIsNotLeftOpen) {
    const locked_file holder = locked(LOCK_EX);
    EXPECT_EQ(refusal(LOCK_EX), EWOULDBLOCK);
    EXPECT_EQ(open_descriptors(holder.status(), O_RDONLY), 1);
}

TEST_F(file_lock, LockGoesWithTheObject) {
    { const locked_file holder = locked(LOCK_EX); }
    EXPECT_EQ(refusal(LOCK_EX), 0);
    locked_file holder = locked(LOCK_EX);
    holder = locked_file();
    EXPECT_EQ(refusal(LOCK_EX), 0);
}

TEST_F(file_lock, LockMovesWithTheObject) {
    locked_file first = locked(LOCK_EX);
    {
        locked_file second(std::move(first));
        EXPECT_TRUE(second);
        EXPECT_TRUE(is_same_file(second.status(), status(path)));
        EXPECT_EQ(refusal(LOCK_EX), EWOULDBLOCK);
        first = std::move(second);
    }
    EXPECT_TRUE(first);
    EXPECT_EQ(refusal(LOCK_EX), EWOULDBLOCK);
}

TEST_F(file_lock, DestructionKeepsErrno) {
    {
        const locked_file holder = locked(LOCK_EX);
        errno = ENOSPC;
    }
    EXPECT_EQ(errno, ENOSPC);
}

// A child process shares the lock for as long as it has the descriptor.
TEST_F(file_lock, LockIsReleasedThoughAForkedChildStillHasTheFileOpen) {
    int finish[2];
    ASSERT_EQ(pipe(finish), 0);
    pid_t child = -1;
    {
        const locked_file holder = locked(LOCK_EX);
        child = fork();
        ASSERT_NE(child, -1);
        if (child == 0) {
            char end;
            close(finish[1]);
            _exit(read(finish[0], &end, 1) == 0 ? 0 : 1);
        }
        EXPECT_EQ(refusal(LOCK_EX), EWOULDBLOCK);
    }
    EXPECT_EQ(refusal(LOCK_EX), 0);
    close(finish[0]);
    close(finish[1]);
    int ended = -1;
    EXPECT_EQ(waitpid(child, &ended, 0), child);
    EXPECT_EQ(ended, 0);
}

TEST_F(file_lock, LockOfAProcessThatEndsIsFree) {
    const auto hold = [&] {
        locked_file file = locked(LOCK_EX);
        _exit(file ? 0 : 1);
    };
    EXPECT_EXIT(hold(), testing::ExitedWithCode(0), "");
    EXPECT_EQ(refusal(LOCK_EX), 0);
}

TEST_F(file_lock, LockThatIsGivenBackMeanwhileIsTaken) {
    locked_file holder = locked(LOCK_EX, O_RDWR);
    locked_file waiting;
    std::thread other([&] { waiting = locked_file(path.c_str(), O_RDONLY, LOCK_EX); });
    wait_for_open_descriptors(holder.status(), O_RDONLY, 1);
    EXPECT_EQ(pwrite(holder.get(), "longer", 6, 0), 6);
    holder = locked_file();
    other.join();
    ASSERT_TRUE(waiting);
    EXPECT_EQ(waiting.status().st_size, 6) << "the status is that of the locked file";
}

TEST_F(file_lock, FileThatReplacesTheOneThatIsWaitedForIsLockedInItsPlace) {
    locked_file holder = locked(LOCK_EX, O_RDWR);
    const struct stat old = holder.status();
    locked_file waiting;
    std::thread other([&] { waiting = locked_file(path.c_str(), O_RDONLY, LOCK_EX); });
    wait_for_open_descriptors(old, O_RDONLY, 1);
    EXPECT_EQ(rename(folder.write("new", "other text").c_str(), path.c_str()), 0);
    holder = locked_file();
    other.join();
    ASSERT_TRUE(waiting);
    EXPECT_FALSE(is_same_file(waiting.status(), old));
    EXPECT_TRUE(is_same_file(waiting.status(), status(path)));
    struct stat opened {};
    ASSERT_EQ(fstat(waiting.get(), &opened), 0);
    EXPECT_TRUE(is_same_file(waiting.status(), opened));
    EXPECT_EQ(refusal(LOCK_SH), EWOULDBLOCK);
}

TEST_F(file_lock, LockOfAFileThatIsReplacedMeanwhileIsNoLongerWaitedFor) {
    const locked_file holder = locked(LOCK_EX, O_RDWR);
    locked_file waiting;
    std::thread other([&] { waiting = locked_file(path.c_str(), O_RDONLY, LOCK_EX); });
    wait_for_open_descriptors(holder.status(), O_RDONLY, 1);
    EXPECT_EQ(rename(folder.write("new", "other text").c_str(), path.c_str()), 0);
    other.join();
    ASSERT_TRUE(waiting) << "the holder has not given back its own";
    EXPECT_TRUE(is_same_file(waiting.status(), status(path)));
}

TEST_F(file_lock, FileThatIsRemovedWhileItIsWaitedForIsReported) {
    locked_file holder = locked(LOCK_EX, O_RDWR);
    int error = 0;
    std::thread other([&] {
        const locked_file waiting(path.c_str(), O_RDONLY, LOCK_EX);
        error = waiting ? 0 : errno;
    });
    wait_for_open_descriptors(holder.status(), O_RDONLY, 1);
    EXPECT_EQ(unlink(path.c_str()), 0);
    holder = locked_file();
    other.join();
    EXPECT_EQ(error, ENOENT);
}

TEST_F(file_lock, LockOfAFileThatWasReplacedDisturbsNobody) {
    const locked_file holder = locked(LOCK_EX);
    ASSERT_EQ(rename(folder.write("new", "other text").c_str(), path.c_str()), 0);
    EXPECT_EQ(refusal(LOCK_EX), 0);
}

TEST_F(file_lock, LinksAndTheFileTheyLeadToAreOne) {
    ASSERT_EQ(symlink("f", folder.file("soft").c_str()), 0);
    ASSERT_EQ(link(path.c_str(), folder.file("hard").c_str()), 0);
    const locked_file holder = locked(LOCK_EX);
    EXPECT_EQ(refusal(folder.file("soft"), LOCK_SH), EWOULDBLOCK);
    EXPECT_EQ(refusal(folder.file("hard"), LOCK_SH), EWOULDBLOCK);
}

TEST_F(file_lock, WhatIsNoFileIsRefusedWithoutWaiting) {
    ASSERT_EQ(mkdir(folder.file("directory").c_str(), 0700), 0);
    ASSERT_EQ(mkfifo(folder.file("fifo").c_str(), 0600), 0);
    const struct {
        std::string file;
        int flags;
        int expected;
    } rows[] = {
        {folder.file("missing"), O_RDONLY, ENOENT},
        {folder.file("missing"), O_RDWR, ENOENT},
        {folder.file("f/below"), O_RDONLY, ENOTDIR},
        {folder.file("directory"), O_RDONLY, EISDIR},
        {folder.file("directory"), O_RDWR, EISDIR},
        {folder.file("fifo"), O_RDONLY, EINVAL},
        {folder.file("fifo"), O_RDWR, EINVAL},
        {"/dev/null", O_RDWR, EINVAL},
        {"/dev/zero", O_RDONLY, EINVAL},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.file + " " + std::to_string(row.flags));
        EXPECT_EQ(refusal(row.file, LOCK_EX, row.flags), row.expected);
    }
}

TEST_F(file_lock, FileThatMayOnlyBeReadCanBeLockedThroughAReadingDescriptor) {
    ASSERT_EQ(chmod(folder.file("").c_str(), 0755), 0);
    ASSERT_EQ(chmod(path.c_str(), 0444), 0);
    const auto attempt = [&] {
        return refusal(path, LOCK_EX, O_RDWR) == EACCES && refusal(path, LOCK_EX) == 0 ? 0 : 1;
    };
    EXPECT_EQ(as_nobody(attempt), 0);
    const locked_file holder = locked(LOCK_EX);
    EXPECT_EQ(as_nobody([&] { return refusal(LOCK_SH) == EWOULDBLOCK ? 0 : 1; }), 0);
}
