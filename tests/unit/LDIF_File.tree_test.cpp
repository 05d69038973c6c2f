// The tree is drawn line by line as its rules say, in both styles.

#include <gmock/gmock.h>

#include <set>
#include <string>
#include <utility>
#include <vector>

#include "LDIF_File.h"
#include "failures.h"
#include "random_names.h"
#include "small_stack.h"
#include "stores.h"

using namespace cfg32::tests;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

struct LDIF_File_treeView : store_test {
    /// A file with those entries, in that order.
    static std::string file_of(const std::vector<std::string>& dns) {
        std::string text = "charset: x\nversion: 1\n\n";
        for (const std::string& dn : dns) {
            text += "dn: " + dn + "\n\n";
        }
        return text;
    }

    std::string drawing_of(const std::vector<std::string>& dns, bool oem) {
        return store(file_of(dns))->treeView(oem);
    }
};

LDIF_Entry tree_of(const std::vector<std::string>& dns) {
    LDIF_Entry root;
    for (const std::string& dn : dns) {
        root += LDIF_Entry(dn_of(dn));
    }
    return root;
}

std::vector<std::string> texts(const std::set<LDIF_DN>& dns) {
    std::vector<std::string> all;
    for (const LDIF_DN& dn : dns) {
        all.push_back(dn.str());
    }
    return all;
}

// The drawings as their rules say them literally.

std::string without_last(std::string text) {
    text.pop_back();
    return text;
}

void note_undefined(const LDIF_Entry& entry, std::set<LDIF_DN>& undefined) {
    for (size_t i = 1; i < entry.relative_dn().rdns().size(); ++i) {
        LDIF_DN dn = entry.dn();
        for (size_t removed = 0; removed < i; ++removed) {
            dn.remove_leaf();
        }
        undefined.insert(dn);
    }
}

std::string literal_plain(const LDIF_Entry& entry, std::set<LDIF_DN>& undefined,
                          const std::string& prefix) {
    std::string out;
    if (!entry.is_root()) {
        const std::string name = entry.relative_dn().str();
        if (!prefix.empty()) {
            out += without_last(prefix) + "+- " + name;
            if (entry.relative_dn().rdns().size() > 1) {
                out += " *";
                note_undefined(entry, undefined);
            }
        } else {
            out += "- " + name + " (suffix)";
        }
        out += "\n";
    }
    size_t left = entry.children().size();
    for (const LDIF_Entry& child : entry.children()) {
        std::string child_prefix = prefix;
        --left;
        if (entry.is_root()) {
            out += "\n";
        } else {
            out += prefix + "    |\n";
            child_prefix += left > 0 ? "    |" : "     ";
        }
        out += literal_plain(child, undefined, child_prefix);
    }
    return out;
}

std::string literal_oem(const LDIF_Entry& entry, bool last, std::set<LDIF_DN>& undefined,
                        const std::string& prefix) {
    std::string out;
    if (!entry.is_root()) {
        const std::string name = entry.relative_dn().str();
        if (!prefix.empty()) {
            out += without_last(prefix) + (last ? '\xC0' : '\xC3') + '\xC4' + " " + name;
            if (entry.relative_dn().rdns().size() > 1) {
                out += " *";
                note_undefined(entry, undefined);
            }
        } else {
            out += std::string(1, '\xC4') + " " + name + " (suffix)";
        }
        out += "\n";
    }
    size_t left = entry.children().size();
    for (const LDIF_Entry& child : entry.children()) {
        --left;
        if (entry.is_root()) {
            out += "\n" + literal_oem(child, false, undefined, prefix);
        } else {
            const std::string more = std::string("    ") + '\xB3';
            out += literal_oem(child, left == 0, undefined, prefix + (left > 0 ? more : "     "));
        }
    }
    return out;
}

std::string literal_view(const LDIF_Entry& root, bool oem) {
    std::set<LDIF_DN> undefined;
    std::string out =
        oem ? literal_oem(root, true, undefined, "") : literal_plain(root, undefined, "");
    if (!undefined.empty()) {
        out += "\n* the following entries are undefined:\n";
        for (const LDIF_DN& dn : undefined) {
            out += dn.str() + "\n";
        }
    }
    return out;
}

}  // namespace

