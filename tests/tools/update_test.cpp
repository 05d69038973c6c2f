#include "change/update.h"

#include <gmock/gmock.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <random>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "after_reading.h"
#include "cfg32.h"
#include "cfg32_platform.h"
#include "change/ldif_reader.h"
#include "modifications.h"
#include "open_regular.h"
#include "outcome.h"
#include "temporary_folder.h"
#include "unique_fd.h"

namespace cfg32::tool {

namespace {

using tests::temporary_folder;

const std::string example = [] {
    std::ifstream in(CFG32_EXAMPLES "/oruslapd.conf", std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), {});
}();

const std::string small =
    "charset: x\nversion: 1\n\n"
    "dn: cn=Configuration\ncn: Configuration\noru-slapdAdminDN: cn=root\n"
    "oru-slapdAdminPW: {SHA}unknown\n\n"
    "dn: cn=a, cn=Configuration\ncn: a\noru-slapdPort: 389\noru-slapdSuffix: o=x\n"
    "oru-slapdSuffix: o=y\n\n"
    "dn: cn=b, cn=a, cn=Configuration\ncn: b\noru-slapdDbUserPW: "
    ">EH0Ril93yPhQR2hyHVFGvV2C9/XVa9yBRtYNB9T+UyMo8Gg1NIo5Sly1jr8=\n\n";

std::vector<change_record> records_of(const std::string& ldif) {
    std::vector<change_record> records;
    for (const auto& each : read_ldif(ldif, change_record::modify)) {
        const auto* error = std::get_if<ldif_error>(&each);
        EXPECT_FALSE(error) << (error ? error->text : "");
        records.push_back(std::get<change_record>(each));
    }
    return records;
}

/// What a file is to everybody else.
struct identity {
    std::string text;
    timespec modified;
    timespec changed;
    ino_t inode;

    bool operator==(const identity& other) const {
        const auto same = [](const timespec& l, const timespec& r) {
            return l.tv_sec == r.tv_sec && l.tv_nsec == r.tv_nsec;
        };
        return text == other.text && same(modified, other.modified) &&
               same(changed, other.changed) && inode == other.inode;
    }
};

struct update_test : testing::Test {
    temporary_folder folder;
    settings options;
    update_options how;

    update_test() {
        options.file = folder.file("conf");
        how.source = "changes.ldif";
    }

    update_result change(const std::string& ldif) { return update(options, records_of(ldif), how); }

    /// The message that ends the update.
    std::string failure_of(const std::string& ldif) {
        try {
            change(ldif);
        } catch (const ended& end) {
            EXPECT_EQ(end.status(), failed);
            return end.what();
        } catch (const LDIF_Exception& e) {
            return report(e);
        }
        ADD_FAILURE() << "no failure";
        return {};
    }

    identity file() const {
        struct stat status {};
        EXPECT_EQ(stat(options.file.c_str(), &status), 0);
        return {folder.read("conf"), status.st_mtim, status.st_ctim, status.st_ino};
    }

