// A process that chooses another locale while a store is loaded: in each, names are compared as
// strcasecmp does, and nothing of the store is lost from sight.

#include <gmock/gmock.h>

#include "modifications.h"
#include "other_locale.h"
#include "stores.h"

using namespace cfg32::tests;

namespace {

/// In Turkish I and i are different letters, and in one byte each has its own letter of the other
/// case, beyond ASCII.
const char* const others[] = {"tr_TR.UTF-8", "tr_TR.ISO-8859-9"};

struct changed_locale : store_test {
    /// Calls check() in each of the locales, with a store that was loaded before.
    template <class Check>
    void in_each(const std::string& text, Check check) {
        for (const char* name : others) {
            SCOPED_TRACE(name);
            const auto file = store(store_head + text);
            // Whatever is made at the first use.
            file->matches(cfg32::dn_path(""), LDIF_Search_Results::Subtree, LDIF_Filter("cn=*"));
            const other_locale other(name);
            ASSERT_TRUE(other.is_there());
            check(*file);
        }
    }
};

std::string numbered_lines(const std::string& name, const std::string& value) {
    std::string lines;
    for (int i = 0; i < 20; ++i) {
        lines += name + ": " + value + std::to_string(i) + "\n";
    }
    return lines;
}

}  // namespace

TEST_F(changed_locale, EntriesAreFoundMergedAndErased) {
    in_each("dn: cn=INDIA, o=x\ncn: INDIA\n\ndn: cn=iris, o=x\ncn: iris\n\n", [](LDIF_File& file) {
        EXPECT_NE(file.root().find(dn_of("cn=INDIA,o=x")), nullptr);
        EXPECT_NE(file.root().find(dn_of("CN=iris,O=x")), nullptr);
        file.add(dn_of("cn=INDIA,o=x"), modifications({{operations::add, "sn", {"a"}}}).records());
        EXPECT_EQ(file.root().children().size(), 2U);
        file.erase(dn_of("cn=INDIA,o=x"), false);
        EXPECT_EQ(text_of(file), store_head + "dn: cn=iris, o=x\ncn: iris\n\n");
    });
}

TEST_F(changed_locale, AnAncestorThatTurnsUpTakesOverItsDescendants) {
    in_each("dn: cn=INDIA, ou=IT, o=x\ncn: INDIA\n\n", [](LDIF_File& file) {
        file.add(dn_of("ou=IT,o=x"), modifications({{operations::add, "ou", {"IT"}}}).records());
        ASSERT_EQ(file.root().children().size(), 1U);
        EXPECT_EQ(file.root().children().front().children().size(), 1U);
    });
}

TEST_F(changed_locale, ValuesOfALongListAreFoundAndErased) {
    const std::string lines = numbered_lines("objectclass", "I");
    in_each("dn: o=x\n" + lines + "\n", [&](LDIF_File& file) {
        const auto modify = [&](int operation, const char* value) {
            file.modify(dn_of("o=x"),
                        modifications({{operation, "objectclass", {value}}}).records());
        };
        modify(operations::add, "I5");
        EXPECT_EQ(text_of(file), store_head + "dn: o=x\n" + lines + "\n");
        modify(operations::del, "I5");
        EXPECT_THAT(text_of(file), testing::Not(testing::HasSubstr(": I5\n")));
    });
}

TEST_F(changed_locale, AnIndexOfValuesStaysGood) {
    const std::string lines = numbered_lines("objectclass", "I");
    for (const char* name : others) {
        const auto file = store(store_head + "dn: o=x\n" + lines + "\n");
        const auto modify = [&](int operation, const char* value) {
            file->modify(dn_of("o=x"),
                         modifications({{operation, "objectclass", {value}}}).records());
        };
        modify(operations::add, "I20");  // by the index
        const other_locale other(name);
        ASSERT_TRUE(other.is_there());
        modify(operations::add, "I20");
        modify(operations::del, "I20");
        EXPECT_EQ(text_of(*file), store_head + "dn: o=x\n" + lines + "\n");
    }
}

TEST_F(changed_locale, WhatWasCheckedIsNotCheckedAgain) {
    const std::string head = store_head + "dn: o=x\n";
    for (const char* name : others) {
        const auto file = store(head + "oru-slapdDerefAliases: FIND\ncn: a\n\n");
        const other_locale other(name);
        ASSERT_TRUE(other.is_there());
        EXPECT_EQ(text_of(*file), head + "cn: a\noru-slapdDerefAliases: FIND\n\n");
        EXPECT_EQ(file->root().children().front().attributes().size(), 2U);
    }
}
