#include "entry_text.h"

#include <gtest/gtest.h>

#include <string>

#include "outcome.h"

using namespace cfg32::tool;

namespace {

const std::string text =
    "# About the file.\n"
    "\n"
    "version: 1\n"
    "\n"
    "# About a,\n"
    "#   in two lines.\n"
    "dn: cn=a\n"
    "cn: a\n"
    "# About the second value.\n"
    "cn: a\n"
    "  continued\n"
    "# About what follows the blank line.\n"
    "\n"
    "no colon, and no entry\n"
    "dn: cn=b,\n"
    "  cn=a\n"
    "cn: b\n"
    "dn: cn=c\n"
    "cn: c\n"
    "\n"
    "dn: cn=twice\n"
    "\n"
    "dn: =no DN\n"
    "\n"
    "dn: CN=Twice\n"
    "\n"
    "dn: cn=last\n"
    "cn: without newline";

struct row {
    const char* dn;
    std::string part;
    int first_line;
};

const row rows[] = {
    {"cn=a",
     "# About a,\n#   in two lines.\ndn: cn=a\ncn: a\n# About the second value.\ncn: a\n  "
     "continued\n",
     5},
    {"cn=B, cn=A", "dn: cn=b,\n  cn=a\ncn: b\n", 15},
    {"cn=c", "dn: cn=c\ncn: c\n", 18},
    {"cn=last", "dn: cn=last\ncn: without newline", 27},
};

TEST(entry_text, GoesFromTheCommentAboveAnEntryToItsLastLine) {
    for (const row& each : rows) {
        const entry_text found = find_entry_text(text, each.dn);
        EXPECT_EQ(text.substr(found.begin, found.end - found.begin), each.part) << each.dn;
        EXPECT_EQ(found.first_line, each.first_line) << each.dn;
    }
}

TEST(entry_text, IsNotOfAnEntryThatStandsTwice) {
    EXPECT_THROW(find_entry_text(text, "cn=twice"), ended);
}

TEST(entry_text, IsNotOfAnEntryThatIsNotThere) {
    EXPECT_THROW(find_entry_text(text, "cn=nobody"), ended);
    EXPECT_THROW(find_entry_text("", "cn=nobody"), ended);
}

TEST(entry_text, PassesOverLinesOfAnotherCharacterSet) {
    const std::string before = "dn: cn=x\ncn: \xe9\n \xe9\n\n";
    const entry_text found = find_entry_text(before + "dn: cn=a\ncn: a\n", "cn=a");
    EXPECT_EQ(found.begin, before.size());
    EXPECT_EQ(found.first_line, 5);
}

}  // namespace