    size_t files() const {
        const std::filesystem::directory_iterator all(folder.file("."));
        return static_cast<size_t>(std::distance(begin(all), end(all)));
    }
};

using namespace tests::operations;
using tests::modifications;

const std::string listener = "cn=Client Listener, cn=Network, cn=Configuration";

/// A change, and the same one in calls of the C interface.
struct same_change {
    const char* name;
    std::string ldif;
    std::function<int(CfgHandle*)> call;
    bool deletes_trees = false;
    bool merges = false;
};

int modified(CfgHandle* handle, const std::string& dn, const std::vector<tests::change>& changes) {
    return cfg_modify_s(handle, dn.c_str(), modifications(changes).records());
}

const same_change same_changes[] = {
    {"replace", "dn: " + listener + "\nreplace: oru-slapdPort\noru-slapdPort: 1389\n",
     [](CfgHandle* h) {
         return modified(h, listener, {{replace, "oru-slapdPort", {"1389"}}});
     }},
    {"replace in another spelling",
     "dn: CN=client listener,cn=network,cn=configuration\nreplace: ORU-SLAPDPORT\noru-slapdport: "
     "007\n",
     [](CfgHandle* h) {
         return modified(h, listener, {{replace, "ORU-SLAPDPORT", {"007"}}});
     }},
    {"several values",
     "dn: cn=Front End, cn=Configuration\nadd: oru-slapdSetenv\noru-slapdSetenv: "
     "A=1\noru-slapdSetenv: "
     "TZ=Europe/Berlin\noru-slapdSetenv: B=2\n-\ndelete: oru-slapdSetenv\noru-slapdSetenv: "
     "MALLOC_ARENA_MAX=4\n",
     [](CfgHandle* h) {
         return modified(h, "cn=Front End, cn=Configuration",
                         {{add, "oru-slapdSetenv", {"A=1", "TZ=Europe/Berlin", "B=2"}},
                          {del, "oru-slapdSetenv", {"MALLOC_ARENA_MAX=4"}}});
     }},
    {"an attribute that goes, with its comment",
     "dn: cn=Front End, cn=Configuration\ndelete: oru-slapdWorkers\n-\n",
     [](CfgHandle* h) {
         return modified(h, "cn=Front End, cn=Configuration", {{del, "oru-slapdWorkers", {}}});
     }},
    {"a replacement by nothing", "dn: " + listener + "\nreplace: oru-slapdIpAddress\n-\n",
     [](CfgHandle* h) {
         return modified(h, listener, {{replace, "oru-slapdIpAddress", {}}});
     }},
    {"a new attribute, in base64 and not in ASCII",
     "dn: " + listener + "\nadd: x-note\nx-note:: SsO2cmc=\n",
     [](CfgHandle* h) {
         return modified(h, listener, {{add, "x-note", {"J\xc3\xb6rg"}}});
     }},
    {"values in another order",
     "dn: cn=jvoss, cn=Administrators, cn=Configuration\nreplace: oru-slapdAdminRole\n"
     "oru-slapdAdminRole: PasswordAdmin\noru-slapdAdminRole: ServerStartStopAdmin\n",
     [](CfgHandle* h) {
         return modified(
             h, "cn=jvoss, cn=Administrators, cn=Configuration",
             {{replace, "oru-slapdAdminRole", {"PasswordAdmin", "ServerStartStopAdmin"}}});
     }},
    {"the lines above all entries", "dn:\nreplace: charset\ncharset: ISO-8859-1\n",
     [](CfgHandle* h) {
         return modified(h, "", {{replace, "charset", {"ISO-8859-1"}}});
     }},
    {"a new entry",
     "dn: cn=New, cn=Network, cn=Configuration\nchangetype: add\nobjectclass: top\nobjectclass: "
     "oruListener\ncn: New\noru-slapdPort: 0390\n",
     [](CfgHandle* h) {
         return cfg_add_s(h, "cn=New, cn=Network, cn=Configuration",
                          modifications({{add, "objectclass", {"top", "oruListener"}},
                                         {add, "cn", {"New"}},
                                         {add, "oru-slapdPort", {"0390"}}})
                              .records());
     }},
    {"what an entry lacks",
     "dn: " + listener + "\nchangetype: add\noru-slapdPort: 389\nx-note: 1\n",
     [](CfgHandle* h) {
         return cfg_add_s(
             h, listener.c_str(),
             modifications({{add, "oru-slapdPort", {"389"}}, {add, "x-note", {"1"}}}).records());
     },
     false, true},
    {"an entry that goes", "dn: " + listener + "\nchangetype: delete\n",
     [](CfgHandle* h) { return cfg_delete_s(h, listener.c_str()); }},
    {"a tree that goes", "dn: cn=Network, cn=Configuration\nchangetype: delete\n",
     [](CfgHandle* h) {
         cfg_set_option(h, CFG_OPT_DELETE_NON_LEAVES, CFG_OPT_ON);
         return cfg_delete_s(h, "cn=Network, cn=Configuration");
     },
     true},
    {"several entries",
     "dn: " + listener +
         "\nreplace: oru-slapdPort\noru-slapdPort: 1389\n\n"
         "dn: cn=Management Listener, cn=Network, cn=Configuration\nchangetype: delete\n\n"
         "dn: cn=New, cn=Configuration\nchangetype: add\ncn: New\n",
     [](CfgHandle* h) {
         const int codes = modified(h, listener, {{replace, "oru-slapdPort", {"1389"}}}) |
                           cfg_delete_s(h, "cn=Management Listener, cn=Network, cn=Configuration");
         return codes | cfg_add_s(h, "cn=New, cn=Configuration",
                                  modifications({{add, "cn", {"New"}}}).records());
     }},
};

}  // namespace

