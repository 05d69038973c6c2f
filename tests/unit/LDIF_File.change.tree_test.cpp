// Entries are added and erased where the rules of the tree put them, and are found again.

#include <gmock/gmock.h>

#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "failing_new.h"
#include "failures.h"
#include "model_tree.h"
#include "modifications.h"
#include "random_names.h"
#include "stores.h"

using namespace cfg32::tests;
using namespace cfg32::tests::operations;
using testing::AnyOf;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

struct LDIF_File_change : store_test {
    /// A store with those entries, in that order.
    std::unique_ptr<LDIF_File> store_of(const std::vector<std::string>& dns) {
        std::string text = store_head;
        for (const std::string& dn : dns) {
            text += "dn: " + dn + "\n\n";
        }
        return store(text);
    }

    static void add_entry(LDIF_File& file, const std::string& dn,
                          const std::vector<change>& changes = {}) {
        file.add(dn_of(dn), modifications(changes).records());
    }

    /// The store's entries in their order.
    static std::vector<std::string> entries(const LDIF_File& file) {
        std::vector<std::string> all;
        cfg32::for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) {
            if (!entry.is_root()) {
                all.push_back(entry.dn().str());
            }
        });
        return all;
    }

    static std::string relative_name(const LDIF_File& file, const std::string& dn) {
        const LDIF_Entry* entry = file.root().find(dn_of(dn));
        return entry ? entry->relative_dn().str() : "none";
    }
};

/// Makes the change of a store again and again, each time with less memory from some allocation on,
/// until it is made. What a flush writes afterwards has been changed wholly or not at all.
template <class Make, class Change>
void expect_all_or_nothing(const temporary_folder& folder, Make make, Change change) {
    const auto text_after = [&](LDIF_File& file) {
        file.refresh();
        file.flush();
        return folder.read("conf");
    };
    const std::string before = text_after(*make());
    const auto changed = make();
    change(*changed);
    changed->flush();
    const std::string after = folder.read("conf");
    ASSERT_NE(before, after);
    bool is_made = false;
    for (long which = 0; !is_made; ++which) {
        SCOPED_TRACE(which);
        const auto file = make();
        {
            const failing_allocation failing(which, failing_allocation::from_then_on);
            try {
                change(*file);
                is_made = !failing.happened();
            } catch (const std::exception&) {  // of the library, or of the making of its arguments
            }
        }
        if (!is_made) {
            ASSERT_THAT(text_after(*file), AnyOf(before, after));
        }
    }
}

using LDIF_File_add = LDIF_File_change;
using LDIF_File_erase = LDIF_File_change;

}  // namespace

TEST_F(LDIF_File_add, EntryIsMadeWithItsAttributes) {
    const auto file = store_of({"o=a"});
    const std::string before = folder.read("conf");
    add_entry(*file, "CN=1;o=A",
              {{add, "sn", {"2", "1", "2"}}, {add, "cn", {"1"}}, {add, "SN", {"3"}}});
    EXPECT_EQ(text_of(*file), before + "dn: CN=1, o=A\ncn: 1\nsn: 2\nsn: 1\nsn: 3\n\n");
    EXPECT_EQ(folder.read("conf"), before) << "it is a flush that writes";
}

TEST_F(LDIF_File_add, OperationOfAModificationIsNotLookedAt) {
    for (const int operation : {add, del, replace, 3, 0x100, -1 & ~binary}) {
        for (const int flag : {0, binary}) {
            const auto file = store_of({});
            add_entry(*file, "o=a", {{operation | flag, "sn", {"1", "2"}}});
            EXPECT_EQ(file->root().find(dn_of("o=a"))->str(), "dn: o=a\nsn: 1\nsn: 2\n\n")
                << operation;
        }
    }
}

TEST_F(LDIF_File_add, ModificationWithoutValuesAddsNothing) {
    const auto file = store_of({});
    add_entry(*file, "o=a", {{add, "sn", {}}, {del, "a:b", {}}, {replace | binary, "ou", {}}});
    EXPECT_TRUE(file->root().find(dn_of("o=a"))->attributes().empty());
}

