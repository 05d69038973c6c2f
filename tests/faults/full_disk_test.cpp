// There is no room on the disk, or none that the process may take: an update that does not fit
// fails as a whole, and does when there is room.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <ostream>

#include "session.h"

using namespace cfg32::tests;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

const attribute_change growth = {
    LDAP_MOD_REPLACE, "cn=Configuration", "description", {std::string(60'000, 'D')}};
const attribute_change shrinkage = {LDAP_MOD_REPLACE, "cn=Configuration", "description", {"short"}};

std::string file_of_some_pages() {
    return as_written(configuration_head + "description: " + std::string(20'000, 'd') + "\n");
}

bool write_text(const char* path, const std::string& text) {
    return static_cast<bool>(std::ofstream(path) << text << std::flush);
}

/// Gets a namespace of mounts of this process's own, which nobody else sees; a test has a process
/// of its own. Returns why not, "" if so.
std::string own_mounts() {
    const std::string user = std::to_string(geteuid());
    const std::string group = std::to_string(getegid());
    if (unshare(CLONE_NEWNS) != 0) {
        if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) {
            return std::string("no namespaces: ") + strerror(errno);
        }
        if (!write_text("/proc/self/setgroups", "deny") ||
            !write_text("/proc/self/uid_map", user + " " + user + " 1") ||
            !write_text("/proc/self/gid_map", group + " " + group + " 1")) {
            return "no user of that namespace";
        }
    }
    if (mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) {
        return std::string("no mounts of its own: ") + strerror(errno);
    }
    return "";
}

struct small_file_system {
    const char* name;
    const char* make;  ///< the command that makes it in a file; null for one in memory
};

void PrintTo(const small_file_system& one, std::ostream* out) { *out << one.name; }

/// One in memory, one on a disk, and one on a disk that can't reserve room.
const small_file_system file_systems[] = {
    {"tmpfs", nullptr},
    {"ext4", "mkfs.ext4 -q -F -m 0 -b 1024"},
    {"ext2", "mkfs.ext2 -q -F -m 0 -b 1024"},
};

constexpr off_t disk_size = 1 << 20;

struct full_disk : testing::TestWithParam<small_file_system> {
    const temporary_folder outside;
    const std::string place = outside.file("disk");
    const std::string config = place + "/oruslapd.conf";
    const std::string backup = place + "/oruslapd.bak";
    const std::string filler = place + "/filler";
    const std::string before = file_of_some_pages();
    bool is_mounted = false;

    void SetUp() override {
        if (const std::string obstacle = own_mounts(); !obstacle.empty()) {
            GTEST_SKIP() << obstacle;
        }
        ASSERT_EQ(mkdir(place.c_str(), 0700), 0);
        if (const std::string obstacle = mount_disk(); !obstacle.empty()) {
            GTEST_SKIP() << "no " << GetParam().name << " can be mounted: " << obstacle;
        }
        is_mounted = true;
        std::ofstream(config, std::ios::binary) << before;
        ASSERT_EQ(text_of(config), before);
    }

    void TearDown() override {
        if (is_mounted) {
            EXPECT_EQ(umount2(place.c_str(), MNT_DETACH), 0);
        }
    }

    std::string mount_disk() const {
        if (!GetParam().make) {
            const std::string size = "size=" + std::to_string(disk_size);
            return mount("none", place.c_str(), "tmpfs", 0, size.c_str()) == 0 ? ""
                                                                               : strerror(errno);
        }
        const std::string image = outside.write("image", "");
        if (truncate(image.c_str(), disk_size) != 0) {
            return strerror(errno);
        }
        const std::string path = "PATH=$PATH:/sbin:/usr/sbin ";
        if (system((path + GetParam().make + " " + image + " >/dev/null 2>&1").c_str()) != 0) {
            return "it can't be made";
        }
        const std::string command = path + "mount -o loop " + image + " " + place + " 2>/dev/null";
        return system(command.c_str()) == 0 ? "" : "the loop device can't be had";
    }

    static std::string text_of(const std::string& path) {
        std::ifstream in(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    /// Takes all the room that is left, but for so many bytes.
    void fill(size_t left = 0) const {
        const int file = open(filler.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
        ASSERT_GE(file, 0);
        const std::string block(512, 'f');
        off_t size = 0;
        for (ssize_t count; (count = ::write(file, block.data(), block.size())) > 0;) {
            size += count;
        }
        EXPECT_EQ(errno, ENOSPC);
        EXPECT_EQ(ftruncate(file, size - static_cast<off_t>(left)), 0);
        EXPECT_EQ(fsync(file), 0);
        close(file);
    }

    void make_room() const { ASSERT_EQ(unlink(filler.c_str()), 0); }

    /// The names in the folder, save those that are to be there.
    std::vector<std::string> other_files() const {
        std::vector<std::string> names;
        for (const auto& file : std::filesystem::directory_iterator(place)) {
            const std::string path = file.path();
            if (path != config && path != backup && path != filler &&
                path != place + "/lost+found") {
                names.push_back(path);
            }
        }
        return names;
    }
};

}  // namespace

TEST_P(full_disk, AnUpdateThatDoesNotFitLeavesTheFileAsItWas) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    fill();
    EXPECT_EQ(user.modify(growth), CFG_OTHER);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(text_of(config), before);
    make_room();
    EXPECT_EQ(user.modify(growth), CFG_SUCCESS) << user.report();
    EXPECT_EQ(text_of(config), as_written_after(before, growth));
}

TEST_P(full_disk, AnUpdateThatFitsOnlyInPartLeavesTheFileAsItWas) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    fill(12'000);
    EXPECT_EQ(user.modify(growth), CFG_OTHER);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(text_of(config), before);
    // A program that comes later finds the old file whole.
    session other(config);
    EXPECT_EQ(other.bind(), CFG_SUCCESS) << other.report();
    EXPECT_EQ(text_of(config), before);
}

TEST_P(full_disk, AnUpdateThatTakesNoMoreRoomIsDone) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    fill();
    EXPECT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    EXPECT_EQ(text_of(config), as_written_after(before, shrinkage));
}

TEST_P(full_disk, ABackupThatDoesNotFitLeavesTheFileAndTheBackupAsTheyWere) {
    session user(config, backup);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(user.flush(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(text_of(backup), before);
    const std::string changed = as_written_after(before, shrinkage);
    ASSERT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    ASSERT_EQ(user.modify(growth), CFG_SUCCESS) << user.report();
    ASSERT_EQ(text_of(backup), changed);
    const std::string grown = text_of(config);
    fill();
    EXPECT_EQ(user.modify(shrinkage), CFG_INSUFFICIENT_ACCESS);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(text_of(config), grown);
    EXPECT_EQ(text_of(backup), changed);
    EXPECT_THAT(other_files(), IsEmpty());
    make_room();
    EXPECT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    EXPECT_EQ(text_of(config), changed);
    EXPECT_EQ(text_of(backup), grown);
}

INSTANTIATE_TEST_SUITE_P(on, full_disk, testing::ValuesIn(file_systems),
                         [](const auto& info) { return std::string(info.param.name); });

namespace {

/// Lets no file of this process grow beyond a size, for as long as it lives.
class size_limit {
  public:
    explicit size_limit(size_t size) : handler_(signal(SIGXFSZ, SIG_IGN)) {
        EXPECT_EQ(getrlimit(RLIMIT_FSIZE, &before_), 0);
        const rlimit limit = {size, before_.rlim_max};
        EXPECT_EQ(setrlimit(RLIMIT_FSIZE, &limit), 0);
    }
    size_limit(const size_limit&) = delete;
    size_limit& operator=(const size_limit&) = delete;
    ~size_limit() {
        EXPECT_EQ(setrlimit(RLIMIT_FSIZE, &before_), 0);
        signal(SIGXFSZ, handler_);
    }

  private:
    rlimit before_{};
    void (*handler_)(int);
};

struct limited_file : testing::Test {
    const std::string before = file_of_some_pages();
    const configuration_folder folder{before};
};

}  // namespace

TEST_F(limited_file, AnUpdateBeyondTheLimitLeavesTheFileAsItWas) {
    session user(folder.config());
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    {
        const size_limit limit(before.size() + 100);
        EXPECT_EQ(user.modify(growth), CFG_OTHER);
        EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(EFBIG) + ":"));
        EXPECT_EQ(folder.text(), before);
    }
    EXPECT_EQ(user.modify(growth), CFG_SUCCESS) << user.report();
    EXPECT_EQ(folder.text(), as_written_after(before, growth));
}

TEST_F(limited_file, ABackupBeyondTheLimitLeavesTheFileAsItWas) {
    session user(folder.config(), folder.backup());
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    {
        const size_limit limit(before.size() - 100);
        EXPECT_EQ(user.modify(shrinkage), CFG_INSUFFICIENT_ACCESS);
        EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(EFBIG) + ":"));
        EXPECT_EQ(folder.text(), before);
        EXPECT_EQ(folder.backup_text(), "");
        EXPECT_THAT(folder.other_files(), IsEmpty());
    }
    EXPECT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    EXPECT_EQ(folder.backup_text(), before);
}