TEST_F(update_test, GivesTheSameBytesAsTheCInterface) {
    for (const same_change& row : same_changes) {
        SCOPED_TRACE(row.name);
        const std::string called = folder.write("called", example);
        CfgHandle* handle = cfg_init();
        cfg_set_option(handle, CFG_OPT_CONFIG_FILE, called.c_str());
        EXPECT_EQ(cfg_bind_s(handle, nullptr, nullptr, CFG_AUTH_SIMPLE), 0);
        EXPECT_EQ(row.call(handle), 0) << cfg_dump_exception(handle);
        cfg_unbind(handle);

        folder.write("conf", example);
        how.deletes_trees = row.deletes_trees;
        how.merges = row.merges;
        const update_result result = change(row.ldif);
        EXPECT_TRUE(result.is_changed);
        EXPECT_EQ(folder.read("conf"), folder.read("called"));
        EXPECT_NE(folder.read("conf"), example);
        EXPECT_EQ(folder.read("conf.bak"), example);
        EXPECT_EQ(result.before, example);
        EXPECT_EQ(result.after, folder.read("conf"));
    }
}

TEST_F(update_test, ADryRunTellsTheSameAndLeavesTheFileAlone) {
    for (const same_change& row : same_changes) {
        SCOPED_TRACE(row.name);
        how.deletes_trees = row.deletes_trees;
        how.merges = row.merges;
        folder.write("conf", example);
        const identity before = file();
        options.is_dry_run = true;
        const update_result dry = change(row.ldif);
        EXPECT_EQ(file(), before);
        EXPECT_EQ(files(), 1u);
        options.is_dry_run = false;
        const update_result real = change(row.ldif);
        EXPECT_TRUE(dry.is_changed);
        EXPECT_EQ(dry.before, real.before);
        EXPECT_EQ(dry.after, real.after);
        std::filesystem::remove(folder.file("conf.bak"));
    }
}

TEST_F(update_test, WritesNothingWhenNothingWouldChange) {
    const std::string a = "dn: cn=a, cn=Configuration\n";
    const std::string rows[] = {
        "",
        a + "replace: oru-slapdPort\noru-slapdPort: 389\n",
        a + "replace: oru-slapdPort\noru-slapdPort: 0389\n",
        a + "replace: oru-slapdSuffix\noru-slapdSuffix: o = x\noru-slapdSuffix: o=y\n",
        a + "replace: x-none\n-\n",
        a + "add: oru-slapdSuffix\noru-slapdSuffix: o=y\noru-slapdSuffix: o=x\n",
        a + "delete: oru-slapdSuffix\noru-slapdSuffix: o=z\n",
        a + "delete: x-none\n-\n",
        a + "delete: x-none\nx-none: 1\n",
        a + "changetype: add\ncn: a\noru-slapdSuffix: o=y\n",
        "dn: cn=b, cn=a, cn=Configuration\nreplace: oru-slapdDbUserPW\noru-slapdDbUserPW: "
        ">EH0Ril93yPhQR2hyHVFGvV2C9/XVa9yBRtYNB9T+UyMo8Gg1NIo5Sly1jr8=\n",
        "dn: cn=Configuration\nreplace: oru-slapdAdminPW\noru-slapdAdminPW: {SHA}unknown\n",
        "dn:\nreplace: charset\ncharset: x\n",
    };
    folder.write("conf", small);
    const identity before = file();
    how.merges = true;
    how.may_be_gone = true;
    for (const std::string& row : rows) {
        SCOPED_TRACE(row);
        const update_result result = change(row);
        EXPECT_FALSE(result.is_changed);
        EXPECT_EQ(result.after, result.before);
        EXPECT_EQ(file(), before);
        EXPECT_EQ(files(), 1u);
    }
}

