// Words as bash has them while one is typed.

#include "completion/shell_word.h"

#include <gtest/gtest.h>

using namespace cfg32::tool;

namespace {

struct word_row {
    const char* raw;
    const char* text;
    const char* kept;
    char quote;
};

void PrintTo(const word_row& row, std::ostream* out) { *out << row.raw; }

class TypedWord : public testing::TestWithParam<word_row> {};

TEST_P(TypedWord, IsReadAsTheShellReadsIt) {
    const typed_word word = read_typed_word(GetParam().raw, " \t\n\"'><=;|&(:");
    EXPECT_EQ(word.text, GetParam().text);
    EXPECT_EQ(word.kept, GetParam().kept);
    EXPECT_EQ(word.quote, GetParam().quote);
}

INSTANTIATE_TEST_SUITE_P(
    Words, TypedWord,
    testing::Values(word_row{"", "", "", '\0'}, word_row{"sea", "sea", "", '\0'},
                    word_row{"cn=Fr", "cn=Fr", "cn=", '\0'}, word_row{"cn\\=Fr", "cn=Fr", "", '\0'},
                    word_row{"cn=Front\\ End,\\ cn=C", "cn=Front End, cn=C",
                             "cn=Front End, cn=", '\0'},
                    word_row{"\"cn=Front E", "cn=Front E", "", '"'},
                    word_row{"cn=\"Front E", "cn=Front E", "cn=", '"'},
                    word_row{"'cn=Front E", "cn=Front E", "", '\''},
                    word_row{"\"cn=Front \"E", "cn=Front E", "cn=Front ", '\0'},
                    word_row{"\"a\\\"b\\c", "a\"b\\c", "", '"'}, word_row{"'a\\", "a\\", "", '\''},
                    word_row{"a\\", "a\\", "", '\0'}));

struct quoted_row {
    const char* text;
    char quote;
    const char* quoted;
};

void PrintTo(const quoted_row& row, std::ostream* out) { *out << row.text; }

class QuotedText : public testing::TestWithParam<quoted_row> {};

TEST_P(QuotedText, IsOneWordOfTheShell) {
    EXPECT_EQ(quoted_for_shell(GetParam().text, GetParam().quote), GetParam().quoted);
}

INSTANTIATE_TEST_SUITE_P(
    Texts, QuotedText,
    testing::Values(quoted_row{"cn=Front End, cn=C", '\0', "cn=Front\\ End,\\ cn=C"},
                    quoted_row{"cn=Front End, cn=C", '"', "cn=Front End, cn=C"},
                    quoted_row{"cn=$(id)", '\0', "cn=\\$\\(id\\)"},
                    quoted_row{"cn=$(id)`\"\\", '"', "cn=\\$(id)\\`\\\"\\\\"},
                    quoted_row{"cn=it's", '\'', "cn=it'\\''s"},
                    quoted_row{"cn=Jörg", '\0', "cn=Jörg"}));

}  // namespace
