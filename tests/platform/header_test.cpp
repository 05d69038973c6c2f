#include <gtest/gtest.h>

extern "C" int use_from_c(void);

TEST(Header, ServesAStrictC99Caller) { EXPECT_EQ(use_from_c(), 1); }
