#include "dn_path.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "dn_of.h"
#include "failures.h"

using namespace cfg32::tests;
using cfg32::dn_path;
using cfg32::given_text;
using cfg32::kept_dn;

namespace {

size_t hash_of(const dn_path& path, size_t from, size_t to) {
    size_t hash = cfg32::hash_seed;
    for (size_t i = from; i < to; ++i) {
        hash = path.hash(i, hash);
    }
    return hash;
}

int sign(int order) { return (order > 0) - (order < 0); }

/// DNs of few parts, so that many are equal, written in many ways.
class random_texts {
  public:
    explicit random_texts(unsigned seed) : random_(seed) {}

    std::string dn() {
        std::string text = rdn();
        for (unsigned more = random_() % 4; more > 0; --more) {
            text += one_of({", ", ", ", ", ", ",", " ;  "}) + rdn();
        }
        return text;
    }

  private:
    std::string one_of(const std::vector<std::string>& choices) {
        return choices[random_() % choices.size()];
    }
    std::string rdn() { return pair() + (random_() % 8 == 0 ? "+" + pair() : ""); }
    std::string pair() {
        return one_of({"cn", "CN", "o", "oid.2.5", "2.5"}) + one_of({"=", "=", "=", "= "}) +
               one_of({"a", "A", "b c", "b  c", "\"a\"", "\\61", "#61", "a\\,", "a ", "\xc3\xa9"});
    }

    std::mt19937 random_;
};

}  // namespace

TEST(kept_dn, ADnWrittenInTheSimplestWayIsKeptAsText) {
    for (const char* text : {"", "cn=a", "CN=a b, o-1=x-y.z/(1), dc=Com", "a=~"}) {
        const std::string memory = text;
        const kept_dn kept(given_text::lasting(memory));
        EXPECT_TRUE(kept.is_simple()) << text;
        EXPECT_EQ(kept.text().data(), memory.data()) << text;
        EXPECT_EQ(kept.dn().str(), text);
        EXPECT_EQ(kept.size(), kept.dn().rdns().size()) << text;
        EXPECT_TRUE(kept_dn(dn_of(text)).is_simple()) << text;
    }
}

TEST(kept_dn, EveryOtherDnIsKeptParsedOrBecomesSimple) {
    const struct {
        const char* text;
        bool is_simple;
    } rows[] = {
        {"cn=a,o=b", true},   {"cn=a ;o=b", false}, {" cn=a", true},       {"cn= a", true},
        {"oid.2.5=a", false}, {"2.5=a", false},     {"cn=\"a\"", false},   {"cn=#61", false},
        {"cn=a\\2Cb", false}, {"cn=a\\41", true},   {"cn=a + o=b", false}, {"cn=a\\20", false},
        {"cn=\\09a", false},  {"cn=", false},       {"cn=a, o=", false},
    };
    for (const auto& row : rows) {
        const kept_dn kept(given_text(row.text));
        EXPECT_EQ(kept.is_simple(), row.is_simple) << row.text;
        EXPECT_EQ(kept.dn(), dn_of(row.text)) << row.text;
        EXPECT_EQ(kept.size(), dn_of(row.text).rdns().size()) << row.text;
    }
    EXPECT_EQ(summary(failure_of([] { kept_dn(given_text("cn=a\\q")); })),
              "34/1014 Invalid escape sequence: \\q");
}

TEST(kept_dn, EndsWithADnThatIsPlainlyWrittenThere) {
    const struct {
        const char* dn;
        const char* end;
        bool is_there;
    } rows[] = {
        {"cn=a, o=b", "o=b", true},       {"cn=1, cn=a, o=b", "cn=a, o=b", true},
        {"cn=1, cn=a, o=b", "o=b", true}, {"o=b", "o=b", false},
        {"cn=a, o=b", "", false},         {"", "", false},
        {"cn=a, xo=b", "o=b", false},     {"cn=a, o=b", "o=B", false},
        {"cn=a + o=b", "o=b", false},     {"o=b", "cn=a, o=b", false},
        {"cn=\\20, o=b", "o=b", false},   {"cn=a, o=\\20", "o=\\20", false},
        {"cn=a\\, o\\=b", "o=b", false},  {"cn=a, o=bb", "o=b", false},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(kept_dn(given_text(row.dn)).ends_with(kept_dn(given_text(row.end))), row.is_there)
            << row.dn << " and " << row.end;
    }
}

TEST(kept_dn, PrintsWhatTheDnPrints) {
    random_texts texts(1);
    for (int i = 0; i < 500; ++i) {
        const std::string text = texts.dn();
        try {
            const std::string expected = dn_of(text).str();
            std::string printed = "> ";
            kept_dn(given_text(text)).append_to(printed);
            EXPECT_EQ(printed, "> " + expected);
            std::string copied;
            kept_dn(kept_dn(dn_of(text))).append_to(copied);
            EXPECT_EQ(copied, expected);
        } catch (const LDIF_Exception&) {
            EXPECT_THROW(kept_dn(given_text(text)), LDIF_Exception) << text;
        }
    }
    std::string none;
    EXPECT_EQ(summary(failure_of([&] { kept_dn(given_text("cn=")).append_to(none); })),
              "34/1013 Missing RDN attribute value");
}

