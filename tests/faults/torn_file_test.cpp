// A file that was not written to its end is noticed by a program that has it loaded already, even
// where nothing but its content tells.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>

#include <cerrno>
#include <initializer_list>

#include "faulty_calls.h"
#include "session.h"

using namespace cfg32::tests;
using testing::HasSubstr;

namespace {

const attribute_change growth = {
    LDAP_MOD_REPLACE, "cn=Configuration", "description", {std::string(9000, 'D')}};

const std::string mark =
    "# This file is being written. If it stays so, its backup is the complete version.\n";

struct torn_file : testing::Test {
    const std::string before = as_written(configuration_head + "description: as it was\n");
    const configuration_folder folder{before};
    session user{folder.config(), folder.backup()};

    void SetUp() override {
        folder.folder().write("oruslapd.bak", before);
        ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    }

    struct stat status() const {
        struct stat status {};
        EXPECT_EQ(stat(folder.config().c_str(), &status), 0);
        return status;
    }

    /// Gives the file the time of a status, which is then all that a handle remembers of it.
    void set_time_of(const struct stat& other) const {
        const timespec times[2] = {other.st_atim, other.st_mtim};
        ASSERT_EQ(utimensat(AT_FDCWD, folder.config().c_str(), times, 0), 0);
        ASSERT_EQ(status().st_ino, other.st_ino);
        ASSERT_EQ(status().st_mtim.tv_nsec, other.st_mtim.tv_nsec);
    }

    void expect_refused_update(session& by) const {
        const std::string torn = folder.text();
        ASSERT_EQ(torn.compare(0, mark.size(), mark), 0);
        for (int i = 0; i < 2; ++i) {
            EXPECT_EQ(by.modify(growth), CFG_OTHER);
            EXPECT_THAT(by.report(), HasSubstr("Configuration file was not written to its end"));
            EXPECT_THAT(by.report(), HasSubstr("extErr 1002"));
            EXPECT_EQ(folder.text(), torn);
            EXPECT_EQ(folder.backup_text(), before);
        }
    }

    /// As the report says.
    void expect_update_of_the_backup(session& by) const {
        folder.restore();
        EXPECT_EQ(by.modify(growth), CFG_SUCCESS) << by.report();
        EXPECT_EQ(folder.text(), as_written_after(before, growth));
        EXPECT_EQ(folder.backup_text(), before);
    }
};

}  // namespace

TEST_F(torn_file, OfTheRememberedTimeIsNeitherUpdatedNorMadeTheBackup) {
    const struct stat remembered = status();
    folder.write(mark + before.substr(0, before.size() / 2));
    set_time_of(remembered);
    expect_refused_update(user);
    expect_update_of_the_backup(user);
}

TEST_F(torn_file, ThatCouldNotBePutBackIsNeitherUpdatedNorMadeTheBackup) {
    session bystander(folder.config(), folder.backup());
    ASSERT_EQ(bystander.bind(), CFG_SUCCESS) << bystander.report();
    const struct stat remembered = status();
    {
        const watched_calls calls({{0, effect::fails, EIO, "ftruncate"}});
        EXPECT_EQ(user.modify(growth), CFG_OTHER);
    }
    EXPECT_THAT(user.report(), HasSubstr("The old content could not be put back"));
    set_time_of(remembered);
    expect_refused_update(bystander);
    expect_refused_update(user);
    expect_update_of_the_backup(bystander);
}
