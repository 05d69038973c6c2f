#include "LDIF_Search.h"

#include <gmock/gmock.h>

#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "LDIF_File.h"
#include "changed_row.h"
#include "dn_of.h"
#include "failures.h"
#include "small_stack.h"
#include "temporary_folder.h"

using namespace cfg32::tests;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

using Results = LDIF_Search_Results;

/// A filter on one line: the attribute, and "=*" or the value in brackets.
std::string shown(const LDIF_Filter& filter) {
    return filter.attribute().text() + (filter.any_value() ? "=*" : "=[" + filter.value() + "]");
}

std::vector<std::string> names(const Results& results) {
    std::vector<std::string> all;
    for (const LDIF_Entry& entry : results.entries()) {
        all.push_back(entry.dn().str());
    }
    return all;
}

std::string printed(const Results& results) {
    std::ostringstream out;
    out << results;
    return out.str();
}

const char* const content =
    "# of the charset\n"
    "charset: UTF-8\n"
    "version: 1\n"
    "\n"
    "# of the configuration\n"
    "DN: cn=Configuration\n"
    "cn: Configuration\n"
    "objectclass: top\n"
    "\n"
    "dn: cn=Front End, cn=Configuration\n"
    "cn: Front End\n"
    "# of the connections\n"
    "oru-slapdDbConnections: 10\n"
    "objectClass: top\n"
    "objectClass: frontend\n"
    "\n"
    "dn: cn=Deep, cn=Front End, cn=Configuration\n"
    "cn: Deep\n"
    "objectclass: top\n"
    "description: a*b\n"
    "\n"
    "dn: cn=Bare, cn=Configuration\n"
    "cn: Bare\n"
    "\n"
    "dn: cn=Orphan, cn=Missing, cn=Configuration\n"
    "cn: Orphan\n"
    "objectclass: top\n"
    "\n"
    "dn: o=other\n"
    "objectclass: TOP\n"
    "o: other\n";

struct LDIF_Search : testing::Test {
    temporary_folder folder;
    LDIF_File file{folder.write("conf", content), "", nullptr};

    Results search(const std::string& base, Results::Scope scope, const std::string& filter = "",
                   const LDIF_AttrFilter& attributes = {}, bool attributes_only = false) {
        return file.search(dn_of(base), scope, LDIF_Filter(filter), attributes, attributes_only);
    }
};

}  // namespace

TEST(LDIF_Filter, FirstTestsThePresenceOfAnObjectclass) {
    EXPECT_EQ(shown(LDIF_Filter()), "objectclass=*");
}

