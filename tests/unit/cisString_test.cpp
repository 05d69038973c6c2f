#include "cisString.h"

#include <gmock/gmock.h>

#include <stdexcept>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "failures.h"
#include "utf8_locale.h"

namespace {

using cfg32::tests::failure_of;
using cfg32::tests::summary;

int sign(int number) { return (number > 0) - (number < 0); }

/// Compares in one overload: compare and the six operators have to agree with the sign.
template <class Other>
void expect_order(const cisString& left, const Other& right, int expected) {
    EXPECT_EQ(sign(left.compare(right)), expected);
    EXPECT_EQ(left == right, expected == 0);
    EXPECT_EQ(left != right, expected != 0);
    EXPECT_EQ(left < right, expected < 0);
    EXPECT_EQ(left > right, expected > 0);
    EXPECT_EQ(left <= right, expected <= 0);
    EXPECT_EQ(left >= right, expected >= 0);
}

TEST(cisString, IsPolymorphic) {
    EXPECT_TRUE(std::is_polymorphic_v<cisString>);
    EXPECT_TRUE(std::has_virtual_destructor_v<cisString>);
}

TEST(cisString, IsEmptyOrHasTheTextItIsMadeOf) {
    EXPECT_EQ(cisString().text(), "");
    EXPECT_TRUE(cisString().empty());
    EXPECT_EQ(cisString("Dn").text(), "Dn");
    EXPECT_EQ(cisString(std::string("Dn")).text(), "Dn");
    EXPECT_STREQ(cisString("Dn").c_str(), "Dn");
    EXPECT_FALSE(cisString("Dn").empty());
}

TEST(cisString, CopyAndAssignmentKeepTheSpelling) {
    const cisString original("MiXed");
    cisString copy(original);
    EXPECT_EQ(copy.text(), "MiXed");
    cisString assigned("other");
    assigned = original;
    EXPECT_EQ(assigned.text(), "MiXed");
    const cisString& self = assigned;
    assigned = self;
    EXPECT_EQ(assigned.text(), "MiXed");
    copy.append(L"!", 0, 1);
    EXPECT_EQ(original.text(), "MiXed");
}

TEST(cisString, EveryOverloadComparesWithoutCase) {
    const struct {
        const char* left;
        const char* right;
        int expected;
    } rows[] = {
        {"Dn", "dN", 0},
        {"", "", 0},
        {"a", "B", -1},
        {"B", "a", 1},
        {"A", "b", -1},
        {"b", "A", 1},
        {"", "a", -1},
        {"a", "", 1},
        {"ab", "AB", 0},
        {"ab", "ABC", -1},
        {"abc", "AB", 1},
        {"a b", "A B", 0},
        {"a", "a ", -1},
        {"[", "a", -1},
        {"[", "A", -1},
        {"_", "z", -1},
        {"cn=x,o=y", "CN=X,O=Y", 0},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::string(row.left) + " and " + row.right);
        const cisString left(row.left);
        expect_order(left, row.right, row.expected);
        expect_order(left, std::string(row.right), row.expected);
        expect_order(left, cisString(row.right), row.expected);
    }
}

TEST(cisString, DefaultComparesAsTheEmptyText) {
    expect_order(cisString(), "", 0);
    expect_order(cisString(), "a", -1);
    expect_order(cisString("a"), cisString(), 1);
    expect_order(cisString(), std::string(), 0);
}

/// Finds every text equal, and notes which texts it was asked about.
struct equal_to_all : cisString {
    using cisString::cisString;
    using cisString::compare;
    int compare(const char* other) const override {
        asked.push_back(other);
        return 0;
    }
    mutable std::vector<std::string> asked;
};

TEST(cisString, OverridingTheCompareOfCharsChangesEveryOverloadAndOperator) {
    const equal_to_all text("a");
    const cisString& base = text;
    expect_order(base, "x", 0);
    expect_order(base, std::string("y"), 0);
    expect_order(base, cisString("z"), 0);
    expect_order(base, std::string(), 0);
    expect_order(base, cisString(), 0);
    std::vector<std::string> expected;
    for (const char* other : {"x", "y", "z", "", ""}) {
        expected.insert(expected.end(), 7, other);
    }
    EXPECT_EQ(text.asked, expected);
}

/// Answers each overload with a number of its own.
struct answering : cisString {
    int chars = 0;
    int string = 0;
    int cis = 0;
    int compare(const char*) const override { return chars; }
    int compare(const std::string&) const override { return string; }
    int compare(const cisString&) const override { return cis; }
};

TEST(cisString, OperatorsAskTheCompareOfTheirOwnOverload) {
    answering text;
    const cisString& base = text;
    for (int chars = -1; chars <= 1; ++chars) {
        text.chars = chars;
        text.string = (chars + 2) % 3 - 1;
        text.cis = -text.string;
        expect_order(base, "x", text.chars);
        expect_order(base, std::string("x"), text.string);
        expect_order(base, cisString("x"), text.cis);
    }
}

TEST(cisString, LessOrEqualIsACompareBelowOne) {
    answering text;
    const cisString& base = text;
    for (const int answer : {-5, -1, 0, 1, 5}) {
        text.chars = answer;
        EXPECT_EQ(base <= "x", answer < 1);
        EXPECT_EQ(base >= "x", answer >= 0);
    }
}

TEST(cisString, AppendTakesAPartOfAWideText) {
    const struct {
        size_t pos;
        size_t count;
        const char* expected;
    } rows[] = {
        {0, 0, "Cn"},      {0, 2, "Cnab"}, {1, 2, "Cnbc"},
        {0, 99, "Cnabcd"}, {4, 1, "Cn"},   {2, std::wstring::npos, "Cncd"},
    };
    for (const auto& row : rows) {
        cisString text("Cn");
        EXPECT_EQ(&text.append(L"abcd", row.pos, row.count), &text);
        EXPECT_EQ(text.text(), row.expected);
    }
    cisString empty;
    EXPECT_EQ(empty.append(L"x", 0, 1).text(), "x");
}

TEST(cisString, AppendBeyondTheTextThrowsAndChangesNothing) {
    cisString text("Cn");
    EXPECT_THROW(text.append(L"abcd", 5, 1), std::out_of_range);
    EXPECT_EQ(text.text(), "Cn");
}

TEST(cisString, AppendConvertsToTheLocalesCharacterSet) {
    REQUIRE_UTF8();
    cisString text("Cn");
    EXPECT_EQ(text.append(L"x\u00e9\u3000", 1, 2).text(), "Cn\xc3\xa9\xe3\x80\x80");
}

TEST(cisString, AppendOfACharacterOutsideTheCharacterSetThrowsAndChangesNothing) {
    cisString text("Cn");
    const std::wstring bad(1, static_cast<wchar_t>(0xdc80));
    EXPECT_EQ(summary(failure_of([&] { text.append(bad, 0, 1); })), "163/163 wcstombs()");
    EXPECT_EQ(text.text(), "Cn");
}

}  // namespace
