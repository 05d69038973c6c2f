// Modifications that can't be made are refused, and the report says which it was and why.

#include <gmock/gmock.h>

#include <limits>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "failures.h"
#include "modifications.h"
#include "modified_store.h"

using namespace cfg32::tests;
using namespace cfg32::tests::operations;
using namespace std::string_literals;

using LDIF_File_refusal = modified_store_test;

TEST_F(LDIF_File_refusal, MissingEntryIsReported) {
    const auto file = store_with("sn: 1\n");
    const std::string before = text_of(*file);
    for (const char* dn : {"cn=a", "cn=x, cn=a, o=b", "o=c"}) {
        const LDIF_Exception e = failure_to_modify(*file, {{add, "sn", {"2"}}}, dn);
        EXPECT_EQ(summary(e), "32/32 Entry not found");
        EXPECT_EQ(e.entryDn, dn);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
        ASSERT_TRUE(e.cause);
        EXPECT_EQ(summary(*e.cause), "32/32 Entry not found");
        EXPECT_EQ(e.cause->entryDn, "");
    }
    EXPECT_EQ(text_of(*file), before);
}

TEST_F(LDIF_File_refusal, NameThatCannotBePrintedIsReportedAllTheSame) {
    const auto file = store_with("");
    const LDIF_Exception e = failure_to_modify(*file, {{add, "sn", {"1"}}}, "cn=");
    EXPECT_EQ(summary(e), "32/32 Entry not found");
    EXPECT_EQ(e.entryDn, "cn=");
}

// Where a value is expected, the attribute's name stands again.
TEST_F(LDIF_File_refusal, MissingAttributeOfADeletionIsReported) {
    const struct {
        change deletion;
        const char* value;
    } rows[] = {
        {{del, "Ou", {}}, "<NULL>"},
        {{del | binary, "Ou", {}}, "<NULL>"},
        {{del | binary, "Ou", {"x"}}, "<binary>"},
        {{del, "Ou", {"x", "y"}}, "Ou"},
        {{del, "", {}}, "<NULL>"},
        {{del, "a:b", {"x"}}, "a:b"},
    };
    for (const auto& row : rows) {
        const auto file = store_with("sn: 1\n");
        const LDIF_Exception e = failure_to_modify(*file, {row.deletion});
        EXPECT_EQ(summary(e), "16/16 Target attribute of MOD_DELETE not found");
        EXPECT_EQ(e.attribute, row.deletion.name);
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.attrType, nullptr);
        EXPECT_EQ(e.entryDn, "CN=A, o=b") << "as the caller wrote it";
        EXPECT_EQ(e.configFile, path);
        ASSERT_TRUE(e.cause);
        EXPECT_EQ(e.cause->value, row.value);
        EXPECT_EQ(lines(*file), "sn: 1\n");
    }
}

TEST_F(LDIF_File_refusal, NoNameIsTheEmptyOne) {
    const auto file = store_with("sn: 1\n");
    modifications mods({{del, "", {}}});
    mods.record(0).mod_type = nullptr;
    const LDIF_Exception e = failure_of([&] { file->modify(dn_of("cn=a,o=b"), mods.records()); });
    EXPECT_EQ(summary(e), "16/16 Target attribute of MOD_DELETE not found");
    EXPECT_EQ(e.attribute, "");
    mods.record(0).mod_op = add;
    file->modify(dn_of("cn=a,o=b"), mods.records());
    EXPECT_EQ(lines(*file), "sn: 1\n");
}

TEST_F(LDIF_File_refusal, UnknownOperationIsReportedWithItsFlag) {
    const struct {
        int operation;
        const char* message;
    } rows[] = {
        {3, "Unknown mod_op: 3"},
        {3 | binary, "Unknown mod_op: 131"},
        {0x100, "Unknown mod_op: 256"},
        {0x101, "Unknown mod_op: 257"},
        {-1, "Unknown mod_op: 4294967295"},
        {std::numeric_limits<int>::min(), "Unknown mod_op: 2147483648"},
    };
    for (const auto& row : rows) {
        for (const std::vector<std::string>& values : {std::vector<std::string>{}, {"2"}}) {
            const auto file = store_with("sn: 1\n");
            const LDIF_Exception e = failure_to_modify(*file, {{row.operation, "sn", values}});
            EXPECT_EQ(summary(e), "89/1010 "s + row.message);
            EXPECT_EQ(e.entryDn, "CN=A, o=b");
            EXPECT_EQ(e.configFile, path);
            EXPECT_EQ(lines(*file), "sn: 1\n");
        }
    }
}

