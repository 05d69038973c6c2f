// An update keeps others away, and what others wrote all the same is never overwritten.

#include <gmock/gmock.h>

#include <cerrno>
#include <optional>
#include <string>
#include <thread>

#include "LDIF_Exception.h"
#include "failures.h"
#include "file_lock.h"
#include "modifications.h"
#include "open_descriptors.h"
#include "stores.h"
#include "unprivileged.h"

using cfg32::locked_file;
using namespace cfg32::tests;
using namespace std::chrono_literals;

namespace {

const char* const content = "charset: x\nversion: 1\n\ndn: cn=a\nsn: 1\n\n";
const char* const changed = "charset: x\nversion: 1\n\ndn: cn=a\nsn: 1\nsn: 2\n\n";
const char* const others = "charset: x\nversion: 1\n\ndn: cn=b\nsn: other\n\n";
const char* const changed_meanwhile = "51/51 Configuration file was changed meanwhile";

struct LDIF_File_update : store_test {
    /// Whether somebody else could lock the file now.
    bool is_free(int operation) const {
        return static_cast<bool>(locked_file(path.c_str(), O_RDONLY, operation, 0ms));
    }

    /// Another file under the same name.
    void replace(const std::string& text) const {
        const std::string name = folder.write("new", text);
        EXPECT_EQ(rename(name.c_str(), path.c_str()), 0);
    }

    /// Another text in the same file.
    void overwrite(const std::string& text) const {
        folder.write("conf", text);
        folder.touch("conf", 1);
    }

    static void add_value(LDIF_File& file) {
        file.modify(dn_of("cn=a"), modifications({{LDAP_MOD_ADD, "sn", {"2"}}}).records());
    }
};

}  // namespace

TEST_F(LDIF_File_update, ChangeIsReadMadeAndWritten) {
    const auto file = store(others, backup);
    overwrite(content);
    {
        const LDIF_File::update lock(*file);
        EXPECT_EQ(file->refresh(), 1);
        add_value(*file);
        file->flush();
    }
    EXPECT_EQ(folder.read("conf"), changed);
    EXPECT_EQ(folder.read("backup"), content);
    EXPECT_EQ(file->refresh(), 0);
}

TEST_F(LDIF_File_update, OthersAreKeptOutFromBeforeTheRefreshUntilAfterTheFlush) {
    const auto file = store(content, backup);
    {
        const LDIF_File::update lock(*file);
        EXPECT_FALSE(is_free(LOCK_SH));
        overwrite(content);
        file->refresh();
        EXPECT_FALSE(is_free(LOCK_SH));
        add_value(*file);
        EXPECT_FALSE(is_free(LOCK_SH));
        file->flush();
        EXPECT_FALSE(is_free(LOCK_SH));
    }
    EXPECT_TRUE(is_free(LOCK_EX));
}

TEST_F(LDIF_File_update, NobodyIsKeptOutWithoutOne) {
    const auto file = store(content);
    EXPECT_TRUE(is_free(LOCK_EX));
    overwrite(changed);
    file->refresh();
    EXPECT_TRUE(is_free(LOCK_EX));
    file->flush();
    EXPECT_TRUE(is_free(LOCK_EX));
}

TEST_F(LDIF_File_update, OthersAreLetInAfterAFailure) {
    const auto file = store(content, folder.file("no/backup"));
    EXPECT_EQ(failure_of([&] {
                  const LDIF_File::update lock(*file);
                  file->refresh();
                  file->flush();
              }).ldapErr,
              50);
    EXPECT_TRUE(is_free(LOCK_EX));
}

TEST_F(LDIF_File_update, InnerOneLeavesTheLockToTheOuter) {
    const auto file = store(content);
    {
        const LDIF_File::update outer(*file);
        for (int i = 0; i < 2; ++i) {
            const LDIF_File::update inner(*file);
            file->refresh();
            file->flush();
        }
        EXPECT_FALSE(is_free(LOCK_SH));
        file->refresh();
        add_value(*file);
        file->flush();
    }
    EXPECT_TRUE(is_free(LOCK_EX));
    EXPECT_EQ(folder.read("conf"), changed);
}

TEST_F(LDIF_File_update, OneMayFollowTheOther) {
    const auto file = store(content);
    for (int i = 0; i < 3; ++i) {
        const LDIF_File::update lock(*file);
        EXPECT_FALSE(is_free(LOCK_SH));
        file->refresh();
        file->flush();
    }
    EXPECT_TRUE(is_free(LOCK_EX));
}

TEST_F(LDIF_File_update, OneMayFlushSeveralTimes) {
    const auto file = store(content, backup);
    const LDIF_File::update lock(*file);
    file->refresh();
    file->flush();
    add_value(*file);
    file->flush();
    EXPECT_EQ(folder.read("conf"), changed);
    EXPECT_EQ(folder.read("backup"), content);
}

