#include <fcntl.h>
#include <grp.h>
#include <gtest/gtest.h>
#include <pwd.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <sys/xattr.h>

#include <algorithm>
#include <array>
#include <climits>
#include <csignal>
#include <cstdint>
#include <thread>
#include <vector>

#include "call_faults.h"
#include "cfg32_platform.h"
#include "test_directory.h"

namespace {

using names = std::set<std::string>;

// Content without a period that a copy in pieces could hide.
std::string long_content(std::size_t size) {
    std::string content(size, '\0');
    std::uint32_t state = 1;
    for (char& c : content) {
        state = state * 1664525 + 1013904223;
        c = static_cast<char>(state >> 24);
    }
    return content;
}

class CopyFile : public testing::Test {
  protected:
    bool copy(mode_t mode = 0600, const char* owner = nullptr, const char* group = nullptr) const {
        errno = 0;
        return copyFile(source_.c_str(), target_.c_str(), owner, group, mode);
    }

    test_directory directory_;
    std::string source_ = directory_.write("source", "dn: cn=Configuration\n", 0640);
    std::string target_ = directory_.file("target");
};

TEST_F(CopyFile, MakesATargetWithTheSameContent) {
    EXPECT_TRUE(copy());
    EXPECT_EQ(content_of(target_), "dn: cn=Configuration\n");
    EXPECT_EQ(content_of(source_), "dn: cn=Configuration\n");
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, ReplacesAnExistingTarget) {
    directory_.write("target", "an older and much longer version than the new one", 0666);
    EXPECT_TRUE(copy(0640));
    EXPECT_EQ(content_of(target_), "dn: cn=Configuration\n");
    EXPECT_EQ(mode_of(target_), 0640u);
}

TEST_F(CopyFile, CopiesAnEmptyFile) {
    directory_.write("source", "");
    EXPECT_TRUE(copy());
    EXPECT_EQ(content_of(target_), "");
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, CopiesMoreThanAnyBufferHolds) {
    const std::string content = long_content((std::size_t{5} << 20) + 17);
    directory_.write("source", content);
    EXPECT_TRUE(copy());
    EXPECT_TRUE(content_of(target_) == content);
}

TEST_F(CopyFile, CopiesByReadingAndWritingWhereTheKernelCannot) {
    const std::string content = long_content((std::size_t{1} << 20) + 17);
    directory_.write("source", content);
    for (const int error : {EXDEV, ENOSYS, EINVAL, EOPNOTSUPP}) {
        const call_fault fault(watched_call::copy_range, 1, error);
        EXPECT_TRUE(copy()) << error;
        EXPECT_TRUE(fault.happened());
        EXPECT_TRUE(content_of(target_) == content) << error;
    }
}

TEST_F(CopyFile, CopiesTheRestByHandWhenTheKernelStopsHalfway) {
    const std::string content = long_content(100000);
    directory_.write("source", content);
    const call_fault fault(watched_call::copy_range, 2, EIO);
    EXPECT_TRUE(copy());
    EXPECT_TRUE(fault.happened());
    EXPECT_TRUE(content_of(target_) == content);
}

TEST_F(CopyFile, CopiesBetweenFileSystems) {
    if (::access("/dev/shm", W_OK) != 0)
        GTEST_SKIP() << "no second file system";
    const test_directory other("/dev/shm");
    if (status_of(other.path()).st_dev == status_of(directory_.path()).st_dev)
        GTEST_SKIP() << "no second file system";
    const std::string content = long_content(100000);
    directory_.write("source", content);
    const std::string far = other.file("far");
    EXPECT_TRUE(copyFile(source_.c_str(), far.c_str(), nullptr, nullptr, 0640));
    EXPECT_TRUE(content_of(far) == content);
    EXPECT_EQ(mode_of(far), 0640u);
    EXPECT_TRUE(copyFile(far.c_str(), target_.c_str(), nullptr, nullptr, 0640));
    EXPECT_TRUE(content_of(target_) == content);
}

TEST_F(CopyFile, CopiesAFileThatDoesNotKnowItsSize) {
    const char* proc = "/proc/self/limits";
    if (::access(proc, R_OK) != 0)
        GTEST_SKIP() << "no /proc";
    EXPECT_TRUE(copyFile(proc, target_.c_str(), nullptr, nullptr, 0600));
    EXPECT_EQ(content_of(target_), content_of(proc));
}

TEST_F(CopyFile, WorksInTheWorkingDirectory) {
    char before[PATH_MAX];
    ASSERT_NE(::getcwd(before, sizeof before), nullptr);
    ASSERT_EQ(::chdir(directory_.path().c_str()), 0);
    const bool copied = copyFile("source", "copy", nullptr, nullptr, 0600);
    ASSERT_EQ(::chdir(before), 0);
    EXPECT_TRUE(copied);
    EXPECT_EQ(directory_.names(), (names{"copy", "source"}));
}

TEST_F(CopyFile, FollowsASourceThatIsALink) {
    ASSERT_EQ(::symlink("source", directory_.file("link").c_str()), 0);
    EXPECT_TRUE(copyFile(directory_.file("link").c_str(), target_.c_str(), nullptr, nullptr, 0600));
    EXPECT_TRUE(S_ISREG(status_of(target_).st_mode));
    EXPECT_EQ(content_of(target_), content_of(source_));
}

TEST_F(CopyFile, ReplacesATargetLinkAndNotItsFile) {
    const std::string elsewhere = directory_.write("elsewhere", "untouched");
    for (const char* destination : {"elsewhere", "dangling"}) {
        ::unlink(target_.c_str());
        ASSERT_EQ(::symlink(destination, target_.c_str()), 0);
        EXPECT_TRUE(copy()) << destination;
        EXPECT_TRUE(S_ISREG(status_of(target_).st_mode)) << destination;
        EXPECT_EQ(content_of(target_), content_of(source_)) << destination;
    }
    EXPECT_EQ(content_of(elsewhere), "untouched");
    EXPECT_EQ(directory_.names(), (names{"elsewhere", "source", "target"}));
}

// Mode -----------------------------------------------------------------------------------------

TEST_F(CopyFile, GivesThePermissionBitsWhateverTheUmask) {
    const mode_t regular_file = S_IFREG;  // callers pass a whole st_mode
    for (const mode_t mask : {mode_t{0}, mode_t{022}, mode_t{0777}}) {
        for (const mode_t mode :
             {0600u, 0640u, 0644u, 0660u, 0666u, 0400u, 0755u, 04755u, 01644u, 0u}) {
            const mode_t before = ::umask(mask);
            const bool copied = copy(mode | regular_file);
            ::umask(before);
            EXPECT_TRUE(copied) << std::oct << mode;
            EXPECT_EQ(mode_of(target_), mode) << std::oct << mask;
        }
    }
}

// An access control list in its binary form: permissions of the owner, of user 65534, of the group,
// of all but the owner and others at most, and of others (acl(5)).
std::vector<unsigned char> access_list(std::uint16_t owner, std::uint16_t user, std::uint16_t group,
                                       std::uint16_t mask, std::uint16_t others) {
    const struct {
        std::uint16_t tag, permissions;
        std::uint32_t id;
    } entries[] = {{0x01, owner, ~0u},
                   {0x02, user, 65534},
                   {0x04, group, ~0u},
                   {0x10, mask, ~0u},
                   {0x20, others, ~0u}};
    std::vector<unsigned char> list = {2, 0, 0, 0};
    for (const auto& entry : entries) {
        const auto* bytes = reinterpret_cast<const unsigned char*>(&entry);
        list.insert(list.end(), bytes, bytes + sizeof entry);
    }
    return list;
}

TEST_F(CopyFile, InheritsNoAccessListFromTheDirectory) {
    const auto list = access_list(7, 6, 5, 7, 5);
    if (::setxattr(directory_.path().c_str(), "system.posix_acl_default", list.data(), list.size(),
                   0) != 0)
        GTEST_SKIP() << "the file system has no access control lists";
    directory_.write("plain", "");
    ASSERT_GT(::getxattr(directory_.file("plain").c_str(), "system.posix_acl_access", nullptr, 0),
              0);
    EXPECT_TRUE(copy(0640));
    EXPECT_EQ(mode_of(target_), 0640u);
    EXPECT_EQ(::getxattr(target_.c_str(), "system.posix_acl_access", nullptr, 0), -1);
    EXPECT_EQ(errno, ENODATA);
}

// What one who has nothing but a group may read, in a process of their own.
bool can_read(gid_t group, const std::string& path) {
    constexpr uid_t somebody = 23456;
    const pid_t child = ::fork();
    if (child == 0) {
        if (::setgroups(0, nullptr) != 0 || ::setgid(group) != 0 || ::setuid(somebody) != 0)
            ::_exit(2);
        ::_exit(::access(path.c_str(), R_OK) == 0 ? 0 : 1);
    }
    int status = -1;
    EXPECT_EQ(::waitpid(child, &status, 0), child);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) != 2) << status;
    return status == 0;
}

