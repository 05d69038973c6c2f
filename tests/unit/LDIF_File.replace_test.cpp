#include <gtest/gtest.h>

#include <string>

#include "LDIF_File.h"
#include "failures.h"
#include "file_lock.h"
#include "stores.h"

using namespace cfg32;
using namespace cfg32::tests;

namespace {

const std::string before = store_head + "dn: cn=a\ncn: a\n\n";
const std::string after = "# whatever stands here\n\ndn: cn=b\n";
const std::string unfinished = std::string(unfinished_mark) + "dn: cn=a\n";

class LDIF_File_replace : public store_test {
  protected:
    void replace(const std::string& expected, const std::string& backup_name) {
        LDIF_File::replace(path, backup_name, after, expected);
    }
};

TEST_F(LDIF_File_replace, WritesTheTextAsItIs) {
    folder.write("conf", before);
    replace(before, "");
    EXPECT_EQ(folder.read("conf"), after);
}

TEST_F(LDIF_File_replace, BacksUpWhatWasThere) {
    folder.write("conf", before);
    replace(before, backup);
    EXPECT_EQ(folder.read("conf"), after);
    EXPECT_EQ(folder.read("backup"), before);
}

TEST_F(LDIF_File_replace, KeepsTheFileItself) {
    folder.write("conf", before);
    const ino_t file = status_of("conf").st_ino;
    replace(before, backup);
    EXPECT_EQ(status_of("conf").st_ino, file);
}

TEST_F(LDIF_File_replace, TakesTheLoadOfTheOldTextForNoCondition) {
    const std::string unloadable = "cn: above all entries\ndn: no name\n";
    folder.write("conf", unloadable);
    replace(unloadable, backup);
    EXPECT_EQ(folder.read("conf"), after);
    EXPECT_EQ(folder.read("backup"), unloadable);
}

TEST_F(LDIF_File_replace, WritesNothingOverATextThatIsNotTheExpectedOne) {
    folder.write("conf", before);
    EXPECT_EQ(summary(failure_of([&] { replace("something else", backup); })),
              "51/51 Configuration file was changed meanwhile");
    EXPECT_EQ(folder.read("conf"), before);
    EXPECT_FALSE(folder.has("backup"));
}

TEST_F(LDIF_File_replace, LeavesTheBackupOfAFileThatWasNotWrittenToItsEnd) {
    folder.write("conf", unfinished);
    folder.write("backup", before);
    replace(unfinished, backup);
    EXPECT_EQ(folder.read("conf"), after);
    EXPECT_EQ(folder.read("backup"), before);
}

TEST_F(LDIF_File_replace, WritesNothingWithoutABackupThatIsAskedFor) {
    folder.write("conf", before);
    EXPECT_EQ(summary(failure_of([&] { replace(before, folder.file("no such folder/backup")); })),
              "50/1004 Unable to backup the configuration file: \"" + path + "\" ");
    EXPECT_EQ(folder.read("conf"), before);
}

TEST_F(LDIF_File_replace, RefusesAFileThatIsNotThere) {
    EXPECT_EQ(summary(failure_of([&] { replace("", ""); })),
              "91/1004 Unable to read the configuration file");
    EXPECT_FALSE(folder.has("conf"));
}

}  // namespace
