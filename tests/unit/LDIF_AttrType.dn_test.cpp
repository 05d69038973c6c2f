// The syntax of distinguished names.

#include <gtest/gtest.h>

#include <string>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "LDIF_Value.h"
#include "failures.h"

using namespace cfg32::tests;

namespace {

const char* const source_file = "src/libraries/cfg32stl/LDIF_AttrType";

const _AttrType* dn_type() { return getAttrType("oru-slapdSuffix"); }

LDIF_Value dn_value(const std::string& text) { return LDIF_Value(dn_type(), text, nullptr); }

/// A value with a text that was never parsed.
LDIF_Value unparsed(const std::string& text) {
    LDIF_Value value(getAttrType(nullptr), text, nullptr);
    value.attrType = dn_type();
    return value;
}

}  // namespace

TEST(LDIF_AttrType_dn, ADnIsStoredNormalisedAndParsed) {
    const struct {
        const char* text;
        const char* stored;
    } rows[] = {
        {"CN=a;o=B", "CN=a, o=B"},
        {"  cn=a,o=b", "cn=a, o=b"},
        {"sn=b+cn=a", "cn=a + sn=b"},
        {"cn=a\\2Cb", "cn=a\\,b"},
        {"", ""},
        {"  ", ""},
    };
    for (const auto& row : rows) {
        const LDIF_Value value = dn_value(row.text);
        EXPECT_EQ(value.text, row.stored);
        EXPECT_EQ(value.str(), row.stored);
        EXPECT_EQ(value.dn ? value.dn->str() : value.text.str(), row.stored);
        EXPECT_EQ(value.binaryLength, 0);
        EXPECT_FALSE(value.binary);
    }
}

TEST(LDIF_AttrType_dn, TheBoundsOfADnAreNotLookedAt) {
    _AttrType type = *dn_type();
    type.minimum = 50;
    type.maximum = 60;
    EXPECT_EQ(LDIF_Value(&type, "cn=a", nullptr).text, "cn=a");
    EXPECT_EQ(LDIF_Value(&type, "cn=" + std::string(5000, 'a'), nullptr).text.size(), 5003U);
}

TEST(LDIF_AttrType_dn, ARefusedDnCarriesItsText) {
    LDIF_Value value = unparsed("");
    const LDIF_Exception e = failure_of([&] { dnFromStr(value, "cn=a,=x"); });
    EXPECT_EQ(summary(e), "34/1012 Invalid attribute sytax: ");
    EXPECT_EQ(e.srcFile, source_file);
    EXPECT_GT(e.srcLine, 0);
    EXPECT_EQ(e.value, "cn=a,=x");
    ASSERT_TRUE(e.cause);
    EXPECT_EQ(e.cause->srcFile, "src/libraries/cfg32stl/LDIF_DN");
}

TEST(LDIF_AttrType_dn, ARefusedDnCarriesItsType) {
    LDIF_Value value = unparsed("");
    EXPECT_EQ(failure_of([&] { dnFromStr(value, "=x"); }).attrType, dn_type());
}

TEST(LDIF_AttrType_dn, ADnThatCannotBePrintedIsRefused) {
    const LDIF_Exception e = failure_of([] { dn_value("cn="); });
    EXPECT_EQ(summary(e), "34/1013 Missing RDN attribute value");
    EXPECT_EQ(e.value, "cn=");
}

TEST(LDIF_AttrType_dn, BytesAreRefusedAndNoBytesAreTheRoot) {
    EXPECT_EQ(summary(failure_of([] { LDIF_Value(dn_type(), "cn=a", 4, nullptr); })),
              "92/1008 Binary representation undefined for syntax: ces");
    const LDIF_Value none(dn_type(), nullptr, 0, nullptr);
    EXPECT_EQ(none.text, "");
    ASSERT_TRUE(none.dn);
    EXPECT_TRUE(none.dn->empty());
}

TEST(LDIF_AttrType_dn, DnsCompareAsDns) {
    EXPECT_EQ(dnCompare(dn_value("cn=A;o=b"), dn_value("CN=a, O=B")), 0);
    EXPECT_EQ(dnCompare(dn_value("cn=\"a\""), dn_value("cn=a")), 0);
    EXPECT_EQ(dnCompare(dn_value("o=b"), dn_value("cn=a, o=b")), 1);
    EXPECT_EQ(dnCompare(dn_value("cn=a, o=b"), dn_value("o=b")), -1);
    EXPECT_LT(dnCompare(dn_value("cn=a"), dn_value("cn=b")), 0);
}

TEST(LDIF_AttrType_dn, ATextThatIsNotParsedYetIsParsedForTheComparison) {
    EXPECT_EQ(dnCompare(unparsed("CN=a;O=b"), dn_value("cn=a, o=b")), 0);
    EXPECT_EQ(dnCompare(dn_value("cn=a, o=b"), unparsed("CN=a;O=b")), 0);
    EXPECT_EQ(dnCompare(unparsed("o=b"), unparsed("cn=a;o=b")), 1);
    EXPECT_EQ(dnCompare(unparsed(""), unparsed("  ")), 0);
}

TEST(LDIF_AttrType_dn, TheParsedDnOutranksTheText) {
    LDIF_Value value = dn_value("cn=a;o=b");
    ASSERT_TRUE(value.dn);
    value.text = cfg32::given_text("cn=other");
    EXPECT_EQ(dnCompare(value, dn_value("cn=a,o=b")), 0);
}

TEST(LDIF_AttrType_dn, AComparisonReportsTheSideThatDoesNotParse) {
    const LDIF_Value right_one = dn_value("cn=a");
    for (const bool is_left : {true, false}) {
        const LDIF_Value wrong = unparsed("cn=a\\q");
        const LDIF_Exception e = failure_of(
            [&] { is_left ? dnCompare(wrong, right_one) : dnCompare(right_one, wrong); });
        EXPECT_EQ(summary(e), "34/1014 Invalid escape sequence: \\q");
        EXPECT_EQ(e.value, "cn=a\\q");
        EXPECT_EQ(e.srcFile, source_file);
        ASSERT_TRUE(e.cause);
        EXPECT_EQ(e.cause->srcFile, "src/libraries/cfg32stl/LDIF_DN");
    }
}
