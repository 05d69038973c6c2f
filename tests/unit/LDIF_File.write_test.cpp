#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <cerrno>
#include <csignal>
#include <stdexcept>
#include <string>
#include <tuple>

#include "LDIF_Exception.h"
#include "failing_new.h"
#include "failures.h"
#include "stores.h"

using namespace cfg32::tests;
using testing::EndsWith;
using testing::HasSubstr;

namespace {

const char* const content = "charset: x\nversion: 1\n\n# c\ndn: cn=a\nsn: 1\n\n# end\n";

struct LDIF_File_flush : store_test {};

/// Adds a value to the store's entry cn=a.
void add_value(LDIF_File& file, const std::string& value) {
    const LDIF_Entry* entry = file.root().find(dn_of("cn=a"));
    const_cast<LDIF_Entry&>(*entry) += LDIF_Attribute(nullptr, "sn", value);
}

}  // namespace

TEST_F(LDIF_File_flush, RootEntriesAndTheTrailingCommentAreWritten) {
    const auto file = store(content);
    add_value(*file, "2");
    file->flush();
    EXPECT_EQ(folder.read("conf"),
              "charset: x\nversion: 1\n\n# c\ndn: cn=a\nsn: 1\nsn: 2\n\n# end\n");
}

TEST_F(LDIF_File_flush, DefaultsAreWrittenAtTheHead) {
    store("dn: cn=a\n")->flush();
    EXPECT_EQ(folder.read("conf"), "charset: ISO-8859-1\nversion: 1\n\ndn: cn=a\n\n");
}

TEST_F(LDIF_File_flush, BlankLinesAtTheEndDisappearAndCommentsStay) {
    store("version: 1\n\ndn: cn=a\n\n\n# end\n\n\n")->flush();
    EXPECT_THAT(folder.read("conf"), EndsWith("dn: cn=a\n\n\n# end\n"));
    store("version: 1\n\ndn: cn=a\n\n\n\n")->flush();
    EXPECT_THAT(folder.read("conf"), EndsWith("dn: cn=a\n\n"));
}

TEST_F(LDIF_File_flush, EmptyStoreMakesAnEmptyFile) {
    store("\n\n")->flush();
    EXPECT_EQ(folder.read("conf"), "");
}

TEST_F(LDIF_File_flush, ShorterTextLeavesNothingOfTheOld) {
    const auto file = store("charset: x\nversion: 1\n\ndn: cn=a\n\n" + std::string(10000, '\n'));
    file->flush();
    EXPECT_EQ(folder.read("conf"), "charset: x\nversion: 1\n\ndn: cn=a\n\n");
}

TEST_F(LDIF_File_flush, OwnWriteIsNotReadAgain) {
    for (const std::string& name : {std::string(), backup}) {
        const auto file = store(content, name);
        add_value(*file, "2");
        file->flush();
        EXPECT_EQ(file->getModTime(), status_of("conf").st_mtim.tv_sec);
        EXPECT_EQ(file->refresh(), 0);
    }
}

TEST_F(LDIF_File_flush, BackupIsTheFileAsItWas) {
    const auto file = store(content, backup);
    EXPECT_FALSE(folder.has("backup"));
    add_value(*file, "2");
    file->flush();
    EXPECT_EQ(folder.read("backup"), content);
    const std::string second = folder.read("conf");
    add_value(*file, "3");
    file->flush();
    EXPECT_EQ(folder.read("backup"), second);
}

TEST_F(LDIF_File_flush, BackupIsOfTheFileAndNotOfTheStore) {
    const auto file = store(content, backup);
    folder.write("conf", "what another process wrote\n");
    file->flush();
    EXPECT_EQ(folder.read("backup"), "what another process wrote\n");
    EXPECT_EQ(folder.read("conf"), content);
}

