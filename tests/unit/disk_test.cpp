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

#include "temporary_folder.h"

using namespace cfg32;
using cfg32::tests::temporary_folder;

namespace {

constexpr mode_t owner_only = 0600;

struct disk : testing::Test {
    temporary_folder folder;

    std::string content(const std::string& path, size_t expected) {
        const file_descriptor file = open_regular_file(path.c_str(), O_RDONLY);
        EXPECT_TRUE(file.is_open());
        std::string text = "what was there before";
        EXPECT_TRUE(read_all(file, expected, text));
        return text;
    }

    bool write(const std::string& name, const std::string& text) {
        file_descriptor file =
            open_regular_file(folder.file(name).c_str(), O_WRONLY | O_CREAT, owner_only);
        return file.is_open() && overwrite(file, text) && file.close();
    }

    /// errno of an attempt to open the path, 0 when it opens.
    int refusal(const std::string& path, int flags) {
        errno = 0;
        return open_regular_file(path.c_str(), flags, owner_only).is_open() ? 0 : errno;
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

TEST_F(disk, DescriptorClosesItsFileAtItsEnd) {
    int number;
    {
        const file_descriptor file(open(folder.write("f", "x").c_str(), O_RDONLY));
        number = file.number();
        EXPECT_TRUE(file.is_open());
        EXPECT_TRUE(is_open_in_system(number));
    }
    EXPECT_FALSE(is_open_in_system(number));
}

TEST_F(disk, MovedDescriptorBelongsToItsNewOwnerOnly) {
    file_descriptor file(open(folder.write("f", "x").c_str(), O_RDONLY));
    const int number = file.number();
    const file_descriptor owner(std::move(file));
    EXPECT_FALSE(file.is_open());
    EXPECT_TRUE(file.close());
    EXPECT_EQ(owner.number(), number);
    EXPECT_TRUE(is_open_in_system(number));
}

TEST_F(disk, ClosingTwiceClosesOnce) {
    file_descriptor file(open(folder.write("f", "x").c_str(), O_RDONLY));
    EXPECT_TRUE(file.close());
    EXPECT_FALSE(file.is_open());
    EXPECT_TRUE(file.close());
}

TEST_F(disk, ClosingReportsTheSystemsError) {
    file_descriptor file(dup(open(folder.write("f", "x").c_str(), O_RDONLY)));
    ::close(file.number());
    EXPECT_FALSE(file.close());
    EXPECT_EQ(errno, EBADF);
}

TEST_F(disk, NothingIsNoOpenFile) { EXPECT_FALSE(file_descriptor().is_open()); }

TEST_F(disk, OpenedFileIsNotInherited) {
    const file_descriptor file = open_regular_file(folder.write("f", "x").c_str(), O_RDONLY);
    ASSERT_TRUE(file.is_open());
    EXPECT_TRUE(fcntl(file.number(), F_GETFD) & FD_CLOEXEC);
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
    const file_descriptor listener(socket(AF_UNIX, SOCK_STREAM, 0));
    ASSERT_EQ(bind(listener.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
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
    const file_descriptor file(open(folder.write("f", "x").c_str(), O_WRONLY));
    std::string text;
    EXPECT_FALSE(read_all(file, 1, text));
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
    const file_descriptor file = open_regular_file(folder.write("f", "0123456789").c_str(), O_RDWR);
    ASSERT_EQ(lseek(file.number(), 5, SEEK_SET), 5);
    EXPECT_TRUE(overwrite(file, "abc"));
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
    const file_descriptor file(open(folder.write("f", "before").c_str(), O_RDONLY));
    EXPECT_FALSE(overwrite(file, "after"));
    EXPECT_EQ(errno, EBADF);
    EXPECT_FALSE(overwrite(file, "x"));
    EXPECT_EQ(folder.read("f"), "before");
}

TEST_F(disk, FullDeviceIsReported) {
    const file_descriptor full(open("/dev/full", O_WRONLY));
    ASSERT_TRUE(full.is_open());
    EXPECT_FALSE(overwrite(full, "text"));
    EXPECT_NE(errno, 0);
}
