#include "LDIF_File.h"

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <cerrno>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "dn_of.h"
#include "failures.h"
#include "temporary_folder.h"
#include "utf8_locale.h"

using namespace cfg32::tests;
using testing::HasSubstr;

namespace {

const char* const invalid_at_root =
    "65/1007 \"oru-slapdInvalidLine\" attribute not allowed in <root> object";

struct LDIF_File_load : testing::Test {
    temporary_folder folder;
    const std::string path = folder.file("conf");

    void put(const std::string& text) { folder.write("conf", text); }

    LDIF_File load(const std::string& text) {
        put(text);
        return LDIF_File(path, "", nullptr);
    }

    LDIF_Exception failure_to_load(const std::string& text) {
        put(text);
        return failure_of([&] { LDIF_File(path, "", nullptr); });
    }

    /// What the store would write now.
    static std::string text_of(const LDIF_File& file) {
        std::ostringstream out;
        out << file.root() << file.trailing_comment();
        return out.str();
    }

    static std::string entry_text(const LDIF_File& file, const std::string& dn) {
        const LDIF_Entry* entry = file.root().find(dn_of(dn));
        EXPECT_TRUE(entry) << dn;
        return entry ? entry->str() : "";
    }

    timespec modification_time() const {
        struct stat status {};
        EXPECT_EQ(stat(path.c_str(), &status), 0);
        return status.st_mtim;
    }

    void set_modification_time(timespec time) const {
        const timespec times[2] = {time, time};
        EXPECT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
    }

    /// Content under the modification time of before, and another inode when the file is replaced.
    void change_unseen(const std::string& text, bool replace) {
        const timespec before = modification_time();
        if (replace) {
            folder.write("new", text);
            ASSERT_EQ(rename(folder.file("new").c_str(), path.c_str()), 0);
        } else {
            put(text);
        }
        set_modification_time(before);
    }
};

const char* const valid =
    "charset: UTF-8\nversion: 1\n\n# c\ndn: cn=Configuration\ncn: Configuration\n\n";

}  // namespace

TEST_F(LDIF_File_load, EmptyFileNameIsRefused) {
    const LDIF_Exception e = failure_of([] { LDIF_File("", "backup", nullptr); });
    EXPECT_EQ(summary(e), "91/1001 Config filename is NULL!");
    EXPECT_EQ(e.configFile, "<NULL>");
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
}

TEST_F(LDIF_File_load, ConstructorLoadsAndTheAccessorsTell) {
    put(valid);
    const LDIF_File file(path, "backup", nullptr);
    EXPECT_STREQ(file.getFileName(), path.c_str());
    EXPECT_STREQ(file.getBackupFileName(), "backup");
    EXPECT_EQ(file.getModTime(), modification_time().tv_sec);
    EXPECT_EQ(file.getAuthentication(), 0);
    EXPECT_EQ(text_of(file), valid);
    EXPECT_STREQ(LDIF_File(path, "", nullptr).getBackupFileName(), "");
}

TEST_F(LDIF_File_load, FileOfTheFirstSecondOfTheEpochIsLoadedToo) {
    put(valid);
    set_modification_time({0, 0});
    LDIF_File file(path, "", nullptr);
    EXPECT_EQ(text_of(file), valid);
    EXPECT_EQ(file.refresh(), 0);
}

TEST_F(LDIF_File_load, MissingFileIsReported) {
    for (const std::string& name : {path, folder.file("no/conf")}) {
        const LDIF_Exception e = failure_of([&] { LDIF_File(name, "", nullptr); });
        EXPECT_EQ(summary(e), "91/1003 _stat()");
        EXPECT_EQ(e.sysErrno, ENOENT);
        EXPECT_EQ(e.configFile, name);
    }
    EXPECT_FALSE(folder.has("conf"));
}

TEST_F(LDIF_File_load, WhatIsNoFileIsReportedWithoutWaiting) {
    ASSERT_EQ(mkdir(folder.file("directory").c_str(), 0700), 0);
    ASSERT_EQ(mkfifo(folder.file("fifo").c_str(), 0600), 0);
    for (const std::string& name : {folder.file("directory"), folder.file("fifo"),
                                    std::string("/dev/null"), std::string("/dev/zero")}) {
        SCOPED_TRACE(name);
        const LDIF_Exception e = failure_of([&] { LDIF_File(name, "", nullptr); });
        EXPECT_EQ(summary(e), "91/1004 ifstream()");
        EXPECT_EQ(e.configFile, name);
    }
}