TEST_F(LDIF_File_treeView, TreesAreDrawnToTheByte) {
    const struct {
        const char* what;
        std::vector<std::string> dns;
        const char* plain;
        const char* oem;
    } rows[] = {
        {"nothing", {}, "", ""},
        {"a suffix", {"o=a"}, "\n- o=a (suffix)\n", "\n\xC4 o=a (suffix)\n"},
        {"several suffixes",
         {"o=a", "O=b", "o=c"},
         "\n- o=a (suffix)\n\n- O=b (suffix)\n\n- o=c (suffix)\n",
         "\n\xC4 o=a (suffix)\n\n\xC4 O=b (suffix)\n\n\xC4 o=c (suffix)\n"},
        {"a child",
         {"o=a", "cn=1,o=a"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- cn=1\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC0\xC4 cn=1\n"},
        {"children in the order of the file",
         {"o=a", "cn=2,o=a", "cn=1,o=a", "cn=3,o=a"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- cn=2\n"
         "    |\n"
         "    +- cn=1\n"
         "    |\n"
         "    +- cn=3\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC3\xC4 cn=2\n"
         "    \xC3\xC4 cn=1\n"
         "    \xC0\xC4 cn=3\n"},
        {"a bar past what is not the last child, and none past what is",
         {"o=a", "cn=1,o=a", "sn=x,cn=1,o=a", "sn=y,cn=1,o=a", "cn=2,o=a", "sn=z,cn=2,o=a", "o=b",
          "cn=3,o=b"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- cn=1\n"
         "    |    |\n"
         "    |    +- sn=x\n"
         "    |    |\n"
         "    |    +- sn=y\n"
         "    |\n"
         "    +- cn=2\n"
         "         |\n"
         "         +- sn=z\n"
         "\n"
         "- o=b (suffix)\n"
         "    |\n"
         "    +- cn=3\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC3\xC4 cn=1\n"
         "    \xB3    \xC3\xC4 sn=x\n"
         "    \xB3    \xC0\xC4 sn=y\n"
         "    \xC0\xC4 cn=2\n"
         "         \xC0\xC4 sn=z\n"
         "\n"
         "\xC4 o=b (suffix)\n"
         "    \xC0\xC4 cn=3\n"},
        {"a deep one",
         {"o=a", "cn=1,o=a", "cn=2,cn=1,o=a", "cn=3,cn=2,cn=1,o=a"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- cn=1\n"
         "         |\n"
         "         +- cn=2\n"
         "              |\n"
         "              +- cn=3\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC0\xC4 cn=1\n"
         "         \xC0\xC4 cn=2\n"
         "              \xC0\xC4 cn=3\n"},
        {"a missing parent",
         {"o=a", "sn=x,cn=1,o=a"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- sn=x, cn=1 *\n"
         "\n"
         "* the following entries are undefined:\n"
         "cn=1, o=a\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC0\xC4 sn=x, cn=1 *\n"
         "\n"
         "* the following entries are undefined:\n"
         "cn=1, o=a\n"},
        // The root is never missing, so that nothing is missing below it.
        {"missing ancestors directly below the root",
         {"sn=x,cn=1,o=a", "o=b"},
         "\n- sn=x, cn=1, o=a (suffix)\n\n- o=b (suffix)\n",
         "\n\xC4 sn=x, cn=1, o=a (suffix)\n\n\xC4 o=b (suffix)\n"},
        {"missing ancestors below such an entry",
         {"sn=x,cn=1,o=a", "ou=z,ou=y,sn=x,cn=1,o=a"},
         "\n"
         "- sn=x, cn=1, o=a (suffix)\n"
         "    |\n"
         "    +- ou=z, ou=y *\n"
         "\n"
         "* the following entries are undefined:\n"
         "ou=y, sn=x, cn=1, o=a\n",
         "\n"
         "\xC4 sn=x, cn=1, o=a (suffix)\n"
         "    \xC0\xC4 ou=z, ou=y *\n"
         "\n"
         "* the following entries are undefined:\n"
         "ou=y, sn=x, cn=1, o=a\n"},
        {"an RDN of several parts is one step",
         {"o=a", "cn=1+sn=2,o=a"},
         "\n"
         "- o=a (suffix)\n"
         "    |\n"
         "    +- cn=1 + sn=2\n",
         "\n"
         "\xC4 o=a (suffix)\n"
         "    \xC0\xC4 cn=1 + sn=2\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(drawing_of(row.dns, false), row.plain);
        EXPECT_EQ(drawing_of(row.dns, true), row.oem);
    }
}

// An ancestor comes after its descendants; each is listed once.
TEST_F(LDIF_File_treeView, UndefinedEntriesAreListedOnceAndInTheOrderOfNames) {
    const std::string text = drawing_of({"o=a", "cn=9,cn=3,cn=2,o=a", "cn=8,cn=3,CN=2,o=a",
                                         "cn=7,cn=1,o=a", "o=0", "cn=6,cn=5,o=0"},
                                        false);
    const size_t list = text.find("\n* ");
    ASSERT_NE(list, text.npos);
    EXPECT_EQ(text.substr(list),
              "\n* the following entries are undefined:\n"
              "cn=5, o=0\n"
              "cn=1, o=a\n"
              "cn=3, cn=2, o=a\n"
              "cn=2, o=a\n");
}

TEST_F(LDIF_File_treeView, EmptyFileIsDrawnAsNothing) {
    for (const char* text : {"", "\n\n", "charset: x\nversion: 1\n"}) {
        EXPECT_EQ(store(text)->treeView(false), "");
        EXPECT_EQ(store(text)->treeView(true), "");
    }
}

TEST_F(LDIF_File_treeView, DrawingChangesNothing) {
    const std::string text = file_of({"o=a", "sn=x, cn=1, o=a"});
    const auto file = store(text);
    EXPECT_EQ(file->treeView(false), file->treeView(false));
    EXPECT_EQ(text_of(*file), text);
}

TEST_F(LDIF_File_treeView, NameThatCannotBePrintedThrows) {
    const auto file = store("version: 1\n\ndn: cn=\nsn: 1\n");
    for (const bool oem : {false, true}) {
        EXPECT_EQ(failure_of([&] { file->treeView(oem); }).ldapErr, 34);
    }
}

TEST_F(LDIF_File_treeView, PartsOfATreeAreDrawnWithTheirPrefix) {
    const LDIF_Entry root = tree_of({"o=a", "cn=1,o=a", "sn=x,cn=1,o=a", "cn=2,o=a"});
    const LDIF_Entry& top = root.children().front();
    const struct {
        const char* what;
        const LDIF_Entry& entry;
        const char* prefix;
        const char* plain;
        const char* oem_last;
        const char* oem_not_last;
    } rows[] = {
        {"a suffix is never the last", top.children().front(), "",
         "- cn=1 (suffix)\n    |\n    +- sn=x\n", "\xC4 cn=1 (suffix)\n    \xC0\xC4 sn=x\n",
         "\xC4 cn=1 (suffix)\n    \xC0\xC4 sn=x\n"},
        {"the last character of the prefix gives way", top.children().back(), "ab|", "ab+- cn=2\n",
         "ab\xC0\xC4 cn=2\n", "ab\xC3\xC4 cn=2\n"},
        {"children keep the whole prefix", top.children().front(), "ab|",
         "ab+- cn=1\nab|    |\nab|    +- sn=x\n", "ab\xC0\xC4 cn=1\nab|    \xC0\xC4 sn=x\n",
         "ab\xC3\xC4 cn=1\nab|    \xC0\xC4 sn=x\n"},
        {"the root has no line, and suffixes with a prefix are no suffixes", root, "ab|",
         "\nab+- o=a\nab|    |\nab|    +- cn=1\nab|    |    |\nab|    |    +- sn=x\n"
         "ab|    |\nab|    +- cn=2\n",
         "\nab\xC3\xC4 o=a\nab|    \xC3\xC4 cn=1\nab|    \xB3    \xC0\xC4 sn=x\n"
         "ab|    \xC0\xC4 cn=2\n",
         "\nab\xC3\xC4 o=a\nab|    \xC3\xC4 cn=1\nab|    \xB3    \xC0\xC4 sn=x\n"
         "ab|    \xC0\xC4 cn=2\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.what);
        std::set<LDIF_DN> undefined;
        EXPECT_EQ(IA5_TreeView(row.entry, undefined, row.prefix), row.plain);
        EXPECT_EQ(OEM_TreeView(row.entry, true, undefined, row.prefix), row.oem_last);
        EXPECT_EQ(OEM_TreeView(row.entry, false, undefined, row.prefix), row.oem_not_last);
        EXPECT_THAT(undefined, IsEmpty());
    }
}

TEST_F(LDIF_File_treeView, UndefinedEntriesAreAddedToTheCallers) {
    const LDIF_Entry root = tree_of({"o=a", "cn=3,cn=2,cn=1,o=a"});
    const LDIF_Entry& entry = root.children().front().children().front();
    std::set<LDIF_DN> undefined = {dn_of("o=z")};
    EXPECT_EQ(IA5_TreeView(entry, undefined, "|"), "+- cn=3, cn=2, cn=1 *\n");
    EXPECT_THAT(texts(undefined), ElementsAre("cn=2, cn=1, o=a", "cn=1, o=a", "o=z"));
    undefined.clear();
    EXPECT_EQ(OEM_TreeView(entry, true, undefined, "|"), "\xC0\xC4 cn=3, cn=2, cn=1 *\n");
    EXPECT_THAT(texts(undefined), ElementsAre("cn=2, cn=1, o=a", "cn=1, o=a"));
    undefined.clear();
    // What stands directly below the root has no parent that could be missing.
    IA5_TreeView(entry, undefined, "");
    OEM_TreeView(entry, true, undefined, "");
    EXPECT_THAT(undefined, IsEmpty());
}

TEST_F(LDIF_File_treeView, GeneratedTreesAreDrawnAsTheRulesSayLiterally) {
    random_names names(52);
    for (int round = 0; round < 300; ++round) {
        std::vector<std::string> dns;
        const unsigned depth = 1 + names.below(6);
        for (unsigned i = names.below(40); i > 0; --i) {
            dns.push_back(names.dn(1 + names.below(depth)));
        }
        const std::string text = file_of(dns);
        SCOPED_TRACE(text);
        const auto file = store(text);
        for (const bool oem : {false, true}) {
            ASSERT_EQ(file->treeView(oem), literal_view(file->root(), oem));
        }
    }
}

// A drawing is as large as the square of the depth. The names are short, as each entry is added to
// its parent alone.
TEST_F(LDIF_File_treeView, ChainThatIsDeeperThanTheStackIsDrawn) {
    on_a_small_stack([] {
        constexpr size_t depth = 4000;
        constexpr size_t widest_line = 5 * (depth - 1) + sizeof "+- cn=x";
        LDIF_Entry top(dn_of("cn=x"));
        LDIF_Entry* last = &top;
        for (size_t level = 1; level < depth; ++level) {
            *last += LDIF_Entry(dn_of("cn=x,cn=x"));
            last = last->find(dn_of("cn=x,cn=x"));
            ASSERT_TRUE(last);
        }
        std::set<LDIF_DN> undefined;
        const std::string plain = IA5_TreeView(top, undefined, "");
        EXPECT_EQ(plain.size() - plain.rfind('\n', plain.size() - 2), widest_line);
        const std::string oem = OEM_TreeView(top, true, undefined, "");
        EXPECT_EQ(oem.size() - oem.rfind('\n', oem.size() - 2), widest_line);
        EXPECT_TRUE(undefined.empty());
    });
}