TEST_F(LDIF_File_flush, EmptyBackupNameMakesNoBackup) {
    store(content)->flush();
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_flush, BackupHasTheFilesMode) {
    for (const mode_t mode : {0600u, 0640u, 0604u}) {
        const auto file = store(content, backup);
        ASSERT_EQ(chmod(path.c_str(), mode), 0);
        file->flush();
        EXPECT_EQ(status_of("backup").st_mode & 07777, mode);
        EXPECT_EQ(status_of("conf").st_mode & 07777, mode);
    }
}

TEST_F(LDIF_File_flush, BackupHasTheFilesOwnerAndGroup) {
    if (geteuid() != 0) {
        GTEST_SKIP() << "only root may give files away";
    }
    const auto file = store(content, backup);
    ASSERT_EQ(chown(path.c_str(), 1, 2), 0);
    file->flush();
    EXPECT_EQ(status_of("backup").st_uid, 1u);
    EXPECT_EQ(status_of("backup").st_gid, 2u);
    EXPECT_EQ(status_of("conf").st_uid, 1u);
    EXPECT_EQ(status_of("conf").st_gid, 2u);
}

TEST_F(LDIF_File_flush, FileIsWrittenInPlace) {
    const auto file = store(content, backup);
    ASSERT_EQ(link(path.c_str(), folder.file("hard").c_str()), 0);
    const ino_t inode = status_of("conf").st_ino;
    add_value(*file, "2");
    file->flush();
    EXPECT_EQ(status_of("conf").st_ino, inode);
    EXPECT_EQ(folder.read("hard"), folder.read("conf"));
    EXPECT_THAT(folder.read("hard"), HasSubstr("sn: 2\n"));
}

TEST_F(LDIF_File_flush, LinkToTheFileStaysALink) {
    folder.write("real", content);
    ASSERT_EQ(symlink("real", path.c_str()), 0);
    LDIF_File file(path, backup, nullptr);
    add_value(file, "2");
    file.flush();
    EXPECT_TRUE(S_ISLNK(status_of("conf").st_mode));
    EXPECT_THAT(folder.read("real"), HasSubstr("sn: 2\n"));
    EXPECT_TRUE(S_ISREG(status_of("backup").st_mode));
    EXPECT_EQ(folder.read("backup"), content);
}

TEST_F(LDIF_File_flush, MissingFileIsMadeAgainWhenThereIsNoBackup) {
    const auto file = store(content);
    ASSERT_EQ(unlink(path.c_str()), 0);
    file->flush();
    EXPECT_EQ(folder.read("conf"), content);
    EXPECT_EQ(file->refresh(), 0);
}

// The message names the backup although it is the configuration file that is missing.
TEST_F(LDIF_File_flush, MissingFileCannotBeBackedUpAndNothingIsWritten) {
    const auto file = store(content, backup);
    ASSERT_EQ(unlink(path.c_str()), 0);
    const LDIF_Exception e = failure_of([&] { file->flush(); });
    EXPECT_EQ(summary(e), "91/1003 _stat on backup file failed.");
    EXPECT_EQ(e.sysErrno, ENOENT);
    EXPECT_EQ(e.configFile, path);
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
    EXPECT_FALSE(folder.has("conf"));
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_flush, BackupThatCannotBeMadeLeavesTheFile) {
    ASSERT_EQ(mkdir(folder.file("directory").c_str(), 0700), 0);
    for (const char* name : {"no/backup", "directory"}) {
        SCOPED_TRACE(name);
        const auto file = store(content, folder.file(name));
        add_value(*file, "2");
        const timespec before = status_of("conf").st_mtim;
        const LDIF_Exception e = failure_of([&] { file->flush(); });
        EXPECT_EQ(summary(e), "50/1004 Unable to backup the configuration file: \"" + path + "\" ");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(folder.read("conf"), content);
        EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, before.tv_nsec);
    }
}

TEST_F(LDIF_File_flush, FileThatCannotBeOpenedIsReported) {
    const auto file = store(content);
    ASSERT_EQ(unlink(path.c_str()), 0);
    ASSERT_EQ(mkdir(path.c_str(), 0700), 0);
    const LDIF_Exception e = failure_of([&] { file->flush(); });
    EXPECT_EQ(summary(e), "50/1004 Unable to open: \"" + path + "\"");
    EXPECT_EQ(e.configFile, path);
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
}