TEST_F(LDIF_File_load, UnreadableFileIsReported) {
    if (geteuid() == 0) {
        GTEST_SKIP() << "root may read everything";
    }
    put(valid);
    ASSERT_EQ(chmod(path.c_str(), 0), 0);
    const LDIF_Exception e = failure_of([&] { LDIF_File(path, "", nullptr); });
    EXPECT_EQ(summary(e), "91/1004 ifstream()");
    EXPECT_EQ(e.configFile, path);
}

TEST_F(LDIF_File_load, FileThatCannotBeReadIsASystemError) {
    // The first page of the own memory is never mapped.
    const char* const name = "/proc/self/mem";
    const LDIF_Exception e = failure_of([&] { LDIF_File(name, "", nullptr); });
    EXPECT_EQ(summary(e), "80/1000 System error reading file");
    EXPECT_EQ(e.configFile, name);
}

TEST_F(LDIF_File_load, FileLargerThanTheMemoryIsASystemError) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the address sanitizer ends a process that asks for too much memory";
#endif
    put("");
    ASSERT_EQ(truncate(path.c_str(), off_t{1} << 36), 0);
    const auto child = [&] {
        const rlimit limit = {rlim_t{1} << 34, rlim_t{1} << 34};
        if (setrlimit(RLIMIT_AS, &limit) != 0) {
            _exit(99);
        }
        try {
            LDIF_File(path, "", nullptr);
        } catch (const LDIF_Exception& e) {
            _exit(summary(e) == "80/1000 System error reading file" && e.configFile == path ? 0
                                                                                            : 1);
        } catch (...) {
            _exit(2);
        }
        _exit(3);
    };
    EXPECT_EXIT(child(), testing::ExitedWithCode(0), "");
}

TEST_F(LDIF_File_load, EmptyFileGivesAnEmptyRoot) {
    for (const char* text : {"", "\n", "\n  \n\t\n"}) {
        const LDIF_File file = load(text);
        EXPECT_TRUE(file.root().attributes().empty());
        EXPECT_TRUE(file.root().children().empty());
        EXPECT_TRUE(file.trailing_comment().empty());
        EXPECT_EQ(folder.read("conf"), text);
    }
}

TEST_F(LDIF_File_load, TextIsKeptAsItIsWritten) {
    for (const char* text : {
             valid,
             "version: 1\n",
             "charset: UTF-8\n# only a comment follows\n",
             "# comment\n\n# comment\n",
             "charset: x\nversion: 1\n\ndn: cn=a\n\n",
             "# 1\n\n# 2\ncharset: x\n# 3\n\nversion: 1\n\n\n# 4\ndn: cn=a\n# 5\ncn: 1\n\n# 6\n",
             "CHARSET: x\nVersion: 1\n\nDN: cn=a\nsn: 1\nsn: 2\n\n\n\ndn: cn=b, cn=a\nsn: \n\n",
         }) {
        EXPECT_EQ(text_of(load(text)), text);
    }
}