// The mode of the file with the list says rw-rw----, although the group may do nothing.
TEST_F(CopyFile, OfAFileWithAnAccessListLetsNobodyInWhomTheListRefuses) {
    const auto list = access_list(6, 6, 0, 6, 0);
    if (::setxattr(source_.c_str(), "system.posix_acl_access", list.data(), list.size(), 0) != 0)
        GTEST_SKIP() << "the file system has no access control lists";
    ASSERT_EQ(mode_of(source_), 0660u);
    EXPECT_TRUE(copy(status_of(source_).st_mode));
    EXPECT_EQ(mode_of(target_), 0600u);
    EXPECT_EQ(::getxattr(target_.c_str(), "system.posix_acl_access", nullptr, 0), -1);
    if (::geteuid() != 0)
        GTEST_SKIP() << "only the superuser can be another";
    constexpr gid_t group = 54321;
    ASSERT_EQ(::chmod(directory_.path().c_str(), 0755), 0);
    ASSERT_EQ(::chown(source_.c_str(), 12345, group), 0);
    EXPECT_TRUE(copy(status_of(source_).st_mode));
    ASSERT_EQ(status_of(target_).st_gid, group);
    ASSERT_FALSE(can_read(group, source_));
    EXPECT_FALSE(can_read(group, target_));
}

