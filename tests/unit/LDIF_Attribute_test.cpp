#include "LDIF_Attribute.h"

#include <gmock/gmock.h>
#include <strings.h>

#include <random>
#include <string>
#include <utility>
#include <vector>

#include "failures.h"
#include "lines.h"

using namespace cfg32::tests;
using testing::ElementsAre;

namespace {

LDIF_Attribute attribute_of(const std::string& name, const std::string& value,
                            const std::vector<std::string>& comment = {}) {
    return LDIF_Attribute(nullptr, line_of(LDIF_Line::attr, name, value), comment_of(comment));
}

LDIF_Attributes set_of(const std::vector<std::pair<std::string, std::string>>& attributes) {
    LDIF_Attributes set;
    for (const auto& [name, value] : attributes) {
        set += attribute_of(name, value);
    }
    return set;
}

std::vector<std::string> names(const LDIF_Attributes& attributes) {
    std::vector<std::string> all;
    for (const LDIF_Attribute& attribute : attributes) {
        all.push_back(attribute.name().text());
    }
    return all;
}

}  // namespace

TEST(LDIF_Attribute, ValueMakesAnAttributeWithThatValue) {
    const LDIF_Attribute attribute(nullptr, "sn", "Doe");
    EXPECT_EQ(attribute.name().text(), "sn");
    EXPECT_TRUE(attribute.comment().empty());
    EXPECT_EQ(attribute.str(), "sn: Doe\n");
}

TEST(LDIF_Attribute, EmptyTextMakesAnAttributeWithoutValues) {
    const LDIF_Attribute attribute(nullptr, "sn", "");
    EXPECT_TRUE(attribute.values().empty());
    EXPECT_EQ(attribute.str(), "");
}

TEST(LDIF_Attribute, LineMakesAnAttributeWithItsCommentAndValue) {
    const LDIF_Attribute attribute = attribute_of("Sn", "Doe", {"", "# note"});
    EXPECT_EQ(attribute.name().text(), "Sn");
    EXPECT_EQ(attribute.comment().str(), "\n# note\n");
    EXPECT_EQ(attribute.str(), "\n# note\nSn: Doe\n");
}

TEST(LDIF_Attribute, LineWithoutValueAddsAnEmptyValue) {
    const LDIF_Attribute attribute = attribute_of("sn", "");
    EXPECT_EQ(attribute.values().size(), 1u);
    EXPECT_EQ(attribute.str(), "sn: \n");
}

TEST(LDIF_Attribute, BlankLineInTheCommentIsWrittenBack) {
    EXPECT_EQ(attribute_of("sn", "Doe", {""}).str(), "\nsn: Doe\n");
}

TEST(LDIF_Attribute, LineOfAnotherTypeIsRefused) {
    const struct {
        int type;
        const char* name;
    } rows[] = {
        {LDIF_Line::endOfFile, "endOfFile"},
        {LDIF_Line::blankLine, "blankLine"},
        {LDIF_Line::comment, "comment"},
        {LDIF_Line::dn, "dn"},
        {5, "UNKNOWN"},
        {-1, "UNKNOWN"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.type);
        const LDIF_Exception e = failure_of(
            [&] { LDIF_Attribute(nullptr, line_of(row.type, "cn", "x"), LDIF_Comment()); });
        EXPECT_EQ(summary(e),
                  std::string("80/1000 Illegal constructor LDIF_Attribute( LDIF_Line::") +
                      row.name + " );");
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Attribute");
        EXPECT_GT(e.srcLine, 0);
    }
}

TEST(LDIF_Attribute, ValueThatTheSyntaxRefusesIsRefusedByEveryWayIn) {
    EXPECT_EQ(failure_of([] { LDIF_Attribute(nullptr, "version", "two"); }).ldapErr,
              failure_of([] { attribute_of("version", "two"); }).ldapErr);
    LDIF_Attribute attribute(nullptr, "version", "1");
    const LDIF_Exception e = failure_of([&] { attribute += std::string("two"); });
    EXPECT_EQ(e.attribute, "version");
    EXPECT_EQ(e.value, "two");
    EXPECT_EQ(attribute.str(), "version: 1\n");
}

