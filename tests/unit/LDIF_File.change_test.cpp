// Modifications of an entry do what they say.

#include <gmock/gmock.h>

#include <cerrno>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "failing_new.h"
#include "modifications.h"
#include "modified_store.h"

using namespace cfg32::tests;
using namespace cfg32::tests::operations;
using namespace std::string_literals;
using testing::StartsWith;

using LDIF_File_modify = modified_store_test;

TEST_F(LDIF_File_modify, ModificationsAreApplied) {
    const struct {
        const char* what;
        const char* before;
        std::vector<change> changes;
        const char* after;
    } rows[] = {
        {"add: a new attribute takes its place",
         "cn: a\nsn: 1\n",
         {{add, "ou", {"x"}}},
         "cn: a\nou: x\nsn: 1\n"},
        {"add: further values follow",
         "sn: 1\n",
         {{add, "sn", {"3", "2"}}},
         "sn: 1\nsn: 3\nsn: 2\n"},
        {"add: a value that is there is dropped",
         "sn: 1\n",
         {{add, "sn", {"1", "2", "2"}}},
         "sn: 1\nsn: 2\n"},
        {"add: equality is the syntax's",
         "objectclass: top\n",
         {{add, "objectclass", {"TOP", "x"}}},
         "objectclass: top\nobjectclass: x\n"},
        {"add: the name is as it was written first",
         "sn: 1\n",
         {{add, "SN", {"2"}}},
         "sn: 1\nsn: 2\n"},
        {"add: a new name is as the caller writes it", "", {{add, "Sn", {"1"}}}, "Sn: 1\n"},
        {"add: no values, nothing", "sn: 1\n", {{add, "sn", {}}, {add, "ou", {}}}, "sn: 1\n"},
        {"add: no values, no look at the name", "sn: 1\n", {{add, "a:b", {}}}, "sn: 1\n"},
        {"add: an empty value is one", "", {{add, "sn", {""}}}, "sn: \n"},
        {"add: values are stored as their syntax stores them",
         "",
         {{add, "oru-slapdPort", {"0389"}}, {add, "oru-slapdAdminDN", {"CN=x;o=y"}}},
         "oru-slapdAdminDN: CN=x, o=y\noru-slapdPort: 389\n"},
        {"delete: the attribute", "ou: x\nsn: 1\nsn: 2\n", {{del, "SN", {}}}, "ou: x\n"},
        {"delete: values", "sn: 1\nsn: 2\nsn: 3\n", {{del, "sn", {"3", "1"}}}, "sn: 2\n"},
        {"delete: equality is the syntax's",
         "objectclass: top\nobjectclass: x\n",
         {{del, "objectclass", {"TOP"}}},
         "objectclass: x\n"},
        {"delete: a value that is not there", "sn: 1\n", {{del, "sn", {"2"}}}, "sn: 1\n"},
        {"delete: the last value takes the attribute with it",
         "ou: x\nsn: 1\nsn: 2\n",
         {{del, "sn", {"2", "1"}}},
         "ou: x\n"},
        {"delete: values after the last are not looked at",
         "cn: a\noru-slapdPort: 389\n",
         {{del, "oru-slapdPort", {"389", "no number"}}},
         "cn: a\n"},
        {"delete: a comment goes with its attribute", "# c\nsn: 1\n", {{del, "sn", {}}}, ""},
        {"replace: the values",
         "ou: x\nsn: 1\nsn: 2\n",
         {{replace, "sn", {"2", "3"}}},
         "ou: x\nsn: 2\nsn: 3\n"},
        {"replace: the name and the comment stay",
         "# c\nsn: 1\n",
         {{replace, "SN", {"2"}}},
         "# c\nsn: 2\n"},
        {"replace: no values remove the attribute",
         "ou: x\nsn: 1\n",
         {{replace, "sn", {}}},
         "ou: x\n"},
        {"replace: a missing attribute is added",
         "sn: 1\n",
         {{replace, "ou", {"x", "y"}}},
         "ou: x\nou: y\nsn: 1\n"},
        {"replace: no values for a missing attribute", "sn: 1\n", {{replace, "ou", {}}}, "sn: 1\n"},
        {"replace: repeated values are dropped",
         "sn: 1\n",
         {{replace, "sn", {"2", "2"}}},
         "sn: 2\n"},
        {"replace: a single value by another",
         "oru-slapdPort: 389\n",
         {{replace, "oru-slapdPort", {"636"}}},
         "oru-slapdPort: 636\n"},
        {"several are applied in their order",
         "sn: 1\n",
         {{add, "sn", {"2"}}, {del, "sn", {"1"}}, {replace, "ou", {"x"}}, {add, "ou", {"y"}}},
         "ou: x\nou: y\nsn: 2\n"},
        {"what one removes another adds again",
         "oru-slapdPort: 389\n",
         {{del, "oru-slapdPort", {}}, {add, "oru-slapdPort", {"636"}}},
         "oru-slapdPort: 636\n"},
        {"binary values",
         "sn: 1\nsn: 2\nou: x\n",
         {{add | binary, "sn", {"3"}},
          {del | binary, "sn", {"1"}},
          {replace | binary, "ou", {"y"}}},
         "ou: y\nsn: 2\nsn: 3\n"},
        {"binary values end at a NUL",
         "",
         {{add | binary, "sn", {"ab\0cd"s, "\0x"s}}},
         "sn: ab\nsn: \n"},
        {"no binary values",
         "sn: 1\nou: x\n",
         {{add | binary, "sn", {}}, {del | binary, "sn", {}}, {replace | binary, "ou", {}}},
         ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        const auto file = store_with(row.before);
        const std::string before = folder.read("conf");
        modify(*file, row.changes);
        EXPECT_EQ(lines(*file), row.after);
        EXPECT_EQ(folder.read("conf"), before) << "it is a flush that writes";
    }
}

TEST_F(LDIF_File_modify, LengthOfABinaryValueIsNotLookedAt) {
    const auto file = store_with("");
    modifications mods({{add | binary, "sn", {"abc", ""}}});
    mods.record(0).mod_bvalues[0]->bv_len = 1;
    mods.record(0).mod_bvalues[1]->bv_len = 1000;
    mods.record(0).mod_bvalues[1]->bv_val = nullptr;
    file->modify(dn_of("cn=a,o=b"), mods.records());
    EXPECT_EQ(lines(*file), "sn: abc\nsn: \n");
}

TEST_F(LDIF_File_modify, NoArrayOfValuesIsNoValues) {
    for (const int flag : {0, binary}) {
        const auto file = store_with("ou: x\nsn: 1\nst: y\n");
        modifications mods(
            {{add | flag, "sn", {}}, {del | flag, "st", {}}, {replace | flag, "ou", {}}});
        for (size_t i = 0; i < 3; ++i) {
            if (flag != 0) {
                mods.record(i).mod_bvalues = nullptr;
            } else {
                mods.record(i).mod_values = nullptr;
            }
        }
        file->modify(dn_of("cn=a,o=b"), mods.records());
        EXPECT_EQ(lines(*file), "sn: 1\n");
    }
}

TEST_F(LDIF_File_modify, NothingToModifySucceedsEvenForAMissingEntry) {
    const auto file = store_with("sn: 1\n");
    const std::string before = text_of(*file);
    for (const char* dn : {"cn=a,o=b", "cn=missing", "cn=", ""}) {
        file->modify(dn_of(dn), nullptr);
        modify(*file, {}, dn);
    }
    EXPECT_EQ(text_of(*file), before);
}

TEST_F(LDIF_File_modify, SameValueAgainIsNoSecondOne) {
    const auto file = store_with("cn: a\noru-slapdPort: 389\n");
    modify(*file, {{add, "oru-slapdPort", {"0389", "389"}},
                   {add, "cn", {"A"}},
                   {replace, "cn", {"b", "B"}},
                   {replace, "oru-slapdMaxOpPerTransaction", {"5", "05"}}});
    EXPECT_EQ(lines(*file), "cn: b\noru-slapdMaxOpPerTransaction: 5\noru-slapdPort: 389\n");
}

TEST_F(LDIF_File_modify, ValuesThatAreThereAlreadyMayBeAddedToTwo) {
    const auto file = store_with("cn: a\ncn: b\n");
    modify(*file, {{add, "cn", {"B", "a"}}});
    EXPECT_EQ(lines(*file), "cn: a\ncn: b\n");
}

TEST_F(LDIF_File_modify, OddNamesAndValuesThatReadBackAreTaken) {
    const auto file = store_with("");
    modify(*file,
           {{add, "a b", {"x: y", ":x", "# z", "dn: cn=x", "a\tb", "-"}}, {add, "dnx", {"x"}}});
    file->flush();
    EXPECT_EQ(text_of(LDIF_File(path, "", nullptr)), text_of(*file));
    EXPECT_EQ(lines(*file),
              "a b: x: y\na b: :x\na b: # z\na b: dn: cn=x\na b: a\tb\na b: -\ndnx: x\n");
}

TEST_F(LDIF_File_modify, RootHasTheEmptyName) {
    const auto file = store_with("sn: 1\n");
    modify(*file, {{replace, "charset", {"y"}}}, "");
    EXPECT_EQ(text_of(*file), "charset: y\nversion: 1\n\ndn: o=b\n\ndn: cn=a, o=b\nsn: 1\n\n");
    const LDIF_Exception e = failure_to_modify(*file, {{add, "version", {"2"}}}, "");
    EXPECT_EQ(e.ldapErr, 21);
    EXPECT_EQ(e.entryDn, "");
    EXPECT_EQ(e.configFile, path);
}

TEST_F(LDIF_File_modify, ChildrenStayBelowAModifiedEntry) {
    const auto file = store(store_head + "dn: o=b\n\ndn: cn=a, o=b\n\ndn: o=c\n\n");
    modify(*file, {{add, "sn", {"1"}}}, "o=b");
    EXPECT_EQ(text_of(*file), store_head + "dn: o=b\nsn: 1\n\ndn: cn=a, o=b\n\ndn: o=c\n\n");
}

namespace {

/// Fails one allocation of the body after the other, until none is left to fail. prepare makes the
/// body's store anew each time. Returns the messages of the reports.
template <class Prepare, class Body>
std::vector<std::string> reports_of_exhausted_memory(const std::string& path, Prepare prepare,
                                                     Body body) {
    std::vector<std::string> messages;
    for (long which = 0;; ++which) {
        const auto file = prepare();
        try {
            failing_allocation failing(which);
            body(*file);
            if (!failing.happened()) {
                return messages;
            }
            ADD_FAILURE() << "allocation " << which << " failed and nothing was reported";
        } catch (const LDIF_Exception& e) {
            EXPECT_EQ(e.ldapErr, 80) << which;
            EXPECT_EQ(e.extErr, 1000) << which;
            EXPECT_EQ(e.sysErrno, ENOMEM) << which;
            EXPECT_EQ(e.entryDn, "cn=a, o=b") << which;
            EXPECT_EQ(e.configFile, path) << which;
            EXPECT_THAT(e.msg, StartsWith("System error in ")) << which;
            messages.push_back(e.msg);
        }
    }
}

}  // namespace

TEST_F(LDIF_File_modify, ExhaustedMemoryIsASystemErrorOfTheOperation) {
    const LDIF_DN dn = dn_of("cn=a,o=b");
    const std::string long_name = "an-attribute-" + std::string(50, 'x');
    const std::string lines_before = "sn: 1\n" + long_name + ": 1\n";
    const struct {
        const char* operation;
        std::vector<change> changes;
    } rows[] = {
        {"LDIF_File::modify()", {{add, long_name, {"2", "3"}}}},
        {"LDIF_File::modify()", {{replace, long_name, {"2", "3"}}}},
        {"LDIF_File::modify()", {{del, long_name, {"1"}}}},
        {"LDIF_File::add()", {{add, long_name, {"2"}}}},
    };
    for (const auto& row : rows) {
        modifications mods(row.changes);
        const std::string operation = row.operation;
        const auto run = [&](LDIF_File& file) {
            if (operation == "LDIF_File::modify()") {
                file.modify(dn, mods.records());
            } else {
                file.add(dn, mods.records());
            }
        };
        const auto messages = reports_of_exhausted_memory(
            path, [&] { return store_with(lines_before); }, run);
        EXPECT_THAT(messages, testing::Contains("System error in " + operation));
    }
}

TEST_F(LDIF_File_modify, ErasingAnEntryNeedsNoMemory) {
    const LDIF_DN dn = dn_of("cn=a,o=b");
    const auto messages = reports_of_exhausted_memory(
        path, [&] { return store_with("sn: 1\n"); },
        [&](LDIF_File& file) { file.erase(dn, false); });
    EXPECT_THAT(messages, testing::IsEmpty());
}