TEST_F(update_test, SeesWhatAReplacementChanges) {
    const std::string a = "dn: cn=a, cn=Configuration\n";
    const std::string rows[] = {
        a + "replace: oru-slapdSuffix\noru-slapdSuffix: o=y\noru-slapdSuffix: o=x\n",
        a + "replace: oru-slapdSuffix\noru-slapdSuffix: o=x\n",
        a + "replace: oru-slapdSuffix\noru-slapdSuffix: o=x\noru-slapdSuffix: o=y\n"
            "oru-slapdSuffix: o=z\n",
        a + "replace: cn\ncn: A\n",
        a + "delete: oru-slapdSuffix\noru-slapdSuffix: o=z\noru-slapdSuffix: o=x\n",
        a + "add: oru-slapdSuffix\noru-slapdSuffix: o=x\noru-slapdSuffix: o=z\n",
        "dn: cn=b, cn=a, cn=Configuration\nreplace: oru-slapdDbUserPW\noru-slapdDbUserPW: other\n",
        "dn: cn=Configuration\nreplace: oru-slapdAdminPW\noru-slapdAdminPW: {SHA}other\n",
    };
    for (const std::string& row : rows) {
        SCOPED_TRACE(row);
        folder.write("conf", small);
        const update_result result = change(row);
        EXPECT_TRUE(result.is_changed);
        EXPECT_NE(result.after, small);
        EXPECT_EQ(folder.read("conf"), result.after);
    }
}

TEST_F(update_test, APasswordIsNotEncodedAnewForTheSameText) {
    folder.write("conf", small);
    const std::string set =
        "dn: cn=b, cn=a, cn=Configuration\nreplace: oru-slapdDbUserPW\noru-slapdDbUserPW: typed\n";
    EXPECT_TRUE(change(set).is_changed);
    const identity after = file();
    EXPECT_FALSE(change(set).is_changed);
    EXPECT_EQ(file(), after);
}

TEST_F(update_test, TellsWhatIsWrongAndWhere) {
    const std::string a = "# x\ndn: cn=a, cn=Configuration\n";
    const struct {
        std::string ldif;
        std::string expected;  ///< as far as a line with what is accepted
    } rows[] = {
        {a + "replace: oru-slapdPort\noru-slapdPort: 1\n-\nadd: oru-slapdPort\noru-slapdPort: x\n",
         "changes.ldif:7: Value is not valid integer syntax [Invalid syntax (21)]\n"
         "  entry: cn=a, cn=Configuration\n  oru-slapdPort: x"},
        {a + "replace: oru-slapdSuffix\noru-slapdSuffix: o=x\noru-slapdSuffix: o\n -x\n",
         "changes.ldif:5: "},
        {a + "replace: oru-slapdPort\noru-slapdPort: 1\noru-slapdPort: 2\n",
         "changes.ldif:5: Attribute may not have multiple values. [Constraint violation (19)]\n"
         "  entry: cn=a, cn=Configuration\n  oru-slapdPort: 2"},
        {a + "changetype: add\ncn: a\n",
         "changes.ldif:2: The entry is there already [Already exists (68)]\n"
         "  entry: cn=a, cn=Configuration"},
        {a + "changetype: delete\n",
         "changes.ldif:2: Entries stand below it: -r deletes them as well [Operation not allowed "
         "on nonleaf (66)]\n  entry: cn=a, cn=Configuration"},
        {"dn: cn=z, cn=Configuration\nchangetype: delete\n",
         "changes.ldif:1: Entry not found [No such object (32)]\n  entry: cn=z, cn=Configuration"},
        {"\ndn: cn=z, cn=Configuration\ndelete: x\n-\n",
         "changes.ldif:2: Entry not found [No such object (32)]\n  entry: cn=z, cn=Configuration"},
        {"dn: a\ndelete: x\n-\n", "changes.ldif:1: "},
        {"dn:\nadd: x\nx: 1\n",
         "changes.ldif:3: Attribute would not read back as it is written [Invalid syntax (21)]"},
        {a + "add: x\nx:: YSA=\n",
         "changes.ldif:4: Attribute would not read back as it is written [Invalid syntax (21)]"},
        {a + "replace: oru-slapdDbUserPW\noru-slapdDbUserPW:: \n", "changes.ldif:4: "},
    };
    folder.write("conf", small);
    const identity before = file();
    for (const auto& row : rows) {
        SCOPED_TRACE(row.ldif);
        EXPECT_THAT(failure_of(row.ldif), testing::StartsWith(row.expected));
        EXPECT_EQ(file(), before);
        EXPECT_EQ(files(), 1u);
    }
}

