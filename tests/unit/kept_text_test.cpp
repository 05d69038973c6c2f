#include "kept_text.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

using cfg32::given_text;
using cfg32::kept_text;

TEST(kept_text, ATextThatLastsIsKeptWhereItStands) {
    const std::string memory = "some text";
    const kept_text kept = given_text::lasting(memory);
    EXPECT_EQ(kept.view().data(), memory.data());
    EXPECT_EQ(kept, "some text");
    EXPECT_TRUE(kept.given().lasts());
}

TEST(kept_text, OfAnyOtherTextACopyIsKept) {
    std::string memory = "some text";
    const kept_text kept = given_text(memory);
    memory = "gone";
    EXPECT_EQ(kept, "some text");
    EXPECT_FALSE(kept.given().lasts());
}

TEST(kept_text, ACopyHasItsOwnText) {
    std::string memory = "some text";
    const kept_text kept = given_text::lasting(memory);
    const kept_text copy(kept);
    kept_text assigned = given_text("another");
    assigned = kept;
    memory.assign(memory.size(), 'x');
    EXPECT_EQ(copy, "some text");
    EXPECT_EQ(assigned, "some text");
    EXPECT_EQ(kept, "xxxxxxxxx");
    assigned = *&assigned;
    EXPECT_EQ(assigned, "some text");
}

TEST(kept_text, MovingLeavesTheTextWhereItIs) {
    for (const bool lasts : {true, false}) {
        const std::string memory = "some text";
        kept_text kept = lasts ? given_text::lasting(memory) : given_text(memory);
        const char* const place = kept.view().data();
        kept_text moved(std::move(kept));
        EXPECT_EQ(moved.view().data(), place);
        kept_text assigned = given_text("another");
        assigned = std::move(moved);
        EXPECT_EQ(assigned.view().data(), place);
        EXPECT_EQ(assigned, "some text");
        EXPECT_EQ(assigned.given().lasts(), lasts);
    }
}

TEST(kept_text, NoTextIsNotAnEmptyOne) {
    EXPECT_FALSE(kept_text().has_value());
    EXPECT_FALSE(kept_text(kept_text()).has_value());
    EXPECT_TRUE(kept_text(given_text("")).has_value());
    EXPECT_TRUE(kept_text(given_text::lasting("")).has_value());
    EXPECT_TRUE(kept_text(given_text("")).empty());
    EXPECT_EQ(kept_text(), "");
}

TEST(kept_text, WhatFollowsInMemoryIsAppendedWithoutACopy) {
    const std::string memory = "one, two, three";
    const std::string_view text = memory;
    kept_text kept = given_text::lasting(text.substr(0, 3));
    kept.append(given_text::lasting(text.substr(3, 5)));
    EXPECT_EQ(kept, "one, two");
    EXPECT_EQ(kept.view().data(), memory.data());
    kept.append(given_text::lasting(text.substr(10)));
    EXPECT_EQ(kept, "one, twothree");
    EXPECT_FALSE(kept.given().lasts());
    kept_text first;
    first.append(given_text::lasting(text.substr(5, 3)));
    EXPECT_EQ(first.view().data(), memory.data() + 5);
}

TEST(kept_text, AnythingElseIsAppendedToATextOfItsOwn) {
    std::string memory = "begin";
    const std::string begin = memory;
    kept_text kept = given_text::lasting(memory);
    std::string expected = memory;
    for (int i = 0; i < 200; ++i) {
        const std::string part(static_cast<size_t>(i % 7), static_cast<char>('a' + i % 26));
        kept.append(part);
        expected += part;
        EXPECT_EQ(kept, expected);
    }
    EXPECT_EQ(memory, begin);
    kept.append(kept.view());
    EXPECT_EQ(kept, expected + expected);
}

TEST(kept_text, TheEndCanBeDropped) {
    kept_text kept = given_text("lines\n\n\n");
    kept.remove_suffix(2);
    EXPECT_EQ(kept, "lines\n");
    kept.append("more\n");
    EXPECT_EQ(kept, "lines\nmore\n");
    const kept_text copy(kept);
    EXPECT_EQ(copy, "lines\nmore\n");
}
