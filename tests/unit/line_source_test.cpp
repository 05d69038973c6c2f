#include "line_source.h"

#include <gmock/gmock.h>

#include <random>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

namespace {

using cfg32::line_source;
using namespace std::string_literals;

TEST(line_source, LinesComeWithoutTheirNewlines) {
    line_source in("a\n\n b \r\n");
    EXPECT_EQ(in.take(), "a");
    EXPECT_EQ(in.take(), "");
    EXPECT_EQ(in.take(), " b \r");
    EXPECT_TRUE(in.good());
    EXPECT_FALSE(in.at_end());
    EXPECT_EQ(in.take(), "");
    EXPECT_FALSE(in.good());
    EXPECT_TRUE(in.at_end());
}

TEST(line_source, LineEndedByTheEndOfTheTextIsAtTheEnd) {
    line_source in("a\nb");
    EXPECT_EQ(in.take(), "a");
    EXPECT_FALSE(in.at_end());
    EXPECT_EQ(in.take(), "b");
    EXPECT_TRUE(in.at_end());
    EXPECT_FALSE(in.good());
}

TEST(line_source, EmptyTextIsGoodUntilItIsRead) {
    line_source in("");
    EXPECT_TRUE(in.good());
    EXPECT_FALSE(in.at_end());
    EXPECT_EQ(in.take(), "");
    EXPECT_FALSE(in.good());
    EXPECT_TRUE(in.at_end());
}

TEST(line_source, GoingBackReadsALineAgain) {
    line_source in("a\nb");
    in.take();
    const size_t before = in.position();
    EXPECT_EQ(in.take(), "b");
    in.go_back(before);
    EXPECT_TRUE(in.good());
    EXPECT_FALSE(in.at_end());
    EXPECT_EQ(in.take(), "b");
    EXPECT_TRUE(in.at_end());
}

TEST(line_source, GoingBackDoesNotMendAFailedRead) {
    line_source in("a\n");
    in.take();
    const size_t before = in.position();
    in.take();
    in.go_back(before);
    EXPECT_FALSE(in.good());
    EXPECT_FALSE(in.at_end());
}

TEST(line_source, LinesArePartsOfTheText) {
    const std::string text = "a\0b\nc"s;
    line_source in(text);
    const std::string_view first = in.take();
    EXPECT_EQ(first, "a\0b"s);
    EXPECT_EQ(first.data(), text.data());
    EXPECT_EQ(in.take().data(), text.data() + 4);
}

TEST(line_source, StatesAreThoseOfAStream) {
    std::mt19937 random(11);
    const std::string characters = "\n\na\r ";
    for (int i = 0; i < 2000 && !testing::Test::HasFailure(); ++i) {
        std::string text;
        for (unsigned long count = random() % 12; count > 0; --count) {
            text += characters[random() % characters.size()];
        }
        SCOPED_TRACE(testing::PrintToString(text));
        line_source in(text);
        std::istringstream stream(text);
        for (int steps = 0; steps < 20 && stream.good(); ++steps) {
            const auto stream_before = stream.tellg();
            const size_t before = in.position();
            ASSERT_EQ(before, static_cast<size_t>(stream_before));
            std::string expected;
            std::getline(stream, expected, '\n');
            ASSERT_EQ(in.take(), expected);
            ASSERT_EQ(in.at_end(), stream.eof());
            ASSERT_EQ(in.good(), stream.good());
            if (random() % 3 == 0) {
                stream.seekg(stream_before);
                in.go_back(before);
                ASSERT_EQ(in.at_end(), stream.eof());
                ASSERT_EQ(in.good(), stream.good());
            }
        }
    }
}

}  // namespace