// By somebody who respects no locks, such as an editor.
TEST_F(LDIF_File_update, WhatOthersWroteSinceTheRefreshIsNotOverwritten) {
    for (const std::string& name : {std::string(), backup}) {
        const auto file = store(content, name);
        {
            const LDIF_File::update lock(*file);
            file->refresh();
            add_value(*file);
            overwrite(others);
            const timespec time = status_of("conf").st_mtim;
            const LDIF_Exception e = failure_of([&] { file->flush(); });
            EXPECT_EQ(summary(e), changed_meanwhile);
            EXPECT_EQ(e.configFile, path);
            EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
            EXPECT_EQ(folder.read("conf"), others);
            EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, time.tv_nsec);
        }
        EXPECT_EQ(file->refresh(), 1);
        EXPECT_EQ(text_of(*file), others);
    }
}

TEST_F(LDIF_File_update, FileThatOthersPutInItsPlaceSinceTheRefreshIsNotOverwritten) {
    for (const char* text : {others, content}) {
        const auto file = store(content);
        {
            const LDIF_File::update lock(*file);
            file->refresh();
            add_value(*file);
            replace(text);
            EXPECT_EQ(summary(failure_of([&] { file->flush(); })), changed_meanwhile);
            EXPECT_EQ(folder.read("conf"), text);
        }
        EXPECT_EQ(file->refresh(), 1);
        EXPECT_EQ(text_of(*file), text);
    }
}

// Nobody keeps its writers away while it is read.
TEST_F(LDIF_File_update, FileThatIsNotTheLockedOneIsNeitherReadNorOverwritten) {
    const auto file = store(content);
    {
        const LDIF_File::update lock(*file);
        replace(others);
        EXPECT_EQ(summary(failure_of([&] { file->refresh(); })), changed_meanwhile);
        EXPECT_EQ(summary(failure_of([&] { file->flush(); })), changed_meanwhile);
        EXPECT_EQ(folder.read("conf"), others);
    }
    EXPECT_EQ(file->refresh(), 1);
    EXPECT_EQ(text_of(*file), others);
}

TEST_F(LDIF_File_update, StoreThatWasNotRefreshedInItIsNotWritten) {
    const auto file = store(content);
    overwrite(others);
    const LDIF_File::update lock(*file);
    EXPECT_EQ(summary(failure_of([&] { file->flush(); })), changed_meanwhile);
    EXPECT_EQ(folder.read("conf"), others);
}

TEST_F(LDIF_File_update, FileThatIsRemovedSinceTheRefreshIsReported) {
    const auto file = store(content);
    const LDIF_File::update lock(*file);
    file->refresh();
    ASSERT_EQ(unlink(path.c_str()), 0);
    const LDIF_Exception e = failure_of([&] { file->flush(); });
    EXPECT_EQ(summary(e), "50/1004 Unable to open: \"" + path + "\"");
    EXPECT_EQ(e.sysErrno, ENOENT);
    EXPECT_FALSE(folder.has("conf"));
}

TEST_F(LDIF_File_update, FileThatCannotBeOpenedIsLeftToTheRefreshToReport) {
    const auto file = store(content);
    ASSERT_EQ(unlink(path.c_str()), 0);
    {
        const LDIF_File::update lock(*file);
        const LDIF_Exception e = failure_of([&] { file->refresh(); });
        EXPECT_EQ(summary(e), "91/1003 _stat()");
        EXPECT_EQ(e.sysErrno, ENOENT);
    }
    for (const bool is_directory : {true, false}) {
        ASSERT_EQ(is_directory ? mkdir(path.c_str(), 0700) : mkfifo(path.c_str(), 0600), 0);
        const LDIF_File::update lock(*file);
        EXPECT_EQ(summary(failure_of([&] { file->refresh(); })), "91/1004 ifstream()");
        ASSERT_EQ(remove(path.c_str()), 0);
    }
}

TEST_F(LDIF_File_update, FileThatIsMadeAgainHasItsModeAndIsNotLeftLocked) {
    const mode_t saved = umask(0);
    const auto file = store(content);
    ASSERT_EQ(chmod(path.c_str(), 0640), 0);
    folder.touch("conf", 1);
    file->refresh();
    ASSERT_EQ(unlink(path.c_str()), 0);
    file->flush();
    umask(saved);
    EXPECT_EQ(folder.read("conf"), content);
    EXPECT_EQ(status_of("conf").st_mode & 07777, 0640u);
    EXPECT_TRUE(is_free(LOCK_EX));
}

TEST_F(LDIF_File_update, FileThatMayOnlyBeReadIsLockedReadAndKept) {
    ASSERT_EQ(chmod(folder.file("").c_str(), 0755), 0);
    folder.write("conf", content);
    ASSERT_EQ(chmod(path.c_str(), 0444), 0);
    const auto attempt = [&] {
        LDIF_File file(path, "", nullptr);
        const LDIF_File::update lock(file);
        if (is_free(LOCK_SH) || file.refresh() != 0) {
            return 1;
        }
        add_value(file);
        const LDIF_Exception e = failure_of([&] { file.flush(); });
        return summary(e) == "50/1004 Unable to open: \"" + path + "\"" && e.sysErrno == EACCES ? 0
                                                                                                : 2;
    };
    EXPECT_EQ(as_nobody(attempt), 0);
    EXPECT_EQ(folder.read("conf"), content);
}