// Owner and group ------------------------------------------------------------------------------

std::string own_name() {
    const passwd* record = ::getpwuid(::geteuid());
    return record == nullptr ? "" : record->pw_name;
}
std::string own_group() {
    const ::group* record = ::getgrgid(::getegid());
    return record == nullptr ? "" : record->gr_name;
}

TEST_F(CopyFile, DoesNotChangeAnOwnerThatIsRightAlready) {
    if (own_name().empty() || own_group().empty())
        GTEST_SKIP() << "this user has no name";
    const call_fault fault(watched_call::chown, 1, EPERM);
    EXPECT_TRUE(copy(0640, own_name().c_str(), own_group().c_str()));
    EXPECT_TRUE(copy(0640));
    EXPECT_EQ(fault.calls(), 0);
    EXPECT_EQ(status_of(target_).st_uid, ::geteuid());
    EXPECT_EQ(status_of(target_).st_gid, ::getegid());
}

TEST_F(CopyFile, GivesAnotherOwnerAndGroup) {
    const passwd* user = ::getpwnam("daemon");
    const ::group* group = ::getgrnam("bin");
    if (::geteuid() != 0 || user == nullptr || group == nullptr)
        GTEST_SKIP() << "only the superuser gives files away";
    const uid_t uid = user->pw_uid;
    const gid_t gid = group->gr_gid;
    const struct {
        const char *owner, *group;
        uid_t uid;
        gid_t gid;
    } rows[] = {
        {"daemon", "bin", uid, gid},
        {"daemon", nullptr, uid, ::getegid()},
        {nullptr, "bin", ::geteuid(), gid},
    };
    for (const auto& row : rows) {
        EXPECT_TRUE(copy(04640, row.owner, row.group));
        EXPECT_EQ(status_of(target_).st_uid, row.uid);
        EXPECT_EQ(status_of(target_).st_gid, row.gid);
        EXPECT_EQ(mode_of(target_), 04640u) << "a change of owner must not cost the set-ID bit";
    }
}