TEST_F(update_test, ShowsNoPasswordThatWasRefused) {
    folder.write("conf", small);
    const std::string message =
        failure_of("dn: cn=a, cn=Configuration\nreplace: oru-slapdDbUserPW\noru-slapdDbUserPW: " +
                   std::string(1025, 's') + "\n");
    EXPECT_THAT(message, testing::HasSubstr("oru-slapdDbUserPW: ********"));
    EXPECT_THAT(message, testing::Not(testing::HasSubstr("sss")));
}

TEST_F(update_test, WithoutASourceFailuresNameTheConfiguration) {
    folder.write("conf", small);
    how.source.clear();
    EXPECT_EQ(failure_of("dn: cn=z\nchangetype: delete\n"),
              options.file + ": Entry not found [No such object (32)]\n  entry: cn=z");
}

TEST_F(update_test, RefusesToDeleteAnAttributeThatIsNotThere) {
    folder.write("conf", small);
    EXPECT_THAT(failure_of("dn: cn=a, cn=Configuration\ndelete: x-none\n-\n"),
                testing::HasSubstr("No such attribute (16)"));
}

TEST_F(update_test, GivesUpOnRecordsThatWereMadeForAnotherText) {
    folder.write("conf", small);
    const std::string other = small + "# Changed.\n";
    how.based_on = &other;
    EXPECT_THAT(
        failure_of("dn: cn=a, cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: 1\n"),
        testing::HasSubstr("DSA is busy (51)"));
    EXPECT_EQ(folder.read("conf"), small);
}

TEST_F(update_test, BeginsAgainWithWhatSomebodyElseWroteMeanwhile) {
    std::string before = small;
    for (int i = 0; i < 2000; ++i) {  // it takes a while to load
        before += "dn: cn=e" + std::to_string(i) + ", cn=a, cn=Configuration\ncn: e\n\n";
    }
    const std::string theirs = before + "dn: cn=theirs, cn=Configuration\ncn: theirs\n\n";
    constexpr int most_tries = 100;
    for (int i = 0; i < most_tries; ++i) {
        folder.write("conf", before);
        bool were_faster = false;
        update_result result;
        {
            const tests::after_reading somebody(options.file, [&] {
                try {
                    LDIF_File::replace(options.file, "", theirs, before);
                    were_faster = true;
                } catch (const LDIF_Exception&) {  // they came too late
                }
            });
            result = change("dn: cn=ours, cn=Configuration\nchangetype: add\ncn: ours\n");
        }
        if (were_faster) {
            EXPECT_EQ(result.before, theirs);
            EXPECT_EQ(folder.read("conf"), theirs + "dn: cn=ours, cn=Configuration\ncn: ours\n\n");
            EXPECT_EQ(folder.read("conf.bak"), theirs);
            return;
        }
    }
    FAIL() << "nobody else was fast enough";
}

TEST_F(update_test, TellsAllRecordsThatDoNotPassTheCheck) {
    folder.write("conf", small);
    const std::string message = failure_of(
        "dn: a\ndelete: x\n-\n\n"
        "dn: cn=a, cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: 1\n\n"
        "dn: cn=z, cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: 0\n\n"
        "dn: cn=a, cn=Configuration\nchangetype: add\noru-slapdPort: x\n");
    EXPECT_THAT(message, testing::HasSubstr("changes.ldif:1: "));
    EXPECT_THAT(message, testing::HasSubstr("\nchanges.ldif:11: "));
    EXPECT_THAT(message, testing::HasSubstr("\nchanges.ldif:15: "));
    EXPECT_THAT(message, testing::Not(testing::HasSubstr("Already")));
}

