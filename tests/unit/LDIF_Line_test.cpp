#include "LDIF_Line.h"

#include <gmock/gmock.h>

#include <strings.h>
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <memory>
#include <random>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include "LDIF_Util.h"
#include "failures.h"
#include "line_source.h"
#include "temporary_folder.h"
#include "utf8_locale.h"

namespace {

using cfg32::tests::summary;
using testing::ElementsAreArray;
using namespace std::string_literals;

#define WIDE_SPACE "\xe3\x80\x80"
#define E_ACUTE "\xc3\xa9"

/// The calls that read a file to its end, each as text; see describe().
using transcript = std::vector<std::string>;

/// "first-returned type [attribute] [value]", and what is unusual about the line.
std::string describe(const LDIF_Line& line, const std::string& returned) {
    return std::to_string(line.lineNumber) + "-" + returned + " " +
           cfg32::line_type_name(line.type) + " [" + line.attribute + "] [" + line.value + "]" +
           (line.hasSeparator == 1 ? "" : " separator " + std::to_string(line.hasSeparator));
}

/// Calls next(line, lastLineNumber) until it finds the end of the file. A failure is noted with
/// the state that it leaves; reading goes on behind it with the same number.
template <class Next>
transcript read_all(Next next) {
    transcript calls;
    LDIF_Line line;
    int last = 0;
    do {
        try {
            last = next(line, last);
            calls.push_back(describe(line, std::to_string(last)));
        } catch (const LDIF_Exception& e) {
            calls.push_back(describe(line, "?") + " throws " + summary(e));
            line.type = -1;  // the failure is not the end
        }
    } while (line.type != LDIF_Line::endOfFile && calls.size() < 10000);
    return calls;
}

const cfg32::tests::temporary_folder& folder() {
    static const cfg32::tests::temporary_folder folder;
    return folder;
}

/// Reads a file of that text with next(line, in, lastLineNumber).
template <class Next>
transcript from_file(const std::string& text, Next next) {
    const std::string path = folder().write("f", text);
    std::ifstream in(path, std::ios::binary);
    // A new file each time: writing over an old one waits for the disk on some file systems.
    std::filesystem::remove(path);
    return read_all([&](LDIF_Line& line, int last) { return next(line, in, last); });
}

transcript from_stream(const std::string& text) {
    return from_file(
        text, [](LDIF_Line& line, std::ifstream& in, int last) { return line.next(in, last); });
}

transcript from_memory(const std::string& text) {
    // A buffer of exactly the text's size lets the sanitizer see a read beyond it.
    const auto copy = std::make_unique<char[]>(text.size());
    std::copy(text.begin(), text.end(), copy.get());
    cfg32::line_source in(std::string_view(copy.get(), text.size()));
    return read_all([&](LDIF_Line& line, int last) { return line.next(in, last); });
}

/// Both sources give exactly these calls.
void expect_calls(const std::string& text, const transcript& calls) {
    SCOPED_TRACE(testing::PrintToString(text));
    EXPECT_THAT(from_stream(text), ElementsAreArray(calls));
    EXPECT_THAT(from_memory(text), ElementsAreArray(calls));
}

struct file_row {
    std::string text;
    transcript calls;
};

void expect_files(const std::vector<file_row>& rows) {
    for (const file_row& row : rows) {
        expect_calls(row.text, row.calls);
    }
}

struct line_row {
    std::string text;
    std::string call;
};

/// For files of one logical line that ends with a newline.
void expect_lines(const std::vector<line_row>& rows) {
    for (const line_row& row : rows) {
        const auto count = std::count(row.text.begin(), row.text.end(), '\n');
        const std::string last = std::to_string(count);
        expect_calls(row.text, {"1-" + last + " " + row.call,
                                std::to_string(count + 1) + "-" + last + " endOfFile [] []"});
    }
}

TEST(LDIF_Line, IsPolymorphicAndEmptyAtFirst) {
    EXPECT_TRUE(std::is_polymorphic_v<LDIF_Line>);
    EXPECT_TRUE(std::has_virtual_destructor_v<LDIF_Line>);
    const LDIF_Line line;
    EXPECT_EQ(line.value, "");
    EXPECT_EQ(line.attribute, "");
    EXPECT_EQ(line.type, 0);
    EXPECT_EQ(line.lineNumber, 0);
    EXPECT_EQ(line.hasSeparator, 0);
}

TEST(LDIF_Line, CopiesHaveAllFields) {
    LDIF_Line line;
    line.value = "v";
    line.attribute = "a";
    line.type = 4;
    line.lineNumber = 7;
    line.hasSeparator = 1;
    LDIF_Line assigned;
    assigned = line;
    for (const LDIF_Line& copy : {LDIF_Line(line), assigned}) {
        EXPECT_EQ(copy.value, "v");
        EXPECT_EQ(copy.attribute, "a");
        EXPECT_EQ(copy.type, 4);
        EXPECT_EQ(copy.lineNumber, 7);
        EXPECT_EQ(copy.hasSeparator, 1);
    }
}

TEST(LDIF_Line, TypesHaveTheirNumbersAndNames) {
    const struct {
        int type;
        int number;
        const char* name;
    } rows[] = {
        {LDIF_Line::endOfFile, 0, "endOfFile"},
        {LDIF_Line::blankLine, 1, "blankLine"},
        {LDIF_Line::comment, 2, "comment"},
        {LDIF_Line::dn, 3, "dn"},
        {LDIF_Line::attr, 4, "attribute"},
        {5, 5, "UNKNOWN"},
        {-1, -1, "UNKNOWN"},
        {1000, 1000, "UNKNOWN"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.type, row.number);
        EXPECT_STREQ(cfg32::line_type_name(row.type), row.name);
    }
}

TEST(LDIF_Line, StrJoinsNameAndValueOfDnAndAttributeLinesOnly) {
    const struct {
        int type;
        const char* expected;
    } rows[] = {{0, "v"}, {1, "v"}, {2, "v"}, {3, "a: v"}, {4, "a: v"}, {5, "v"}, {-1, "v"}};
    LDIF_Line line;
    line.attribute = "a";
    line.value = "v";
    for (const auto& row : rows) {
        line.type = row.type;
        EXPECT_EQ(line.str(), row.expected) << row.type;
    }
    line.type = LDIF_Line::attr;
    line.value = "";
    EXPECT_EQ(line.str(), "a: ");
}

TEST(LDIF_Line, LineReadBackIsPrintedInFileForm) {
    const struct {
        const char* text;
        const char* expected;
    } rows[] = {
        {"#  note \r\n", "#  note "},
        {"\n", ""},
        {" \t\n", ""},
        {"dn:cn=x\n", "dn: cn=x"},
        {"cn::  a \n", "cn: a"},
        {"cn:a\n b\n", "cn: ab"},
        {"garbage\n", "garbage: "},
    };
    for (const auto& row : rows) {
        cfg32::line_source in(row.text);
        LDIF_Line line;
        line.next(in, 0);
        EXPECT_EQ(line.str(), row.expected);
    }
}

TEST(LDIF_Line, InvalidLineBecomesAnAttributeThatKeepsItsText) {
    const struct {
        const char* text;
        int type;
        int separator;
        const char* value;
    } rows[] = {
        {"garbage\n", 4, 0, "garbage: "}, {"dnx\n", 3, 0, "dnx: "},
        {"dn: cn=x\n", 3, 1, "dn: cn=x"}, {"cn: a\n", 4, 1, "cn: a"},
        {":x\n y\n", 4, 0, ":x: y"},
    };
    for (const auto& row : rows) {
        cfg32::line_source in(row.text);
        LDIF_Line line;
        line.next(in, 0);
        line.changeToInvalidAttr();
        EXPECT_EQ(line.attribute, "oru-slapdInvalidLine");
        EXPECT_EQ(line.value, row.value);
        EXPECT_EQ(line.type, row.type);
        EXPECT_EQ(line.hasSeparator, row.separator);
        EXPECT_EQ(line.lineNumber, 1);
    }
}

TEST(LDIF_Line, StreamAtItsEndReturnsTheNumberUnchanged) {
    std::ifstream missing(folder().file("missing"));
    std::ifstream ended(folder().write("f", ""));
    ended.get();
    cfg32::line_source memory("");
    memory.take();
    const auto expect_end = [](auto& in) {
        LDIF_Line line;
        line.value = line.attribute = "old";
        line.type = LDIF_Line::dn;
        line.hasSeparator = 0;
        for (const int last : {0, 41, 41}) {
            EXPECT_EQ(line.next(in, last), last);
            EXPECT_EQ(describe(line, "x"), std::to_string(last + 1) + "-x endOfFile [] []");
        }
    };
    expect_end(missing);
    expect_end(ended);
    expect_end(memory);
}

TEST(LDIF_Line, NumbersGoOnFromTheLastOne) {
    cfg32::line_source in("cn: a\n b\nsn: c\n");
    LDIF_Line line;
    EXPECT_EQ(line.next(in, 100), 102);
    EXPECT_EQ(line.lineNumber, 101);
    EXPECT_EQ(line.next(in, 102), 103);
    EXPECT_EQ(line.lineNumber, 103);
}

TEST(LDIF_Line, NameEndsAtTheFirstColon) {
    expect_lines({
        {"cn: a\n", "attribute [cn] [a]"},
        {"cn:a\n", "attribute [cn] [a]"},
        {"cn:\n", "attribute [cn] []"},
        {"cn:   \n", "attribute [cn] []"},
        {"cn : a\n", "attribute [cn] [a]"},
        {"cn \t : a\n", "attribute [cn] [a]"},
        {" cn: a\n", "attribute [ cn] [a]"},
        {"\tcn x : a\n", "attribute [\tcn x] [a]"},
        {"  : a\n", "attribute [] [a]"},
        {"cn: a: b : c\n", "attribute [cn] [a: b : c]"},
        {"cn: :a\n", "attribute [cn] [:a]"},
        {"cn:\t a\n", "attribute [cn] [a]"},
        {"cn;x-opt: a\n", "attribute [cn;x-opt] [a]"},
        {"cn: \x01\x7f\n", "attribute [cn] [\x01\x7f]"},
        {"a:b\n", "attribute [a] [b]"},
    });
}

TEST(LDIF_Line, EveryFollowingColonIsSkipped) {
    expect_lines({
        {"description:: Zm9v\n", "attribute [description] [Zm9v]"},
        {"name::\n", "attribute [name] []"},
        {"name:::\n", "attribute [name] []"},
        {"name::: a\n", "attribute [name] [a]"},
        {"name::a:b\n", "attribute [name] [a:b]"},
        {"name:: :a\n", "attribute [name] [:a]"},
        {"dn:: Y249eA==\n", "dn [dn] [Y249eA==]"},
        {"name:< file:///x\n", "attribute [name] [< file:///x]"},
    });
}

TEST(LDIF_Line, DnLineIsNamedDnInAnyCase) {
    expect_lines({
        {"dn: cn=x\n", "dn [dn] [cn=x]"},
        {"DN : cn=x\n", "dn [DN] [cn=x]"},
        {"Dn:cn=x\n", "dn [Dn] [cn=x]"},
        {"dN\t:\n", "dn [dN] []"},
        {" dn: cn=x\n", "attribute [ dn] [cn=x]"},
        {"dnx: cn=x\n", "attribute [dnx] [cn=x]"},
        {"d: cn=x\n", "attribute [d] [cn=x]"},
        {"dn x: cn=x\n", "attribute [dn x] [cn=x]"},
    });
}

// A line that merely begins with "dn" is a DN line, so that the next lines are not added to the
// entry before it.
TEST(LDIF_Line, LineWithoutSeparatorIsTypedByItsFirstTwoCharacters) {
    expect_lines({
        {"garbage\n", "attribute [garbage] [] separator 0"},
        {"dn\n", "dn [dn] [] separator 0"},
        {"dnx\n", "dn [dnx] [] separator 0"},
        {"DN cn=x\n", "dn [DN cn=x] [] separator 0"},
        {"d\n", "attribute [d] [] separator 0"},
        {" dn\n", "attribute [ dn] [] separator 0"},
        {"  # note\n", "attribute [  # note] [] separator 0"},
        {"garbage \t\n", "attribute [garbage \t] [] separator 0"},
        {":\n", "attribute [:] [] separator 0"},
        {":x\n", "attribute [:x] [] separator 0"},
        {"::\n", "attribute [::] [] separator 0"},
        {":: x: y \n", "attribute [:: x: y ] [] separator 0"},
        {":dn: x\n", "attribute [:dn: x] [] separator 0"},
        {"garbage\n more\n", "attribute [garbage] [more] separator 0"},
        {"garbage\n  more \n", "attribute [garbage] [ more] separator 0"},
        {":x\n : y\n", "attribute [:x] [: y] separator 0"},
    });
}

TEST(LDIF_Line, ContinuationLosesExactlyOneWhitespaceCharacter) {
    expect_lines({
        {"cn: a\n b\n  c\n", "attribute [cn] [ab c]"},
        {"cn: a\n\tb\n", "attribute [cn] [ab]"},
        {"cn: a\n\vb\n\fc\n", "attribute [cn] [abc]"},
        {"cn: a\n \tb\n", "attribute [cn] [a\tb]"},
        {"cn: a\n \n", "attribute [cn] [a]"},
        {"cn: a\n \n b\n", "attribute [cn] [ab]"},
        {"cn: a\n   \n b\n", "attribute [cn] [a  b]"},
        {"cn: a  \n b\n", "attribute [cn] [a  b]"},
        {"cn: a\n b  \n", "attribute [cn] [ab]"},
        {"cn: a\n b\n   \n", "attribute [cn] [ab]"},
        {"cn:\n  b\n", "attribute [cn] [ b]"},
        {"cn:  \n b\n", "attribute [cn] [b]"},
        {"cn:\n :b\n", "attribute [cn] [:b]"},
        {"cn: a\n # b\n", "attribute [cn] [a# b]"},
        {"dn: cn=x,\n o=y\n", "dn [dn] [cn=x,o=y]"},
    });
}

TEST(LDIF_Line, LogicalLineEndsBeforeALineThatDoesNotBeginWithWhitespace) {
    expect_files({{"cn: a\nsn: b\n",
                   {"1-1 attribute [cn] [a]", "2-2 attribute [sn] [b]", "3-2 endOfFile [] []"}},
                  {"cn: a\n b\n#c\n d\n",
                   {"1-2 attribute [cn] [ab]", "3-3 comment [] [#c]",
                    "4-4 attribute [ d] [] separator 0", "5-4 endOfFile [] []"}}});
}

TEST(LDIF_Line, EmptyLineEndsTheLogicalLineAndIsReadAgain) {
    expect_files({{"cn: a\n\n b: c\n",
                   {"1-1 attribute [cn] [a]", "2-2 blankLine [] []", "3-3 attribute [ b] [c]",
                    "4-3 endOfFile [] []"}},
                  {"cn: a\n\r\n b: c\n",
                   {"1-1 attribute [cn] [a]", "2-2 blankLine [] []", "3-3 attribute [ b] [c]",
                    "4-3 endOfFile [] []"}},
                  {"cn: a\n\n",
                   {"1-1 attribute [cn] [a]", "2-2 blankLine [] []", "3-3 blankLine [] []",
                    "4-3 endOfFile [] []"}}});
}

TEST(LDIF_Line, CommentKeepsItsTextAndTakesNoContinuation) {
    expect_files(
        {{"# note\n", {"1-1 comment [] [# note]", "2-2 blankLine [] []", "3-2 endOfFile [] []"}},
         {"#\nx: y\n", {"1-1 comment [] [#]", "2-2 attribute [x] [y]", "3-2 endOfFile [] []"}},
         {"#a: b  \t\n more\nx: y\n",
          {"1-1 comment [] [#a: b  \t]", "2-2 attribute [ more] [] separator 0",
           "3-3 attribute [x] [y]", "4-3 endOfFile [] []"}},
         {"# a\r b\r\nx: y\n",
          {"1-1 comment [] [# a b]", "2-2 attribute [x] [y]", "3-2 endOfFile [] []"}}});
}

TEST(LDIF_Line, CarriageReturnsAreRemovedBeforeAnythingElse) {
    expect_files(
        {{"a: b\r\n", {"1-1 attribute [a] [b]", "2-1 endOfFile [] []"}},
         {"\ra\r:\r \rb\rc\r\n", {"1-1 attribute [a] [bc]", "2-1 endOfFile [] []"}},
         {"a:\r: b\n", {"1-1 attribute [a] [b]", "2-1 endOfFile [] []"}},
         {"d\rn: b\n", {"1-1 dn [dn] [b]", "2-1 endOfFile [] []"}},
         {"a: b\r\n\r c\r\n", {"1-2 attribute [a] [bc]", "3-2 endOfFile [] []"}},
         {"a: b\n\rc: d\n",
          {"1-1 attribute [a] [b]", "2-2 attribute [c] [d]", "3-2 endOfFile [] []"}},
         {"\r#x\na: b\n", {"1-1 comment [] [#x]", "2-2 attribute [a] [b]", "3-2 endOfFile [] []"}},
         {"\r\r\r\na: b\n",
          {"1-1 blankLine [] []", "2-2 attribute [a] [b]", "3-2 endOfFile [] []"}},
         {"\r:x\n", {"1-1 attribute [:x] [] separator 0", "2-1 endOfFile [] []"}}});
}

// It may have been cut off in the middle, so the value of a last line without a newline is dropped.
TEST(LDIF_Line, LastLineWithoutANewlineIsNamedButHasNoValue) {
    expect_files({{"cn: a", {"1-1 attribute [cn] []", "2-1 endOfFile [] []"}},
                  {"dn: cn=x", {"1-1 dn [dn] []", "2-1 endOfFile [] []"}},
                  {"garbage", {"1-1 attribute [garbage] [] separator 0", "2-1 endOfFile [] []"}},
                  {"a: b\r", {"1-1 attribute [a] []", "2-1 endOfFile [] []"}},
                  {"cn: a\n b", {"1-2 attribute [cn] []", "3-2 endOfFile [] []"}},
                  {"cn: a\n b\n ", {"1-3 attribute [cn] []", "4-3 endOfFile [] []"}},
                  {"cn: a\nsn: b",
                   {"1-1 attribute [cn] [a]", "2-2 attribute [sn] []", "3-2 endOfFile [] []"}}});
}

TEST(LDIF_Line, LastCommentOrBlankLineWithoutANewlineIsComplete) {
    expect_files(
        {{"# note", {"1-1 comment [] [# note]", "2-1 endOfFile [] []"}},
         {"   ", {"1-1 blankLine [] []", "2-1 endOfFile [] []"}},
         {"\r", {"1-1 blankLine [] []", "2-1 endOfFile [] []"}},
         {"cn: a\n# b", {"1-1 attribute [cn] [a]", "2-2 comment [] [# b]", "3-2 endOfFile [] []"}},
         {"cn: a\n\r", {"1-1 attribute [cn] [a]", "2-2 blankLine [] []", "3-2 endOfFile [] []"}}});
}

// The stream does not know of its end before a read meets it.
TEST(LDIF_Line, EndBehindANewlineReadsAsABlankLineUnlessAnAttributeLooksAhead) {
    expect_files({{"", {"1-1 blankLine [] []", "2-1 endOfFile [] []"}},
                  {"\n", {"1-1 blankLine [] []", "2-2 blankLine [] []", "3-2 endOfFile [] []"}},
                  {"cn: a\n", {"1-1 attribute [cn] [a]", "2-1 endOfFile [] []"}},
                  {"cn: a\n#b\n",
                   {"1-1 attribute [cn] [a]", "2-2 comment [] [#b]", "3-3 blankLine [] []",
                    "4-3 endOfFile [] []"}}});
}

TEST(LDIF_Line, WhitespaceOnlyLineIsBlankUnlessItContinuesALine) {
    expect_files({{" \t\v\f\n  \ncn: a\n",
                   {"1-1 blankLine [] []", "2-2 blankLine [] []", "3-3 attribute [cn] [a]",
                    "4-3 endOfFile [] []"}},
                  {"#\n \ncn: a\n",
                   {"1-1 comment [] [#]", "2-2 blankLine [] []", "3-3 attribute [cn] [a]",
                    "4-3 endOfFile [] []"}},
                  {"cn: a\n   \nsn: b\n",
                   {"1-2 attribute [cn] [a]", "3-3 attribute [sn] [b]", "4-3 endOfFile [] []"}}});
}

TEST(LDIF_Line, NulEndsAPhysicalLine) {
    expect_files({{"cn: a\0b\nsn: c\n"s,
                   {"1-1 attribute [cn] [a]", "2-2 attribute [sn] [c]", "3-2 endOfFile [] []"}},
                  {"c\0n: a\n"s, {"1-1 attribute [c] [] separator 0", "2-1 endOfFile [] []"}},
                  {"\0cn: a\nsn: b\n"s,
                   {"1-1 blankLine [] []", "2-2 attribute [sn] [b]", "3-2 endOfFile [] []"}},
                  {"# a\0b\nsn: b\n"s,
                   {"1-1 comment [] [# a]", "2-2 attribute [sn] [b]", "3-2 endOfFile [] []"}},
                  {"cn: a\n b\0c\n d\n"s, {"1-3 attribute [cn] [abd]", "4-3 endOfFile [] []"}},
                  {"cn: a\n\0 b\nsn: c\n"s,
                   {"1-1 attribute [cn] [a]", "2-2 blankLine [] []", "3-3 attribute [sn] [c]",
                    "4-3 endOfFile [] []"}},
                  {"cn: a\0\xff\n"s, {"1-1 attribute [cn] [a]", "2-1 endOfFile [] []"}}});
}

TEST(LDIF_Line, LineThatIsNotValidTextThrowsWithItsText) {
    expect_files(
        {{"cn: \xff\r\nsn: b\n",
          {"1-? endOfFile [] [] throws 162/162 mbstowcs( cn: \xff\r )", "1-1 attribute [sn] [b]",
           "2-1 endOfFile [] []"}},
         {"# \xff\n",
          {"1-? endOfFile [] [] throws 162/162 mbstowcs( # \xff )", "1-1 blankLine [] []",
           "2-1 endOfFile [] []"}},
         {"\xff", {"1-? endOfFile [] [] throws 162/162 mbstowcs( \xff )", "1-0 endOfFile [] []"}}});
}

TEST(LDIF_Line, LineThatFollowsHasToBeValidTextEvenIfItIsNoContinuation) {
    expect_files({{"cn: a\n \xff\nsn: b\n",
                   {"1-? attribute [cn] [] throws 162/162 mbstowcs(  \xff )",
                    "1-1 attribute [sn] [b]", "2-1 endOfFile [] []"}},
                  {"cn: a\nsn: \xff\n",
                   {"1-? attribute [cn] [] throws 162/162 mbstowcs( sn: \xff )",
                    "1-1 blankLine [] []", "2-1 endOfFile [] []"}}});
}

TEST(LDIF_Line, Utf8TextIsKept) {
    REQUIRE_UTF8();
    expect_files(
        {{"n" E_ACUTE "m" E_ACUTE " : " E_ACUTE "\r" E_ACUTE "\n " E_ACUTE "\n",
          {"1-2 attribute [n" E_ACUTE "m" E_ACUTE "] [" E_ACUTE E_ACUTE E_ACUTE "]",
           "3-2 endOfFile [] []"}},
         {"# " E_ACUTE "\r", {"1-1 comment [] [# " E_ACUTE "]", "2-1 endOfFile [] []"}},
         {E_ACUTE "\n", {"1-1 attribute [" E_ACUTE "] [] separator 0", "2-1 endOfFile [] []"}}});
}

TEST(LDIF_Line, CharacterSplitOverTwoLinesIsNotValidText) {
    REQUIRE_UTF8();
    expect_files({{"cn: \xc3\n \xa9\n",
                   {"1-? endOfFile [] [] throws 162/162 mbstowcs( cn: \xc3 )",
                    "1-? endOfFile [] [] throws 162/162 mbstowcs(  \xa9 )", "1-1 blankLine [] []",
                    "2-1 endOfFile [] []"}}});
}

TEST(LDIF_Line, IdeographicSpaceIsWhitespaceEverywhere) {
    REQUIRE_UTF8();
    expect_lines({
        {"cn" WIDE_SPACE ":" WIDE_SPACE " a" WIDE_SPACE "\n", "attribute [cn] [a]"},
        {WIDE_SPACE "cn: a\n", "attribute [" WIDE_SPACE "cn] [a]"},
        {"dn" WIDE_SPACE ": a\n", "dn [dn] [a]"},
        {"cn: a\n" WIDE_SPACE WIDE_SPACE "b\n", "attribute [cn] [a" WIDE_SPACE "b]"},
        {"cn: a\n " WIDE_SPACE "b" WIDE_SPACE "\n", "attribute [cn] [a" WIDE_SPACE "b]"},
        {"cn: a\n" WIDE_SPACE "\n", "attribute [cn] [a]"},
    });
    expect_files({{WIDE_SPACE " \ncn: a\n",
                   {"1-1 blankLine [] []", "2-2 attribute [cn] [a]", "3-2 endOfFile [] []"}},
                  {"cn: a\n\xc2\xa0"
                   "b\n",
                   {"1-1 attribute [cn] [a]",
                    "2-2 attribute [\xc2\xa0"
                    "b] [] separator 0",
                    "3-2 endOfFile [] []"}}});
}

TEST(LDIF_Line, LongLinesAndManyContinuationsAreRead) {
    const std::string long_value(300000, 'v');
    expect_calls("cn: " + long_value + "\n",
                 {"1-1 attribute [cn] [" + long_value + "]", "2-1 endOfFile [] []"});
    std::string text = "cn: \n";
    std::string value;
    for (int i = 0; i < 5000; ++i) {
        text += " x" + std::to_string(i) + "\n";
        value += "x" + std::to_string(i);
    }
    expect_calls(text, {"1-5001 attribute [cn] [" + value + "]", "5002-5001 endOfFile [] []"});
}

/// The rules once more, one by one and all in wide text.
int next_by_the_rules(LDIF_Line& line, std::ifstream& in, int last) {
    const auto physical_line = [&in] {
        std::string raw;
        std::getline(in, raw, '\n');
        std::wstring wide = multibyte2wide(raw);
        w_stripCarriageReturn(wide);
        return wide;
    };
    const auto is_dn = [](const std::string& name) { return strcasecmp(name.c_str(), "dn") == 0; };
    line.value = line.attribute = "";
    line.type = 0;
    line.lineNumber = last + 1;
    line.hasSeparator = 1;
    if (!in.good()) {
        return last;
    }
    const std::wstring text = physical_line();
    ++last;
    if (w_isBlank(text)) {
        line.type = 1;
        return last;
    }
    if (text[0] == L'#') {
        line.type = 2;
        line.value = wide2multibyte(text);
        return last;
    }
    size_t rest = text.find(L':');
    if (rest != std::wstring::npos && rest > 0) {
        line.attribute = wide2multibyte(text.substr(0, rest));
        stripTrailing(line.attribute);
        line.type = is_dn(line.attribute) ? 3 : 4;
    } else {
        line.type = is_dn(wide2multibyte(text.substr(0, 2))) ? 3 : 4;
        line.attribute = wide2multibyte(text);
        line.hasSeparator = 0;
        rest = text.size();
    }
    while (rest < text.size() && text[rest] == L':') {
        ++rest;
    }
    std::wstring value = text.substr(rest);
    w_stripLeading(value);
    while (true) {
        if (in.eof()) {
            return last;
        }
        const std::streampos before = in.tellg();
        const std::wstring more = physical_line();
        ++last;
        if (more.empty() || !w_my_isspace(static_cast<unsigned int>(more[0]))) {
            --last;
            in.seekg(before);
            break;
        }
        value += more.substr(1);
    }
    line.value = wide2multibyte(w_stripTrailing(value));
    return last;
}

void expect_calls_by_the_rules(const std::string& text) {
    SCOPED_TRACE(testing::PrintToString(text));
    const transcript expected = from_file(text, next_by_the_rules);
    EXPECT_EQ(from_stream(text), expected);
    EXPECT_EQ(from_memory(text), expected);
}

/// Text that has found mistakes in line readers, or might.
const std::vector<std::string> nasty_pieces = {
    "\n",       "\n",       "\n",     "\r\n", "\r",        "\r ",          " ",
    " ",        "\t",       "\v",     "\f",   "   \n",     "\n\n",         "#",
    "# c\n",    "#c\n d\n", "dn",     "dn: ", "DN : x\n",  "dn\n",         "dN",
    ":",        ":x",       "::",     ":::",  "cn: a",     "cn: a\n",      " b\n",
    "\n b",     "\n \n",    "\r\n c", "a",    "garbage\n", "version: 1\n", "\0"s,
    " \0\n"s,   "\xff",     "\xc3",   "\xa9", E_ACUTE,     WIDE_SPACE,     "\n" WIDE_SPACE,
    "\xe3\x80", "\xc2\xa0", "\x7f",   "\x01", "\x1a",      "cn:: Zm9v\n",
};

std::string nasty_text(std::mt19937& random) {
    std::string text;
    for (unsigned long pieces = random() % 14; pieces > 0; --pieces) {
        text += nasty_pieces[random() % nasty_pieces.size()];
    }
    return text;
}

TEST(LDIF_Line, BothSourcesFollowTheRulesWhateverTheText) {
    std::mt19937 random(20240229);
    for (int i = 0; i < 4000 && !testing::Test::HasFailure(); ++i) {
        expect_calls_by_the_rules(nasty_text(random));
    }
}

/// Without bytes that end a reading early in one locale or the other.
TEST(LDIF_Line, BothSourcesFollowTheRulesForPlainText) {
    std::mt19937 random(7);
    const std::string characters = "\n\n\n  \t\r:#adnN=\\";
    for (int i = 0; i < 2000 && !testing::Test::HasFailure(); ++i) {
        std::string text;
        for (unsigned long count = random() % 30; count > 0; --count) {
            text += characters[random() % characters.size()];
        }
        expect_calls_by_the_rules(text);
    }
}

}  // namespace