TEST_F(CopyFile, FailsForAnUnknownOwnerOrGroup) {
    directory_.write("target", "old");
    EXPECT_FALSE(copy(0640, "no-such-name-here", nullptr));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(copy(0640, nullptr, "no-such-name-here"));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(content_of(target_), "old");
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, KeepsTheNumbersOfAnOwnerAndAGroupWithoutNames) {
    if (::chown(source_.c_str(), 12345, 54321) != 0)
        GTEST_SKIP() << "only the superuser gives files away";
    const passwd* user = ::getpwnam("daemon");
    ASSERT_NE(user, nullptr);
    const struct {
        const char* owner;
        uid_t uid;
    } rows[] = {{nullptr, 12345}, {"daemon", user->pw_uid}};
    for (const auto& row : rows) {
        EXPECT_TRUE(copy(04664, row.owner, nullptr));
        EXPECT_EQ(status_of(target_).st_uid, row.uid);
        EXPECT_EQ(status_of(target_).st_gid, 54321u);
        EXPECT_EQ(mode_of(target_), 04664u);
    }
}

// The superuser acts as an ordinary user for a while; an ordinary user stays what it is.
class ordinary_user {
  public:
    ordinary_user() : changed_(::geteuid() == 0 && ::seteuid(65534) == 0) {}
    ~ordinary_user() {
        if (changed_ && ::seteuid(0) != 0)
            std::abort();
    }

  private:
    bool changed_;
};

TEST_F(CopyFile, FailsWhenTheOwnerCannotBeGiven) {
    ASSERT_EQ(::chmod(directory_.path().c_str(), 0777), 0);
    ASSERT_EQ(::chmod(source_.c_str(), 0644), 0);
    directory_.write("target", "old");
    {
        const ordinary_user user;
        if (::geteuid() == 0)
            GTEST_SKIP() << "still the superuser";
        EXPECT_FALSE(copy(0644, "root", nullptr));
        EXPECT_EQ(errno, EPERM);
        EXPECT_TRUE(
            copyFile(source_.c_str(), directory_.file("own").c_str(), nullptr, nullptr, 0644))
            << "the directory itself must not be what failed";
    }
    EXPECT_EQ(content_of(target_), "old");
    EXPECT_EQ(directory_.names(), (names{"own", "source", "target"}));
}

// The rights of the one group are not those of the other.
TEST_F(CopyFile, LeavesTheRightsOfAGroupThatCannotBeGivenToNoOther) {
    if (::chown(source_.c_str(), 12345, 54321) != 0)
        GTEST_SKIP() << "only the superuser gives files away";
    ASSERT_EQ(::chmod(directory_.path().c_str(), 0777), 0);
    ASSERT_EQ(::chmod(source_.c_str(), 0664), 0);
    {
        const ordinary_user user;
        if (::geteuid() == 0)
            GTEST_SKIP() << "still the superuser";
        EXPECT_TRUE(copy(0664));
        EXPECT_EQ(status_of(target_).st_uid, ::geteuid());
        EXPECT_EQ(status_of(target_).st_gid, ::getegid());
    }
    EXPECT_EQ(mode_of(target_), 0604u);
}

TEST_F(CopyFile, FailsWhenTheSourceCannotBeRead) {
    ASSERT_EQ(::chmod(directory_.path().c_str(), 0777), 0);
    ASSERT_EQ(::chmod(source_.c_str(), 0), 0);
    const ordinary_user user;
    if (::geteuid() == 0)
        GTEST_SKIP() << "still the superuser";
    EXPECT_FALSE(copy());
    EXPECT_EQ(errno, EACCES);
    EXPECT_EQ(directory_.names(), names{"source"});
}

// Refusals -------------------------------------------------------------------------------------