TEST_F(LDIF_File_update, BadLinesOfAFileThatMayOnlyBeReadEndTheLoad) {
    const char* const bad = "version: 1\n\ndn: cn=a\ngarbage\n";
    ASSERT_EQ(chmod(folder.file("").c_str(), 0755), 0);
    folder.write("conf", bad);
    ASSERT_EQ(chmod(path.c_str(), 0444), 0);
    const auto attempt = [&] {
        const LDIF_Exception e = failure_of([&] { LDIF_File(path, "", nullptr); });
        return summary(e) == "50/1004 Unable to open: \"" + path + "\"" ? 0 : 1;
    };
    EXPECT_EQ(as_nobody(attempt), 0);
    EXPECT_EQ(folder.read("conf"), bad);
}

TEST_F(LDIF_File_update, AnotherReaderDisturbsNoLoad) {
    const auto file = store(content);
    const locked_file reader(path.c_str(), O_RDONLY, LOCK_SH);
    overwrite(others);
    EXPECT_EQ(file->refresh(), 1);
    EXPECT_EQ(text_of(*file), others);
}

// The lock for the repair is waited for, and who had it may have made the repair.
TEST_F(LDIF_File_update, BadLinesThatAnotherProcessRepairedMeanwhileAreNotRepairedAgain) {
    const char* const bad = "version: 1\n\ndn: cn=a\ngarbage\n";
    const char* const repaired = "dn: CN=a\nsn: repaired\ncn: a\n\n\n";
    const auto file = store(content, backup);
    overwrite(bad);
    std::optional<locked_file> reader(std::in_place, path.c_str(), O_RDONLY, LOCK_SH);
    int result = -1;
    std::thread other([&] { result = file->refresh(); });
    // Only an update opens it for writing, too, and the bad lines have been read by then.
    wait_for_open_descriptors(reader->status(), O_RDWR, 1);
    folder.write("conf", repaired);
    folder.touch("conf", 2);
    const timespec time = status_of("conf").st_mtim;
    reader.reset();
    other.join();
    EXPECT_EQ(result, 1);
    EXPECT_EQ(folder.read("conf"), repaired);
    EXPECT_EQ(status_of("conf").st_mtim.tv_sec, time.tv_sec);
    EXPECT_EQ(status_of("conf").st_mtim.tv_nsec, time.tv_nsec);
    EXPECT_FALSE(folder.has("backup"));
    EXPECT_EQ(file->root().find(dn_of("cn=a"))->str(), "dn: CN=a\ncn: a\nsn: repaired\n\n");
    EXPECT_EQ(file->refresh(), 0);
}

TEST_F(LDIF_File_update, BadLinesThatNobodyElseRepairedAreRepairedUnderTheLock) {
    const auto file = store(content, backup);
    const char* const bad = "charset: x\nversion: 1\n\ndn: cn=a\ngarbage\n";
    overwrite(bad);
    std::optional<locked_file> reader(std::in_place, path.c_str(), O_RDONLY, LOCK_SH);
    std::thread other([&] { file->refresh(); });
    wait_for_open_descriptors(reader->status(), O_RDWR, 1);
    EXPECT_EQ(folder.read("conf"), bad);
    reader.reset();
    other.join();
    EXPECT_EQ(folder.read("backup"), bad);
    EXPECT_EQ(folder.read("conf"),
              "charset: x\nversion: 1\n\ndn: cn=a\noru-slapdInvalidLine: garbage: \n\n");
}

TEST_F(LDIF_File_update, FileThatSomebodyElseKeepsForTooLongIsBusy) {
    const auto file = store(content);
    LDIF_File flushed(path, "", nullptr);
    const locked_file holder(path.c_str(), O_RDONLY, LOCK_EX);
    std::optional<LDIF_Exception> of_load;
    std::optional<LDIF_Exception> of_flush;
    std::thread loading(
        [&] { of_load.emplace(failure_of([&] { LDIF_File(path, "", nullptr); })); });
    std::thread flushing([&] { of_flush.emplace(failure_of([&] { flushed.flush(); })); });
    const LDIF_Exception of_update = failure_of([&] { const LDIF_File::update lock(*file); });
    loading.join();
    flushing.join();
    const LDIF_Exception* const all[] = {&of_update, &*of_load, &*of_flush};
    for (const LDIF_Exception* e : all) {
        EXPECT_EQ(summary(*e), "51/51 Configuration file is in use by another process");
        EXPECT_EQ(e->configFile, path);
        EXPECT_EQ(e->sysErrno, 0);
        EXPECT_EQ(e->srcFile, "src/libraries/cfg32stl/LDIF_File");
    }
    EXPECT_EQ(file->refresh(), 0) << "an unchanged file needs no lock";
    EXPECT_EQ(text_of(*file), content);
    EXPECT_EQ(folder.read("conf"), content);
}