TEST(dn_path, GivesWhatTheDnsGiveHoweverTheyAreWritten) {
    random_texts texts(2);
    int equal = 0;
    for (int i = 0; i < 4000; ++i) {
        const std::string left_text = texts.dn();
        const std::string right_text = texts.dn();
        SCOPED_TRACE(left_text + " | " + right_text);
        LDIF_DN left;
        LDIF_DN right;
        try {
            left = cisString(left_text);
            right = cisString(right_text);
        } catch (const LDIF_Exception&) {
            continue;
        }
        const kept_dn kept_left(left);
        const dn_path left_path(kept_left);
        const dn_path right_path(right);
        ASSERT_EQ(left_path.size(), left.rdns().size());
        ASSERT_EQ(sign(left_path.compare(right_path)), sign(left.compare(right)));
        ASSERT_EQ(sign(right_path.compare(left_path)), sign(right.compare(left)));
        const LDIF_DN common = left.intersection(right);
        const size_t count = common.rdns().size();
        EXPECT_TRUE(left_path.has_equal_part(0, right_path, 0, count));
        EXPECT_FALSE(left_path.has_equal_part(0, right_path, 0, count + 1));
        EXPECT_EQ(hash_of(left_path, 0, count), hash_of(right_path, 0, count));
        if (left == right) {
            ++equal;
            EXPECT_EQ(hash_of(left_path, 0, left.rdns().size()), left.hash());
        }
    }
    EXPECT_GT(equal, 20);
}

TEST(dn_path, FindsTheRelativeDnOfAnEntry) {
    LDIF_Entry root;
    LDIF_Entry parent(dn_of("o=b"));
    LDIF_Entry child(dn_of("cn=a b, o=b"));
    LDIF_Entry quoted(dn_of("cn=\"q\", o=b"));
    root += parent;
    root += child;
    root += quoted;
    const LDIF_DN wanted = dn_of("cn=x, CN=A B, O=B");
    const dn_path path(wanted);
    EXPECT_TRUE(path.is_relative_dn(0, 1, parent));
    EXPECT_TRUE(path.is_relative_dn(1, 2, child));
    EXPECT_FALSE(path.is_relative_dn(0, 2, child));
    EXPECT_FALSE(path.is_relative_dn(2, 3, child));
    EXPECT_FALSE(path.is_relative_dn(1, 2, quoted));
    const LDIF_DN plain = dn_of("CN=Q, o=b");
    EXPECT_TRUE(dn_path(plain).is_relative_dn(1, 2, quoted));
    // A longer value is not the same one.
    const LDIF_DN longer = dn_of("cn=a bc, o=b");
    EXPECT_FALSE(dn_path(longer).is_relative_dn(1, 2, child));
    const LDIF_DN shorter = dn_of("cn=a, o=b");
    EXPECT_FALSE(dn_path(shorter).is_relative_dn(1, 2, child));
}

TEST(dn_path, DnsOfManyRdnsAreFoundToo) {
    for (const size_t count : {23, 24, 25, 60}) {
        std::string text = "o=top";
        LDIF_Entry root;
        for (size_t i = 1; i < count; ++i) {
            LDIF_Entry entry(dn_of(text));
            root += entry;
            text = "cn=" + std::to_string(i) + ", " + text;
        }
        EXPECT_TRUE(kept_dn(given_text(text)).is_simple()) << count;
        root += LDIF_Entry(dn_of(text));
        const LDIF_Entry* found = root.find(dn_of(text));
        ASSERT_TRUE(found) << count;
        EXPECT_EQ(found->dn().str(), text);
        EXPECT_EQ(found->relative_dn().str(), "cn=" + std::to_string(count - 1));
    }
}

// An entry is compared with no more than its part of the path, in whichever way either is written.
TEST(dn_path, EntriesBelowALongDnAreFoundByNamesInAnotherForm) {
    std::string text = "o=top";
    LDIF_Entry root;
    for (int i = 1; i < 60; ++i) {
        root += LDIF_Entry(dn_of(text));
        text = "cn=" + std::to_string(i) + (i % 7 == 0 ? " + sn=a" : "") + ", " + text;
    }
    root += LDIF_Entry(dn_of(text));
    const LDIF_Entry* found = root.find(dn_of("cn=\"59\"" + text.substr(5)));
    ASSERT_TRUE(found);
    EXPECT_EQ(found->relative_dn().str(), "cn=59");
    EXPECT_FALSE(root.find(dn_of("cn=\"58\"" + text.substr(5))));
}