TEST_F(LDIF_File_flush, FifoInPlaceOfTheFileIsReportedWithoutWaiting) {
    for (const std::string& name : {std::string(), backup}) {
        const auto file = store(content, name);
        ASSERT_EQ(unlink(path.c_str()), 0);
        ASSERT_EQ(mkfifo(path.c_str(), 0600), 0);
        EXPECT_EQ(failure_of([&] { file->flush(); }).ldapErr, 50);
        ASSERT_EQ(unlink(path.c_str()), 0);
    }
}

TEST_F(LDIF_File_flush, FileThatMayNotBeWrittenIsReportedAndKept) {
    if (geteuid() == 0) {
        GTEST_SKIP() << "root may write everything";
    }
    const auto file = store(content);
    ASSERT_EQ(chmod(path.c_str(), 0400), 0);
    add_value(*file, "2");
    EXPECT_EQ(summary(failure_of([&] { file->flush(); })),
              "50/1004 Unable to open: \"" + path + "\"");
    EXPECT_EQ(folder.read("conf"), content);
}

TEST_F(LDIF_File_flush, MessagesWithLongNamesAreCut) {
    std::string name = "deep";
    while (name.size() < 1200) {
        ASSERT_EQ(mkdir(folder.file(name).c_str(), 0700), 0);
        name += "/" + std::string(200, 'x');
    }
    const std::string long_path = folder.write(name, content);
    LDIF_File file(long_path, "", nullptr);
    ASSERT_EQ(unlink(long_path.c_str()), 0);
    ASSERT_EQ(mkdir(long_path.c_str(), 0700), 0);
    const LDIF_Exception e = failure_of([&] { file.flush(); });
    EXPECT_EQ(e.msg, ("Unable to open: \"" + long_path).substr(0, 1023));
    EXPECT_EQ(e.configFile, long_path);
}

TEST_F(LDIF_File_flush, NameThatCannotBePrintedFailsBeforeAFileIsTouched) {
    const auto file = store("version: 1\n\ndn: cn=\nsn: 1\n", backup);
    const std::string before = folder.read("conf");
    const timespec time = status_of("conf").st_mtim;
    const LDIF_Exception e = failure_of([&] { file->flush(); });
    EXPECT_EQ(summary(e), "34/1013 Missing RDN attribute value");
    EXPECT_EQ(e.configFile, path);
    EXPECT_EQ(folder.read("conf"), before);
    EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, time.tv_nsec);
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_flush, NameThatWouldNotReadBackFailsBeforeAFileIsTouched) {
    for (const char* name :
         {"cn=a\\0Ab", "cn=a\\0Db", "cn=\"a\\0A\"", "cn=x,cn=a\\0A\\0Ab", "cn=a\\0Asn: 2"}) {
        SCOPED_TRACE(name);
        const std::string before = std::string("version: 1\n\ndn: ") + name + "\nsn: 1\n";
        const auto file = store(before, backup);
        const timespec time = status_of("conf").st_mtim;
        const LDIF_Exception e = failure_of([&] { file->flush(); });
        EXPECT_NE(e.ldapErr, 0);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(folder.read("conf"), before);
        EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, time.tv_nsec);
        EXPECT_FALSE(folder.has("backup"));
    }
}

TEST_F(LDIF_File_flush, EscapedLineBreakAtTheEndOfANameAndZeroBytesSurvive) {
    for (const std::string line :
         {"dn: cn=a\\0A\n", "dn: cn=a\\00b\n", "dn: cn=\\00, cn=\"\\00b\"\n"}) {
        const auto file = store("version: 1\n\n" + line + "sn: 1\n");
        file->flush();
        EXPECT_THAT(folder.read("conf"), HasSubstr(line));
    }
}