TEST_F(CopyFile, RefusesItsOwnSourceUnderAnyName) {
    ASSERT_EQ(::link(source_.c_str(), directory_.file("hard").c_str()), 0);
    ASSERT_EQ(::symlink("source", directory_.file("soft").c_str()), 0);
    const names before = directory_.names();
    const struct stat status = status_of(source_);
    for (const std::string& name : {std::string("source"), std::string("./source"),
                                    std::string("hard"), std::string("soft")}) {
        errno = 0;
        EXPECT_FALSE(
            copyFile(source_.c_str(), directory_.file(name).c_str(), nullptr, nullptr, 0600))
            << name;
        EXPECT_EQ(errno, EINVAL) << name;
    }
    EXPECT_FALSE(
        copyFile(directory_.file("soft").c_str(), source_.c_str(), nullptr, nullptr, 0600));
    EXPECT_EQ(content_of(source_), "dn: cn=Configuration\n");
    EXPECT_EQ(mode_of(source_), 0640u);
    EXPECT_EQ(status_of(source_).st_ino, status.st_ino);
    EXPECT_TRUE(S_ISLNK(status_of(directory_.file("soft")).st_mode));
    EXPECT_EQ(directory_.names(), before);
}

TEST_F(CopyFile, RefusesASourceThatIsNoRegularFile) {
    ASSERT_EQ(::mkfifo(directory_.file("fifo").c_str(), 0600), 0);
    directory_.write("target", "old");
    const struct {
        std::string source;
        int error;
    } rows[] = {
        {directory_.file("missing"), ENOENT},
        {directory_.file("fifo"), EINVAL},  // would block if it were opened like a file
        {directory_.path(), EISDIR},
        {"/dev/null", EINVAL},
        {"", ENOENT},
    };
    for (const auto& row : rows) {
        errno = 0;
        EXPECT_FALSE(copyFile(row.source.c_str(), target_.c_str(), nullptr, nullptr, 0600))
            << row.source;
        EXPECT_EQ(errno, row.error) << row.source;
    }
    EXPECT_EQ(content_of(target_), "old");
    EXPECT_EQ(directory_.names(), (names{"fifo", "source", "target"}));
}

TEST_F(CopyFile, RefusesATargetThatARenameWouldDestroy) {
    ASSERT_EQ(::mkfifo(directory_.file("fifo").c_str(), 0600), 0);
    ASSERT_EQ(::symlink("fifo", directory_.file("to-fifo").c_str()), 0);
    ASSERT_EQ(::mkdir(directory_.file("dir").c_str(), 0700), 0);
    ASSERT_EQ(::symlink("loop", directory_.file("loop").c_str()), 0);
    const names before = directory_.names();
    const struct {
        std::string target;
        int error;
    } rows[] = {
        {"fifo", EINVAL},
        {"to-fifo", EINVAL},
        {"dir", EISDIR},
        {"dir/", EISDIR},
        {"new/", EISDIR},
        {".", EISDIR},
        {"missing/x", ENOENT},
        {"source/x", ENOTDIR},
        {"loop", ELOOP},
        {std::string(256, 'n'), ENAMETOOLONG},
        {std::string(PATH_MAX, '/') + "x", ENAMETOOLONG},
    };
    for (const auto& row : rows) {
        errno = 0;
        EXPECT_FALSE(
            copyFile(source_.c_str(), directory_.file(row.target).c_str(), nullptr, nullptr, 0600))
            << row.target;
        EXPECT_EQ(errno, row.error) << row.target;
    }
    EXPECT_EQ(directory_.names(), before);
    EXPECT_TRUE(S_ISFIFO(status_of(directory_.file("fifo")).st_mode));
    EXPECT_TRUE(S_ISLNK(status_of(directory_.file("to-fifo")).st_mode));
}

TEST_F(CopyFile, RefusesNullAndEmptyNames) {
    EXPECT_FALSE(copyFile(nullptr, target_.c_str(), nullptr, nullptr, 0600));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(copyFile(source_.c_str(), nullptr, nullptr, nullptr, 0600));
    EXPECT_EQ(errno, EINVAL);
    EXPECT_FALSE(copyFile(source_.c_str(), "", nullptr, nullptr, 0600));
    EXPECT_EQ(errno, ENOENT);
}

// Failures halfway -----------------------------------------------------------------------------