TEST_F(LDIF_File_add, EntryNeedsNoAttributes) {
    const auto file = store_of({});
    add_entry(*file, "o=a");
    file->add(dn_of("o=b"), nullptr);
    EXPECT_EQ(text_of(*file), store_head + "dn: o=a\n\ndn: o=b\n\n");
}

TEST_F(LDIF_File_add, EntryTakesThePlaceThatItsNameTells) {
    const auto file = store_of({"o=a", "cn=1,o=a", "o=b"});
    add_entry(*file, "cn=2,o=a");
    add_entry(*file, "sn=x,cn=1,o=a");
    add_entry(*file, "sn=y,cn=9,o=b");
    EXPECT_THAT(entries(*file), ElementsAre("o=a", "cn=1, o=a", "sn=x, cn=1, o=a", "cn=2, o=a",
                                            "o=b", "sn=y, cn=9, o=b"));
    EXPECT_EQ(relative_name(*file, "sn=x,cn=1,o=a"), "sn=x");
    EXPECT_EQ(relative_name(*file, "sn=y,cn=9,o=b"), "sn=y, cn=9");
}

TEST_F(LDIF_File_add, EntriesThatBelongBelowANewOneMoveThere) {
    const auto file = store_of({"o=a", "sn=x,cn=1,o=a", "cn=2,o=a", "sn=y,cn=1,o=a"});
    add_entry(*file, "cn=1,o=a", {{add, "sn", {"v"}}});
    EXPECT_THAT(entries(*file),
                ElementsAre("o=a", "cn=2, o=a", "cn=1, o=a", "sn=x, cn=1, o=a", "sn=y, cn=1, o=a"));
    EXPECT_EQ(relative_name(*file, "sn=x,cn=1,o=a"), "sn=x");
    EXPECT_EQ(file->root().find(dn_of("cn=1,o=a"))->str(), "dn: cn=1, o=a\nsn: v\n\n");
}

TEST_F(LDIF_File_add, AncestorThatTurnsUpWhileMemoryIsExhaustedTakesNoEntryAway) {
    const auto make = [&] {
        return store_of({"cn=1, cn=m, o=a", "cn=2, cn=m, o=a", "cn=3, cn=m, o=a", "o=b"});
    };
    expect_all_or_nothing(folder, make, [&](LDIF_File& file) { add_entry(file, "cn=m, o=a"); });
    expect_all_or_nothing(folder, make,
                          [&](LDIF_File& file) { add_entry(file, "cn=4, cn=n, o=c"); });
}

TEST_F(LDIF_File_change, ValuesAreAllDeletedOrNoneWhileMemoryIsExhausted) {
    std::string lines;
    change deletion{del, "sn", {}};
    for (int i = 0; i < 40; ++i) {
        lines += "sn: " + std::to_string(i) + "\n";
        deletion.values.push_back(std::to_string(i));
    }
    deletion.values.resize(15);
    expect_all_or_nothing(
        folder, [&] { return store(store_head + "dn: o=a\n" + lines + "\n"); },
        [&](LDIF_File& file) { file.modify(dn_of("o=a"), modifications({deletion}).records()); });
}

TEST_F(LDIF_File_add, EntryThatIsThereTakesOverTheAttributes) {
    const auto file =
        store(store_head + "# c\ndn: o=a\ncn: 1\nsn: 1\n\ndn: cn=1, o=a\n\ndn: o=b\n\n");
    add_entry(*file, "O=A", {{add, "SN", {"1", "2"}}, {replace, "ou", {"x"}}, {del, "cn", {"1"}}});
    EXPECT_EQ(text_of(*file), store_head +
                                  "# c\ndn: o=a\ncn: 1\nou: x\nsn: 1\nsn: 2\n\ndn: cn=1, o=a\n\n"
                                  "dn: o=b\n\n");
}