TEST(LDIF_Attribute, NamesCompareWithoutRegardToCase) {
    const LDIF_Attribute cn(nullptr, "cn", "a");
    EXPECT_EQ(cn.compare("CN"), 0);
    EXPECT_EQ(cn.compare(std::string("Cn")), 0);
    EXPECT_EQ(cn.compare(LDIF_Attribute(nullptr, "CN", "b")), 0);
    EXPECT_GT(cn.compare(""), 0);
    EXPECT_GT(cn.compare("C"), 0);
    EXPECT_LT(cn.compare("SN"), 0);
    EXPECT_TRUE(cn == "CN");
    EXPECT_FALSE(cn == "sn");
    EXPECT_TRUE(cn == LDIF_Attribute(nullptr, "CN", "b"));
    EXPECT_TRUE(cn < LDIF_Attribute(nullptr, "SN", "a"));
    EXPECT_FALSE(cn < LDIF_Attribute(nullptr, "CN", "b"));
}

TEST(LDIF_Attribute, AddingOneOfTheSameNameAppendsItsCommentAndMergesItsValues) {
    LDIF_Attribute cn = attribute_of("cn", "a", {"# one"});
    cn += std::string("b");
    LDIF_Attribute other = attribute_of("CN", "B", {"# two", ""});
    other += std::string("c");
    cn += other;
    EXPECT_EQ(cn.str(), "# one\n# two\n\ncn: a\ncn: b\ncn: c\n");
}

TEST(LDIF_Attribute, AddingOneOfAnotherNameChangesNothing) {
    LDIF_Attribute cn = attribute_of("cn", "a", {"# one"});
    cn += attribute_of("sn", "b", {"# two"});
    EXPECT_EQ(cn.str(), "# one\ncn: a\n");
}

TEST(LDIF_Attribute, AddingAttributeToItselfDoublesItsCommentOnly) {
    LDIF_Attribute cn = attribute_of("cn", "a", {"# one"});
    cn += cn;
    EXPECT_EQ(cn.str(), "# one\n# one\ncn: a\n");
}

TEST(LDIF_Attribute, AddingACommentAppendsItsLines) {
    LDIF_Attribute cn = attribute_of("cn", "a", {"# one"});
    cn += comment_of({"", "# two"});
    EXPECT_EQ(cn.str(), "# one\n\n# two\ncn: a\n");
}

TEST(LDIF_Attribute, CopiesAreIndependent) {
    LDIF_Attribute cn = attribute_of("cn", "a", {"# one"});
    LDIF_Attribute copy(cn);
    LDIF_Attribute assigned(nullptr, "sn", "x");
    assigned = cn;
    cn += std::string("b");
    cn += comment_of({"# two"});
    EXPECT_EQ(copy.str(), "# one\ncn: a\n");
    EXPECT_EQ(assigned.str(), "# one\ncn: a\n");
    EXPECT_EQ(assigned.name().text(), "cn");
    assigned = *&assigned;
    EXPECT_EQ(assigned.str(), "# one\ncn: a\n");
}

TEST(LDIF_Attributes, AttributesStandInTheOrderOfTheirNames) {
    EXPECT_THAT(names(set_of({{"sn", "x"}, {"cn", "x"}, {"uid", "x"}})),
                ElementsAre("cn", "sn", "uid"));
}

TEST(LDIF_Attributes, SameNameInAnotherCaseIsMergedIntoTheFirst) {
    LDIF_Attributes attributes;
    attributes += attribute_of("cn", "a", {"# one"});
    attributes += attribute_of("CN", "b", {"# two"});
    EXPECT_THAT(names(attributes), ElementsAre("cn"));
    EXPECT_EQ(attributes.str(), "# one\n# two\ncn: a\ncn: b\n");
}

TEST(LDIF_Attributes, FindIgnoresCase) {
    LDIF_Attributes attributes = set_of({{"objectClass", "top"}, {"cn", "a"}});
    ASSERT_NE(attributes.find("objectclass"), attributes.end());
    EXPECT_EQ(attributes.find("objectclass")->name().text(), "objectClass");
    EXPECT_EQ(attributes.find("CN")->name().text(), "cn");
    for (const char* absent : {"a", "d", "z", "", "objectclas"}) {
        EXPECT_EQ(attributes.find(absent), attributes.end()) << absent;
        EXPECT_EQ(std::as_const(attributes).find(absent), std::as_const(attributes).end());
    }
    LDIF_Attributes none;
    EXPECT_EQ(none.find("cn"), none.end());
}

