// The problems that were found so far.

#include "check/findings.h"

#include <algorithm>
#include <iterator>
#include <tuple>

#include "LDIF_Exception.h"

namespace cfg32::tool {

void take_codes(problem& found, const LDIF_Exception& e) {
    found.result = e.ldapErr;
    found.extended = e.extErr;
}

void sort_by_place(std::vector<problem>& all) {
    const auto order = [](const problem& each) {
        return std::tuple(each.line, each.column, index_of(*each.broken));
    };
    std::stable_sort(all.begin(), all.end(), [&](const problem& left, const problem& right) {
        return order(left) < order(right);
    });
}

std::vector<problem> findings::sorted() {
    std::vector<problem> all(std::make_move_iterator(problems_.begin()),
                             std::make_move_iterator(problems_.end()));
    sort_by_place(all);
    return all;
}

}  // namespace cfg32::tool
