#include <algorithm>
#include <memory>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "check/check_report.h"
#include "check/problem.h"
#include "memory_file.h"
#include "property.h"

namespace cfg32::fuzz {

namespace {

using namespace cfg32::tool;

/// Why a text can't be loaded; "" when it can.
std::string failure_of_load(std::string_view text) {
    const memory_file file(text);
    try {
        const LDIF_File loaded(file.name(), "", nullptr);
        return "";
    } catch (const LDIF_Exception& e) {
        require_refusal(e);
        return e.dump();
    }
}

void require_places(const std::vector<problem>& problems, std::string_view text) {
    const auto lines = std::count(text.begin(), text.end(), '\n') + 1;
    int last = 1;
    for (const problem& each : problems) {
        require(each.line >= last && each.line <= lines, "problems are in the order of lines");
        require(each.column >= 1 && each.width >= 1, "problems have a place");
        last = each.line;
    }
}

}  // namespace

void problems_property(std::string_view input) {
    const std::vector<problem> problems = find_problems(input, nullptr);
    require_places(problems, input);
    const std::string failure = failure_of_load(input);
    require(can_be_loaded(problems) == failure.empty(),
            "a check finds what stops a load: " + (failure.empty() ? "nothing does" : failure));
    require_equal(failure_of_load(loadable_part(input, problems)), "",
                  "what is left without that can be loaded");
    const std::vector<checked_file> files = {{"conf", std::string(input), problems}};
    require(problems.empty() == (text_report(files).empty()), "a report tells of the problems");
}

}  // namespace cfg32::fuzz
