// The problems that were found so far.

#include "check/findings.h"

#include <algorithm>
#include <iterator>
#include <tuple>

namespace cfg32::tool {

std::vector<problem> findings::sorted() {
    std::vector<problem> all(std::make_move_iterator(problems_.begin()),
                             std::make_move_iterator(problems_.end()));
    const auto order = [](const problem& each) {
        return std::tuple(each.line, each.column, index_of(*each.broken));
    };
    std::stable_sort(all.begin(), all.end(), [&](const problem& left, const problem& right) {
        return order(left) < order(right);
    });
    return all;
}

}  // namespace cfg32::tool