TEST_F(LDIF_File_load, TextIsBroughtIntoItsCanonicalForm) {
    const std::string head = "charset: x\nversion: 1\n\n";
    const struct {
        const char* name;
        std::string text;
        std::string expected;
    } rows[] = {
        {"a DN is written canonically", "dn: CN=a;O=b\n", "dn: CN=a, O=b\n\n"},
        {"attributes are sorted", "dn: cn=a\nsn: 1\ncn: a\n", "dn: cn=a\ncn: a\nsn: 1\n\n"},
        {"attributes of a name stand together", "dn: cn=a\nsn: 1\ncn: a\nSN: 2\n",
         "dn: cn=a\ncn: a\nsn: 1\nsn: 2\n\n"},
        {"equal values are dropped", "dn: cn=a\nobjectclass: top\nobjectclass: TOP\n",
         "dn: cn=a\nobjectclass: top\n\n"},
        {"a second value of a single attribute is kept", "dn: cn=a\ncn: a\ncn: b\n",
         "dn: cn=a\ncn: a\ncn: b\n\n"},
        {"comments move with their attribute", "dn: cn=a\n# s\nsn: 1\n# c\ncn: a\n",
         "dn: cn=a\n# c\ncn: a\n# s\nsn: 1\n\n"},
        {"a comment at the end of an entry goes to the next", "dn: cn=a\n# c\n\ndn: cn=b\n",
         "dn: cn=a\n\n# c\ndn: cn=b\n\n"},
        {"a dn line ends the entry before", "dn: cn=a\nsn: 1\ndn: cn=b\nsn: 2\n",
         "dn: cn=a\nsn: 1\n\ndn: cn=b\nsn: 2\n\n"},
        {"children follow their parents", "dn: cn=b, cn=a\n\ndn: cn=c\n\ndn: cn=a\n",
         "dn: cn=c\n\ndn: cn=a\n\n\ndn: cn=b, cn=a\n\n"},
        {"an entry that comes again is merged", "# 1\ndn: cn=a\nsn: 1\n\n# 2\ndn: CN=A\nsn: 2\n",
         "# 1\n# 2\ndn: cn=a\nsn: 1\nsn: 2\n\n"},
        {"continuations are joined", "dn: cn=\n a\nsn: 1\n 2\n\t3\n", "dn: cn=a\nsn: 123\n\n"},
        {"carriage returns are dropped", "dn: cn=a\r\nsn: 1\r\n\r\n", "dn: cn=a\nsn: 1\n\n"},
        {"blank lines at the end are dropped", "dn: cn=a\n\n\n \n", "dn: cn=a\n\n"},
        {"comments at the end are kept", "dn: cn=a\n\n# 1\n\n# 2\n\n\n",
         "dn: cn=a\n\n# 1\n\n# 2\n"},
        {"a comment directly after the last entry is kept", "dn: cn=a\n# 1", "dn: cn=a\n\n# 1\n"},
        {"blank lines within a comment are kept", "dn: cn=a\n\n\n# 1\n\ndn: cn=b\n",
         "dn: cn=a\n\n\n# 1\n\ndn: cn=b\n\n"},
        {"encoded values stay as they are", "dn: cn=a\nsn:: Zm9v\n", "dn: cn=a\nsn: Zm9v\n\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(text_of(load(head + row.text)), head + row.expected);
        EXPECT_EQ(folder.read("conf"), head + row.text);
        EXPECT_EQ(text_of(load(head + row.expected)), head + row.expected);
    }
}

TEST_F(LDIF_File_load, LastLineWithoutANewlineLosesItsValue) {
    EXPECT_EQ(text_of(load("charset: x\nversion: 1\n\ndn: cn=a\nsn: 1")),
              "charset: x\nversion: 1\n\ndn: cn=a\nsn: \n\n");
}

TEST_F(LDIF_File_load, FileWithoutCharsetAndVersionGetsThemOnItsFirstEntry) {
    const struct {
        const char* text;
        const char* expected;
    } rows[] = {
        {"dn: cn=a\n\ndn: cn=b\n", "charset: ISO-8859-1\nversion: 1\n\ndn: cn=a\n\ndn: cn=b\n\n"},
        // The comment of the first entry moves to the first attribute that is added.
        {"# c\n\ndn: cn=a\n", "# c\n\ncharset: ISO-8859-1\nversion: 1\n\ndn: cn=a\n\n"},
        {"# v\nversion: 1\n# c\ndn: cn=a\n",
         "# c\ncharset: ISO-8859-1\n# v\nversion: 1\n\ndn: cn=a\n\n"},
        {"# x\ncharset: x\n# c\ndn: cn=a\n", "# x\ncharset: x\n# c\nversion: 1\n\ndn: cn=a\n\n"},
        {"version: 1\ncharset: x\n# c\ndn: cn=a\n", "charset: x\nversion: 1\n\n# c\ndn: cn=a\n\n"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(text_of(load(row.text)), row.expected);
        EXPECT_EQ(folder.read("conf"), row.text) << "it is the next write that puts them there";
    }
}

TEST_F(LDIF_File_load, FileWithoutEntriesGetsNoDefaults) {
    EXPECT_EQ(text_of(load("version: 1\n# c\n")), "version: 1\n# c\n");
    EXPECT_EQ(text_of(load("# c\n")), "# c\n");
}

TEST_F(LDIF_File_load, AttributeOutsideOfAnEntryEndsTheLoad) {
    const struct {
        const char* text;
        const char* name;
        const char* value;
        int line;
    } rows[] = {
        {"cn: a\n", "cn", "a", 1},
        {"# c\n\nCn: a\n b\n c\n", "Cn", "abc", 5},
        {"charset: x\nversion: 1\n\ndn: cn=a\nsn: 1\n\nsn: 2\n\n", "sn", "2", 7},
        {"version: 1\nsn:\n", "sn", "", 2},
        {"oru-slapdInvalidLine: x\n", "oru-slapdInvalidLine", "x", 1},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_Exception e = failure_to_load(row.text);
        EXPECT_EQ(summary(e), "65/1007 \"" + std::string(row.name) +
                                  "\" attribute not allowed in <root> object");
        EXPECT_EQ(e.entryDn, "<root>");
        EXPECT_EQ(e.attribute, row.name);
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.configLine, row.line);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
        EXPECT_EQ(folder.read("conf"), row.text);
    }
}

// A line that an entry would keep as an invalid one ends the load when it stands outside of one.
TEST_F(LDIF_File_load, BadLineOutsideOfAnEntryEndsTheLoad) {
    const struct {
        const char* text;
        const char* value;
        int line;
    } rows[] = {
        {"version: 2\n", "version: 2", 1},
        {"version: one\n", "version: one", 1},
        {"version: 1\nVERSION: 1\n", "VERSION: 1", 2},
        {"charset: x\n# c\nCharset: y\n", "Charset: y", 3},
        {"garbage\n", "garbage: ", 1},
        {"version\n", "version: ", 1},
        {":x\n", ":x: ", 1},
        {"  # no comment\n", "  # no comment: ", 1},
        // The defaults of the first entry count.
        {"dn: cn=a\n\nversion: 1\n", "version: 1", 3},
        {"dn: cn=a\n\ncharset: x\n", "charset: x", 3},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_Exception e = failure_to_load(row.text);
        EXPECT_EQ(summary(e), invalid_at_root);
        EXPECT_EQ(e.entryDn, "<root>");
        EXPECT_EQ(e.attribute, "oru-slapdInvalidLine");
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.configLine, row.line);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(folder.read("conf"), row.text);
    }
}