TEST(LDIF_Filter, Grammar) {
    const struct {
        const char* text;
        const char* expected;
    } rows[] = {
        {"(cn=Frontend)", "cn=[Frontend]"},
        {"cn=Frontend", "cn=[Frontend]"},
        {"cn=*", "cn=*"},
        {"(cn=*)", "cn=*"},
        {"(cn)", "cn=*"},
        {"cn", "cn=*"},
        {"cn  ", "cn=*"},
        {"(cn )", "cn=*"},
        {"  \t(cn=a)", "cn=[a]"},
        {"  cn=a", "cn=[a]"},
        {"( cn=a)", " cn=[a]"},
        {"(cn =a)", "cn=[a]"},
        {"cn=  a b  ", "cn=[a b]"},
        {"(cn= a )", "cn=[a]"},
        {"cn=", "cn=*"},
        {"(cn=)", "cn=*"},
        {"cn=   ", "cn=*"},
        {"cn= * ", "cn=*"},
        {"cn=**", "cn=[**]"},
        {"cn=a*", "cn=[a*]"},
        {"cn=a=b", "cn=[a=b]"},
        {"cn==a", "cn=[=a]"},
        {"", "objectclass=*"},
        {"   ", "objectclass=*"},
        {"(", "objectclass=*"},
        {"()", "objectclass=*"},
        {"(  ", "objectclass=*"},
        {"(  )", "objectclass=*"},
        {"=a", "objectclass=*"},
        {"(=a)", "objectclass=*"},
        {"=", "objectclass=*"},
        {"  =a", "objectclass=*"},
        {"(  =a)", "=[a]"},
        // Only where the first closing parenthesis is the last character it is removed.
        {"(cn=a))", "cn=[a))]"},
        {"(cn=a)b", "cn=[a)b]"},
        {"(cn=(a))", "cn=[(a))]"},
        {"(cn=a) ", "cn=[a)]"},
        {"(cn) ", "cn)=*"},
        {"cn=a)", "cn=[a)]"},
        {"((cn=a)", "(cn=[a]"},
        {"(cn=a", "cn=[a]"},
        {"(&(cn=a)(sn=b))", "&(cn=[a)(sn=b))]"},
        {"cn=\\41", "cn=[A]"},
        {"cn=x\\4ay\\4Bz", "cn=[xJyKz]"},
        {"(cn=\\2a)", "cn=[*]"},
        {"(cn=\\28a\\29)", "cn=[(a)]"},
        {"cn=\\5c41", "cn=[\\41]"},
        {"cn=\\20", "cn=[ ]"},
        // A broken escape ends the value.
        {"(cn=a\\4", "cn=[a]"},
        {"(cn=a\\4)", "cn=[a]"},
        {"(cn=a\\zz)", "cn=[a]"},
        {"(cn=a\\zzb)", "cn=[a]"},
        {"cn=a\\", "cn=[a]"},
        {"cn=a\\4gb", "cn=[a]"},
        {"cn=a\\g4b", "cn=[a]"},
        {"cn=a\\\\41", "cn=[a]"},
        {"cn=\\", "cn=[]"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(shown(LDIF_Filter(row.text)), row.expected) << row.text;
    }
}

TEST(LDIF_Filter, EscapeMayBeAnyByte) {
    EXPECT_EQ(LDIF_Filter("cn=a\\00b").value(), std::string("a\0b", 3));
    EXPECT_EQ(LDIF_Filter("cn=\\c3\\A4").value(), "\xc3\xa4");
}

TEST(LDIF_Filter, AssigningForgetsTheFilterOfBefore) {
    LDIF_Filter filter("cn=a");
    filter = std::string("=x");
    EXPECT_EQ(shown(filter), "objectclass=*");
    filter = std::string("sn=b");
    filter = std::string("cn");
    EXPECT_EQ(shown(filter), "cn=*");
    EXPECT_EQ(filter.value(), "");
}

TEST(LDIF_Filter, MatchesByTheAttributesSyntax) {
    LDIF_Entry entry(dn_of("cn=a"));
    entry += LDIF_Attribute(nullptr, "cn", "Front End");
    entry += LDIF_Attribute(nullptr, "oru-slapdDbConnections", "10");
    entry += LDIF_Attribute(nullptr, "free", "Text");
    entry += LDIF_Attribute(nullptr, "free", "more");
    entry += LDIF_Attribute(nullptr, "none", "");
    const struct {
        const char* filter;
        bool expected;
    } rows[] = {
        {"cn=front end", true},
        {"CN=Front End", true},
        {"cn=Front", false},
        {"cn=*", true},
        {"oru-slapdDbConnections=10", true},
        {"oru-slapdDbConnections=010", true},
        {"oru-slapdDbConnections=11", false},
        {"FREE=Text", true},
        {"free=text", false},
        {"free=more", true},
        {"free=\\6Dore", true},
        {"none", true},
        {"none=x", false},
        {"objectclass=*", false},
        {"sn=x", false},
        {"(  =a)", false},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(LDIF_Filter(row.filter).match(entry), row.expected) << row.filter;
    }
    EXPECT_FALSE(LDIF_Filter().match(entry));
    EXPECT_FALSE(LDIF_Filter("cn").match(LDIF_Entry()));
}

TEST_F(LDIF_Search, BaseScopeFindsTheBase) {
    EXPECT_THAT(names(search("CN=configuration", Results::Base)), ElementsAre("cn=Configuration"));
}

TEST_F(LDIF_Search, BaseThatDoesNotMatchIsAnEmptyResult) {
    EXPECT_THAT(names(search("cn=Bare,cn=Configuration", Results::Base)), IsEmpty());
}

TEST_F(LDIF_Search, OneLevelFindsTheChildrenWithoutTheBase) {
    EXPECT_THAT(names(search("cn=Configuration", Results::OneLevel, "cn")),
                ElementsAre("cn=Front End, cn=Configuration", "cn=Bare, cn=Configuration",
                            "cn=Orphan, cn=Missing, cn=Configuration"));
    EXPECT_THAT(
        names(search("cn=Configuration", Results::OneLevel)),
        ElementsAre("cn=Front End, cn=Configuration", "cn=Orphan, cn=Missing, cn=Configuration"));
    EXPECT_THAT(names(search("o=other", Results::OneLevel)), IsEmpty());
}

TEST_F(LDIF_Search, SubtreeFindsEachEntryBeforeItsChildren) {
    EXPECT_THAT(names(search("cn=Configuration", Results::Subtree, "cn")),
                ElementsAre("cn=Configuration", "cn=Front End, cn=Configuration",
                            "cn=Deep, cn=Front End, cn=Configuration", "cn=Bare, cn=Configuration",
                            "cn=Orphan, cn=Missing, cn=Configuration"));
}

TEST_F(LDIF_Search, EntriesBelowOneThatDoesNotMatchAreFound) {
    EXPECT_THAT(names(search("cn=Configuration", Results::Subtree, "cn=deep")),
                ElementsAre("cn=Deep, cn=Front End, cn=Configuration"));
}

TEST_F(LDIF_Search, EmptyBaseIsTheRoot) {
    EXPECT_THAT(names(search("", Results::Base, "version")), ElementsAre(""));
    EXPECT_THAT(names(search("", Results::Base)), IsEmpty());
    EXPECT_THAT(names(search("", Results::OneLevel)), ElementsAre("cn=Configuration", "o=other"));
    EXPECT_EQ(search("", Results::Subtree).entries().size(), 5u);
}

TEST_F(LDIF_Search, MissingBaseIsReported) {
    for (const char* base : {"o=nowhere", "cn=Missing,cn=Configuration", "cn=x,o=other"}) {
        for (const auto scope : {Results::Base, Results::OneLevel, Results::Subtree}) {
            const LDIF_Exception e = failure_of([&] { search(base, scope); });
            EXPECT_EQ(summary(e), "32/32 Base entry not found") << base;
            EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Search");
            EXPECT_FALSE(e.cause);
        }
    }
}

TEST_F(LDIF_Search, ResultHasNoCommentsAndNoChildrenButItsLabelAndNames) {
    const Results results = search("cn=Front End,cn=Configuration", Results::Base);
    ASSERT_EQ(results.entries().size(), 1u);
    const LDIF_Entry& found = results.entries().front();
    EXPECT_TRUE(found.comment().empty());
    EXPECT_TRUE(found.children().empty());
    EXPECT_EQ(found.relative_dn().str(), "cn=Front End");
    EXPECT_EQ(search("cn=Configuration", Results::Base).entries().front().name().text(), "DN");
}

TEST_F(LDIF_Search, EmptyAttributeFilterCopiesAllAttributes) {
    const Results results = search("cn=Front End,cn=Configuration", Results::Base);
    EXPECT_EQ(results.entries().at(0).attributes().size(), 3u);
}

TEST_F(LDIF_Search, AttributeFilterLetsTheNamedThroughWhateverTheirCase) {
    const Results results =
        search("cn=Front End,cn=Configuration", Results::Base, "", {"OBJECTCLASS", "CN", "absent"});
    EXPECT_THAT(printed(results), HasSubstr("cn: Front End\nobjectClass: top\n"
                                            "objectClass: frontend\n"));
    EXPECT_EQ(results.entries().at(0).attributes().size(), 2u);
}

TEST_F(LDIF_Search, EntryWithoutAWantedAttributeIsStillFound) {
    const Results results = search("cn=Configuration", Results::Base, "", {"absent"});
    ASSERT_EQ(results.entries().size(), 1u);
    EXPECT_TRUE(results.entries().front().attributes().empty());
}

TEST_F(LDIF_Search, AttributesOnlyStillCopiesTheValues) {
    const Results results = search("cn=Configuration", Results::Base, "", {"cn"}, true);
    EXPECT_TRUE(results.attributes_only());
    EXPECT_EQ(results.entries().at(0).attributes().begin()->values().size(), 1u);
}

TEST_F(LDIF_Search, ResultsArePrintedWithTheirValues) {
    EXPECT_EQ(printed(search("cn=Configuration", Results::Subtree, "objectclass=top",
                             {"cn", "objectclass"})),
              "4 entries found.\n"
              "\nDN: cn=Configuration\ncn: Configuration\nobjectclass: top\n"
              "\ndn: cn=Front End, cn=Configuration\ncn: Front End\n"
              "objectClass: top\nobjectClass: frontend\n"
              "\ndn: cn=Deep, cn=Front End, cn=Configuration\ncn: Deep\nobjectclass: top\n"
              "\ndn: cn=Orphan, cn=Missing, cn=Configuration\ncn: Orphan\nobjectclass: top\n");
}

TEST_F(LDIF_Search, OneResultIsAnEntryAndNoneAreEntries) {
    EXPECT_EQ(printed(search("o=other", Results::Base, "", {"o"})),
              "1 entry found.\n\ndn: o=other\no: other\n");
    EXPECT_EQ(printed(search("o=other", Results::OneLevel)), "0 entries found.\n");
}

TEST_F(LDIF_Search, AttributesOnlyPrintsEachNameOnce) {
    EXPECT_EQ(printed(search("cn=Front End,cn=Configuration", Results::Base, "", {}, true)),
              "1 entry found.\n\ndn: cn=Front End, cn=Configuration\n"
              "cn\nobjectClass\noru-slapdDbConnections\n");
}

TEST_F(LDIF_Search, ValueThatTheSyntaxRefusesIsReportedWithTheBaseEntry) {
    const LDIF_Exception e = failure_of([&] {
        search("cn=Front End,cn=Configuration", Results::Subtree, "oru-slapdDbConnections=many");
    });
    const LDIF_Exception& first = first_cause(e);
    EXPECT_EQ(summary(e), summary(first));
    EXPECT_EQ(e.value, "many");
    EXPECT_EQ(e.attribute, "oru-slapdDbConnections");
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Search");
    EXPECT_TRUE(e.cause);
    EXPECT_THAT(e.entryDn, HasSubstr("dn: cn=Front End, cn=Configuration\ncn: Front End\n"));
}

TEST_F(LDIF_Search, UnexpectedFailureIsASystemErrorWithTheEntry) {
    const auto fail = [](const LDIF_Value&, const LDIF_Value&) -> int {
        throw std::runtime_error("unexpected");
    };
    changed_row failing("o");
    failing->match = fail;
    LDIF_Entry entry(dn_of("o=x"));
    entry += LDIF_Attribute(nullptr, "o", "x");
    Results results(Results::Base, LDIF_Filter("o=x"), {}, false);
    const LDIF_Exception e = failure_of([&] { results += entry; });
    EXPECT_EQ(summary(e), "80/1000 System error in LDIF_Search_Results::addEntry()");
    EXPECT_EQ(e.entryDn, "dn: o=x\no: x\n\n");
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Search");
    EXPECT_TRUE(results.entries().empty());
}

TEST(LDIF_Search_failure, IsToldFromWithinATreeThatIsDeeperThanTheStack) {
    on_a_small_stack([] {
        constexpr int depth = 1000;
        LDIF_Entry root;
        std::string dn = "o=x";
        for (int i = 0; i < depth; ++i, dn.insert(0, "o=x, ")) {
            LDIF_Entry entry(dn_of(dn));
            if (i == depth - 1) {
                entry += LDIF_Attribute(nullptr, "oru-slapdMasterPW", "{iMASK}>undecodable");
            }
            root += std::move(entry);
        }
        Results results(Results::Subtree, LDIF_Filter("oru-slapdMasterPW=x"), {}, false);
        const LDIF_Exception e = failure_of([&] { results += root; });
        EXPECT_EQ(e.ldapErr, 84);
        int layers = 0;
        for (const LDIF_Exception* at = &e; at; at = at->cause.get()) {
            ++layers;
        }
        EXPECT_GT(layers, depth);
    });
}

TEST_F(LDIF_Search, ResultsAreCopiesOfTheirOwn) {
    Results results = search("o=other", Results::Base);
    Results copy(results);
    results.addEntry(LDIF_Entry(dn_of("cn=x")), true);
    results += *file.root().find(dn_of("cn=Configuration"));
    EXPECT_THAT(names(results), ElementsAre("o=other", "cn=Configuration"));
    EXPECT_THAT(names(copy), ElementsAre("o=other"));
}

TEST_F(LDIF_Search, EntryThatIsNoBaseIsFoundByOneLevelWithoutItsChildren) {
    Results results(Results::OneLevel, LDIF_Filter("cn"), {}, false);
    results.addEntry(*file.root().find(dn_of("cn=Front End,cn=Configuration")), false);
    EXPECT_THAT(names(results), ElementsAre("cn=Front End, cn=Configuration"));
}

TEST_F(LDIF_Search, ValueOfOneEntryDoesNotMatchAnothers) {
    EXPECT_THAT(names(search("", Results::Subtree, "description=a\\2ab")),
                ElementsAre("cn=Deep, cn=Front End, cn=Configuration"));
    EXPECT_THAT(names(search("", Results::Subtree, "objectclass=frontend")),
                ElementsAre("cn=Front End, cn=Configuration"));
}
