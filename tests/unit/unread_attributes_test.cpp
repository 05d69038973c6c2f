// Entries whose attributes are read only when somebody looks at them.

#include "unread_attributes.h"

#include <gmock/gmock.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "LDIF_Line.h"
#include "LDIF_Search.h"
#include "failing_new.h"
#include "line_source.h"
#include "stores.h"
#include "utf8_locale.h"

using namespace cfg32::tests;

namespace {

const std::string dn_line = "dn: cn=a\n";

struct unread : store_test {
    /// A store of which the last entry has those lines.
    std::unique_ptr<LDIF_File> store_of(const std::string& lines) {
        return store(store_head + "dn: cn=first\n\n" + dn_line + lines + "\n");
    }
    static const LDIF_Entry& entry_of(const LDIF_File& file) {
        return file.root().children().back();
    }
};

/// True while nobody has looked at the attributes, if their lines are printed as they stand.
bool has_canonical_lines(const LDIF_Entry& entry) { return entry.unread().is_canonical(); }

/// Looks again and again, the first, second, ... allocation failing each time, until it is done.
template <class Look, class IsDone>
void with_failing_allocations(Look look, IsDone is_done) {
    for (long which = 0; !is_done(); ++which) {
        try {
            failing_allocation failing(which);
            look();
        } catch (const LDIF_Exception& e) {
            EXPECT_EQ(e.sysErrno, ENOMEM) << which;
        } catch (const std::bad_alloc&) {
        }
        ASSERT_LT(which, 100);
    }
}

/// The lines as attributes, read one by one.
LDIF_Attributes read_at_once(const std::string& lines) {
    LDIF_Attributes attributes;
    LDIF_Comment pending;
    LDIF_Line line;
    cfg32::line_source source(lines);
    for (int last = line.next(source, 0); line.type != LDIF_Line::endOfFile;
         last = line.next(source, last)) {
        if (line.type == LDIF_Line::attr) {
            attributes += LDIF_Attribute(nullptr, line, pending);
            pending.clear();
        } else {
            pending += line;
        }
    }
    return attributes;
}

/// Lines of attributes that are written in many ways; most of them plainly.
class random_lines {
  public:
    explicit random_lines(unsigned seed) : random_(seed) {}

    std::string lines() {
        std::string text;
        for (unsigned count = random_() % 7; count > 0; --count) {
            text += one_of({"", "", "", "# c\n", "#\n# \xc3\xa9\n"}) + line();
        }
        return text;
    }

    std::string filter() {
        return "(" + one_of({"cn", "CN", "oru-slapdPort", "oru-slapdSuffix", "unknown", "sn"}) +
               "=" + one_of({"*", "a", "A", "389", "o=b", "O=\"b\"", "b c", "x"}) + ")";
    }

  private:
    std::string line() {
        switch (random_() % 8) {
            case 0:
                return "oru-slapdPort" + separator() + one_of({"389", "389", "0389", "636 "}) +
                       "\n";
            case 1:
                return "oru-slapdSuffix" + separator() +
                       one_of({"o=b", "o=b", "O=B", "o=\"b\"", "o=b,c=d", "cn=a + o=b"}) + "\n";
            case 2:
                return one_of({"objectclass", "objectClass"}) + separator() + "top\n";
            default:
                return one_of({"cn", "cn", "cn", "CN", "sn", "unknown", "Unknown"}) + separator() +
                       one_of({"a", "a", "A", "b", "b c", "", "a\n b", "a \n  b", "\xc3\xa9"}) +
                       one_of({"", "", "", "", " ", "\r"}) + "\n";
        }
    }
    std::string separator() { return one_of({": ", ": ", ": ", ": ", ": ", ": ", ":", "::  "}); }
    std::string one_of(const std::vector<std::string>& choices) {
        return choices[random_() % choices.size()];
    }

    std::mt19937 random_;
};

}  // namespace

