// What was written reads back as the same tree, and is written again as the same bytes.

#include <gmock/gmock.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "LDIF_File.h"
#include "stores.h"
#include "tree_description.h"
#include "utf8_locale.h"

using namespace cfg32::tests;

namespace {

struct LDIF_File_round_trip : store_test {
    void check(const std::string& text, bool has_unusable_lines) {
        const auto file = store(text);
        const std::string tree = description(*file);
        EXPECT_TRUE(has_unusable_lines || tree.find("oru-slapdInvalidLine") == tree.npos) << tree;
        file->flush();
        const std::string written = folder.read("conf");
        EXPECT_EQ(written, text_of(*file));
        LDIF_File again(path, "", nullptr);
        EXPECT_EQ(description(again), tree);
        again.flush();
        EXPECT_EQ(folder.read("conf"), written);
        EXPECT_EQ(file->refresh(), 1);
        EXPECT_EQ(description(*file), tree);
    }
};

/// How a generated file is: each number is how many of a hundred are so.
struct recipe {
    const char* what;
    unsigned comments;       ///< lines that have comment or blank lines before them
    unsigned continuations;  ///< lines that are continued
    unsigned odd_names;      ///< RDNs that need quotes, escapes or other care
    unsigned multibyte;      ///< values and RDNs of other than ASCII characters
    unsigned unusable;       ///< lines that become oru-slapdInvalidLine
    unsigned returns;        ///< lines that end with a carriage return, too
    unsigned heads;          ///< files that begin with version and charset
};

constexpr recipe recipes[] = {
    {"plain", 0, 0, 0, 0, 0, 0, 100},
    {"without a head", 30, 0, 0, 0, 0, 0, 0},
    {"with comments", 50, 0, 0, 0, 0, 0, 50},
    {"with continuations", 10, 60, 0, 0, 0, 0, 50},
    {"with odd names", 10, 10, 70, 0, 0, 0, 50},
    {"with multibyte text", 10, 0, 0, 60, 0, 0, 50},
    {"with continued multibyte text", 10, 60, 20, 60, 0, 0, 50},
    {"with unusable lines", 20, 20, 0, 0, 20, 0, 50},
    {"of another system", 20, 20, 20, 0, 0, 100, 50},
    {"with everything", 20, 20, 20, 20, 10, 20, 50},
};

class generator {
  public:
    generator(const recipe& recipe, unsigned seed) : recipe_(recipe), random_(seed) {}

    std::string file() {
        text_.clear();
        if (happens(recipe_.heads)) {
            line("version: 1");
            line("charset: UTF-8");
            text_ += "\n";
        }
        for (unsigned i = 1 + below(12); i > 0; --i) {
            entry();
        }
        before_a_line();
        return text_;
    }

  private:
    unsigned below(unsigned count) { return static_cast<unsigned>(random_() % count); }
    bool happens(unsigned of_a_hundred) { return below(100) < of_a_hundred; }

    template <size_t count>
    std::string one_of(const char* const (&texts)[count]) {
        return texts[below(count)];
    }

    std::string rdn() {
        static const char* const plain[] = {"cn=a", "cn=b", "CN=c", "ou=x y", "o=d", "sn=1"};
        static const char* const odd[] = {
            "cn=\"a, b\"",     "cn=a\\,b",     "cn=#616263", "oid.2.5.4.3=x",
            "  cn =  spaced ", "cn=\\23x",     "cn=a\\=b",   "cn=\"\\\"\"",
            "cn=\" a \"",      "cn=\\20a\\20", "cn=a\\\\b",  "cn=\"<a>\"",
            "cn=\"a;b\"",      "cn=\"a+b\"",   "cn=a\\0A",   "cn=\"#616263\""};
        static const char* const multibyte[] = {"cn=Müller", "ou=日本 語", "cn=\"ß, €\"",
                                                "cn=\\C3\\BC"};
        return happens(recipe_.odd_names)   ? one_of(odd)
               : happens(recipe_.multibyte) ? one_of(multibyte)
                                            : one_of(plain);
    }

    std::string dn() {
        std::string text = rdn();
        for (unsigned i = below(4); i > 0; --i) {
            text += (below(4) == 0 ? ";" : below(2) == 0 ? "," : ", ") + rdn();
        }
        return text;
    }

    void entry() {
        before_a_line();
        line((below(4) == 0 ? "DN: " : "dn: ") + dn());
        for (unsigned i = below(6); i > 0; --i) {
            before_a_comment();
            attribute();
        }
        text_ += "\n";
    }

    void attribute() {
        static const char* const usable[] = {"cn: a",
                                             "sn: a value of several words",
                                             "SN:  other",
                                             "description:",
                                             "objectclass: top",
                                             "oru-slapdPort: 0389",
                                             "oru-slapdAdminDN: cn=x;o=y",
                                             "oru-slapdReadOnly: TRUE",
                                             "labeledURI:: http://host/",
                                             "note: # no comment",
                                             "note: dn: cn=x"};
        // Those without a colon get a blank at the end, which the next load drops.
        static const char* const unusable[] = {"oru-slapdPort: many", "version: 2",
                                               "oru-slapdReadOnly: perhaps"};
        static const char* const multibyte[] = {"sn: Grüße aus München", "sn: 日本語の値",
                                                "note: €", "описание: текст"};
        line(happens(recipe_.unusable)    ? one_of(unusable)
             : happens(recipe_.multibyte) ? one_of(multibyte)
                                          : one_of(usable));
    }

    void before_a_line() {
        while (happens(recipe_.comments)) {
            text_ += below(2) == 0 ? "\n" : "# a comment: " + std::to_string(below(10)) + "\n";
        }
    }

    /// Within an entry: a blank line would end it.
    void before_a_comment() {
        while (happens(recipe_.comments)) {
            text_ += below(2) == 0 ? "#\n" : "#  another\n";
        }
    }

    void line(std::string text) {
        // Breaks stand behind the first character of the value, and not within one.
        const size_t colon = std::min(text.find(':'), text.size());
        const size_t value = text.find_first_not_of(": ", colon);
        for (size_t at = value; at < text.size(); ++at) {
            const bool is_within = (static_cast<unsigned char>(text[at]) & 0xC0) == 0x80;
            if (!is_within && at > value && below(300) < recipe_.continuations) {
                text.insert(at, "\n ");
                at += 2;
            }
        }
        text_ += text + (happens(recipe_.returns) ? "\r\n" : "\n");
    }

    const recipe& recipe_;
    std::mt19937 random_;
    std::string text_;
};

}  // namespace

TEST_F(LDIF_File_round_trip, GeneratedFilesAreWrittenAsWhatTheyAre) {
    for (const recipe& recipe : recipes) {
        if (recipe.multibyte > 0 && !locale_is_utf8()) {
            continue;
        }
        generator files(recipe, 53);
        for (int round = 0; round < 40; ++round) {
            const std::string text = files.file();
            SCOPED_TRACE(std::string(recipe.what) + "\n" + text);
            try {
                check(text, recipe.unusable > 0);
            } catch (const LDIF_Exception& e) {
                ADD_FAILURE() << e.dump();
            }
            ASSERT_FALSE(HasFailure());
        }
    }
}
