#include "LDIF_Entry.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "dn_of.h"
#include "failures.h"
#include "lines.h"

using namespace cfg32::tests;
using testing::ElementsAre;

namespace {

LDIF_Entry entry_of(const std::string& dn) { return LDIF_Entry(dn_of(dn)); }

LDIF_Attribute attribute_of(const std::string& name, const std::string& value) {
    return LDIF_Attribute(nullptr, name, value);
}

/// An entry with a comment and an attribute that name it.
LDIF_Entry marked_entry(const std::string& dn, const std::string& mark) {
    LDIF_Entry entry(line_of(LDIF_Line::dn, "dn", dn), comment_of({"# " + mark}));
    entry += attribute_of("sn", mark);
    return entry;
}

/// A tree of entries added one after the other.
LDIF_Entry tree_of(const std::vector<std::string>& dns) {
    LDIF_Entry root;
    for (const std::string& dn : dns) {
        LDIF_Entry entry = entry_of(dn);
        root += entry;
    }
    return root;
}

/// The tree on one line: relative names, children in parentheses.
std::string shape(const LDIF_Entry& entry) {
    std::string text = entry.relative_dn().str();
    std::string children;
    for (const LDIF_Entry& child : entry.children()) {
        children += (children.empty() ? "" : " ") + shape(child);
    }
    return children.empty() ? text : text + "(" + children + ")";
}

std::string file_text(const LDIF_Entry& entry) {
    std::ostringstream out;
    out << entry;
    return out.str();
}

}  // namespace

TEST(LDIF_Entry, RootIsEmpty) {
    const LDIF_Entry root;
    EXPECT_TRUE(root.is_root());
    EXPECT_TRUE(root.name().empty());
    EXPECT_TRUE(root.dn().empty());
    EXPECT_TRUE(root.relative_dn().empty());
    EXPECT_TRUE(root.comment().empty());
    EXPECT_TRUE(root.attributes().empty());
    EXPECT_TRUE(root.children().empty());
    EXPECT_EQ(root.str(), "");
}

TEST(LDIF_Entry, EntryOfADNIsNamedDnAndRelativeToTheRoot) {
    const LDIF_Entry entry = entry_of("cn=a,o=b");
    EXPECT_EQ(entry.name().text(), "dn");
    EXPECT_EQ(entry.dn().str(), "cn=a, o=b");
    EXPECT_EQ(entry.relative_dn().str(), "cn=a, o=b");
    EXPECT_TRUE(entry.comment().empty());
    EXPECT_TRUE(entry.attributes().empty());
    EXPECT_TRUE(entry.children().empty());
}

TEST(LDIF_Entry, EntryOfALineKeepsTheSpellingOfItsLabel) {
    const LDIF_Entry entry(line_of(LDIF_Line::dn, "DN", "cn=a,o=b"), comment_of({"", "# c"}));
    EXPECT_EQ(entry.name().text(), "DN");
    EXPECT_EQ(entry.relative_dn().str(), "cn=a, o=b");
    EXPECT_EQ(entry.str(), "\n# c\nDN: cn=a, o=b\n\n");
}

TEST(LDIF_Entry, LineOfAnotherTypeIsRefused) {
    const struct {
        int type;
        const char* name;
    } rows[] = {
        {LDIF_Line::endOfFile, "endOfFile"},
        {LDIF_Line::blankLine, "blankLine"},
        {LDIF_Line::comment, "comment"},
        {LDIF_Line::attr, "attribute"},
        {5, "UNKNOWN"},
        {-1, "UNKNOWN"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.type);
        const LDIF_Exception e =
            failure_of([&] { LDIF_Entry(line_of(row.type, "dn", "cn=a"), LDIF_Comment()); });
        EXPECT_EQ(summary(e), std::string("80/1000 Illegal constructor LDIF_Entry( LDIF_Line::") +
                                  row.name + " );");
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Entry");
        EXPECT_GT(e.srcLine, 0);
    }
}

TEST(LDIF_Entry, LineWhoseDNDoesNotParseIsRefused) {
    const LDIF_Exception e =
        failure_of([] { LDIF_Entry(line_of(LDIF_Line::dn, "dn", "cn=a=b"), LDIF_Comment()); });
    EXPECT_EQ(summary(e), "34/1014 Invalid character in RDN value: =");
}