TEST_F(unread, LinesThatAreWrittenPlainlyAndInOrderAreLeftUntilSomebodyLooks) {
    for (const char* lines :
         {"cn: a\n", "cn: a\ncn: b\nsn: c\n", "# c\ncn: a\ncn: b\n# d\n# e\nsn: b\n",
          "oru-slapdPort: 389\n", "oru-slapdSuffix: o=b\noru-slapdSuffix: o=c\n",
          "oru-slapdAdminPW: {SSHA}x\n", "objectClass: top\n", "a-b: x: y #\n"}) {
        const auto file = store_of(lines);
        const LDIF_Entry& entry = entry_of(*file);
        EXPECT_TRUE(has_canonical_lines(entry)) << lines;
        EXPECT_EQ(entry.str(), dn_line + lines + "\n");
        EXPECT_TRUE(has_canonical_lines(entry)) << lines;
        EXPECT_EQ(entry.attributes().str(), lines);
        EXPECT_FALSE(has_canonical_lines(entry)) << lines;
        EXPECT_EQ(entry.str(), dn_line + lines + "\n");
    }
}

TEST_F(unread, LinesThatAreWrittenOtherwiseAreNotPrintedAsTheyStand) {
    const struct {
        const char* lines;
        const char* printed;
    } rows[] = {
        {"cn:a\n", "cn: a\n"},
        {"cn:  a\n", "cn: a\n"},
        {"cn: a \n", "cn: a\n"},
        {"cn : a\n", "cn: a\n"},
        {"cn:: a\n", "cn: a\n"},
        {"cn: a\n b\n", "cn: ab\n"},
        {"cn:\n", "cn: \n"},
        {"cn: a\r\n", "cn: a\n"},
        {"sn: a\ncn: b\n", "cn: b\nsn: a\n"},
        {"cn: a\ncn: A\n", "cn: a\n"},
        {"# c\ncn: a\n# d\ncn: b\n", "# c\n# d\ncn: a\ncn: b\n"},
        {"cn: a\nCN: b\n", "cn: a\ncn: b\n"},
        {"oru-slapdPort: 0389\n", "oru-slapdPort: 389\n"},
        {"oru-slapdSuffix: o=b,c=d\n", "oru-slapdSuffix: o=b, c=d\n"},
        {"oru-slapdSuffix: o=b\noru-slapdSuffix: O=B\n", "oru-slapdSuffix: o=b\n"},
        {"cn: a\nno separator\n", "cn: a\noru-slapdInvalidLine: no separator: \n"},
        {"oru-slapdPort: x\n", "oru-slapdInvalidLine: oru-slapdPort: x\n"},
    };
    for (const auto& row : rows) {
        const auto file = store_of(row.lines);
        EXPECT_FALSE(has_canonical_lines(entry_of(*file))) << row.lines;
        EXPECT_EQ(entry_of(*file).str(), dn_line + row.printed + "\n");
    }
}

TEST_F(unread, LinesThatAreWrittenOtherwiseAreWrittenAnewOnce) {
    const struct {
        const char* lines;
        const char* printed;
    } rows[] = {
        {"cn:  a\n", "cn: a\n"},
        {"cn: a\n b\n", "cn: ab\n"},
        {"cn:\n a\n", "cn: a\n"},
        {"# c\nsn: a\n# d\ncn: b\n", "# d\ncn: b\n# c\nsn: a\n"},
        {"cn: a\ncn: A\n", "cn: a\n"},
        {"# c\ncn: a\n# d\ncn: b\n", "# c\n# d\ncn: a\ncn: b\n"},
        {"cn: a\nCN: b\n", "cn: a\ncn: b\n"},
    };
    for (const auto& row : rows) {
        const auto file = store_of(row.lines);
        const LDIF_Entry& entry = entry_of(*file);
        ASSERT_FALSE(has_canonical_lines(entry)) << row.lines;
        EXPECT_TRUE(LDIF_Filter("(cn=*)").match(entry)) << row.lines;
        ASSERT_TRUE(has_canonical_lines(entry)) << row.lines;
        EXPECT_EQ(entry.unread().text(), row.printed);
        EXPECT_EQ(entry.str(), dn_line + row.printed + "\n");
        EXPECT_EQ(entry.attributes().str(), row.printed);
        EXPECT_EQ(entry.str(), dn_line + row.printed + "\n");
    }
}