TEST_F(LDIF_File_load, BadLineOfAnEntryIsKeptAsAnInvalidLine) {
    const struct {
        const char* line;
        const char* expected;
    } rows[] = {
        {"oru-slapdDbConnections: many\n", "oru-slapdInvalidLine: oru-slapdDbConnections: many\n"},
        {"oru-slapdDbConnections: ma\n ny\n",
         "oru-slapdInvalidLine: oru-slapdDbConnections: many\n"},
        {"oru-slapdDbConnections:\n", "oru-slapdInvalidLine: oru-slapdDbConnections: \n"},
        {"version: 2\n", "oru-slapdInvalidLine: version: 2\n"},
        {"garbage\n", "oru-slapdInvalidLine: garbage: \n"},
        {"garbage\n continued\n", "oru-slapdInvalidLine: garbage: continued\n"},
        {":x: y\n", "oru-slapdInvalidLine: :x: y: \n"},
        {"# of the line\noru-slapdAdminDN: x\n",
         "# of the line\noru-slapdInvalidLine: oru-slapdAdminDN: x\n"},
    };
    const std::string head = "charset: x\nversion: 1\n\ndn: cn=a\ncn: a\n";
    for (const auto& row : rows) {
        SCOPED_TRACE(row.line);
        LDIF_File file = load(head + row.line + "sn: 1\n");
        EXPECT_EQ(text_of(file), head + row.expected + "sn: 1\n\n");
        EXPECT_EQ(folder.read("conf"), text_of(file)) << "the file is rewritten at once";
        EXPECT_EQ(file.refresh(), 0);
    }
}

TEST_F(LDIF_File_load, SeveralBadLinesOfAnEntryAreAllKept) {
    const LDIF_File file = load(
        "charset: x\nversion: 1\n\ndn: cn=a\nfirst\nsn: 1\nsecond\nfirst\noru-slapdAdminDN: x\n");
    EXPECT_EQ(entry_text(file, "cn=a"),
              "\ndn: cn=a\noru-slapdInvalidLine: first: \noru-slapdInvalidLine: second: \n"
              "oru-slapdInvalidLine: oru-slapdAdminDN: x\nsn: 1\n\n");
}