TEST(LDIF_Entry, PrintsTheCanonicalDNItsAttributesAndABlankLine) {
    LDIF_Entry entry = entry_of("cn=x,o=y");
    entry += attribute_of("cn", "x");
    EXPECT_EQ(entry.str(), "dn: cn=x, o=y\ncn: x\n\n");
}

TEST(LDIF_Entry, EntryWithoutAttributesEndsWithABlankLineToo) {
    EXPECT_EQ(entry_of("cn=x").str(), "dn: cn=x\n\n");
}

TEST(LDIF_Entry, NameThatCannotBePrintedThrows) {
    EXPECT_EQ(summary(failure_of([] { entry_of("cn=").str(); })),
              "34/1013 Missing RDN attribute value");
}

TEST(LDIF_Entry, RootEndsWithABlankLineOnlyBeforeAChildThatBringsNone) {
    const struct {
        std::vector<std::vector<std::string>> children;  // their comments
        const char* expected;
    } rows[] = {
        {{}, "version: 1\n"},           {{{}}, "version: 1\n\n"},
        {{{"# c"}}, "version: 1\n\n"},  {{{"# c", ""}}, "version: 1\n\n"},
        {{{""}}, "version: 1\n"},       {{{"", "# c"}}, "version: 1\n"},
        {{{}, {""}}, "version: 1\n\n"}, {{{""}, {}}, "version: 1\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.expected);
        LDIF_Entry root;
        root += attribute_of("version", "1");
        int number = 0;
        for (const auto& comment : row.children) {
            root += LDIF_Entry(line_of(LDIF_Line::dn, "dn", "cn=" + std::to_string(++number)),
                               comment_of(comment));
        }
        EXPECT_EQ(root.str(), row.expected);
    }
}

TEST(LDIF_Entry, RootWithoutAttributesStillSeparatesItsChildren) {
    EXPECT_EQ(tree_of({"cn=a"}).str(), "\n");
}

TEST(LDIF_Entry, CommentsAreAppended) {
    LDIF_Entry entry = entry_of("cn=a");
    entry += comment_of({"# one"});
    entry += comment_of({"", "# two"});
    EXPECT_EQ(entry.str(), "# one\n\n# two\ndn: cn=a\n\n");
}

TEST(LDIF_Entry, AttributesAreSortedAndMerged) {
    LDIF_Entry entry = entry_of("cn=a");
    entry += attribute_of("sn", "1");
    entry += attribute_of("ou", "1");
    const LDIF_Attribute again = attribute_of("SN", "2");
    entry += again;
    EXPECT_EQ(entry.str(), "dn: cn=a\nou: 1\nsn: 1\nsn: 2\n\n");
}

TEST(LDIF_Entry, ChildIsHungUnderItsParentByARelativeName) {
    LDIF_Entry root = tree_of({"o=b"});
    LDIF_Entry child = entry_of("cn=a, o=b");
    const LDIF_Entry& parent = root += child;
    EXPECT_EQ(parent.dn().str(), "o=b");
    EXPECT_EQ(child.relative_dn().str(), "cn=a");
    EXPECT_EQ(child.dn().str(), "cn=a, o=b");
    EXPECT_EQ(shape(root), "(o=b(cn=a))");
    ASSERT_TRUE(root.find(dn_of("cn=a, o=b")));
    EXPECT_EQ(root.find(dn_of("cn=a, o=b"))->relative_dn().str(), "cn=a");
}

TEST(LDIF_Entry, ParentThatComesLaterTakesItsDescendants) {
    LDIF_Entry root = tree_of({"cn=a, o=b"});
    EXPECT_EQ(shape(root), "(cn=a, o=b)");
    LDIF_Entry parent = entry_of("o=b");
    EXPECT_EQ(&(root += parent), &root);
    EXPECT_EQ(shape(root), "(o=b(cn=a))");
    EXPECT_EQ(root.children().front().children().front().dn().str(), "cn=a, o=b");
}

TEST(LDIF_Entry, DescendantsMoveInTheirOrderAndTheParentGoesToTheEnd) {
    EXPECT_EQ(shape(tree_of({"cn=2, o=b", "o=x", "cn=y, cn=1, o=b", "o=z", "cn=1, o=c", "o=b"})),
              "(o=x o=z cn=1, o=c o=b(cn=2 cn=y, cn=1))");
}

TEST(LDIF_Entry, MissingLevelsAreFilledInAnyOrder) {
    EXPECT_EQ(shape(tree_of({"cn=4,cn=3,cn=2,cn=1", "cn=1", "cn=3,cn=2,cn=1", "cn=2,cn=1"})),
              "(cn=1(cn=2(cn=3(cn=4))))");
    EXPECT_EQ(shape(tree_of({"cn=4,cn=3,cn=2,cn=1", "cn=2,cn=1", "cn=1", "cn=3,cn=2,cn=1"})),
              "(cn=1(cn=2(cn=3(cn=4))))");
    EXPECT_EQ(shape(tree_of({"cn=4,cn=3,cn=2,cn=1", "cn=3,cn=2,cn=1", "cn=1"})),
              "(cn=1(cn=3, cn=2(cn=4)))");
}

TEST(LDIF_Entry, NamesInAnotherCaseAreTheSameEntry) {
    EXPECT_EQ(shape(tree_of({"CN=A,O=B", "o=b", "cn=a, o=B", "sn=X, cn=a, o=b"})),
              "(o=b(CN=A(sn=X)))");
}

TEST(LDIF_Entry, SameEntryAgainIsMergedIntoTheFirst) {
    LDIF_Entry root;
    root += marked_entry("o=b", "one");
    LDIF_Entry again = marked_entry("O=B", "two");
    const LDIF_Entry& merged = root += again;
    EXPECT_EQ(&merged, &root.children().front());
    EXPECT_EQ(file_text(merged), "# one\n# two\ndn: o=b\nsn: one\nsn: two\n\n");
    EXPECT_EQ(root.children().size(), 1u);
}

TEST(LDIF_Entry, EntryAddedToItsEqualIsMerged) {
    LDIF_Entry entry = marked_entry("o=b", "one");
    LDIF_Entry again = marked_entry("o=b", "two");
    EXPECT_EQ(&(entry += again), &entry);
    EXPECT_EQ(entry.str(), "# one\n# two\ndn: o=b\nsn: one\nsn: two\n\n");
}

TEST(LDIF_Entry, EntryWithAnEmptyDNIsMergedIntoTheRoot) {
    LDIF_Entry root;
    LDIF_Entry empty = marked_entry("", "x");
    EXPECT_EQ(&(root += empty), &root);
    EXPECT_EQ(root.str(), "# x\nsn: x\n");
}

TEST(LDIF_Entry, EntryThatIsNotBelowIsRefusedAndChangesNothing) {
    LDIF_Entry parent = marked_entry("o=b", "one");
    LDIF_Entry child = entry_of("cn=a, o=b");
    parent += child;
    for (const char* other : {"o=c", "cn=a", "cn=a, o=c"}) {
        SCOPED_TRACE(other);
        LDIF_Entry stranger = entry_of(other);
        const LDIF_Exception e = failure_of([&] { parent += stranger; });
        EXPECT_EQ(summary(e), std::string("80/1000 [") + other + "] is not child of [o=b]");
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_Entry");
        EXPECT_EQ(stranger.relative_dn().str(), other);
        EXPECT_EQ(shape(parent), "o=b(cn=a)");
    }
}

TEST(LDIF_Entry, AncestorIsNotBelowItsDescendant) {
    LDIF_Entry entry = entry_of("cn=a, o=b");
    LDIF_Entry ancestor = entry_of("o=b");
    EXPECT_EQ(summary(failure_of([&] { entry += ancestor; })),
              "80/1000 [o=b] is not child of [cn=a, o=b]");
}

TEST(LDIF_Entry, FindAnswersForTheRootForEveryEntryAndForNoOther) {
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b", "cn=2,cn=1,o=c"});
    EXPECT_EQ(root.find(LDIF_DN()), &root);
    EXPECT_EQ(root.find(dn_of("O=B")), &root.children().front());
    EXPECT_EQ(root.find(dn_of("cn=2,cn=1,o=c")), &root.children().back());
    for (const char* absent : {"o=c", "cn=1,o=c", "cn=a", "cn=a,o=c", "sn=x,cn=a,o=b", "o=d",
                               "cn=3,cn=1,o=c", "o=b,cn=a"}) {
        EXPECT_EQ(root.find(dn_of(absent)), nullptr) << absent;
        EXPECT_EQ(std::as_const(root).find(dn_of(absent)), nullptr) << absent;
    }
}

TEST(LDIF_Entry, FindIsRelativeToTheEntrysParent) {
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b", "sn=x,cn=a,o=b"});
    LDIF_Entry* entry = root.find(dn_of("cn=a,o=b"));
    ASSERT_TRUE(entry);
    EXPECT_EQ(entry->find(dn_of("cn=a")), entry);
    EXPECT_EQ(entry->find(dn_of("sn=x,cn=a")), root.find(dn_of("sn=x,cn=a,o=b")));
    EXPECT_EQ(entry->find(dn_of("cn=a,o=b")), nullptr);
    EXPECT_EQ(entry->find(LDIF_DN()), nullptr);
}

TEST(LDIF_Entry, TreeIsWrittenEachEntryBeforeItsChildren) {
    LDIF_Entry root = tree_of({"o=b", "o=c", "cn=2,o=b", "cn=1,o=b", "sn=x,cn=2,o=b"});
    root += attribute_of("version", "1");
    EXPECT_EQ(file_text(root),
              "version: 1\n\ndn: o=b\n\ndn: cn=2, o=b\n\ndn: sn=x, cn=2, o=b\n\ndn: cn=1, o=b\n\n"
              "dn: o=c\n\n");
}

TEST(LDIF_Entry, ClearEmptiesEverything) {
    LDIF_Entry entry = marked_entry("o=b", "one");
    LDIF_Entry child = entry_of("cn=a, o=b");
    entry += child;
    EXPECT_EQ(&entry.clear(), &entry);
    EXPECT_EQ(file_text(entry), "");
    EXPECT_TRUE(entry.is_root());
    EXPECT_TRUE(entry.dn().empty());
    EXPECT_TRUE(entry.relative_dn().empty());
    EXPECT_EQ(entry.find(dn_of("cn=a")), nullptr);
    LDIF_Entry again = entry_of("o=z");
    entry += again;
    EXPECT_EQ(shape(entry), "(o=z)");
}

TEST(LDIF_Entry, CopiesAreDeepAndIndependent) {
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b"});
    LDIF_Entry copy(root);
    LDIF_Entry assigned = tree_of({"o=old"});
    assigned = root;
    for (const char* dn : {"cn=c,o=b", "sn=x,cn=a,o=b", "o=d"}) {
        LDIF_Entry entry = entry_of(dn);
        root += entry;
    }
    EXPECT_EQ(shape(copy), "(o=b(cn=a))");
    EXPECT_EQ(shape(assigned), "(o=b(cn=a))");
    EXPECT_EQ(copy.find(dn_of("cn=c,o=b")), nullptr);
    EXPECT_NE(copy.find(dn_of("cn=a,o=b")), root.find(dn_of("cn=a,o=b")));
    EXPECT_EQ(assigned.find(dn_of("o=old")), nullptr);
    LDIF_Entry late = entry_of("cn=e,o=b");
    copy += late;
    EXPECT_EQ(shape(copy), "(o=b(cn=a cn=e))");
    EXPECT_EQ(shape(root), "(o=b(cn=a(sn=x) cn=c) o=d)");
}

TEST(LDIF_Entry, CopyOfAChildMayReplaceItsParent) {
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b", "sn=x,cn=a,o=b"});
    root = root.children().front();
    EXPECT_EQ(shape(root), "o=b(cn=a(sn=x))");
}

TEST(LDIF_Entry, MovedTreeStillFindsAndPlaces) {
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b", "cn=2,cn=1,o=c"});
    LDIF_Entry moved(std::move(root));
    LDIF_Entry target = tree_of({"o=old"});
    target = std::move(moved);
    EXPECT_TRUE(target.find(dn_of("cn=a,o=b")));
    LDIF_Entry parent = entry_of("o=c");
    target += parent;
    EXPECT_EQ(shape(target), "(o=b(cn=a) o=c(cn=2, cn=1))");
}

TEST(LDIF_Entry, AddedChildIsCopiedAndStaysUsable) {
    LDIF_Entry root;
    LDIF_Entry child = marked_entry("o=b", "one");
    root += child;
    child += attribute_of("sn", "two");
    EXPECT_EQ(root.children().front().str(), "# one\ndn: o=b\nsn: one\n\n");
}

TEST(LDIF_Entry, SubtreeIsAddedWithItsEntry) {
    LDIF_Entry subtree = entry_of("o=b");
    for (const char* dn : {"cn=a,o=b", "sn=x,cn=a,o=b"}) {
        LDIF_Entry entry = entry_of(dn);
        subtree += entry;
    }
    LDIF_Entry root = tree_of({"o=a"});
    root += subtree;
    EXPECT_EQ(shape(root), "(o=a o=b(cn=a(sn=x)))");
    EXPECT_TRUE(root.find(dn_of("sn=x,cn=a,o=b")));
}

TEST(LDIF_Entry, ChildrenOfAnEntryThatIsMergedAreAddedToTheOther) {
    LDIF_Entry again = entry_of("o=b");
    for (const char* dn : {"cn=a,o=b", "sn=y,cn=a,o=b", "cn=c,o=b"}) {
        LDIF_Entry entry = entry_of(dn);
        again += entry;
    }
    LDIF_Entry root = tree_of({"o=b", "cn=a,o=b", "sn=x,cn=a,o=b"});
    root += again;
    EXPECT_EQ(shape(root), "(o=b(cn=a(sn=x sn=y) cn=c))");
}

TEST(LDIF_Entry, DescendantThatMovesUnderASubtreeGoesToItsPlaceThere) {
    LDIF_Entry subtree = entry_of("o=b");
    for (const char* dn : {"cn=a,o=b", "cn=c,o=b"}) {
        LDIF_Entry entry = entry_of(dn);
        subtree += entry;
    }
    LDIF_Entry root = tree_of({"sn=x,cn=a,o=b", "cn=C,o=b", "cn=d,o=b"});
    root += subtree;
    EXPECT_EQ(shape(root), "(o=b(cn=a(sn=x) cn=c cn=d))");
    EXPECT_TRUE(root.find(dn_of("sn=x,cn=a,o=b")));
    EXPECT_TRUE(root.find(dn_of("cn=d,o=b")));
}

TEST(LDIF_Entry, NamesNamingTheSameByTheirFirstBytesOnlyAreTheSame) {
    // Names compare as C strings, so that what follows a NUL does not count.
    EXPECT_EQ(tree_of({"cn=a\\00b", "cn=a\\00c"}).children().size(), 1u);
}

TEST(LDIF_Entry, RDNsOfSeveralPartsAreOneLevel) {
    EXPECT_EQ(shape(tree_of({"cn=b+sn=a,o=x", "o=x", "ou=1,sn=A+CN=B,o=x"})),
              "(o=x(cn=b + sn=a(ou=1)))");
}

TEST(LDIF_Entry, HeaderNamesTheEntryAndNothingElse) {
    LDIF_Entry root = tree_of({"o=b"});
    root += marked_entry("cn=a,o=b", "one");
    LDIF_Entry* entry = root.find(dn_of("cn=a,o=b"));
    ASSERT_TRUE(entry);
    const LDIF_Entry header = entry->header();
    EXPECT_EQ(header.str(), "dn: cn=a, o=b\n\n");
    EXPECT_EQ(header.relative_dn().str(), "cn=a");
    EXPECT_TRUE(header.children().empty());
}

TEST(LDIF_Entry, LineCountIsTheNumberOfLinesOfItsText) {
    LDIF_Entry root = tree_of({});
    EXPECT_EQ(root.line_count(), 0u);
    root += attribute_of("version", "1");
    root += marked_entry("o=b", "one");
    LDIF_Entry entry = root.children().front();
    entry += attribute_of("sn", "two");
    entry += LDIF_Attribute(nullptr, line_of(LDIF_Line::attr, "ou", ""), comment_of({"", "# c"}));
    for (const LDIF_Entry* e : {&root, &entry}) {
        const std::string text = e->str();
        EXPECT_EQ(e->line_count(), static_cast<size_t>(std::count(text.begin(), text.end(), '\n')));
    }
}

TEST(LDIF_Entry, ReportsShowWhatTheyCanOfANameThatCannotBePrinted) {
    EXPECT_EQ(cfg32::shown(dn_of("")), "");
    EXPECT_EQ(cfg32::shown(dn_of("cn=")), "cn=");
    EXPECT_EQ(cfg32::shown(dn_of("cn=\"\", ou=b, o=")), "cn=, ou=b, o=");
    EXPECT_EQ(cfg32::shown(dn_of("cn=a")), "cn=a");
    EXPECT_EQ(cfg32::shown(dn_of("cn=a\\,b, o=c")), "cn=a\\,b, o=c");
    EXPECT_EQ(cfg32::shown(entry_of("cn=")), "");
    EXPECT_EQ(cfg32::shown(entry_of("cn=a")), "dn: cn=a\n\n");
}

TEST(LDIF_Entry, PreorderVisitsEachEntryOnce) {
    std::vector<std::string> visited;
    cfg32::for_each_in_preorder(tree_of({"o=c", "cn=1,o=c", "sn=2,cn=1,o=c", "o=d"}),
                                [&](const LDIF_Entry& e) { visited.push_back(e.dn().str()); });
    EXPECT_THAT(visited, ElementsAre("", "o=c", "cn=1, o=c", "sn=2, cn=1, o=c", "o=d"));
}

TEST(LDIF_Entry, ErasedChildGoesWithEverythingBelowIt) {
    LDIF_Entry root = tree_of({"o=a", "o=b", "cn=1,o=b", "sn=2,cn=1,o=b", "o=c"});
    root.erase(*root.find(dn_of("o=b")));
    EXPECT_EQ(shape(root), "(o=a o=c)");
    for (const char* dn : {"o=b", "cn=1,o=b", "sn=2,cn=1,o=b"}) {
        EXPECT_EQ(root.find(dn_of(dn)), nullptr) << dn;
    }
}

TEST(LDIF_Entry, SiblingsOfAnErasedChildStayWhereTheyAre) {
    for (const char* erased : {"o=a", "o=b", "o=c"}) {
        LDIF_Entry root = tree_of({"o=a", "o=b", "o=c"});
        std::vector<const LDIF_Entry*> others;
        for (const LDIF_Entry& child : root.children()) {
            if (child.dn() != dn_of(erased)) {
                others.push_back(&child);
            }
        }
        root.erase(*root.find(dn_of(erased)));
        std::vector<const LDIF_Entry*> left;
        for (const LDIF_Entry& child : root.children()) {
            left.push_back(&child);
            EXPECT_EQ(root.find(child.dn()), &child);
        }
        EXPECT_EQ(left, others);
    }
}

TEST(LDIF_Entry, EntryWithoutItsLastChildIsALeafAgain) {
    LDIF_Entry root = tree_of({"o=b", "cn=1,o=b"});
    LDIF_Entry* parent = root.find(dn_of("o=b"));
    parent->erase(*root.find(dn_of("cn=1,o=b")));
    EXPECT_TRUE(parent->children().empty());
    EXPECT_EQ(root.find(dn_of("cn=1,o=b")), nullptr);
    root += entry_of("cn=1,o=b");
    EXPECT_EQ(shape(root), "(o=b(cn=1))");
}

TEST(LDIF_Entry, ErasedChildComesBackEmptyAndAsTheLast) {
    LDIF_Entry root = tree_of({"o=a"});
    root += marked_entry("cn=1,o=a", "old");
    root += entry_of("cn=2,o=a");
    LDIF_Entry* parent = root.find(dn_of("o=a"));
    parent->erase(*root.find(dn_of("cn=1,o=a")));
    root += entry_of("cn=1,o=a");
    EXPECT_EQ(shape(root), "(o=a(cn=2 cn=1))");
    EXPECT_EQ(root.find(dn_of("cn=1,o=a"))->str(), "dn: cn=1, o=a\n\n");
}

TEST(LDIF_Entry, ErasedChildIsNotTakenOverByAnAncestorThatTurnsUp) {
    LDIF_Entry root = tree_of({"cn=2,cn=1,o=b", "cn=3,cn=1,o=b"});
    root.erase(*root.find(dn_of("cn=2,cn=1,o=b")));
    root += entry_of("cn=1,o=b");
    EXPECT_EQ(shape(root), "(cn=1, o=b(cn=3))");
}