// A value would lose the blank before it, a text without one would be no line of a value, and
// whatever is long is found faster in arrays.
TEST_F(unread, WhatWouldNotBeReadAsItIsWrittenIsNotWrittenAnew) {
    std::string many_names;
    std::string many_values;
    for (int i = 0; i < 100; ++i) {
        many_names += "a" + std::to_string(200 - i) + ": v\n";
        many_values += "sn: " + std::to_string(i) + "\n";
    }
    for (const std::string& lines :
         {std::string("cn:\n  a\n"), std::string("cn:\n"), std::string("sn: b\n# c\n cn: a\n"),
          std::string("sn: a\ncn:\n"), many_names, many_values}) {
        const auto file = store_of(lines);
        const LDIF_Entry& entry = entry_of(*file);
        EXPECT_FALSE(LDIF_Filter("(ou=*)").match(entry)) << lines;
        EXPECT_TRUE(entry.unread().empty()) << lines;
        EXPECT_EQ(entry.attributes().str(), read_at_once(lines).str());
    }
}

// A comparison of passwords may fail, and that is to be told by the load.
TEST_F(unread, ASecondPasswordIsComparedAtOnce) {
    for (const char* lines : {"oru-slapdAdminPW: {SSHA}x\noru-slapdAdminPW: {SSHA}y\n",
                              "oru-slapdAdminPW: {SSHA}x\ncn: a\noru-slapdAdminPW: {SSHA}y\n"}) {
        const auto file = store_of(lines);
        EXPECT_THAT(entry_of(*file).str(),
                    testing::HasSubstr("oru-slapdInvalidLine: oru-slapdAdminPW: {SSHA}y\n"));
    }
}

TEST_F(unread, ACommentBehindTheLastAttributeIsTheNextEntrys) {
    const auto file = store(store_head + "dn: cn=a\ncn: a\n# of b\n\ndn: cn=b\ncn: b\n\n");
    EXPECT_EQ(text_of(*file), store_head + "dn: cn=a\ncn: a\n\n# of b\ndn: cn=b\ncn: b\n\n");
    EXPECT_EQ(file->root().children().front().attributes().str(), "cn: a\n");
}

TEST_F(unread, WhateverTheLinesTheAttributesAreTheSameAsReadAtOnce) {
    random_lines random(1);
    int unread_count = 0;
    for (int round = 0; round < 2000; ++round) {
        const std::string lines = random.lines();
        SCOPED_TRACE(lines);
        LDIF_Attributes expected;
        try {
            expected = read_at_once(lines);
        } catch (const LDIF_Exception&) {
            continue;  // a line that a load keeps aside, or refuses
        }
        std::unique_ptr<LDIF_File> file;
        try {
            file = store_of(lines);
        } catch (const LDIF_Exception& e) {
            FAIL() << e.msg;
        }
        const LDIF_Entry& entry = entry_of(*file);
        unread_count += has_canonical_lines(entry);
        const std::string printed = entry.str();
        EXPECT_EQ(entry.attributes().str(), expected.str());
        EXPECT_EQ(printed, entry.str());
    }
    EXPECT_GT(unread_count, 40);
}

TEST_F(unread, AFilterMatchesWhatItMatchesWhenTheAttributesAreRead) {
    random_lines random(2);
    int matches = 0;
    for (int round = 0; round < 300; ++round) {
        std::unique_ptr<LDIF_File> file;
        std::string lines;
        try {
            file = store_of(lines = random.lines());
        } catch (const LDIF_Exception&) {
            continue;
        }
        const LDIF_Entry& entry = entry_of(*file);
        const LDIF_Entry read(entry);  // a copy has attributes of its own
        const auto again = store_of(lines);
        for (int i = 0; i < 20; ++i) {
            const std::string text = random.filter();
            const auto result = [&](const LDIF_Entry& matched) -> std::string {
                try {
                    return LDIF_Filter(text).match(matched) ? "match" : "no match";
                } catch (const LDIF_Exception& e) {
                    return e.msg;
                }
            };
            const std::string expected = result(read);
            EXPECT_EQ(result(entry_of(*again)), expected) << text << "\n" << lines;
            matches += expected == "match";
        }
    }
    EXPECT_GT(matches, 200);
}

