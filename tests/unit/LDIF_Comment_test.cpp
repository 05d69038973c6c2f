#include "LDIF_Comment.h"

#include <gmock/gmock.h>

#include <sstream>
#include <string>
#include <type_traits>

namespace {

LDIF_Line line_of(int type, const std::string& value = "") {
    LDIF_Line line;
    line.type = type;
    line.attribute = "cn";
    line.value = value;
    return line;
}

LDIF_Line note(const std::string& text) { return line_of(LDIF_Line::comment, text); }
LDIF_Line blank() { return line_of(LDIF_Line::blankLine); }

TEST(LDIF_Comment, IsPolymorphicAndEmptyAtFirst) {
    EXPECT_TRUE(std::is_polymorphic_v<LDIF_Comment>);
    EXPECT_TRUE(std::has_virtual_destructor_v<LDIF_Comment>);
    const LDIF_Comment comment;
    EXPECT_EQ(comment.str(), "");
    EXPECT_TRUE(comment.empty());
    EXPECT_EQ(comment.line_count(), 0u);
    EXPECT_FALSE(comment.begins_with_blank_line());
}

TEST(LDIF_Comment, CommentAndBlankLinesAreAppendedInOrder) {
    LDIF_Comment comment;
    EXPECT_EQ(&(comment += note("# a")), &comment);
    comment += blank();
    comment += note("#b ");
    EXPECT_EQ(comment.str(), "# a\n\n#b \n");
    EXPECT_EQ(comment.line_count(), 3u);
    EXPECT_FALSE(comment.empty());
}

TEST(LDIF_Comment, LineOfAnotherTypeIsIgnored) {
    LDIF_Comment comment;
    comment += note("# a");
    for (const int type : {-1, 0, 3, 4, 5, 99}) {
        EXPECT_EQ(&(comment += line_of(type, "v")), &comment);
    }
    EXPECT_EQ(comment.str(), "# a\n");
    EXPECT_EQ(comment.line_count(), 1u);
}

TEST(LDIF_Comment, CommentIsAppendedWithAllItsLines) {
    LDIF_Comment first;
    first += note("# a");
    LDIF_Comment second;
    second += blank();
    second += note("# b");
    EXPECT_EQ(&(first += second), &first);
    EXPECT_EQ(first.str(), "# a\n\n# b\n");
    EXPECT_EQ(second.str(), "\n# b\n");
    first += LDIF_Comment();
    EXPECT_EQ(first.str(), "# a\n\n# b\n");
}

TEST(LDIF_Comment, CommentMayBeAppendedToItself) {
    LDIF_Comment comment;
    for (int i = 0; i < 5; ++i) {
        comment += note("#" + std::to_string(i));
    }
    const std::string before = comment.str();
    const LDIF_Comment& self = comment;
    comment += self;
    EXPECT_EQ(comment.str(), before + before);
}

TEST(LDIF_Comment, ClearRemovesEveryLine) {
    LDIF_Comment comment;
    comment += note("# a");
    comment += blank();
    EXPECT_EQ(&comment.clear(), &comment);
    EXPECT_EQ(comment.str(), "");
    EXPECT_TRUE(comment.empty());
    EXPECT_EQ(&comment.clear(), &comment);
}

TEST(LDIF_Comment, CopiesAreIndependent) {
    LDIF_Comment comment;
    comment += note("# a");
    LDIF_Comment copy(comment);
    LDIF_Comment assigned;
    assigned = comment;
    comment.clear();
    copy += note("# b");
    EXPECT_EQ(copy.str(), "# a\n# b\n");
    EXPECT_EQ(assigned.str(), "# a\n");
}

TEST(LDIF_Comment, StreamingWritesTheLines) {
    LDIF_Comment comment;
    comment += blank();
    comment += note("# a");
    std::ostringstream out;
    EXPECT_EQ(&(out << comment), &out);
    EXPECT_EQ(out.str(), "\n# a\n");
    std::ostringstream nothing;
    nothing << LDIF_Comment();
    EXPECT_EQ(nothing.str(), "");
}

struct own_words : LDIF_Comment {
    std::string str() const override { return "own"; }
};

TEST(LDIF_Comment, StreamingAsksTheVirtualFunction) {
    const own_words derived;
    const LDIF_Comment& base = derived;
    std::ostringstream out;
    out << base;
    EXPECT_EQ(out.str(), "own");
}

TEST(LDIF_Comment, TextIsAppendedToWhatIsThere) {
    LDIF_Comment comment;
    comment += note("# a");
    std::string text = "before\n";
    comment.append_to(text);
    EXPECT_EQ(text, "before\n# a\n");
}

TEST(LDIF_Comment, TrailingBlankLinesCanBeDropped) {
    LDIF_Comment comment;
    comment.drop_trailing_blank_lines();
    EXPECT_EQ(comment.str(), "");
    comment += blank();
    comment += note("# a");
    comment += blank();
    comment += blank();
    comment.drop_trailing_blank_lines();
    EXPECT_EQ(comment.str(), "\n# a\n");
    comment.drop_trailing_blank_lines();
    EXPECT_EQ(comment.str(), "\n# a\n");

    LDIF_Comment only_blank;
    only_blank += blank();
    only_blank += blank();
    only_blank.drop_trailing_blank_lines();
    EXPECT_TRUE(only_blank.empty());
}

TEST(LDIF_Comment, BeginsWithABlankLineWhenItsFirstLineIsBlank) {
    LDIF_Comment comment;
    comment += note("# a");
    comment += blank();
    EXPECT_FALSE(comment.begins_with_blank_line());
    LDIF_Comment other;
    other += blank();
    other += note("# a");
    EXPECT_TRUE(other.begins_with_blank_line());
}

}  // namespace