TEST_F(LDIF_File_add, RootTakesNothingUnderTheEmptyNameThatNoFileHasThere) {
    const auto file = store_of({"o=a"});
    const std::string before = text_of(*file);
    add_entry(*file, "", {{add, "charset", {"x"}}});
    const struct {
        change refused;
        const char* expected;
    } rows[] = {
        {{add, "charset", {"y"}}, "19/1006 Attribute may not have multiple values."},
        {{add, "sn", {"1"}}, "21/1005 Attribute would not read back as it is written"},
    };
    for (const auto& row : rows) {
        const LDIF_Exception e = failure_of([&] { add_entry(*file, "", {row.refused}); });
        EXPECT_EQ(summary(e), row.expected);
        EXPECT_EQ(e.entryDn, "");
        EXPECT_EQ(text_of(*file), before);
    }
}

TEST_F(LDIF_File_add, RefusedEntryChangesNothing) {
    const struct {
        const char* what;
        const char* dn;
        std::vector<change> changes;
        const char* expected;
        const char* attribute;
        const char* value;
    } rows[] = {
        {"a value that the syntax refuses",
         "o=new",
         {{add, "sn", {"2"}}, {add, "oru-slapdPort", {"x"}}},
         "21/1016 Value is not valid integer syntax",
         "oru-slapdPort",
         "x"},
        {"two values of a single-valued attribute",
         "o=new",
         {{add, "sn", {"2"}}, {add, "oru-slapdPort", {"1", "2"}}},
         "19/1006 Attribute may not have multiple values.",
         "oru-slapdPort",
         "2"},
        {"the same in two modifications",
         "o=new",
         {{add, "oru-slapdPort", {"1"}}, {del, "ORU-SLAPDPORT", {"2"}}},
         "19/1006 Attribute may not have multiple values.",
         "ORU-SLAPDPORT",
         "2"},
        {"another value than the entry that is there has",
         "O=A",
         {{add, "sn", {"2"}}, {replace, "oru-slapdPort", {"636"}}},
         "19/1006 Attribute may not have multiple values.",
         "oru-slapdPort",
         "636"},
        {"another one for an entry that is there below another",
         "cn=1,o=a",
         {{add, "cn", {"2"}}},
         "19/1006 Attribute may not have multiple values.",
         "cn",
         "2"},
        {"a name that would not read back",
         "o=new",
         {{add, "a:b", {"x"}}},
         "21/1005 Attribute would not read back as it is written",
         "a:b",
         "x"},
    };
    const std::string before = store_head +
                               "dn: o=a\noru-slapdPort: 389\nsn: 1\n\n"
                               "dn: cn=1, o=a\ncn: 1\n\ndn: cn=2, o=new\n\n";
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        const auto file = store(before);
        const LDIF_Exception e = failure_of([&] { add_entry(*file, row.dn, row.changes); });
        EXPECT_EQ(summary(e), row.expected);
        EXPECT_EQ(e.entryDn, dn_of(row.dn).str());
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.attribute, row.attribute);
        EXPECT_EQ(e.value, row.value);
        EXPECT_EQ(e.attrType, getAttrType(row.attribute));
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
        EXPECT_EQ(summary(first_cause(e)), row.expected);
        EXPECT_NE(&first_cause(e), &e);
        EXPECT_EQ(text_of(*file), before);
    }
}

TEST_F(LDIF_File_add, SameSingleValueAgainIsNoSecondOne) {
    const auto file = store(store_head + "dn: o=a\noru-slapdPort: 389\n\n");
    add_entry(*file, "o=a", {{add, "oru-slapdPort", {"0389"}}});
    add_entry(*file, "o=b", {{add, "cn", {"x"}}, {add, "cn", {"X"}}});
    EXPECT_EQ(text_of(*file), store_head + "dn: o=a\noru-slapdPort: 389\n\ndn: o=b\ncn: x\n\n");
}

