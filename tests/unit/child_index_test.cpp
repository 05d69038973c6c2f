#include "child_index.h"

#include <gmock/gmock.h>

#include <clocale>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "dn_of.h"
#include "model_tree.h"
#include "random_names.h"
#include "small_stack.h"

using cfg32::child_index;
using namespace cfg32::tests;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

void print(const model_entry& entry, std::string& out) {
    out += entry.str();
    for (const model_entry& child : entry.children) {
        print(child, out);
    }
}

std::string file_text(const LDIF_Entry& entry) {
    std::ostringstream out;
    out << entry;
    return out.str();
}

std::string file_text(const model_entry& entry) {
    std::string text;
    print(entry, text);
    return text;
}

class random_entries : public random_names {
  public:
    using random_names::random_names;

    LDIF_Entry entry(const std::string& text, model_entry& model) {
        const std::string comment = "# " + std::to_string(++number_);
        const char value = static_cast<char>('a' + number_ % 26);
        LDIF_Line line;
        line.type = LDIF_Line::dn;
        line.attribute = "dn";
        line.value = text;
        LDIF_Line comment_line;
        comment_line.type = LDIF_Line::comment;
        comment_line.value = comment;
        LDIF_Comment comments;
        comments += comment_line;
        LDIF_Entry entry(line, comments);
        model = {steps_of(entry.dn()), entry.dn().str(), comment + "\n", "", {}};
        // Few are merged more than once; a value that is repeated would be dropped.
        if (below(26) != 0) {
            entry += LDIF_Attribute(nullptr, "sn", std::string(1, value));
            model.values = value;
        }
        return entry;
    }

  private:
    unsigned number_ = 0;
};

/// Drops what LDIF_Values drops, too.
void drop_repeated_values(model_entry& entry) {
    std::string kept;
    for (const char value : entry.values) {
        if (kept.find(value) == kept.npos) {
            kept += value;
        }
    }
    entry.values = kept;
    for (model_entry& child : entry.children) {
        drop_repeated_values(child);
    }
}

}  // namespace

TEST(child_index, RandomInsertionsBuildTheTreeThatTheWalkOverAllSiblingsBuilds) {
    random_entries names(1);
    for (int round = 0; round < 150; ++round) {
        SCOPED_TRACE(round);
        const unsigned count = 1 + names.below(60);
        const unsigned depth = 1 + names.below(5);
        LDIF_Entry root;
        model_entry expected;
        for (unsigned i = 0; i < count; ++i) {
            model_entry model;
            LDIF_Entry entry = names.entry(names.dn(1 + names.below(depth)), model);
            const bool is_copied = names.below(2) == 0;
            const LDIF_Entry& receiver = is_copied ? root += entry : root += std::move(entry);
            ASSERT_EQ(receiver.dn().str(), expected.add(model).dn);
            if (names.below(40) == 0) {
                LDIF_Entry copy(root);
                root = names.below(2) == 0 ? copy : std::move(copy);
            }
        }
        drop_repeated_values(expected);
        ASSERT_EQ(shape(root), shape(expected));
        ASSERT_EQ(file_text(root), file_text(expected));
        for (unsigned i = 0; i < 100; ++i) {
            const LDIF_DN wanted = dn_of(names.dn(1 + names.below(depth)));
            const LDIF_Entry* found = root.find(wanted);
            const model_entry* model = expected.find(steps_of(wanted));
            ASSERT_EQ(found != nullptr, model != nullptr) << wanted.str();
            ASSERT_EQ(found ? found->str() : "", model ? model->str() : "");
        }
    }
}

