#pragma once

#include <gtest/gtest.h>

#include <string>

#include "outcome.h"

namespace cfg32::tests {

/// What the command says at its end when this is done.
template <class Body>
std::string end_of(Body body) {
    try {
        body();
    } catch (const tool::ended& end) {
        EXPECT_EQ(end.status(), tool::failed);
        return end.what();
    }
    return "done";
}

}  // namespace cfg32::tests
