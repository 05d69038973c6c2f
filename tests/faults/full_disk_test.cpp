// There is no room on the disk, or none that the process may take: an update that does not fit
// fails as a whole, and does when there is room.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <fstream>
#include <set>

#include "session.h"
#include "small_disk.h"

using namespace cfg32::tests;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

const attribute_change growth = {
    LDAP_MOD_REPLACE, "cn=Configuration", "description", {std::string(60'000, 'D')}};
const attribute_change shrinkage = {LDAP_MOD_REPLACE, "cn=Configuration", "description", {"short"}};

std::string file_of_some_pages() {
    return as_written(configuration_head + "description: " + std::string(20'000, 'd') + "\n");
}

/// One in memory, one on a disk, and one on a disk that can't reserve room.
const file_system file_systems[] = {
    {"tmpfs", nullptr},
    {"ext4", "mkfs.ext4 -q -F -m 0 -b 1024"},
    {"ext2", "mkfs.ext2 -q -F -m 0 -b 1024"},
};

/// One where a copy shares the blocks of the file until either is written; it is made no smaller.
const file_system sharing = {"xfs", "mkfs.xfs -q -f -m reflink=1", off_t{320} << 20};

/// One whose times are of two seconds, and whose files have no owner.
const file_system coarse = {"vfat", "mkfs.vfat"};

struct on_a_disk : testing::Test {
    const small_disk disk;
    const std::string config = disk.config();
    const std::string backup = disk.backup();
    const std::string before = file_of_some_pages();

    explicit on_a_disk(const file_system& kind) : disk(kind) {}

    void SetUp() override {
        if (!disk.obstacle().empty()) {
            GTEST_SKIP() << disk.obstacle();
        }
        std::ofstream(config, std::ios::binary) << before;
        ASSERT_EQ(disk.text_of(config), before);
    }

    struct stat status() const {
        struct stat status {};
        EXPECT_EQ(stat(config.c_str(), &status), 0);
        return status;
    }
};

struct full_disk : on_a_disk, testing::WithParamInterface<file_system> {
    full_disk() : on_a_disk(GetParam()) {}
};

struct sharing_disk : on_a_disk {
    sharing_disk() : on_a_disk(sharing) {}
};

struct coarse_disk : on_a_disk {
    coarse_disk() : on_a_disk(coarse) {}
};

}  // namespace

TEST_P(full_disk, AnUpdateThatDoesNotFitLeavesTheFileAsItWas) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    disk.fill();
    EXPECT_EQ(user.modify(growth), CFG_OTHER);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(disk.text_of(config), before);
    disk.make_room();
    EXPECT_EQ(user.modify(growth), CFG_SUCCESS) << user.report();
    EXPECT_EQ(disk.text_of(config), as_written_after(before, growth));
}

TEST_P(full_disk, AnUpdateThatFitsOnlyInPartLeavesTheFileAsItWas) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    disk.fill(12'000);
    EXPECT_EQ(user.modify(growth), CFG_OTHER);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(disk.text_of(config), before);
    // A program that comes later finds the old file whole.
    session other(config);
    EXPECT_EQ(other.bind(), CFG_SUCCESS) << other.report();
    EXPECT_EQ(disk.text_of(config), before);
}

TEST_P(full_disk, AnUpdateThatFitsOnlyInPartGivesBackTheRoomThatItGot) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    disk.fill(12'000);
    const int file = open(config.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_GE(file, 0);
    ASSERT_EQ(fsync(file),
              0);  // only now is it known where the content lies, and how much it takes
    close(file);
    const auto blocks = status().st_blocks;
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(user.modify(growth), CFG_OTHER);
        EXPECT_EQ(status().st_blocks, blocks);
        EXPECT_EQ(disk.text_of(config), before);
    }
}

TEST_P(full_disk, AnUpdateThatTakesNoMoreRoomIsDone) {
    session user(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    disk.fill();
    EXPECT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    EXPECT_EQ(disk.text_of(config), as_written_after(before, shrinkage));
}

TEST_P(full_disk, ABackupThatDoesNotFitLeavesTheFileAndTheBackupAsTheyWere) {
    session user(config, backup);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(user.flush(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(disk.text_of(backup), before);
    const std::string changed = as_written_after(before, shrinkage);
    ASSERT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    ASSERT_EQ(user.modify(growth), CFG_SUCCESS) << user.report();
    ASSERT_EQ(disk.text_of(backup), changed);
    const std::string grown = disk.text_of(config);
    disk.fill();
    EXPECT_EQ(user.modify(shrinkage), CFG_INSUFFICIENT_ACCESS);
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_EQ(disk.text_of(config), grown);
    EXPECT_EQ(disk.text_of(backup), changed);
    EXPECT_THAT(disk.other_files(), IsEmpty());
    disk.make_room();
    EXPECT_EQ(user.modify(shrinkage), CFG_SUCCESS) << user.report();
    EXPECT_EQ(disk.text_of(config), changed);
    EXPECT_EQ(disk.text_of(backup), grown);
}

INSTANTIATE_TEST_SUITE_P(on, full_disk, testing::ValuesIn(file_systems),
                         [](const auto& info) { return std::string(info.param.name); });

// The backup takes next to no room then, and it is short when the file is written.
TEST_F(sharing_disk, AnUpdateOfSharedBlocksIsDoneOrLeavesTheFileAsItWas) {
    constexpr size_t length = 1 << 19;
    const auto replacement = [](size_t count, char with) {
        return attribute_change{
            LDAP_MOD_REPLACE, "cn=Configuration", "description", {std::string(count, with)}};
    };
    session user(config, backup);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    std::set<int> codes;
    for (size_t left = 0; left <= 4 * length && !HasFailure(); left += length / 2) {
        for (const attribute_change& what :
             {replacement(length, 'D'), replacement(2 * length, 'D')}) {
            SCOPED_TRACE(std::to_string(left) + ", " + std::to_string(what.values[0].size()));
            ASSERT_EQ(user.modify(replacement(length, 'd')), CFG_SUCCESS) << user.report();
            const std::string now = disk.text_of(config);
            const std::string last = disk.text_of(backup);
            disk.fill(left);
            const int code = user.modify(what);
            disk.make_room();
            codes.insert(code);
            EXPECT_TRUE(disk.text_of(config) ==
                        (code == CFG_SUCCESS ? as_written_after(now, what) : now));
            EXPECT_TRUE(disk.text_of(backup) == (code == CFG_INSUFFICIENT_ACCESS ? last : now));
            if (code != CFG_SUCCESS) {
                EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
                EXPECT_THAT(user.report(), Not(HasSubstr("could not be put back")));
            }
            EXPECT_THAT(disk.other_files(), IsEmpty());
        }
    }
    // No room for the backup; some for it, but not for the file; room for both.
    EXPECT_EQ(codes, (std::set<int>{CFG_INSUFFICIENT_ACCESS, CFG_OTHER, CFG_SUCCESS}));
}

TEST_F(coarse_disk, EveryUpdateGivesTheFileALaterTime) {
    session user(config, backup);
    session other(config);
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(other.bind(), CFG_SUCCESS) << other.report();
    for (int i = 0; i < 5; ++i) {
        const struct stat last = status();
        const std::string value = "number " + std::to_string(i);
        const std::string now = disk.text_of(config);
        EXPECT_EQ(user.modify({LDAP_MOD_REPLACE, "cn=Configuration", "description", {value}}),
                  CFG_SUCCESS)
            << user.report();
        EXPECT_GT(status().st_mtim.tv_sec, last.st_mtim.tv_sec);
        EXPECT_EQ(disk.text_of(backup), now);
        std::set<std::string> values;
        EXPECT_EQ(other.search("cn=Configuration", "description", values), CFG_SUCCESS);
        EXPECT_EQ(values, std::set<std::string>{value});
    }
    EXPECT_THAT(disk.other_files(), IsEmpty());
}

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