TEST_F(LDIF_File_flush, ValueThatWouldNotReadBackFailsBeforeAFileIsTouched) {
    for (const std::string& value : {std::string("a\nb"), std::string("a\n"), std::string("a\rb"),
                                     std::string("a\ndn: cn=x")}) {
        const auto file = store(content, backup);
        add_value(*file, value);
        EXPECT_NE(failure_of([&] { file->flush(); }).ldapErr, 0) << value;
        EXPECT_EQ(folder.read("conf"), content);
        EXPECT_FALSE(folder.has("backup"));
    }
}

// What a load accepts and a later load would refuse, or read as something else.
TEST_F(LDIF_File_flush, FileThatWouldNotLoadAgainAsItWasIsLeftAlone) {
    const struct {
        const char* why;
        const char* text;
        const char* entry;
    } rows[] = {
        {"an attribute of the root", "version: 1\n\ndn: cn=a\n\ndn:\nsn: y\n\n", ""},
        {"a second value of the root's version", "version: 1\n\ndn: cn=a\n\ndn:\ncharset: y\n\n",
         ""},
        {"names with leading blanks merge into a continuation",
         "version: 1\n\ndn: cn=a\n# c\n foo: a\n# d\n foo: b\nsn: 1\n\n", "cn=a"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.why);
        const auto file = store(row.text, backup);
        const LDIF_Exception e = failure_of([&] { file->flush(); });
        EXPECT_EQ(summary(e), "21/1005 Entry would not read back as it is written");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.entryDn, row.entry);
        EXPECT_EQ(folder.read("conf"), row.text);
        EXPECT_FALSE(folder.has("backup"));
    }
}

TEST_F(LDIF_File_flush, FileThatTheLoadWouldSpoilIsLeftAlone) {
    // The line without a colon counts as a DN line; its entry could not be read back.
    const char* const text = "version: 1\n\ndn: cn=a\n\ndn=x\nsn: y\n\n";
    const LDIF_Exception e = failure_of([&] { store(text); });
    EXPECT_EQ(summary(e), "21/1005 Entry would not read back as it is written");
    EXPECT_EQ(folder.read("conf"), text);
}

TEST_F(LDIF_File_flush, NamesWithLeadingBlanksAreWrittenWhereTheyReadBack) {
    const std::string text = "charset: x\nversion: 1\n\ndn: cn=a\n# c\n foo: a\nsn: 1\n\n";
    const auto file = store(text);
    file->flush();
    EXPECT_EQ(folder.read("conf"), text);
}

TEST_F(LDIF_File_flush, UnexpectedFailureIsASystemErrorBeforeAFileIsTouched) {
    const auto file = store(content, backup);
    const LDIF_Exception e = failure_of([&] {
        failing_allocation failing(0);
        file->flush();
    });
    EXPECT_EQ(summary(e), "80/1000 System error writing file");
    EXPECT_EQ(e.configFile, path);
    EXPECT_EQ(folder.read("conf"), content);
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_flush, FullDiskKeepsTheOldContent) {
    for (const std::string& name : {std::string(), backup}) {
        SCOPED_TRACE(name.empty() ? "without a backup" : "with a backup");
        const auto file = store(content, name);
        const std::string old = content;
        add_value(*file, std::string(100, 'x'));
        const auto child = [&] {
            signal(SIGXFSZ, SIG_IGN);
            const rlimit limit = {old.size() + 10, old.size() + 10};
            if (setrlimit(RLIMIT_FSIZE, &limit) != 0) {
                _exit(99);
            }
            try {
                file->flush();
            } catch (const LDIF_Exception& e) {
                const bool told = e.sysErrno == EFBIG && e.ldapErr == 80 && e.extErr == 1000 &&
                                  e.msg == "System error writing file" && e.configFile == path;
                _exit(told ? 0 : 1);
            }
            _exit(2);
        };
        EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
        EXPECT_EQ(folder.read("conf"), old);
        if (!name.empty()) {
            EXPECT_EQ(folder.read("backup"), old);
        }
    }
}