TEST_F(LDIF_File_refusal, ModificationsBeforeTheOneThatFailsStay) {
    const struct {
        change failing;
        int code;
    } rows[] = {
        {{del, "ou", {}}, 16},
        {{7, "ou", {}}, 89},
        {{add, "oru-slapdPort", {"x"}}, 21},
        {{add, "cn", {"b"}}, 19},
    };
    for (const auto& row : rows) {
        const auto file = store_with("cn: a\nsn: 1\n");
        const LDIF_Exception e =
            failure_to_modify(*file, {{add, "sn", {"2"}}, row.failing, {add, "sn", {"3"}}});
        EXPECT_EQ(e.ldapErr, row.code);
        EXPECT_EQ(lines(*file), "cn: a\nsn: 1\nsn: 2\n");
    }
}

TEST_F(LDIF_File_refusal, SecondValueOfASingleValuedAttributeIsRefused) {
    const struct {
        const char* what;
        const char* before;
        change refused;
        const char* value;
    } rows[] = {
        {"add to one", "oru-slapdPort: 389\n", {add, "oru-slapdPort", {"636"}}, "636"},
        {"add two to one", "oru-slapdPort: 389\n", {add, "oru-slapdPort", {"389", "636"}}, "636"},
        {"add two to none", "", {add, "oru-slapdPort", {"389", "636"}}, "636"},
        {"add binary ones", "", {add | binary, "oru-slapdPort", {"389", "0636"}}, "636"},
        {"replace one by two",
         "oru-slapdPort: 1\n",
         {replace, "oru-slapdPort", {"389", "636"}},
         "636"},
        {"replace none by two", "", {replace, "oru-slapdPort", {"389", "636"}}, "636"},
        {"the old one counts as new",
         "oru-slapdPort: 1\n",
         {replace, "oru-slapdPort", {"2", "1"}},
         "1"},
        {"another name's spelling", "oru-slapdPort: 389\n", {add, "ORU-SLAPDPORT", {"636"}}, "636"},
        // A load takes what a change would not.
        {"add to two", "cn: a\ncn: b\n", {add, "cn", {"b", "c"}}, "c"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        const auto file = store_with(row.before);
        const LDIF_Exception e = failure_to_modify(*file, {row.refused});
        EXPECT_EQ(summary(e), "19/1006 Attribute may not have multiple values.");
        EXPECT_EQ(e.entryDn, "CN=A, o=b");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.attribute, row.refused.name);
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.attrType, getAttrType(row.refused.name.c_str()));
        ASSERT_TRUE(e.cause);
        EXPECT_EQ(e.cause->attrType, e.attrType);
        EXPECT_EQ(lines(*file), row.before);
    }
}

TEST_F(LDIF_File_refusal, ValueThatTheSyntaxRefusesIsReported) {
    const struct {
        change refused;
        const char* expected;
        const char* value;
    } rows[] = {
        {{add, "oru-slapdPort", {"x"}}, "21/1016 Value is not valid integer syntax", "x"},
        {{add, "oru-slapdPort", {"0"}}, "21/1015 Integer value out of range", "0"},
        {{add | binary, "oru-slapdPort", {"65536"}}, "21/1015 Integer value out of range", "65536"},
        {{add, "oru-slapdReadOnly", {"perhaps"}},
         "21/1017 value not one of attrType.enumValues",
         "perhaps"},
        {{replace, "oru-slapdAdminDN", {"cn"}}, "34/1013 Missing RDN value: cn", "cn"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.refused.name);
        const auto file = store_with("sn: 1\n");
        const LDIF_Exception e = failure_to_modify(*file, {row.refused});
        EXPECT_EQ(summary(e), row.expected);
        EXPECT_EQ(e.entryDn, "CN=A, o=b");
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.attribute, row.refused.name);
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.attrType, getAttrType(row.refused.name.c_str()));
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
        EXPECT_EQ(first_cause(e).srcFile.find("src/libraries/cfg32stl/LDIF_"), 0u);
        EXPECT_NE(first_cause(e).srcFile, e.srcFile) << "the chain begins where it was refused";
        EXPECT_EQ(summary(first_cause(e)), row.expected);
        EXPECT_EQ(lines(*file), "sn: 1\n");
    }
}