TEST(LDIF_Attributes, MergingKeepsTheOrderAndMergesEqualNames) {
    LDIF_Attributes left = set_of({{"a", "1"}, {"c", "1"}});
    left += set_of({{"b", "2"}, {"C", "2"}, {"d", "2"}});
    EXPECT_THAT(names(left), ElementsAre("a", "b", "c", "d"));
    EXPECT_EQ(left.str(), "a: 1\nb: 2\nc: 1\nc: 2\nd: 2\n");
}

TEST(LDIF_Attributes, MergingWithAnEmptySet) {
    LDIF_Attributes set = set_of({{"a", "1"}});
    set += LDIF_Attributes();
    EXPECT_EQ(set.str(), "a: 1\n");
    LDIF_Attributes none;
    none += set;
    EXPECT_EQ(none.str(), "a: 1\n");
    set += set;
    EXPECT_EQ(set.str(), "a: 1\n");
}

TEST(LDIF_Attributes, RemovingTakesTheWholeAttributeWhateverTheValues) {
    LDIF_Attributes set = set_of({{"a", "1"}, {"b", "1"}, {"b", "2"}});
    set -= attribute_of("B", "other");
    EXPECT_EQ(set.str(), "a: 1\n");
}

TEST(LDIF_Attributes, RemovingAnAbsentAttributeChangesNothing) {
    LDIF_Attributes set = set_of({{"a", "1"}});
    set -= attribute_of("x", "1");
    EXPECT_EQ(set.str(), "a: 1\n");
    LDIF_Attributes none;
    none -= attribute_of("x", "1");
    EXPECT_TRUE(none.empty());
}

namespace {

// The set as its rules say it literally: a list that is walked, from the end to add.
struct model {
    struct attribute {
        std::string name;
        std::string values;
    };
    std::vector<attribute> list;

    void add(const attribute& added) {
        for (size_t i = list.size(); i > 0; --i) {
            const int order = strcasecmp(list[i - 1].name.c_str(), added.name.c_str());
            if (order == 0) {
                list[i - 1].values += added.values;
                return;
            }
            if (order < 0) {
                list.insert(list.begin() + static_cast<ptrdiff_t>(i), added);
                return;
            }
        }
        list.insert(list.begin(), added);
    }

    void remove(const std::string& name) {
        std::erase_if(list, [&](const attribute& a) {
            return strcasecmp(a.name.c_str(), name.c_str()) == 0;
        });
    }

    std::string str() const {
        std::string text;
        for (const attribute& a : list) {
            for (const char value : a.values) {
                text += a.name + ": " + value + "\n";
            }
        }
        return text;
    }
};

}  // namespace

TEST(LDIF_Attributes, RandomChangesLeadWhereTheWalkOverAllAttributesLeads) {
    std::mt19937 random(20);
    const auto below = [&](unsigned count) { return random() % count; };
    const std::vector<std::string> pool = {"a",  "A",  "ab", "aB", "b",  "B-x", "b-X",
                                           "cn", "Cn", "d",  "_d", "[d", "Z",   "z"};
    for (int round = 0; round < 200; ++round) {
        LDIF_Attributes set;
        model expected;
        LDIF_Attributes other;
        model other_expected;
        // Values that differ, so that none is dropped as a duplicate.
        for (char value = 'a'; value <= 'z'; ++value) {
            const std::string& name = pool[below(static_cast<unsigned>(pool.size()))];
            const std::string text(1, value);
            switch (below(4)) {
                case 0:
                    other += attribute_of(name, text);
                    other_expected.add({name, text});
                    break;
                case 1:
                    set -= attribute_of(name, text);
                    expected.remove(name);
                    break;
                default:
                    set += attribute_of(name, text);
                    expected.add({name, text});
            }
        }
        set += other;
        for (const model::attribute& a : other_expected.list) {
            expected.add(a);
        }
        ASSERT_EQ(set.str(), expected.str()) << "round " << round;
        ASSERT_EQ(other.str(), other_expected.str()) << "round " << round;
    }
}