TEST(child_index, RandomSubtreesArePlacedWhereTheWalkOverAllSiblingsPlacesThem) {
    random_entries names(2);
    for (int round = 0; round < 150; ++round) {
        SCOPED_TRACE(round);
        LDIF_Entry root;
        model_entry expected;
        for (unsigned tree = 0; tree < 8; ++tree) {
            model_entry model_top;
            const std::string top_name = names.dn(1 + names.below(2));
            LDIF_Entry top = names.entry(top_name, model_top);
            for (unsigned i = names.below(6); i > 0; --i) {
                LDIF_Entry entry(dn_of(names.dn(1 + names.below(2)) + "," + top_name));
                model_top.add({steps_of(entry.dn()), entry.dn().str(), "", "", {}});
                top += entry;
            }
            root += top;
            expected.add(model_top);
        }
        drop_repeated_values(expected);
        ASSERT_EQ(shape(root), shape(expected));
        ASSERT_EQ(file_text(root), file_text(expected));
    }
}

TEST(child_index, WideTreeIsBuiltSearchedCopiedAndDestroyed) {
    constexpr int width = 100000;
    LDIF_Entry root;
    root += LDIF_Entry(dn_of("o=wide"));
    for (int i = 0; i < width; ++i) {
        root += LDIF_Entry(dn_of("cn=" + std::to_string(i) + ",o=wide"));
    }
    ASSERT_EQ(root.children().size(), 1u);
    const LDIF_Entry& wide = root.children().front();
    ASSERT_EQ(wide.children().size(), static_cast<size_t>(width));
    EXPECT_EQ(wide.children().front().relative_dn().str(), "cn=0");
    EXPECT_EQ(wide.children().back().relative_dn().str(), "cn=99999");
    EXPECT_EQ(root.find(dn_of("CN=99999,o=wide")), &wide.children().back());
    EXPECT_EQ(root.find(dn_of("cn=100000,o=wide")), nullptr);
    const LDIF_Entry copy(root);
    EXPECT_TRUE(copy.find(dn_of("cn=50000,o=wide")));
}

TEST(child_index, ManyEntriesMoveUnderAParentThatComesLast) {
    constexpr int width = 20000;
    LDIF_Entry root;
    for (int i = 0; i < width; ++i) {
        root += LDIF_Entry(dn_of("cn=" + std::to_string(i) + ",ou=later,o=wide"));
    }
    root += LDIF_Entry(dn_of("o=wide"));
    root += LDIF_Entry(dn_of("ou=later,o=wide"));
    const LDIF_Entry& parent = root.children().front().children().front();
    ASSERT_EQ(parent.children().size(), static_cast<size_t>(width));
    EXPECT_EQ(parent.children().back().relative_dn().str(), "cn=19999");
}

TEST(child_index, EntriesMoveDownAChainOfParentsThatComesFromTheRoot) {
    constexpr size_t depth = 60;
    const auto chain = [](size_t length) {
        std::string dn = "o=top";
        for (size_t level = 1; level <= length; ++level) {
            dn = "ou=" + std::to_string(level) + "," + dn;
        }
        return dn;
    };
    LDIF_Entry root;
    // A few of them leave the others on the way, and one is written otherwise.
    for (const size_t end : {depth, depth / 2, depth, depth - 1, size_t{3}, depth}) {
        const std::string number = std::to_string(root.children().size());
        root += LDIF_Entry(dn_of("cn=" + number + "," + chain(end)));
    }
    root += LDIF_Entry(dn_of("cn=\"other\"," + chain(depth)));
    for (size_t level = 0; level <= depth; ++level) {
        root += LDIF_Entry(dn_of(chain(level)));
        EXPECT_TRUE(root.find(dn_of("CN=2," + chain(depth)))) << level;
    }
    const auto names_below = [&](size_t level) {
        std::vector<std::string> names;
        for (const LDIF_Entry& child : root.find(dn_of(chain(level)))->children()) {
            names.push_back(child.relative_dn().str());
        }
        return names;
    };
    EXPECT_THAT(names_below(depth), ElementsAre("cn=0", "cn=2", "cn=5", "cn=\"other\""));
    EXPECT_THAT(names_below(depth - 1), ElementsAre("cn=3", "ou=60"));
    EXPECT_THAT(names_below(depth / 2), ElementsAre("cn=1", "ou=31"));
    EXPECT_THAT(names_below(3), ElementsAre("cn=4", "ou=4"));
}

