#include "ldif_writer.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <random>
#include <sstream>

#include "change/ldif_reader.h"

namespace cfg32::tool {

TEST(LdifLine, StandsAsItIsOrInBase64) {
    const struct {
        std::string value;
        const char* expected;
    } rows[] = {
        {"", "x:\n"},
        {"a b", "x: a b\n"},
        {"a:<b", "x: a:<b\n"},
        {" a", "x:: IGE=\n"},
        {"a ", "x:: YSA=\n"},
        {":a", "x:: OmE=\n"},
        {"<a", "x:: PGE=\n"},
        {"a\nb", "x:: YQpi\n"},
        {"a\rb", "x:: YQ1i\n"},
        {std::string("a\0b", 3), "x:: YQBi\n"},
        {"\xc3\xb6", "x:: w7Y=\n"},
        {"\xff", "x:: /w==\n"},
        {"a\tb", "x: a\tb\n"},
        {"\x7f", "x:: fw==\n"},
        {"\x1b[8m", "x:: G1s4bQ==\n"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(ldif_line("x", row.value), row.expected);
    }
}

TEST(LdifLine, IsFoldedAtColumn76) {
    EXPECT_EQ(ldif_line("x", std::string(73, 'a')), "x: " + std::string(73, 'a') + "\n");
    EXPECT_EQ(ldif_line("x", std::string(74, 'a')), "x: " + std::string(73, 'a') + "\n a\n");
    EXPECT_EQ(ldif_line("x", std::string(73 + 75, 'a')),
              "x: " + std::string(73, 'a') + "\n " + std::string(75, 'a') + "\n");
    EXPECT_EQ(ldif_line("x", std::string(73 + 76, 'a')),
              "x: " + std::string(73, 'a') + "\n " + std::string(75, 'a') + "\n a\n");
    EXPECT_EQ(ldif_line("x", std::string(200, 'a'), false), "x: " + std::string(200, 'a') + "\n");
}

TEST(Ldif, PrintsEntries) {
    EXPECT_EQ(ldif(entry{"cn=a", {{"cn", {"a"}}, {"x", {"1", "2"}}}}),
              "dn: cn=a\ncn: a\nx: 1\nx: 2\n\n");
    EXPECT_EQ(ldif(entry{"", {{"version", {"1"}}}}), "dn:\nversion: 1\n\n");
}

TEST(Ldif, PrintsChangeRecords) {
    EXPECT_EQ(
        ldif(change_record{change_record::add, "cn=a", {{modification::add, "x", {"1", "2"}}}}),
        "dn: cn=a\nchangetype: add\nx: 1\nx: 2\n\n");
    EXPECT_EQ(ldif(change_record{change_record::modify,
                                 "cn=a",
                                 {{modification::replace, "x", {"1"}},
                                  {modification::remove, "y", {}},
                                  {modification::add, "z", {"2", "\xc3\xb6"}}}}),
              "dn: cn=a\nchangetype: modify\nreplace: x\nx: 1\n-\ndelete: y\n-\nadd: z\nz: 2\n"
              "z:: w7Y=\n-\n\n");
    EXPECT_EQ(ldif(change_record{change_record::remove, "cn=a", {}}),
              "dn: cn=a\nchangetype: delete\n\n");
}

namespace {

/// Changes of any text that a value can be.
class random_changes {
  public:
    change_record record() {
        const auto kind = static_cast<change_record::operation>(below(3));
        change_record made = {kind, "cn=" + text(40), {}};
        for (unsigned i = below(3) + 1; i > 0 && kind != change_record::remove; --i) {
            // Of an added entry, the values of an attribute come together.
            modification change = {kind == change_record::add
                                       ? modification::add
                                       : static_cast<modification::operation>(below(3)),
                                   "x-" + std::to_string(i),
                                   {}};
            for (unsigned k = below(3) + 1; k > 0; --k) {
                change.values.push_back(text(200));
            }
            made.modifications.push_back(change);
        }
        return made;
    }

    bool coin() { return below(2) == 0; }

  private:
    unsigned below(unsigned end) { return static_cast<unsigned>(random_() % end); }

    std::string text(unsigned longest) {
        static constexpr char common[] = " :<-#=abc";
        std::string made;
        for (unsigned length = below(longest); length > 0; --length) {
            const char any = static_cast<char>(below(256));
            const char c = below(4) == 0 ? any : common[below(sizeof common - 1)];
            made += c == '\0' || c == '\n' || c == '\r' ? '.' : c;
        }
        return made;
    }

    std::mt19937 random_{20260521};
};

void expect_same(const change_record& read, const change_record& written) {
    EXPECT_EQ(read.kind, written.kind);
    EXPECT_EQ(read.dn, written.dn);
    ASSERT_EQ(read.modifications.size(), written.modifications.size());
    for (size_t i = 0; i < read.modifications.size(); ++i) {
        EXPECT_EQ(read.modifications[i].kind, written.modifications[i].kind);
        EXPECT_EQ(read.modifications[i].attribute, written.modifications[i].attribute);
        EXPECT_EQ(read.modifications[i].values, written.modifications[i].values);
    }
}

/// No line is longer than the format's recommendation.
bool is_folded_text(const std::string& text) {
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        if (line.size() > 76) {
            return false;
        }
    }
    return true;
}

}  // namespace

TEST(Ldif, ReadsBackAsItWasWritten) {
    random_changes changes;
    for (int i = 0; i < 2000 && !testing::Test::HasFailure(); ++i) {
        const change_record written = changes.record();
        const bool is_folded = changes.coin();
        const std::string text = ldif(written, is_folded);
        EXPECT_TRUE(!is_folded || is_folded_text(text));
        const auto read = read_ldif("# a comment\n\n" + text, change_record::modify);
        ASSERT_EQ(read.size(), 1u) << text;
        ASSERT_TRUE(std::holds_alternative<change_record>(read.front())) << text;
        expect_same(std::get<change_record>(read.front()), written);
    }
}

}  // namespace cfg32::tool