TEST_F(LDIF_File_load, BadVersionLineOfAnEntryIsNotTheRoots) {
    const LDIF_File file = load("charset: x\nversion: 1\n\ndn: cn=a\nversion: 1\ncharset: y\n");
    EXPECT_EQ(entry_text(file, "cn=a"), "\ndn: cn=a\ncharset: y\nversion: 1\n\n");
}

TEST_F(LDIF_File_load, RewritingBadLinesMakesABackupOfTheFileAsItWas) {
    const std::string text = "version: 1\n\ndn: cn=a\ngarbage\n";
    put(text);
    LDIF_File file(path, folder.file("backup"), nullptr);
    EXPECT_EQ(folder.read("backup"), text);
    EXPECT_THAT(folder.read("conf"), HasSubstr("oru-slapdInvalidLine: garbage: \n"));
    EXPECT_EQ(file.refresh(), 0);
}

TEST_F(LDIF_File_load, BadLinesThatCannotBeBackedUpEndTheLoadAndLeaveTheFile) {
    const std::string text = "version: 1\n\ndn: cn=a\ngarbage\n";
    put(text);
    const LDIF_Exception e =
        failure_of([&] { LDIF_File(path, folder.file("no/backup"), nullptr); });
    EXPECT_EQ(summary(e), "50/1004 Unable to backup the configuration file: \"" + path + "\" ");
    EXPECT_EQ(folder.read("conf"), text);
}

// What looks like an entry may be half of one, and what looks like a bad line the seam of two.
TEST_F(LDIF_File_load, FileThatWasNotWrittenToItsEndIsRefusedAndNothingIsWritten) {
    const std::string mark(cfg32::unfinished_mark);
    const std::string good = "version: 1\n\ndn: cn=a\nsn: 1\n";
    for (const std::string& text : {mark, mark + good, mark + "garbage\n" + good}) {
        SCOPED_TRACE(text);
        put(text);
        folder.write("backup", good);
        const LDIF_Exception e =
            failure_of([&] { LDIF_File(path, folder.file("backup"), nullptr); });
        EXPECT_EQ(summary(e),
                  "80/1002 Configuration file was not written to its end; its backup is the "
                  "complete version");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(folder.read("conf"), text);
        EXPECT_EQ(folder.read("backup"), good);
    }
    // Anywhere else the line is a comment like any other.
    load(good + mark);
}

TEST_F(LDIF_File_load, FileOfValidLinesIsNotWritten) {
    const char* const text = "dn: CN=b;cn=a\nsn: 2\ncn: b\n\n\n# c\n\n";
    put(text);
    set_modification_time({1000000000, 123456789});
    LDIF_File file(path, folder.file("backup"), nullptr);
    EXPECT_EQ(folder.read("conf"), text);
    EXPECT_EQ(modification_time().tv_sec, 1000000000);
    EXPECT_EQ(modification_time().tv_nsec, 123456789);
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_load, NameThatDoesNotParseEndsTheLoad) {
    const struct {
        const char* text;
        const char* expected;
        int line;
    } rows[] = {
        {"dn: cn=a=b\n", "34/1014 Invalid character in RDN value: =", 1},
        {"dn: cn=x\nsn: 1\n\n# c\ndn: cn \n x\n", "34/1012 Invalid character in RDN attribute: x",
         6},
        {"dn: cn=x\nsn: 1\ndn: cn\n", "34/1013 Missing RDN value: cn", 3},
        // A line that merely begins with "dn" is no attribute of the entry before.
        {"dn: cn=x\ndnx\n", "34/1012 Invalid character in RDN attribute: :", 2},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_Exception e = failure_to_load(row.text);
        EXPECT_EQ(e.configLine, row.line);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.entryDn, "<root>");
        EXPECT_EQ(summary(e), row.expected);
        EXPECT_EQ(folder.read("conf"), row.text);
    }
}

