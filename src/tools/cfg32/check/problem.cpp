// The list of rules, and reading a file in spite of its problems.

#include "check/problem.h"

#include <algorithm>
#include <utility>

#include "LDIF_File.h"

namespace cfg32::tool {

const std::vector<const rule*> rules = {
#define RULE(name, ...) &kind::name,
#include "check/problem_rules.def"
#undef RULE
};

size_t index_of(const rule& wanted) {
    return static_cast<size_t>(std::find(rules.begin(), rules.end(), &wanted) - rules.begin());
}

bool can_be_loaded(const std::vector<problem>& problems) {
    return std::none_of(problems.begin(), problems.end(), [](const problem& each) {
        return each.outcome() == consequence::stops_load;
    });
}

std::string loadable_part(std::string_view text, const std::vector<problem>& problems) {
    std::vector<std::pair<int, int>> left_out;
    for (const problem& each : problems) {
        if (each.first_left_out > 0) {
            left_out.emplace_back(each.first_left_out, each.last_left_out);
        }
    }
    std::sort(left_out.begin(), left_out.end());
    while (text.starts_with(byte_order_mark)) {
        text.remove_prefix(byte_order_mark.size());
    }
    std::string part;
    int skipped_to = 0;
    auto range = left_out.begin();
    for (int number = 1; !text.empty(); ++number) {
        for (; range != left_out.end() && range->first <= number; ++range) {
            skipped_to = std::max(skipped_to, range->second);
        }
        const size_t length = std::min(text.find('\n'), text.size() - 1) + 1;
        if (number > skipped_to) {
            part += text.substr(0, length);
        }
        text.remove_prefix(length);
    }
    // What stood above such a line may be what was left out.
    size_t begin = 0;
    while (std::string_view(part).substr(begin).starts_with(unfinished_mark)) {
        begin += unfinished_mark.size();
    }
    return part.erase(0, begin);
}

}  // namespace cfg32::tool