TEST_F(update_test, AFailingRecordAmongGoodOnesLeavesTheFileAlone) {
    folder.write("conf", example);
    const identity before = file();
    failure_of(
        "dn: " + listener + "\nreplace: oru-slapdPort\noru-slapdPort: 1\n\n" + "dn: " + listener +
        "\nreplace: oru-slapdIpAddress\n-\nadd: oru-slapdSecurePort\n" +
        "oru-slapdSecurePort: 2\n\ndn: cn=New, cn=Configuration\nchangetype: add\ncn: New\n");
    EXPECT_EQ(file(), before);
    EXPECT_EQ(files(), 1u);
}

TEST_F(update_test, GoesOnWithoutTheRecordsThatFail) {
    folder.write("conf", small);
    how.goes_on = true;
    const std::string ldif =
        "dn: cn=a, cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: x\n\n"
        "dn: cn=a, cn=Configuration\nreplace: oru-slapdSuffix\n-\nadd: oru-slapdPort\n"
        "oru-slapdPort: 1\n\n"
        "dn: cn=b, cn=Configuration\nchangetype: add\ncn: b\n\n"
        "dn: cn=a, cn=Configuration\nchangetype: delete\n\n"
        "dn: cn=b, cn=Configuration\nchangetype: add\ncn: b\n\n"
        "dn: cn=b, cn=Configuration\nadd: x-note\nx-note: 1\n";
    options.is_dry_run = true;
    const update_result dry = change(ldif);
    options.is_dry_run = false;
    const update_result result = change(ldif);
    std::vector<std::string> skipped;
    for (const skipped_record& each : result.skipped) {
        skipped.push_back(std::to_string(each.line) + " " + each.dn + " " +
                          each.reason.substr(0, each.reason.find(" [")));
    }
    EXPECT_THAT(
        skipped,
        testing::ElementsAre(
            "1 cn=a, cn=Configuration changes.ldif:3: Value is not valid integer syntax",
            "5 cn=a, cn=Configuration changes.ldif:9: Attribute may not have multiple values.",
            "15 cn=a, cn=Configuration changes.ldif:15: Entries stand below it: -r deletes them as "
            "well",
            "18 cn=b, cn=Configuration changes.ldif:18: The entry is there already"));
    EXPECT_TRUE(result.is_changed);
    EXPECT_EQ(folder.read("conf"), small + "dn: cn=b, cn=Configuration\ncn: b\nx-note: 1\n\n");
    EXPECT_EQ(dry.after, result.after);
    EXPECT_EQ(dry.skipped.size(), result.skipped.size());
}

namespace {

/// Of another form than a write's, so that what is put back is not what was read.
const std::string unsorted = [] {
    std::string text =
        "version: 1\n# above all\ncharset: x\n\n# first\ndn: CN=Configuration\n"
        "# of the password\noru-slapdAdminPW: {AES256}EKYCnJ\nX-List: a\ncn: Configuration\n"
        "# of a list\nx-list: b\n  c\noru-slapdsuffix: O=X , c=y\noru-slapdInvalidLine: no colon\n"
        "oru-slapdPort: 0389\n\ndn: cn=a, cn=Configuration\ncn: a\n# a long one\n";
    for (int i = 0; i < 120; ++i) {  // too many to be copied
        text += "X-LIST: " + std::to_string(i) + "\n";
    }
    return text + "\n# the end\n";
}();

modification random_modification(std::mt19937& random) {
    // What an attribute may get: values that it has, others, and what is refused.
    const struct {
        const char* name;
        std::vector<std::string> values;
    } rows[] = {
        {"x-list", {"a", "b c", "0", "7", "19", "new", "newer", " unreadable"}},
        {"X-New", {"a", "b", "c", " unreadable"}},
        {"oru-slapdPort", {"389", "1", "2"}},
        {"ORU-slapdSuffix", {"o=x, c=y", "o=z", "c=y"}},
        {"oru-slapdAdminPW", {"{AES256}EKYCnJ", "{SHA}unknown"}},
        {"charset", {"x", "y"}},
    };
    const auto& row = rows[random() % std::size(rows)];
    modification change;
    change.kind = static_cast<modification::operation>(random() % 3);
    change.attribute = row.name;
    const bool may_be_none = change.kind != modification::add;
    for (size_t count = random() % 3 + (may_be_none ? 0 : 1); count > 0; --count) {
        change.values.push_back(row.values[random() % row.values.size()]);
    }
    return change;
}

std::vector<change_record> random_records(std::mt19937& random) {
    constexpr const char* dns[] = {"", "cn=Configuration", "cn=a, cn=Configuration", "cn=none"};
    std::vector<change_record> records(12);
    for (change_record& record : records) {
        record.dn = dns[random() % std::size(dns)];
        record.line = static_cast<int>(&record - records.data()) + 1;
        for (size_t count = random() % 5 + 1; count > 0; --count) {
            record.modifications.push_back(random_modification(random));
        }
    }
    return records;
}

}  // namespace

