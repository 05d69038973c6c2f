#include "disk.h"

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <string>
#include <utility>

#include "open_regular.h"
#include "temporary_folder.h"

using namespace cfg32;
using cfg32::tests::temporary_folder;

namespace {

constexpr mode_t owner_only = 0600;

unique_fd opened(const std::string& path, int flags) {
    struct stat status;
    return open_regular(path.c_str(), status, flags, owner_only);
}

struct disk : testing::Test {
    temporary_folder folder;

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
        return file && reserve(file.get(), static_cast<size_t>(status.st_size), text) &&
               overwrite(file.get(), text) && file.close();
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
    EXPECT_TRUE(overwrite(file.get(), "abc"));
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

TEST_F(disk, FailureToWriteIsReportedAndChangesNothing) {
    const unique_fd file(open(folder.write("f", "before").c_str(), O_RDONLY));
    EXPECT_FALSE(overwrite(file.get(), "after"));
    EXPECT_EQ(errno, EBADF);
    EXPECT_FALSE(overwrite(file.get(), "x"));
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, FullDeviceIsReported) {
    const unique_fd full(open("/dev/full", O_WRONLY));
    ASSERT_TRUE(full);
    EXPECT_FALSE(overwrite(full.get(), "text"));
    EXPECT_NE(errno, 0);
}
