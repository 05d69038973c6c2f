#include "secret.h"

#include <gtest/gtest.h>

#include <utility>

namespace cfg32::tool {

TEST(secret, LeavesNothingBehindWhereItWas) {
    secret first("hunter2");
    const std::string_view place(first.c_str(), 7);  // short texts lie in the object itself
    secret second(std::move(first));
    EXPECT_EQ(second.text(), "hunter2");
    EXPECT_EQ(place, std::string(7, '\0'));
    secret third("what it was before");
    third = std::move(second);
    EXPECT_EQ(third.text(), "hunter2");
}

}  // namespace cfg32::tool
