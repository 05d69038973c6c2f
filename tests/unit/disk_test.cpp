#include "disk.h"

#include <dlfcn.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <cerrno>
#include <csignal>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <utility>

#include "open_regular.h"
#include "temporary_folder.h"
#include "unprivileged.h"

using namespace cfg32;
using cfg32::tests::as_nobody;
using cfg32::tests::temporary_folder;

namespace {

constexpr int64_t second = 1'000'000'000;

/// What the file system rounds the times down to that a program chooses, in nanoseconds.
thread_local int64_t granularity = 1;

timespec rounded(const timespec& time) {
    const int64_t all = time.tv_sec * second + time.tv_nsec;
    const int64_t less = all - all % granularity;
    return {less / second, static_cast<long>(less % second)};
}

}  // namespace

namespace {

/// What a file of somebody else does with the times that it is to take.
enum class time_of_others { is_taken, stands_still, fails };

/// Set for the file of somebody else: only the present time can be asked for.
thread_local std::optional<time_of_others> others;

thread_local bool writes_nothing = false;

}  // namespace

// These take the place of the C library's, for file systems of all kinds.
extern "C" ssize_t pwrite(int file, const void* bytes, size_t size, off_t offset) {
    static const auto original =
        reinterpret_cast<ssize_t (*)(int, const void*, size_t, off_t)>(dlsym(RTLD_NEXT, "pwrite"));
    return writes_nothing ? 0 : original(file, bytes, size, offset);
}

extern "C" int futimens(int file, const timespec times[2]) noexcept {
    static const auto original =
        reinterpret_cast<int (*)(int, const timespec*)>(dlsym(RTLD_NEXT, "futimens"));
    if (others && times) {
        errno = EPERM;
        return -1;
    }
    if (others == time_of_others::fails) {
        errno = EROFS;
        return -1;
    }
    if (others == time_of_others::stands_still) {
        return 0;
    }
    if (!times || granularity == 1) {
        return original(file, times);
    }
    const timespec coarse[2] = {times[0], rounded(times[1])};
    return original(file, coarse);
}

namespace {

constexpr mode_t owner_only = 0600;

unique_fd opened(const std::string& path, int flags) {
    struct stat status;
    return open_regular(path.c_str(), status, flags, owner_only);
}

struct disk : testing::Test {
    temporary_folder folder;
    struct stat status {};

    std::string content(const std::string& path, size_t expected) {
        const unique_fd file = opened(path, O_RDONLY);
        EXPECT_TRUE(file);
        std::string text = "what was there before";
        EXPECT_TRUE(read_all(file.get(), expected, text));
        return text;
    }

    bool write(const std::string& name, const std::string& text) {
        struct stat status;
        unique_fd file =
            open_regular(folder.file(name).c_str(), status, O_WRONLY | O_CREAT, owner_only);
        return file && reserve(file.get(), static_cast<size_t>(status.st_size), text.size()) &&
               replace_content(file.get(), text) && file.close();
    }

    /// errno of an attempt to open the path, 0 when it opens.
    int refusal(const std::string& path, int flags) {
        errno = 0;
        return opened(path, flags) ? 0 : errno;
    }
};

bool is_open_in_system(int number) { return fcntl(number, F_GETFD) != -1; }

/// For a child process: lets no file grow beyond size and has writes fail for it.
void limit_file_size(rlim_t size) {
    signal(SIGXFSZ, SIG_IGN);
    const rlimit limit = {size, size};
    if (setrlimit(RLIMIT_FSIZE, &limit) != 0) {
        _exit(99);
    }
}

}  // namespace

TEST_F(disk, OpenedFileIsNotInherited) {
    const unique_fd file = opened(folder.write("f", "x"), O_RDONLY);
    ASSERT_TRUE(file);
    EXPECT_TRUE(fcntl(file.get(), F_GETFD) & FD_CLOEXEC);
}