// A tree needs memory for the square of its depth, so the stack is small instead of the tree deep.
TEST(child_index, DeepTreeIsBuiltPrintedAndDestroyedWithoutRecursion) {
    on_a_small_stack([] {
        constexpr size_t depth = 1500;
        LDIF_Entry root;
        LDIF_DN dn;
        cisString step = "cn=x";
        const LDIF_RDN rdn(step);
        for (size_t level = 0; level < depth; ++level) {
            dn += rdn;
            root += LDIF_Entry(dn);
        }
        EXPECT_TRUE(root.find(dn));
        size_t visited = 0;
        cfg32::for_each_in_preorder(root, [&](const LDIF_Entry&) { ++visited; });
        EXPECT_EQ(visited, depth + 1);
        LDIF_Entry moved(std::move(root));
        moved.clear();
        EXPECT_TRUE(moved.children().empty());
    });
}

TEST(child_index, DeepTreeThatIsAddedFromItsLeafUpEndsInTheSameChain) {
    constexpr size_t depth = 300;
    LDIF_DN dn;
    cisString step = "cn=x";
    const LDIF_RDN rdn(step);
    for (size_t level = 0; level < depth; ++level) {
        dn += rdn;
    }
    const LDIF_DN leaf = dn;
    LDIF_Entry root;
    for (; !dn.empty(); dn.remove_leaf()) {
        root += LDIF_Entry(dn);
    }
    const LDIF_Entry* found = root.find(leaf);
    ASSERT_TRUE(found);
    EXPECT_EQ(found->relative_dn().str(), "cn=x");
    EXPECT_EQ(root.children().size(), 1u);
}

namespace {

/// Entries that are not in a tree, and an index of them.
struct indexed_entries {
    LDIF_Entry::list entries;
    child_index index;

    child_index::position add(const std::string& dn) {
        entries.emplace_back(dn_of(dn));
        const auto position = std::prev(entries.end());
        index.insert(position, cfg32::dn_path(position->named_dn()));
        return position;
    }

    std::string nearest(const std::string& dn, size_t from = 0) const {
        const LDIF_Entry* entry = index.equal_or_ancestor(cfg32::dn_path(dn_of(dn)), from);
        return entry ? entry->dn().str() : "none";
    }

    std::vector<std::string> below(const std::string& dn) const {
        std::vector<std::string> names;
        const LDIF_Entry sibling(dn_of(dn));
        const cfg32::dn_path path(sibling.named_dn());
        for (const auto position : index.descendants(sibling, path)) {
            names.push_back(position->dn().str());
        }
        return names;
    }
};

}  // namespace

TEST(child_index, FindsAnEqualChildOrAnAncestor) {
    indexed_entries children;
    children.add("o=a");
    children.add("cn=2,cn=1,o=b");
    EXPECT_EQ(children.nearest("O=A"), "o=a");
    EXPECT_EQ(children.nearest("cn=x,cn=y,o=a"), "o=a");
    EXPECT_EQ(children.nearest("cn=2,cn=1,o=b"), "cn=2, cn=1, o=b");
    EXPECT_EQ(children.nearest("sn=x,cn=2,CN=1,o=b"), "cn=2, cn=1, o=b");
    EXPECT_EQ(children.nearest("cn=1,o=b"), "none");
    EXPECT_EQ(children.nearest("o=b"), "none");
    EXPECT_EQ(children.nearest("o=c"), "none");
    EXPECT_EQ(children.nearest("cn=x,o=a,dc=top", 1), "o=a");
    EXPECT_EQ(children.nearest("o=a", 1), "none");
}

TEST(child_index, FindsDescendantsInTheOrderTheyWereEntered) {
    indexed_entries children;
    children.add("cn=2,o=a");
    children.add("o=b");
    children.add("sn=1,cn=1,o=a");
    children.add("cn=1,O=A");
    EXPECT_THAT(children.below("o=a"), ElementsAre("cn=2, o=a", "sn=1, cn=1, o=a", "cn=1, O=A"));
    EXPECT_THAT(children.below("cn=1,o=a"), ElementsAre("sn=1, cn=1, o=a"));
    EXPECT_THAT(children.below("o=b"), IsEmpty());
    EXPECT_THAT(children.below("o=c"), IsEmpty());
}

