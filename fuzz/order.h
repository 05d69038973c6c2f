#pragma once

#include <vector>

#include "property.h"

namespace cfg32::fuzz {

inline int sign(int order) { return (order > 0) - (order < 0); }

/// The comparisons of values, each with each, are those of a strict weak order: compare(a, b) is
/// negative, 0 or positive.
template <class Value, class Compare>
void require_order(const std::vector<Value>& values, Compare compare) {
    const auto order = [&](const Value& a, const Value& b) { return sign(compare(a, b)); };
    for (const Value& a : values) {
        require_equal(order(a, a), 0, "what is compared with itself is equal");
        for (const Value& b : values) {
            require_equal(order(a, b), -order(b, a), "an order is the same from both sides");
            for (const Value& c : values) {
                require(!(order(a, b) <= 0 && order(b, c) <= 0) || order(a, c) <= 0,
                        "an order is transitive");
                require(order(a, b) != 0 || order(a, c) == order(b, c),
                        "equals stand in one place of an order");
            }
        }
    }
}

}  // namespace cfg32::fuzz