TEST_F(LDIF_File_load, TextOfAnotherCharacterSetIsReportedWithTheLineAndTheOpenEntry) {
    REQUIRE_UTF8();
    const struct {
        const char* text;
        const char* entry;
        int line;
    } rows[] = {
        {"\xff: x\n", "<root>", 1},
        {"# c\n# c\n\xff\n", "<root>", 3},
        {"# c\n# \xff\n", "<root>", 2},
        {"dn: cn=a, o=b\n# c\nsn: \xff\n", "cn=a, o=b", 3},
        {"dn: cn=a, o=b\nsn: 1\n\nxx: \xff\n", "<root>", 4},
        // A line is not complete before the next has been looked at.
        {"dn: cn=a, o=b\n# c\nsn: 1\n \xff\n", "cn=a, o=b", 3},
        {"dn: cn=a, o=b\nsn: 1\nsn: \xff\n", "cn=a, o=b", 2},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.text);
        const LDIF_Exception e = failure_to_load(row.text);
        EXPECT_EQ(e.ldapErr, 162);
        EXPECT_EQ(e.extErr, 162);
        EXPECT_EQ(e.configLine, row.line);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.entryDn, row.entry);
    }
}

TEST_F(LDIF_File_load, UnchangedFileIsNotReadAgain) {
    put(valid);
    LDIF_File file(path, "", nullptr);
    const LDIF_Entry* entry = file.root().find(dn_of("cn=Configuration"));
    EXPECT_EQ(file.refresh(), 0);
    EXPECT_EQ(file.root().find(dn_of("cn=Configuration")), entry);
}

TEST_F(LDIF_File_load, EntryThatCannotBeMergedIsReportedWithItsName) {
    const LDIF_Exception e = failure_to_load(
        "version: 1\n\ndn: cn=a\noru-slapdAdminPW: {SHA}x\n\n"
        "dn: cn=A\noru-slapdAdminPW: {SHA}y\n\n");
    EXPECT_EQ(e.ldapErr, 84);
    EXPECT_EQ(e.entryDn, "cn=A");
    EXPECT_EQ(e.configFile, path);
    EXPECT_EQ(e.configLine, 8);
}

TEST_F(LDIF_File_load, TheModificationTimeAloneTellsOfAChangeInPlace) {
    put(valid);
    LDIF_File file(path, "", nullptr);
    change_unseen("version: 1\n", false);
    EXPECT_EQ(file.refresh(), 0);
    EXPECT_EQ(text_of(file), valid);
}

// Software that deploys every file with the same fixed time replaces files so.
TEST_F(LDIF_File_load, AnotherFileUnderTheSameNameIsReadAlthoughItsTimeIsTheSame) {
    put(valid);
    LDIF_File file(path, "", nullptr);
    change_unseen("version: 1\n", true);
    EXPECT_EQ(file.refresh(), 1);
    EXPECT_EQ(text_of(file), "version: 1\n");
}

TEST_F(LDIF_File_load, AnyOtherModificationTimeReadsTheFileAgain) {
    const timespec start = {1000000000, 500000000};
    for (const timespec other :
         {timespec{1000000001, 500000000}, timespec{999999999, 500000000},
          timespec{1000000000, 500000001}, timespec{1000000000, 499999999}, timespec{0, 0}}) {
        put(valid);
        set_modification_time(start);
        LDIF_File file(path, "", nullptr);
        put("version: 1\n");
        set_modification_time(other);
        EXPECT_EQ(file.refresh(), 1);
        EXPECT_EQ(text_of(file), "version: 1\n");
        EXPECT_EQ(file.getModTime(), other.tv_sec);
        EXPECT_EQ(file.refresh(), 0);
    }
}

TEST_F(LDIF_File_load, ReadingAgainForgetsEverythingOfBefore) {
    put("# 1\ncharset: x\nversion: 1\n\n# 2\ndn: cn=a\nsn: 1\n\n# 3\n");
    LDIF_File file(path, "", nullptr);
    put("version: 1\ndn: cn=b\n");
    folder.touch("conf", 1);
    EXPECT_EQ(file.refresh(), 1);
    EXPECT_EQ(text_of(file), "charset: ISO-8859-1\nversion: 1\n\ndn: cn=b\n\n");
}