TEST_F(LDIF_File_erase, LeafGoesWithOrWithoutTheOption) {
    for (const bool option : {false, true}) {
        const auto file = store_of({"o=a", "cn=1,o=a", "o=b"});
        const std::string before = folder.read("conf");
        file->erase(dn_of("CN=1,O=A"), option);
        EXPECT_THAT(entries(*file), ElementsAre("o=a", "o=b"));
        file->erase(dn_of("o=a"), option);
        EXPECT_THAT(entries(*file), ElementsAre("o=b"));
        file->erase(dn_of("o=b"), option);
        EXPECT_THAT(entries(*file), IsEmpty());
        EXPECT_EQ(folder.read("conf"), before) << "it is a flush that writes";
    }
}

TEST_F(LDIF_File_erase, EntryWithChildrenNeedsTheOption) {
    const auto file = store_of({"o=a", "cn=1,o=a", "sn=x,cn=1,o=a", "sn=y,cn=9,o=a", "o=b"});
    const std::string before = text_of(*file);
    for (const char* dn : {"o=a", "cn=1, o=a"}) {
        const LDIF_Exception e = failure_of([&] { file->erase(dn_of(dn), false); });
        EXPECT_EQ(summary(e), "66/66 Use CFG_OPT_DELETE_NON_LEAVES to enable subtree delete");
        EXPECT_EQ(e.entryDn, dn);
        EXPECT_EQ(e.configFile, path);
        EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
        ASSERT_TRUE(e.cause);
        EXPECT_EQ(summary(*e.cause), summary(e));
        EXPECT_EQ(text_of(*file), before);
    }
    file->erase(dn_of("cn=1,o=a"), true);
    EXPECT_THAT(entries(*file), ElementsAre("o=a", "sn=y, cn=9, o=a", "o=b"));
    file->erase(dn_of("o=a"), true);
    EXPECT_THAT(entries(*file), ElementsAre("o=b"));
}

TEST_F(LDIF_File_erase, MissingEntryIsReported) {
    const auto file = store_of({"o=a", "cn=1,o=a", "sn=y,cn=9,o=a"});
    const std::string before = text_of(*file);
    // Among them ancestors of an entry that are missing.
    for (const char* dn :
         {"o=b", "cn=2, o=a", "sn=x, cn=1, o=a", "cn=9, o=a", "sn=z, cn=9, o=a", "cn=1", ""}) {
        for (const bool option : {false, true}) {
            const LDIF_Exception e = failure_of([&] { file->erase(dn_of(dn), option); });
            EXPECT_EQ(summary(e), "32/32 Entry not found");
            EXPECT_EQ(e.entryDn, dn);
            EXPECT_EQ(e.configFile, path);
            ASSERT_TRUE(e.cause);
            EXPECT_EQ(e.cause->entryDn, "");
        }
    }
    EXPECT_EQ(text_of(*file), before);
}

TEST_F(LDIF_File_erase, EmptyStoreHasNothingToErase) {
    const auto file = store("");
    for (const char* dn : {"o=a", "cn=1, o=a", ""}) {
        EXPECT_EQ(failure_of([&] { file->erase(dn_of(dn), true); }).ldapErr, 32);
    }
}

TEST_F(LDIF_File_erase, EntryWithMissingAncestorsIsFoundBelowTheNearestOneThatIsThere) {
    const auto file = store_of({"o=a", "ou=z,sn=y,cn=9,o=a", "cn=2,cn=1,o=b", "cn=1,o=a"});
    file->erase(dn_of("ou=z,sn=y,cn=9,o=a"), false);
    EXPECT_THAT(entries(*file), ElementsAre("o=a", "cn=1, o=a", "cn=2, cn=1, o=b"));
    file->erase(dn_of("cn=2,cn=1,o=b"), false);
    EXPECT_THAT(entries(*file), ElementsAre("o=a", "cn=1, o=a"));
}

TEST_F(LDIF_File_erase, ParentInBetweenGoesWithItsChildrenAlone) {
    const auto file =
        store_of({"o=a", "cn=1,o=a", "sn=x,cn=1,o=a", "ou=z,sn=y,cn=1,o=a", "sn=x,cn=2,o=a"});
    file->erase(dn_of("cn=1,o=a"), true);
    EXPECT_THAT(entries(*file), ElementsAre("o=a", "sn=x, cn=2, o=a"));
    add_entry(*file, "ou=z,sn=y,cn=1,o=a");
    EXPECT_EQ(relative_name(*file, "ou=z,sn=y,cn=1,o=a"), "ou=z, sn=y, cn=1");
}