TEST_F(update_test, ARecordThatFailsInTheMiddleIsLeftOutAsIfItHadNotBeenThere) {
    std::mt19937 random(17);
    folder.write("conf", unsorted);
    options.is_dry_run = true;
    size_t skipped = 0;
    size_t changed = 0;
    for (int i = 0; i < 300 && !HasFailure(); ++i) {
        std::vector<change_record> records = random_records(random);
        how.goes_on = true;
        const update_result all = update(options, records, how);
        for (const skipped_record& each : all.skipped) {
            std::erase_if(records, [&](const auto& record) { return record.line == each.line; });
        }
        how.goes_on = false;
        const update_result good = update(options, records, how);
        EXPECT_EQ(all.after, good.after);
        EXPECT_EQ(all.is_changed, good.is_changed);
        skipped += all.skipped.size();
        changed += good.is_changed ? 1 : 0;
    }
    EXPECT_GT(skipped, 1000u);
    EXPECT_GT(changed, 100u);
}

TEST_F(update_test, NothingIsWrittenWhenAllRecordsAreLeftOut) {
    folder.write("conf", small);
    const identity before = file();
    how.goes_on = true;
    const update_result result = change("dn: cn=z\nchangetype: delete\n");
    EXPECT_FALSE(result.is_changed);
    EXPECT_EQ(result.skipped.size(), 1u);
    EXPECT_EQ(file(), before);
}

TEST_F(update_test, TakesTheAdministratorsPasswordOnly) {
    folder.write("conf", example);
    const identity before = file();
    const std::string set = "dn: " + listener + "\nreplace: oru-slapdPort\noru-slapdPort: 1389\n";
    const struct {
        const char* dn;
        const char* password;
        bool is_dry_run;
    } refused[] = {
        {"cn=root", "wrong", false},
        {"cn=root", "wrong", true},
        {"cn=root", "", false},
        {"cn=somebody", "secret", false},
    };
    for (const auto& row : refused) {
        options.bind_dn = row.dn;
        options.password_file = folder.write("password", std::string(row.password) + "\n");
        options.is_dry_run = row.is_dry_run;
        EXPECT_EQ(failure_of(set), options.file +
                                       ": not the administrator's DN and password "
                                       "[Invalid credentials (49)]");
        EXPECT_EQ(file(), before);
    }
    options = {};
    options.file = folder.file("conf");
    change("dn: cn=Configuration\nreplace: oru-slapdAdminPW\noru-slapdAdminPW: typed\n");
    options.bind_dn = "cn=root";
    options.password_file = folder.write("password", "typed\n");
    EXPECT_TRUE(change(set).is_changed);
}

TEST_F(update_test, AFileThatDoesNotLoadIsNamedWithAHint) {
    folder.write("conf", small + "\ndn: a\ncn: a\n\n");
    const identity before = file();
    const std::string message = failure_of("dn: cn=z\nchangetype: delete\n");
    EXPECT_THAT(message, testing::StartsWith(options.file + ":20: "));
    EXPECT_THAT(message,
                testing::EndsWith("\n  hint: `cfg32 check` tells everything that is wrong"));
    EXPECT_EQ(file(), before);
}