TEST_F(CopyFile, AFailedStepLeavesTheTargetAndNothingElse) {
    const struct {
        watched_call call;
        int nth;
        int error;
    } rows[] = {
        {watched_call::random, 1, EFAULT}, {watched_call::chmod, 1, EPERM},
        {watched_call::sync, 1, EIO},      {watched_call::close, 1, EDQUOT},
        {watched_call::rename, 1, EACCES},
    };
    directory_.write("target", "old", 0604);
    for (const auto& row : rows) {
        const call_fault fault(row.call, row.nth, row.error);
        EXPECT_FALSE(copy()) << row.error;
        EXPECT_EQ(errno, row.error);
        EXPECT_TRUE(fault.happened()) << row.error;
        EXPECT_EQ(content_of(target_), "old") << row.error;
        EXPECT_EQ(mode_of(target_), 0604u) << row.error;
        EXPECT_EQ(directory_.names(), (names{"source", "target"})) << row.error;
    }
}

TEST_F(CopyFile, AFullDiskLeavesTheTargetAndNothingElse) {
    directory_.write("source", long_content(200000));
    directory_.write("target", "old");
    rlimit before;
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &before), 0);
    const auto handler = std::signal(SIGXFSZ, SIG_IGN);
    const rlimit small = {100000, before.rlim_max};
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &small), 0);
    const bool copied = copy();
    const int error = errno;
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &before), 0);
    std::signal(SIGXFSZ, handler);
    EXPECT_FALSE(copied);
    EXPECT_EQ(error, EFBIG);
    EXPECT_EQ(content_of(target_), "old");
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, AWriteThatWritesNothingIsAFailureAndNotRepeatedForEver) {
    const char* proc = "/proc/self/limits";  // no part of it goes past write(2)
    if (::access(proc, R_OK) != 0)
        GTEST_SKIP() << "no /proc";
    directory_.write("target", "old");
    const call_fault fault(watched_call::write, 1);
    EXPECT_FALSE(copyFile(proc, target_.c_str(), nullptr, nullptr, 0600));
    EXPECT_EQ(errno, EIO);
    EXPECT_EQ(fault.calls(), 1);
    EXPECT_EQ(content_of(target_), "old");
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, SyncsTheFileAndThenItsDirectory) {
    call_fault fault(watched_call::sync, 0);
    EXPECT_TRUE(copy());
    EXPECT_EQ(fault.calls(), 2);
}

TEST_F(CopyFile, AFailedSyncOfTheDirectoryIsAFailureThatLeavesACompleteCopy) {
    directory_.write("target", "old");
    const call_fault fault(watched_call::sync, 2, EIO);
    EXPECT_FALSE(copy());
    EXPECT_EQ(errno, EIO);
    EXPECT_EQ(content_of(target_), content_of(source_));
    EXPECT_EQ(directory_.names(), (names{"source", "target"}));
}

TEST_F(CopyFile, AFileSystemThatCannotSyncDirectoriesIsNoFailure) {
    const call_fault fault(watched_call::sync, 2, EINVAL);
    EXPECT_TRUE(copy());
    EXPECT_TRUE(fault.happened());
}

TEST_F(CopyFile, AnInterruptedSyncIsRepeated) {
    call_fault fault(watched_call::sync, 1, EINTR);
    EXPECT_TRUE(copy());
    EXPECT_EQ(fault.calls(), 3);
}

TEST_F(CopyFile, ExhaustedMemoryIsAFailure) {
    const call_fault fault(watched_call::allocate, 1, 0);
    EXPECT_FALSE(copy(0600, "root", nullptr));
    EXPECT_EQ(errno, ENOMEM);
}

TEST_F(CopyFile, NeverShowsAnIncompleteTarget) {
    const std::string versions[] = {long_content(50000), std::string(90000, 'x')};
    directory_.write("0", versions[0]);
    directory_.write("1", versions[1]);
    ASSERT_TRUE(copyFile(directory_.file("0").c_str(), target_.c_str(), nullptr, nullptr, 0600));
    std::thread writer([this] {
        for (int round = 0; round < 40; ++round)
            EXPECT_TRUE(copyFile(directory_.file(round % 2 == 0 ? "1" : "0").c_str(),
                                 target_.c_str(), nullptr, nullptr, 0600));
    });
    for (int round = 0; round < 200; ++round) {
        const std::string seen = content_of(target_);
        EXPECT_TRUE(seen == versions[0] || seen == versions[1]) << seen.size();
    }
    writer.join();
}

}  // namespace
