#include <gtest/gtest.h>

#include <string>

#include "cfg32_platform.h"

namespace {

TEST(BoundedFormat, WritesTheWholeTextWhenItFits) {
    char buffer[32];
    EXPECT_EQ(nuv_snprintf(buffer, sizeof buffer, "%s: %ld to %5.2f", "x", 1024L, 2.5), 16);
    EXPECT_STREQ(buffer, "x: 1024 to  2.50");
}

TEST(BoundedFormat, CutsTheTextAndStillTerminatesIt) {
    std::string buffer(8, '#');
    EXPECT_EQ(nuv_snprintf(buffer.data(), 5, "%s", "0123456789"), 10);
    EXPECT_EQ(buffer, std::string("0123\0###", 8));
}

TEST(BoundedFormat, OfSizeZeroOnlyMeasures) {
    char untouched = '#';
    EXPECT_EQ(nuv_snprintf(&untouched, 0, "%d", 12345), 5);
    EXPECT_EQ(untouched, '#');
    EXPECT_EQ(nuv_snprintf(nullptr, 0, "%d", 12345), 5);
}

}  // namespace