TEST_F(LDIF_File_refusal, ValueToDeleteIsCheckedBySyntaxToo) {
    const auto file = store_with("oru-slapdPort: 389\n");
    const LDIF_Exception e = failure_to_modify(*file, {{del, "oru-slapdPort", {"x"}}});
    EXPECT_EQ(summary(e), "21/1016 Value is not valid integer syntax");
    EXPECT_EQ(e.value, "x");
    EXPECT_EQ(lines(*file), "oru-slapdPort: 389\n");
}

// The old values go before the new ones are looked at by their syntax.
TEST_F(LDIF_File_refusal, ReplacementThatTheSyntaxRefusesLeavesTheAttributeWithoutValues) {
    const auto file = store_with("# c\noru-slapdPort: 389\nsn: 1\n");
    EXPECT_EQ(failure_to_modify(*file, {{replace, "oru-slapdPort", {"636", "x"}}}).extErr, 1016);
    const auto found = attributes(*file).find("oru-slapdPort");
    ASSERT_NE(found, attributes(*file).end());
    EXPECT_TRUE(found->values().empty());
    modify(*file, {{add, "oru-slapdPort", {"636"}}});
    EXPECT_EQ(lines(*file), "# c\noru-slapdPort: 636\nsn: 1\n");
}

TEST_F(LDIF_File_refusal, AttributeWithoutValuesIsDeletedWhateverIsToBeDeletedOfIt) {
    const auto file = store_with("oru-slapdPort: 389\nsn: 1\n");
    failure_to_modify(*file, {{replace, "oru-slapdPort", {"x"}}});
    modify(*file, {{del, "oru-slapdPort", {"no number"}}});
    EXPECT_EQ(attributes(*file).find("oru-slapdPort"), attributes(*file).end());
    EXPECT_EQ(lines(*file), "sn: 1\n");
}

TEST_F(LDIF_File_refusal, WhatWouldNotReadBackIsRefused) {
    const struct {
        const char* what;
        std::string name;
        std::string value;
    } rows[] = {
        {"no name", "", "x"},
        {"a colon in the name", "a:b", "x"},
        {"a name like a comment's line", "#x", "x"},
        {"a blank after the name", "x ", "x"},
        {"a blank before the name", " x", "x"},
        {"the name of DN lines", "dn", "x"},
        {"the name of DN lines in capitals", "DN", "x"},
        {"a line feed in the name", "a\nb", "x"},
        {"a carriage return in the name", "a\rb", "x"},
        {"a line feed", "sn", "a\nb"},
        {"a line feed at the end", "sn", "a\n"},
        {"a line feed alone", "sn", "\n"},
        {"a continuation", "sn", "a\n b"},
        {"a carriage return", "sn", "a\rb"},
        {"a carriage return at the end", "sn", "a\r"},
        {"a blank before", "sn", " a"},
        {"a blank behind", "sn", "a "},
        {"a tab before", "sn", "\ta"},
        {"a blank alone", "sn", " "},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        for (const int operation : {add, replace}) {
            const auto file = store_with("sn: 1\n");
            const LDIF_Exception e =
                failure_to_modify(*file, {{operation, row.name, {"good", row.value}}});
            // Of a bad name the first value is named.
            const bool is_bad_value = row.name == "sn";
            EXPECT_EQ(summary(e), "21/1005 Attribute would not read back as it is written");
            EXPECT_EQ(e.entryDn, "CN=A, o=b");
            EXPECT_EQ(e.configFile, path);
            EXPECT_EQ(e.attribute, row.name);
            EXPECT_EQ(e.value, is_bad_value ? row.value : "good");
            EXPECT_EQ(e.attrType, getAttrType(row.name.c_str()));
            EXPECT_EQ(lines(*file), "sn: 1\n");
        }
        EXPECT_EQ(
            failure_of([&] {
                const auto file = store_with("");
                file->add(dn_of("cn=new"), modifications({{add, row.name, {row.value}}}).records());
            }).extErr,
            1005);
    }
}