TEST_F(LDIF_File_erase, SiblingsKeepTheirOrder) {
    const auto file = store_of({"cn=3", "cn=1", "cn=4", "cn=2"});
    file->erase(dn_of("cn=1"), false);
    EXPECT_THAT(entries(*file), ElementsAre("cn=3", "cn=4", "cn=2"));
    file->erase(dn_of("cn=2"), false);
    file->erase(dn_of("cn=3"), false);
    EXPECT_THAT(entries(*file), ElementsAre("cn=4"));
}

TEST_F(LDIF_File_erase, ErasedEntryCanBeAddedAgainAsANewOne) {
    const auto file =
        store(store_head + "dn: o=a\n\n# c\ndn: cn=1, o=a\nsn: 1\n\ndn: cn=2, o=a\n\n");
    file->erase(dn_of("cn=1,o=a"), false);
    add_entry(*file, "cn=1,o=a", {{add, "ou", {"x"}}});
    EXPECT_EQ(text_of(*file), store_head + "dn: o=a\n\ndn: cn=2, o=a\n\ndn: cn=1, o=a\nou: x\n\n");
    file->flush();
    EXPECT_EQ(folder.read("conf"), text_of(*file));
}

namespace {

/// Erases as the rules say it literally; returns the code of the failure, 0 for none.
int erase_literally(model_entry& root, const steps& dn, bool with_children) {
    steps shorter = dn;
    steps ancestor_dn;
    model_entry* ancestor = nullptr;
    while (!ancestor && !shorter.empty()) {
        shorter.pop_back();
        ancestor = const_cast<model_entry*>(root.find(shorter));
        ancestor_dn = shorter;
    }
    if (!ancestor) {
        ancestor = &root;
        ancestor_dn.clear();
    }
    const steps name(dn.begin() + static_cast<ptrdiff_t>(ancestor_dn.size()), dn.end());
    for (size_t i = 0; i < ancestor->children.size(); ++i) {
        if (ancestor->children[i].relative != name) {
            continue;
        }
        if (!ancestor->children[i].children.empty() && !with_children) {
            return 66;
        }
        ancestor->children.erase(ancestor->children.begin() + static_cast<ptrdiff_t>(i));
        return 0;
    }
    return 32;
}

int erase(LDIF_File& file, const LDIF_DN& dn, bool with_children) {
    try {
        file.erase(dn, with_children);
        return 0;
    } catch (const LDIF_Exception& e) {
        return e.ldapErr;
    }
}

}  // namespace

TEST_F(LDIF_File_erase, GeneratedTreesLoseWhatTheRulesSayLiterally) {
    random_names names(54);
    std::map<int, int> outcomes;
    for (int round = 0; round < 800; ++round) {
        SCOPED_TRACE(round);
        const auto file = store("");
        model_entry expected;
        const unsigned depth = 1 + names.below(5);
        for (unsigned i = names.below(40); i > 0; --i) {
            const std::string dn = names.dn(1 + names.below(depth));
            // A third of the steps erase, so that some entries come back.
            if (names.below(3) == 0) {
                const bool with_children = names.below(2) == 0;
                const int code = erase_literally(expected, steps_of(dn_of(dn)), with_children);
                ASSERT_EQ(erase(*file, dn_of(dn), with_children), code) << dn;
                ++outcomes[code];
            } else {
                add_entry(*file, dn);
                expected.add({steps_of(dn_of(dn)), dn_of(dn).str(), "", "", {}});
            }
            ASSERT_EQ(shape(file->root()), shape(expected)) << dn;
        }
    }
    for (const int code : {0, 32, 66}) {
        EXPECT_GT(outcomes[code], 100) << code << " is hardly tested";
    }
}