TEST_F(unread, ANameEndsAtItsColonWhateverTheFilterAsksFor) {
    const auto file = store_of("cn: a: b\n");
    ASSERT_TRUE(has_canonical_lines(entry_of(*file)));
    EXPECT_FALSE(LDIF_Filter("(cn: a=*)").match(entry_of(*file)));
    EXPECT_FALSE(LDIF_Filter("(cn: a=b)").match(entry_of(*file)));
    EXPECT_TRUE(LDIF_Filter("(cn=a: b)").match(entry_of(*file)));
}

TEST_F(unread, ANumberSignBeginsNoNameWhateverTheFilterAsksFor) {
    const auto file = store_of("#cn: a\ncn: b\n");
    EXPECT_FALSE(LDIF_Filter("(#cn=*)").match(entry_of(*file)));
    EXPECT_TRUE(LDIF_Filter("(cn=b)").match(entry_of(*file)));
}

// Its line would be read as one without a colon.
TEST_F(unread, AnAttributeWithoutANameIsNoCanonicalLine) {
    const auto file = store_of("# c\n : a\nsn:\n b\n");
    const LDIF_Entry& entry = entry_of(*file);
    EXPECT_EQ(entry.printed_lines(), nullptr);
    EXPECT_EQ(entry.attributes().begin()->name().text(), "");
    EXPECT_EQ(entry.attributes().str(), "# c\n: a\nsn: b\n");
}

TEST_F(unread, ACopyOutlivesTheStore) {
    for (const char* lines : {"cn: a\nsn: b\n", "sn: b\ncn: a\n"}) {
        auto file = store_of(lines);
        entry_of(*file).printed_lines();
        const LDIF_Entry copy(entry_of(*file));
        file.reset();
        EXPECT_EQ(copy.str(), dn_line + "cn: a\nsn: b\n\n");
    }
}

TEST_F(unread, ExhaustedMemoryLeavesTheLinesToBeWrittenAnewLater) {
    const auto file = store_of("sn: c\n# c\ncn: a\ncn: b\nunknown: d\n");
    const LDIF_Entry& entry = entry_of(*file);
    with_failing_allocations([&] { entry.printed_lines(); },
                             [&] { return has_canonical_lines(entry); });
    EXPECT_EQ(entry.attributes().str(), "# c\ncn: a\ncn: b\nsn: c\nunknown: d\n");
}

TEST_F(unread, ExhaustedMemoryLeavesTheLinesToBeReadLater) {
    const std::string lines = "# c\ncn: a\ncn: b\nsn: c\nunknown: d\n";
    const auto file = store_of(lines);
    const LDIF_Entry& entry = entry_of(*file);
    with_failing_allocations([&] { entry.attributes(); },
                             [&] { return !has_canonical_lines(entry); });
    EXPECT_EQ(entry.attributes().str(), lines);
}

// Neither many names out of order nor many values cost more than their number.
TEST_F(unread, WideEntriesAndLongListsAreReadInOrder) {
    std::string lines;
    std::string expected;
    for (int i = 0; i < 3000; ++i) {
        const std::string line = "a" + std::to_string(100000 + i) + ": v\n";
        expected += line;
        lines = line + lines;
    }
    for (int i = 0; i < 3000; ++i) {
        const std::string line = "cn: " + std::to_string(i) + "\n";
        expected += line;
        lines += line;
    }
    const auto file = store_of(lines + "cn: 2999\n");
    EXPECT_EQ(entry_of(*file).attributes().str(), expected);
    EXPECT_EQ(entry_of(*file).attributes().size(), 3001U);
}