TEST_F(update_test, AFailureOfTheSystemWhileLoadingIsToldAsThat) {
    folder.write("conf", small);
    rlimit before{};
    ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &before), 0);
    // Room for the private copy, but not to open it.
    const auto next = static_cast<rlim_t>(unique_fd(dup(STDIN_FILENO)).get());
    const rlimit one_more{next + 1, before.rlim_max};
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &one_more), 0);
    const std::string message =
        failure_of("dn: cn=b, cn=a, cn=Configuration\nchangetype: delete\n");
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &before), 0);
    EXPECT_EQ(message, options.file + ": Too many open files [Connection error (91)]");
}

TEST_F(update_test, AMissingFileIsAConnectionError) {
    EXPECT_EQ(failure_of(""), options.file + ": No such file or directory [Connection error (91)]");
}

TEST_F(update_test, AFileThatAnotherProgramKeepsIsBusy) {
    folder.write("conf", small);
    const identity before = file();
    struct stat status {};
    const unique_fd holder = open_regular(options.file.c_str(), status);
    ASSERT_EQ(flock(holder.get(), LOCK_EX), 0);
    EXPECT_EQ(failure_of("dn: cn=a, cn=Configuration\ndelete: cn\n-\n"),
              options.file + ": in use by another process [DSA is busy (51)]");
    EXPECT_EQ(file(), before);
}

TEST_F(update_test, AProgramThatReadsKeepsTheFileFromBeingWritten) {
    folder.write("conf", small);
    const identity before = file();
    struct stat status {};
    const unique_fd reader = open_regular(options.file.c_str(), status);
    ASSERT_EQ(flock(reader.get(), LOCK_SH), 0);
    EXPECT_THAT(failure_of("dn: cn=a, cn=Configuration\ndelete: cn\n-\n"),
                testing::HasSubstr("[DSA is busy (51)]"));
    EXPECT_EQ(file(), before);
    EXPECT_FALSE(change("dn: cn=a, cn=Configuration\nreplace: x-none\n-\n").is_changed);
}

TEST_F(update_test, UnusableLinesDoNotReachTheBackup) {
    const std::string before = small + "dn: cn=c, cn=Configuration\noru-slapdPort: x\n\n";
    folder.write("conf", before);
    EXPECT_FALSE(change("dn: cn=c, cn=Configuration\nreplace: x-none\n-\n").is_changed);
    EXPECT_EQ(folder.read("conf"), before);
    EXPECT_EQ(files(), 1u);

    const update_result result =
        change("dn: cn=c, cn=Configuration\nadd: oru-slapdPort\noru-slapdPort: 1\n");
    EXPECT_EQ(result.before, before);
    EXPECT_EQ(folder.read("conf"),
              small +
                  "dn: cn=c, cn=Configuration\noru-slapdInvalidLine: oru-slapdPort: x\n"
                  "oru-slapdPort: 1\n\n");
    EXPECT_EQ(result.after, folder.read("conf"));
    EXPECT_EQ(folder.read("conf.bak"), before);
    EXPECT_EQ(files(), 2u);
}

TEST_F(update_test, MakesTheBackupThatIsAskedFor) {
    const std::string set = "dn: cn=a, cn=Configuration\nreplace: oru-slapdPort\noru-slapdPort: ";
    folder.write("conf", small);
    options.has_no_backup = true;
    EXPECT_TRUE(change(set + "1\n").is_changed);
    EXPECT_EQ(files(), 1u);
    const std::string before = folder.read("conf");
    options.has_no_backup = false;
    options.backup_option = folder.file("other");
    EXPECT_TRUE(change(set + "2\n").is_changed);
    EXPECT_EQ(folder.read("other"), before);
    EXPECT_EQ(files(), 2u);
}

TEST_F(update_test, EncodesWithTheKey) {
    folder.write("conf", small);
    options.key_file = folder.write("key", "0123456789abcdef");
    std::filesystem::permissions(options.key_file, std::filesystem::perms::owner_read);
    const update_result result =
        change("dn: cn=a, cn=Configuration\nadd: oru-slapdDbUserPW\noru-slapdDbUserPW: typed\n");
    EXPECT_THAT(result.after, testing::HasSubstr("oru-slapdDbUserPW: {AES128}"));
}

}  // namespace cfg32::tool