TEST(child_index, ErasedChildIsFoundNoMore) {
    indexed_entries children;
    const auto first = children.add("cn=1,o=a");
    children.add("cn=2,o=a");
    children.index.erase(first);
    EXPECT_EQ(children.nearest("cn=1,o=a"), "none");
    EXPECT_EQ(children.nearest("cn=2,o=a"), "cn=2, o=a");
    EXPECT_THAT(children.below("o=a"), ElementsAre("cn=2, o=a"));
}

// Another thread may do so while it is filled.
TEST(child_index, HasOneKindOfHashesHoweverOftenTheLocaleChanges) {
    const std::string before = setlocale(LC_ALL, nullptr);
    indexed_entries children;
    for (int i = 0; i < 8; ++i) {
        setlocale(LC_ALL, i % 2 == 0 ? "C" : "C.UTF-8");
        children.add("cn=idx" + std::to_string(i));
    }
    for (int i = 0; i < 8; ++i) {
        setlocale(LC_ALL, i % 2 == 0 ? "C.UTF-8" : "C");
        EXPECT_EQ(children.nearest("cn=idx" + std::to_string(i)), "cn=idx" + std::to_string(i));
    }
    setlocale(LC_ALL, before.c_str());
}

TEST(child_index, TellsWhereAChildStands) {
    indexed_entries children;
    std::vector<child_index::position> positions;
    for (const char* dn : {"o=a", "cn=2,cn=1,o=b", "cn=1,o=c", "cn=1+sn=2,o=d"}) {
        positions.push_back(children.add(dn));
    }
    for (const auto position : positions) {
        EXPECT_EQ(children.index.position_of(*position), position);
    }
    children.index.erase(positions[1]);
    EXPECT_EQ(children.index.position_of(*positions[0]), positions[0]);
    EXPECT_EQ(children.index.position_of(*positions[2]), positions[2]);
}

// A child is meant by itself and not by its name.
TEST(child_index, TellsChildrenOfTheSameNameApart) {
    indexed_entries children;
    const auto first = children.add("cn=1,o=a");
    const auto second = children.add("CN=1,O=A");
    EXPECT_EQ(children.index.position_of(*first), first);
    EXPECT_EQ(children.index.position_of(*second), second);
    children.index.erase(first);
    EXPECT_EQ(children.index.position_of(*second), second);
    EXPECT_EQ(children.nearest("cn=1,o=a"), "CN=1, O=A");
}

TEST(child_index, AncestorsThatTurnUpInReverseTakeTheirDescendantsOver) {
    LDIF_Entry root;
    for (int i = 0; i < 50; ++i) {
        root += LDIF_Entry(dn_of("cn=a, cn=" + std::to_string(i) + ", cn=missing, o=x"));
    }
    for (int i = 50; i-- > 0;) {
        root += LDIF_Entry(dn_of("cn=" + std::to_string(i) + ", cn=missing, o=x"));
    }
    ASSERT_EQ(root.children().size(), 50U);
    for (const LDIF_Entry& entry : root.children()) {
        EXPECT_EQ(entry.children().size(), 1U) << entry.str();
    }
    root += LDIF_Entry(dn_of("cn=missing, o=x"));
    ASSERT_EQ(root.children().size(), 1U);
    EXPECT_EQ(root.children().front().children().size(), 50U);
    EXPECT_EQ(root.children().front().children().front().dn().str(), "cn=49, cn=missing, o=x");
}

TEST(child_index, WithoutChildrenHasNothingToFind) {
    const indexed_entries children;
    EXPECT_EQ(children.nearest("o=a"), "none");
    EXPECT_THAT(children.below("o=a"), IsEmpty());
}
