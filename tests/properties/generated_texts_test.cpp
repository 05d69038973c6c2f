#include "generated_texts.h"

#include <gmock/gmock.h>

#include <set>

using cfg32::tests::fragments_of;
using cfg32::tests::generated_texts;
using testing::ElementsAre;

TEST(GeneratedTexts, AreMadeOfADictionarysFragments) {
    EXPECT_THAT(fragments_of("\"a b\"\n\"\\\\\\\"\"\n\"\\x00\\xff\"\n"),
                ElementsAre("a b", "\\\"", std::string("\0\xff", 2)));
    EXPECT_THROW(fragments_of("a\n"), std::invalid_argument);
}

TEST(GeneratedTexts, AreTheSameForTheSameSeedAndElseOthers) {
    const auto texts = [](unsigned long seed) {
        generated_texts made({"a", "b", "c"}, {"given text"}, seed);
        std::vector<std::string> all;
        for (int i = 0; i < 50; ++i) {
            all.push_back(made.next());
        }
        return all;
    };
    EXPECT_EQ(texts(1), texts(1));
    EXPECT_NE(texts(1), texts(2));
    const std::vector<std::string> made = texts(1);
    EXPECT_GT(std::set<std::string>(made.begin(), made.end()).size(), 40u);
}