TEST_F(LDIF_File_load, FailedLoadKeepsWhatWasReadAndTheNextReadsAgain) {
    put(valid);
    LDIF_File file(path, "", nullptr);
    put("# 1\nversion: 1\n\ndn: cn=b\nsn: 1\n\n# 2\ncn: outside\n");
    folder.touch("conf", 1);
    for (int attempt = 0; attempt < 2; ++attempt) {
        const LDIF_Exception e = failure_of([&] { file.refresh(); });
        EXPECT_EQ(summary(e), "65/1007 \"cn\" attribute not allowed in <root> object");
        EXPECT_EQ(e.configLine, 8);
        EXPECT_EQ(entry_text(file, "cn=b"), "dn: cn=b\nsn: 1\n\n");
        EXPECT_EQ(file.root().find(dn_of("cn=Configuration")), nullptr);
    }
    change_unseen(valid, false);
    EXPECT_EQ(file.refresh(), 1);
    EXPECT_EQ(text_of(file), valid);
}

TEST_F(LDIF_File_load, FailedLoadIsRepeatedThoughTheFileIsBackAtItsOldTime) {
    put(valid);
    const timespec start = modification_time();
    LDIF_File file(path, "", nullptr);
    put("cn: outside\n");
    folder.touch("conf", 1);
    failure_of([&] { file.refresh(); });
    put(valid);
    set_modification_time(start);
    EXPECT_EQ(file.refresh(), 1);
    EXPECT_EQ(text_of(file), valid);
}

TEST_F(LDIF_File_load, FileThatIsGoneOrNoFileLeavesTheStoreAsItWas) {
    put(valid);
    LDIF_File file(path, "", nullptr);
    ASSERT_EQ(unlink(path.c_str()), 0);
    EXPECT_EQ(summary(failure_of([&] { file.refresh(); })), "91/1003 _stat()");
    EXPECT_EQ(text_of(file), valid);
    ASSERT_EQ(mkdir(path.c_str(), 0700), 0);
    EXPECT_EQ(summary(failure_of([&] { file.refresh(); })), "91/1004 ifstream()");
    EXPECT_EQ(text_of(file), valid);
}

TEST_F(LDIF_File_load, EntryWithAnEmptyNameBelongsToTheRoot) {
    const LDIF_File file = load("version: 1\n\n# c\ndn:\nsn: 1\n");
    EXPECT_TRUE(file.root().children().empty());
    EXPECT_EQ(file.root().attributes().size(), 3u);
}

TEST_F(LDIF_File_load, LinkToTheFileIsFollowed) {
    put(valid);
    ASSERT_EQ(symlink("conf", folder.file("link").c_str()), 0);
    EXPECT_EQ(text_of(LDIF_File(folder.file("link"), "", nullptr)), valid);
}

TEST_F(LDIF_File_load, RandomFilesAreWrittenAndReadWithoutAChange) {
    std::mt19937 random(51);
    const std::vector<std::string> lines = {"\n",
                                            "\n",
                                            "\n",
                                            "# c\n",
                                            "#\n",
                                            "sn: 1\n",
                                            "SN: 2\n",
                                            "cn: a\n",
                                            "ou: x y\n",
                                            "objectclass: top\n",
                                            "oru-slapdDbConnections: 007\n",
                                            "description: \n",
                                            "z: :x\n",
                                            "dn: cn=a\n",
                                            "dn: cn=b,cn=a\n",
                                            "dn: ou=c,cn=b,cn=a\n",
                                            "dn: cn=b,cn=a\n",
                                            "dn: o=x;o=y\n"};
    int loaded = 0;
    for (int round = 0; round < 300; ++round) {
        std::string text = random() % 2 == 0 ? "version: 1\n" : "";
        for (unsigned i = random() % 25; i > 0; --i) {
            const std::string& line = lines[random() % lines.size()];
            const size_t last = text.rfind("\n\n");
            const bool in_entry = text.find("dn:", last == text.npos ? 0 : last) != text.npos;
            if (in_entry || line[0] == '\n' || line[0] == '#' || line[0] == 'd') {
                text += line == "description: \n" && !in_entry ? "" : line;
            }
        }
        SCOPED_TRACE(text);
        put(text);
        LDIF_File file(path, "", nullptr);
        ++loaded;
        const std::string first = text_of(file);
        file.flush();
        ASSERT_EQ(folder.read("conf"), first);
        EXPECT_EQ(file.refresh(), 0);
        EXPECT_EQ(text_of(file), first);
        LDIF_File again(path, "", nullptr);
        ASSERT_EQ(text_of(again), first);
        again.flush();
        ASSERT_EQ(folder.read("conf"), first);
    }
    EXPECT_EQ(loaded, 300);
}
