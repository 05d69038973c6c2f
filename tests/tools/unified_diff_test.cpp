#include "diff/unified_diff.h"

#include <gmock/gmock.h>

#include <cstdio>
#include <random>

#include "diff/matching_lines.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

std::string diff(const std::string& before, const std::string& after) {
    return unified_diff(before, after, "conf", false);
}

const std::string head = "--- conf\n+++ conf\n";

}  // namespace

TEST(UnifiedDiff, ShowsWhatDiffers) {
    const struct {
        const char* promise;
        std::string before;
        std::string after;
        std::string expected;
    } rows[] = {
        {"nothing", "a\nb\n", "a\nb\n", ""},
        {"nothing at all", "", "", ""},
        {"a line", "a\n", "b\n", head + "@@ -1 +1 @@\n-a\n+b\n"},
        {"all is new", "", "a\nb\n", head + "@@ -0,0 +1,2 @@\n+a\n+b\n"},
        {"all is gone", "a\nb\n", "", head + "@@ -1,2 +0,0 @@\n-a\n-b\n"},
        {"three lines around", "1\n2\n3\n4\n5\n6\n7\n8\n9\n", "1\n2\n3\n4\nx\n6\n7\n8\n9\n",
         head + "@@ -2,7 +2,7 @@\n 2\n 3\n 4\n-5\n+x\n 6\n 7\n 8\n"},
        {"an added line", "1\n2\n3\n4\n", "1\n2\n3\n4\nx\n",
         head + "@@ -2,3 +2,4 @@\n 2\n 3\n 4\n+x\n"},
        {"a removed line", "1\n2\n3\n4\n5\n", "2\n3\n4\n5\n",
         head + "@@ -1,4 +1,3 @@\n-1\n 2\n 3\n 4\n"},
        {"near changes together", "1\n2\n3\n4\n5\n6\n7\n8\n", "x\n2\n3\n4\n5\n6\n7\ny\n",
         head + "@@ -1,8 +1,8 @@\n-1\n+x\n 2\n 3\n 4\n 5\n 6\n 7\n-8\n+y\n"},
        {"distant changes apart", "1\n2\n3\n4\n5\n6\n7\n8\n9\n", "x\n2\n3\n4\n5\n6\n7\n8\ny\n",
         head + "@@ -1,4 +1,4 @@\n-1\n+x\n 2\n 3\n 4\n@@ -6,4 +6,4 @@\n 6\n 7\n 8\n-9\n+y\n"},
        {"a moved line", "1\n2\n3\n", "2\n3\n1\n", head + "@@ -1,3 +1,3 @@\n-1\n 2\n 3\n+1\n"},
        {"lines that stand twice", "a\nb\na\nb\nc\n", "b\na\nb\na\nc\n",
         head + "@@ -1,5 +1,5 @@\n-a\n b\n a\n b\n+a\n c\n"},
        {"a last line without newline", "a\nb", "a\nb\n",
         head + "@@ -1,2 +1,2 @@\n a\n-b\n\\ No newline at end of file\n+b\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.promise);
        EXPECT_EQ(diff(row.before, row.after), row.expected);
    }
}

TEST(UnifiedDiff, ShowsNoPassword) {
    const std::string masked = ">EH0Ril93yPhQR2hyHVFGvV2C9/XVa9yBRtYNB9T+UyMo8Gg1NIo5Sly1jr8=";
    const struct {
        const char* promise;
        std::string before;
        std::string after;
        std::string expected;
    } rows[] = {
        {"neither in clear nor masked", "oru-slapdAdminPW: secret\n",
         "oru-slapdAdminPW: " + masked + "\n",
         "@@ -1 +1 @@\n-oru-slapdAdminPW: ********\n+oru-slapdAdminPW: ********\n"},
        {"nor around a change", "oru-slapdAdminPW: secret\na\n", "oru-slapdAdminPW: secret\nb\n",
         "@@ -1,2 +1,2 @@\n oru-slapdAdminPW: ********\n-a\n+b\n"},
        {"nor in a folded line", "oru-slapdAdminPW: sec\n ret\n  again\na\n",
         "oru-slapdAdminPW: x\na\n",
         "@@ -1,4 +1,2 @@\n-oru-slapdAdminPW: ********\n- ********\n- ********\n"
         "+oru-slapdAdminPW: ********\n a\n"},
        {"nor in one that begins empty", "oru-slapdAdminPW:\n secret\n", "x\n",
         "@@ -1,2 +1 @@\n-oru-slapdAdminPW:\n- ********\n+x\n"},
        {"nor in a kept line", "oru-slapdInvalidLine: oru-slapdAdminPW: secret\n", "x\n",
         "@@ -1 +1 @@\n-oru-slapdInvalidLine: oru-slapdAdminPW: ********\n+x\n"},
        {"nor below a comment, with a blank before it", "# x\n oru-slapdAdminPW: secret\n", "# x\n",
         "@@ -1,2 +1 @@\n # x\n- oru-slapdAdminPW: ********\n"},
        {"nor without a newline", "oru-slapdAdminPW: secret", "",
         "@@ -1 +0,0 @@\n-oru-slapdAdminPW: ********\n\\ No newline at end of file\n"},
        {"an encrypted one hides itself, folded as well", "oru-slapdAdminPW: {AES256}EKY\n CnJ\n",
         "x\n", "@@ -1,2 +1 @@\n-oru-slapdAdminPW: {AES256}EKY\n- CnJ\n+x\n"},
        {"nor far from its name", "oru-slapdAdminPW: s\n e\n c\n r\n e\n t\n x\na\n",
         "oru-slapdAdminPW: t\n e\n c\n r\n e\n t\n y\na\n",
         "@@ -1,8 +1,8 @@\n-oru-slapdAdminPW: ********\n+oru-slapdAdminPW: ********\n"
         "  ********\n  ********\n  ********\n  ********\n  ********\n"
         "- ********\n+ ********\n a\n"},
        {"nor where only a late change is shown", "oru-slapdAdminPW: s\n e\n c\n r\n e\n t\na\n",
         "oru-slapdAdminPW: s\n e\n c\n r\n e\n x\na\n",
         "@@ -3,5 +3,5 @@\n  ********\n  ********\n  ********\n- ********\n+ ********\n a\n"},
        {"nor after another line that goes on", "cn: a\n b\noru-slapdAdminPW: s\n t\ncn: c\n d\n",
         "cn: x\n y\noru-slapdAdminPW: s\n t\ncn: e\n f\n",
         "@@ -1,6 +1,6 @@\n-cn: a\n- b\n+cn: x\n+ y\n oru-slapdAdminPW: ********\n  ********\n"
         "-cn: c\n- d\n+cn: e\n+ f\n"},
        {"and other lines are shown", "cn: a\n  b\n", "x\n", "@@ -1,2 +1 @@\n-cn: a\n-  b\n+x\n"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.promise);
        EXPECT_EQ(diff(row.before, row.after), head + row.expected);
    }
}

TEST(UnifiedDiff, HidesWhatContinuesALineThatIsTooLongToBeJudgedEachTime) {
    const std::string shown = "note: " + std::string(1000, 'n') + "\n";
    const std::string unseen = "note: " + std::string(2000, 'n') + "\n";
    EXPECT_THAT(diff(shown + " v\n", shown + " w\n"), testing::EndsWith("\n- v\n+ w\n"));
    EXPECT_THAT(diff(unseen + " v\n", unseen + " w\n"),
                testing::EndsWith("\n- ********\n+ ********\n"));
}

TEST(UnifiedDiff, IsColouredForPeopleOnly) {
    choose_color(color_choice::always);
    const std::string coloured = unified_diff("a\nb\n", "a\nc\n", "conf");
    const std::string plain = unified_diff("a\nb\n", "a\nc\n", "conf", false);
    choose_color(color_choice::automatic);
    EXPECT_EQ(coloured,
              "\x1b[1m--- conf\x1b[0m\n\x1b[1m+++ conf\x1b[0m\n\x1b[36m@@ -1,2 +1,2 @@\x1b[0m\n a\n"
              "\x1b[31m-b\x1b[0m\n\x1b[32m+c\x1b[0m\n");
    EXPECT_EQ(plain, head + "@@ -1,2 +1,2 @@\n a\n-b\n+c\n");
}

namespace {

using lines = std::vector<std::string_view>;

/// Takes a diff's word for what becomes of a text, checking the lines that it claims are there.
std::string patched(const std::string& before, const std::string& patch) {
    const lines old_lines = lines_of(before);
    std::string text;
    size_t next = 0;
    for (const std::string_view line : lines_of(patch)) {
        if (line.starts_with("---") || line.starts_with("+++")) {
            continue;
        }
        if (line.starts_with("@@")) {
            size_t begin = 0;
            size_t count = 1;
            std::sscanf(line.data(), "@@ -%zu,%zu", &begin, &count);
            for (begin -= count == 0 ? 0 : 1; next < begin; ++next) {
                text += old_lines.at(next);
            }
        } else if (line.front() == '+') {
            text += line.substr(1);
        } else {
            EXPECT_EQ(old_lines.at(next), line.substr(1));
            text += line.front() == ' ' ? line.substr(1) : "";
            ++next;
        }
    }
    for (; next < old_lines.size(); ++next) {
        text += old_lines[next];
    }
    return text;
}

/// A text of so many lines, of so many different ones.
std::string random_text(std::mt19937& random, unsigned count, unsigned variety) {
    std::string text;
    for (; count > 0; --count) {
        text += "l" + std::to_string(random() % variety) + "\n";
    }
    return text;
}

/// The text with some lines changed, moved, left out and added.
std::string mutated(std::mt19937& random, const std::string& text) {
    lines all = lines_of(text);
    for (unsigned changes = random() % 6; changes > 0 && !all.empty(); --changes) {
        const auto at = all.begin() + static_cast<long>(random() % all.size());
        switch (random() % 4) {
            case 0:
                *at = "new\n";
                break;
            case 1:
                all.erase(at);
                break;
            case 2:
                all.insert(at, all.front());
                break;
            default:
                std::iter_swap(at, all.begin());
        }
    }
    std::string made;
    for (const std::string_view line : all) {
        made += line;
    }
    return made;
}

size_t longest_common(const lines& a, const lines& b) {
    std::vector<size_t> lengths(b.size() + 1);
    for (const std::string_view line : a) {
        size_t diagonal = 0;
        for (size_t j = 0; j < b.size(); ++j) {
            const size_t above = lengths[j + 1];
            lengths[j + 1] = line == b[j] ? diagonal + 1 : std::max(above, lengths[j]);
            diagonal = above;
        }
    }
    return lengths.back();
}

}  // namespace

TEST(UnifiedDiff, LeadsFromTheOneTextToTheOther) {
    std::mt19937 random(7);
    for (int i = 0; i < 3000 && !testing::Test::HasFailure(); ++i) {
        const std::string before = random_text(random, static_cast<unsigned>(random() % 40),
                                               static_cast<unsigned>(random() % 30) + 1);
        const std::string after =
            random() % 2 == 0 ? mutated(random, before)
                              : random_text(random, static_cast<unsigned>(random() % 40), 20);
        const std::string patch = diff(before, after);
        EXPECT_EQ(patched(before, patch), after) << patch;
        EXPECT_EQ(patch.empty(), before == after);
    }
}

TEST(MatchingLines, AreInTheOrderOfBothTexts) {
    std::mt19937 random(11);
    for (int i = 0; i < 1000 && !testing::Test::HasFailure(); ++i) {
        const std::string before = random_text(random, 60, 40);
        const std::string after = mutated(random, before);
        const lines a = lines_of(before);
        const lines b = lines_of(after);
        const auto matches = matching_lines(a, b);
        for (size_t k = 0; k < matches.size(); ++k) {
            EXPECT_EQ(a.at(matches[k].before), b.at(matches[k].after));
            EXPECT_TRUE(k == 0 || (matches[k - 1].before < matches[k].before &&
                                   matches[k - 1].after < matches[k].after));
        }
        EXPECT_LE(matches.size(), longest_common(a, b));
    }
}

TEST(MatchingLines, AreAllThereAreWhereNoLineIsUnique) {
    std::mt19937 random(13);
    for (int i = 0; i < 300 && !testing::Test::HasFailure(); ++i) {
        std::string before = random_text(random, 40, 4);
        std::string after = random_text(random, 60, 4);
        before += before;
        after += after;
        const lines a = lines_of(before);
        const lines b = lines_of(after);
        EXPECT_EQ(matching_lines(a, b).size(), longest_common(a, b));
    }
}

// Without a limit this asks for more memory than there is.
TEST(MatchingLines, OfLongTextsInAnotherOrderAreFoundAtOnce) {
    std::string forwards;
    std::string backwards;
    for (int i = 0; i < 300000; ++i) {
        forwards += std::to_string(i / 2) + "\n";
        backwards += std::to_string((299999 - i) / 2) + "\n";
    }
    EXPECT_LE(matching_lines(lines_of(forwards), lines_of(backwards)).size(), 2u);
    std::string swapped;
    for (int i = 0; i < 300000; i += 2) {
        swapped += std::to_string(i + 1) + "\n" + std::to_string(i) + "\n";
    }
    std::string all;
    for (int i = 0; i < 300000; ++i) {
        all += std::to_string(i) + "\n";
    }
    EXPECT_EQ(matching_lines(lines_of(all), lines_of(swapped)).size(), 150000u);
}

}  // namespace cfg32::tool