TEST_F(disk, MissingFileIsRefusedOrMade) {
    EXPECT_EQ(refusal(folder.file("f"), O_RDONLY), ENOENT);
    EXPECT_EQ(refusal(folder.file("f"), O_WRONLY), ENOENT);
    EXPECT_FALSE(folder.has("f"));
    EXPECT_EQ(refusal(folder.file("f"), O_WRONLY | O_CREAT), 0);
    struct stat status {};
    ASSERT_EQ(stat(folder.file("f").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, owner_only);
    EXPECT_EQ(refusal(folder.file("no/f"), O_WRONLY | O_CREAT), ENOENT);
}

TEST_F(disk, DirectoryIsRefused) {
    for (const int flags : {O_RDONLY, O_WRONLY, O_WRONLY | O_CREAT}) {
        EXPECT_EQ(refusal(folder.file(""), flags), EISDIR);
    }
}

TEST_F(disk, FifoIsRefusedWithoutWaitingForItsOtherEnd) {
    const std::string fifo = folder.file("fifo");
    ASSERT_EQ(mkfifo(fifo.c_str(), owner_only), 0);
    for (const int flags : {O_RDONLY, O_WRONLY, O_WRONLY | O_CREAT, O_RDWR}) {
        EXPECT_NE(refusal(fifo, flags), 0);
    }
}

TEST_F(disk, DeviceIsRefused) {
    EXPECT_EQ(refusal("/dev/null", O_RDONLY), EINVAL);
    EXPECT_EQ(refusal("/dev/null", O_WRONLY), EINVAL);
    EXPECT_NE(refusal("/dev/tty", O_RDONLY), 0);
}

TEST_F(disk, SocketIsRefused) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    const std::string path = folder.file("s");
    ASSERT_LT(path.size(), sizeof address.sun_path);
    path.copy(address.sun_path, path.size());
    const unique_fd listener(socket(AF_UNIX, SOCK_STREAM, 0));
    ASSERT_EQ(bind(listener.get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    EXPECT_NE(refusal(path, O_RDONLY), 0);
}

TEST_F(disk, RefusedFileIsNotLeftOpen) {
    const int next = open("/dev/null", O_RDONLY);
    ::close(next);
    EXPECT_NE(refusal("/dev/null", O_RDONLY), 0);
    EXPECT_FALSE(is_open_in_system(next));
}

TEST_F(disk, LinkToAFileIsFollowed) {
    folder.write("f", "text");
    ASSERT_EQ(symlink("f", folder.file("link").c_str()), 0);
    EXPECT_EQ(content(folder.file("link"), 4), "text");
}

TEST_F(disk, LoopOfLinksIsRefused) {
    ASSERT_EQ(symlink("loop", folder.file("loop").c_str()), 0);
    EXPECT_EQ(refusal(folder.file("loop"), O_RDONLY), ELOOP);
}

TEST_F(disk, UnreadableFileIsRefused) {
    if (geteuid() == 0) {
        GTEST_SKIP() << "root may read everything";
    }
    const std::string path = folder.write("f", "x");
    ASSERT_EQ(chmod(path.c_str(), 0), 0);
    EXPECT_EQ(refusal(path, O_RDONLY), EACCES);
}

TEST_F(disk, WholeFileIsReadWhateverWasExpected) {
    for (const size_t size : {0, 1, 2, 4095, 4096, 4097, 20000}) {
        std::string text(size, 'x');
        for (size_t i = 0; i < size; ++i) {
            text[i] = static_cast<char>(i * 7);  // NULs and high bytes among them
        }
        const std::string path = folder.write("f", text);
        for (const size_t expected : {size_t{0}, size_t{1}, size / 2, size, size + 1, 2 * size}) {
            SCOPED_TRACE(std::to_string(size) + " " + std::to_string(expected));
            EXPECT_TRUE(content(path, expected) == text);
        }
    }
}

TEST_F(disk, FileWithoutASizeIsRead) {
    // The system's own files have the size 0.
    EXPECT_THAT(content("/proc/self/status", 0), testing::HasSubstr("Pid:"));
}

TEST_F(disk, FailureToReadIsReported) {
    const unique_fd file(open(folder.write("f", "x").c_str(), O_WRONLY));
    std::string text;
    EXPECT_FALSE(read_all(file.get(), 1, text));
    EXPECT_EQ(errno, EBADF);
}

TEST_F(disk, TextBecomesTheWholeContent) {
    const struct {
        const char* before;
        const char* after;
    } rows[] = {{"", ""},
                {"", "text"},
                {"text", ""},
                {"short", "a longer one"},
                {"a longer one", "short"},
                {"same!", "!emas"}};
    for (const auto& row : rows) {
        SCOPED_TRACE(std::string(row.before) + " " + row.after);
        folder.write("f", row.before);
        EXPECT_TRUE(write("f", row.after));
        EXPECT_EQ(folder.read("f"), row.after);
    }
}

TEST_F(disk, TextStartsAtTheBeginningWhereverTheFileStands) {
    const unique_fd file = opened(folder.write("f", "0123456789"), O_RDWR);
    ASSERT_EQ(lseek(file.get(), 5, SEEK_SET), 5);
    EXPECT_TRUE(replace_content(file.get(), "abc"));
    EXPECT_EQ(folder.read("f"), "abc");
}

TEST_F(disk, OverwritingKeepsTheFileItsLinksAndItsMode) {
    const std::string path = folder.write("f", "before");
    ASSERT_EQ(chmod(path.c_str(), 0604), 0);
    ASSERT_EQ(link(path.c_str(), folder.file("hard").c_str()), 0);
    EXPECT_TRUE(write("f", "after"));
    EXPECT_EQ(folder.read("hard"), "after");
    struct stat status {};
    ASSERT_EQ(stat(path.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0604u);
}

TEST_F(disk, RoomThatWasReservedDoesNotGrowTheFile) {
    EXPECT_TRUE(write("f", std::string(100000, 'x')));
    struct stat status {};
    ASSERT_EQ(stat(folder.file("f").c_str(), &status), 0);
    EXPECT_EQ(status.st_size, 100000);
}

TEST_F(disk, FileThatMayNotGrowKeepsItsContent) {
    folder.write("f", "what was there before");
    const auto child = [&] {
        limit_file_size(30);
        const bool failed = !write("f", std::string(31, 'x')) && errno == EFBIG;
        _exit(failed ? 0 : 1);
    };
    EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
    EXPECT_EQ(folder.read("f"), "what was there before");
}

TEST_F(disk, FileThatMayNotGrowTakesATextThatFits) {
    folder.write("f", "before");
    const auto child = [&] {
        limit_file_size(30);
        _exit(write("f", std::string(30, 'x')) ? 0 : 1);
    };
    EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
    EXPECT_EQ(folder.read("f"), std::string(30, 'x'));
}

TEST_F(disk, MarkIsGoneWhenTheTextIsComplete) {
    const std::string mark = "# unfinished\n";
    for (const size_t size : {size_t{0}, mark.size() - 1, mark.size(), mark.size() + 1, 9000ul}) {
        const std::string text(size, 'x');
        const unique_fd file = opened(folder.write("f", "before"), O_RDWR);
        EXPECT_TRUE(replace_content(file.get(), text, mark));
        EXPECT_TRUE(folder.read("f") == text) << size;
    }
}

TEST_F(disk, WhatAnotherFileHoldsIsMadeTheContentInParts) {
    const std::string mark = "# unfinished\n";
    for (const size_t size : {size_t{0}, size_t{1}, mark.size() - 1, mark.size(), mark.size() + 1,
                              65536ul, 65536 + mark.size(), 200'000ul}) {
        std::string text(size, 'x');
        for (size_t i = 0; i < size; i += 7) {
            text[i] = static_cast<char>('a' + i % 26);
        }
        const unique_fd other = opened(folder.write("other", text), O_RDONLY);
        for (const std::string_view marked : {std::string_view(mark), std::string_view()}) {
            for (const size_t before : {0, 100, 300'000}) {
                const unique_fd file = opened(folder.write("f", std::string(before, 'b')), O_RDWR);
                EXPECT_TRUE(replace_content(file.get(), other.get(), marked));
                EXPECT_TRUE(folder.read("f") == text) << size << " over " << before;
            }
        }
    }
}

TEST_F(disk, AnotherFileThatCannotBeReadLeavesTheContent) {
    const unique_fd file = opened(folder.write("f", "before"), O_RDWR);
    const unique_fd other(open(folder.write("other", "after").c_str(), O_WRONLY));
    EXPECT_FALSE(replace_content(file.get(), other.get(), "# unfinished\n"));
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, FailureToWriteIsReportedAndChangesNothing) {
    const unique_fd file(open(folder.write("f", "before").c_str(), O_RDONLY));
    EXPECT_FALSE(replace_content(file.get(), "after"));
    EXPECT_EQ(errno, EBADF);
    EXPECT_FALSE(replace_content(file.get(), "x"));
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, WriteThatWritesNothingIsReported) {
    const unique_fd file = opened(folder.write("f", "before"), O_RDWR);
    writes_nothing = true;
    errno = 0;
    EXPECT_FALSE(replace_content(file.get(), "after"));
    writes_nothing = false;
    EXPECT_EQ(errno, EIO);
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, FullDeviceIsReported) {
    const unique_fd full(open("/dev/full", O_WRONLY));
    ASSERT_TRUE(full);
    EXPECT_FALSE(replace_content(full.get(), "text"));
    EXPECT_NE(errno, 0);
}

TEST_F(disk, TextThatFitsNeedsNoRoom) {
    const unique_fd file = opened(folder.write("f", "before"), O_RDWR);
    for (const size_t size : {0, 5, 6}) {
        EXPECT_TRUE(reserve(file.get(), 6, size)) << size;
    }
}

TEST_F(disk, RoomIsTakenBehindTheContent) {
    constexpr blkcnt_t block_unit = 512;
    const std::string before = "before";
    constexpr size_t size = 1 << 20;
    const unique_fd file = opened(folder.write("f", before), O_RDWR);
    ASSERT_TRUE(reserve(file.get(), before.size(), size));
    struct stat status {};
    ASSERT_EQ(fstat(file.get(), &status), 0);
    EXPECT_GE(status.st_blocks * block_unit, static_cast<off_t>(size));
    // Where a file system can't reserve, blank lines take the room.
    const std::string now = folder.read("f");
    EXPECT_TRUE(now == before || now == before + std::string(size - before.size(), '\n'));
}

TEST_F(disk, RoomThatCannotBeTakenIsReportedAndChangesNothing) {
    const unique_fd file = opened(folder.write("f", "before"), O_RDONLY);
    EXPECT_FALSE(reserve(file.get(), 6, 7));
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, LimitOfTheProcessIsKeptToTheByte) {
    const unique_fd file = opened(folder.write("f", "before"), O_RDWR);
    const auto child = [&] {
        limit_file_size(30);
        const bool fits = reserve(file.get(), 6, 30);
        const bool is_refused = !reserve(file.get(), 6, 31) && errno == EFBIG;
        _exit(fits && is_refused ? 0 : 1);
    };
    EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
}

namespace {

/// A file whose modification time can be seen and set.
struct timed_file {
    unique_fd file;

    timespec time() const {
        struct stat status {};
        EXPECT_EQ(fstat(file.get(), &status), 0);
        return status.st_mtim;
    }

    /// Returns the time that the file has then.
    timespec set(const timespec& time) const {
        const timespec times[2] = {time, time};
        EXPECT_EQ(::futimens(file.get(), times), 0);
        return this->time();
    }
};

int64_t nanoseconds(const timespec& time) { return time.tv_sec * second + time.tv_nsec; }

constexpr timespec some_time{1'000'000'000, 123'456'789};
constexpr timespec end_of_a_second{1'000'000'000, 999'999'999};
constexpr timespec future{4'000'000'000, 999'999'999};

}  // namespace

TEST_F(disk, TimeIsMadeTheNextOneThatThereIs) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    for (const timespec& time : {some_time, end_of_a_second, future, timespec{0, 0}}) {
        const timespec before = file.set(time);
        EXPECT_TRUE(make_later(file.file.get(), before, status));
        EXPECT_EQ(nanoseconds(file.time()), nanoseconds(before) + 1) << time.tv_sec;
    }
}

TEST_F(disk, TimeThatIsLaterAlreadyStays) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    const timespec now = file.set(some_time);
    for (const timespec& before : {timespec{some_time.tv_sec, some_time.tv_nsec - 1},
                                   timespec{some_time.tv_sec - 1, 999'999'999}, timespec{0, 0}}) {
        EXPECT_TRUE(make_later(file.file.get(), before, status));
        EXPECT_EQ(nanoseconds(file.time()), nanoseconds(now));
    }
}

TEST_F(disk, TimeOfBeforeInTheFutureIsPassed) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    file.set(some_time);
    EXPECT_TRUE(make_later(file.file.get(), future, status));
    EXPECT_EQ(nanoseconds(file.time()), nanoseconds(future) + 1);
}

TEST_F(disk, OnlyTheModificationTimeIsSet) {
    const std::string path = folder.write("f", "x");
    const timed_file file{opened(path, O_RDWR)};
    file.set(some_time);
    EXPECT_TRUE(make_later(file.file.get(), some_time, status));
    struct stat status {};
    ASSERT_EQ(stat(path.c_str(), &status), 0);
    EXPECT_EQ(nanoseconds(status.st_atim), nanoseconds(some_time));
}

TEST_F(disk, TimeIsMadeLaterWhereFileSystemsRoundItDown) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    for (const int64_t step : {int64_t{1}, int64_t{100}, int64_t{1000}, second, 2 * second}) {
        for (const timespec& time : {some_time, end_of_a_second, future}) {
            SCOPED_TRACE(std::to_string(step) + " " + std::to_string(time.tv_sec));
            granularity = step;
            const timespec before = file.set(time);
            EXPECT_TRUE(make_later(file.file.get(), before, status));
            granularity = 1;
            EXPECT_GT(nanoseconds(file.time()), nanoseconds(before));
            EXPECT_EQ(nanoseconds(file.time()) % step, 0);
        }
    }
}

TEST_F(disk, TimeThatCannotBeMadeLaterIsReported) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    granularity = 10 * second;
    const timespec before = file.set(some_time);
    errno = 0;
    EXPECT_FALSE(make_later(file.file.get(), before, status));
    EXPECT_EQ(errno, EOVERFLOW);
    granularity = 1;
    EXPECT_EQ(nanoseconds(file.time()), nanoseconds(before));
    EXPECT_FALSE(make_later(-1, some_time, status));
    EXPECT_EQ(errno, EBADF);
}

// Only the owner may choose a time, but who may write may set the present one.
TEST_F(disk, TimeOfSomebodyElsesFileIsMadeThePresentOne) {
    if (geteuid() != 0) {
        GTEST_SKIP() << "only root can make a file of somebody else";
    }
    const std::string path = folder.write("f", "x");
    ASSERT_EQ(chmod(path.c_str(), 0666), 0);
    const timed_file file{opened(path, O_RDWR)};
    const timespec before = file.set(some_time);
    EXPECT_EQ(as_nobody([&] { return make_later(file.file.get(), before, status) ? 0 : 1; }), 0);
    EXPECT_GT(nanoseconds(file.time()), nanoseconds(before));
    // One in the future can't be passed, but the present one is another.
    const timespec later = file.set(future);
    EXPECT_EQ(as_nobody([&] { return make_later(file.file.get(), later, status) ? 0 : 1; }), 0);
    EXPECT_LT(nanoseconds(file.time()), nanoseconds(later));
}

TEST_F(disk, TimeOfSomebodyElsesFileThatStaysOrCanNotBeSetIsReported) {
    const timed_file file{opened(folder.write("f", "x"), O_RDWR)};
    const timespec before = file.set(some_time);
    others = time_of_others::fails;
    EXPECT_FALSE(make_later(file.file.get(), before, status));
    EXPECT_EQ(errno, EROFS);
    // Two seconds are waited for, in which the coarsest clock goes on.
    others = time_of_others::stands_still;
    EXPECT_FALSE(make_later(file.file.get(), before, status));
    EXPECT_EQ(errno, EPERM);
    others.reset();
    EXPECT_EQ(nanoseconds(file.time()), nanoseconds(before));
}