TEST_F(LDIF_File_flush, DiskThatIsTooFullForABackupKeepsTheOldContent) {
    const auto file = store(content, backup);
    add_value(*file, "2");
    const auto child = [&] {
        signal(SIGXFSZ, SIG_IGN);
        const rlimit limit = {5, 5};
        if (setrlimit(RLIMIT_FSIZE, &limit) != 0) {
            _exit(99);
        }
        try {
            file->flush();
        } catch (const LDIF_Exception& e) {
            _exit(e.ldapErr == 50 && e.extErr == 1004 ? 0 : 1);
        }
        _exit(2);
    };
    EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
    EXPECT_EQ(folder.read("conf"), content);
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_flush, FailedWriteIsMadeGoodByTheNext) {
    const auto file = store(content);
    add_value(*file, "2");
    ASSERT_EQ(rename(path.c_str(), folder.file("aside").c_str()), 0);
    ASSERT_EQ(mkdir(path.c_str(), 0700), 0);
    failure_of([&] { file->flush(); });
    ASSERT_EQ(rmdir(path.c_str()), 0);
    file->flush();
    EXPECT_THAT(folder.read("conf"), HasSubstr("sn: 2\n"));
}

// The modification time alone tells others that there is something new.
TEST_F(LDIF_File_flush, EveryWriteMakesTheModificationTimeALaterOne) {
    const auto file = store(content);
    timespec before = status_of("conf").st_mtim;
    for (int i = 0; i < 500; ++i) {
        file->flush();
        const timespec after = status_of("conf").st_mtim;
        ASSERT_TRUE(std::tie(after.tv_sec, after.tv_nsec) > std::tie(before.tv_sec, before.tv_nsec))
            << i;
        ASSERT_EQ(file->refresh(), 0);
        before = after;
    }
}

TEST_F(LDIF_File_flush, ModificationTimeInTheFutureBecomesALaterOneToo) {
    const auto file = store(content);
    folder.touch("conf", 1'000'000);
    const timespec before = status_of("conf").st_mtim;
    LDIF_File reader(path, "", nullptr);
    file->flush();
    const timespec after = status_of("conf").st_mtim;
    EXPECT_TRUE(std::tie(after.tv_sec, after.tv_nsec) > std::tie(before.tv_sec, before.tv_nsec));
    EXPECT_EQ(file->refresh(), 0);
    EXPECT_EQ(reader.refresh(), 1);
}

// It would cut off what the load did not come to.
TEST_F(LDIF_File_flush, StoreOfHalfAFileIsNotWritten) {
    const char* const second = "version: 1\n\ndn: cn=a\nsn: 1\n\nsn: outside\n\ndn: cn=b\n\n";
    for (const std::string& name : {std::string(), backup}) {
        const auto file = store(content, name);
        folder.write("conf", second);
        folder.touch("conf", 1);
        failure_of([&] { file->refresh(); });
        ASSERT_TRUE(file->root().find(dn_of("cn=a"))) << "the load ended in the middle";
        const timespec time = status_of("conf").st_mtim;
        const LDIF_Exception e = failure_of([&] { file->flush(); });
        EXPECT_EQ(summary(e), "80/1000 Configuration file was not read to its end");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(folder.read("conf"), second);
        EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, time.tv_nsec);
        EXPECT_FALSE(folder.has("backup"));
        folder.write("conf", content);
        file->refresh();
        file->flush();
        EXPECT_EQ(folder.read("conf"), content);
    }
}

// Otherwise no later change could be written either.
TEST_F(LDIF_File_flush, WhatWouldNotReadBackIsForgottenByTheNextRefresh) {
    const auto file = store(content);
    add_value(*file, "a\nb");
    EXPECT_EQ(summary(failure_of([&] { file->flush(); })),
              "21/1005 Entry would not read back as it is written");
    EXPECT_EQ(file->refresh(), 1);
    EXPECT_EQ(text_of(*file), content);
    file->flush();
    EXPECT_EQ(folder.read("conf"), content);
    EXPECT_EQ(file->refresh(), 0);
}
