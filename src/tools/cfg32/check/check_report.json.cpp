// Problems for programs.

#include <nlohmann/json.hpp>

#include "check/check_report.h"
#include "json_text.h"

namespace cfg32::tool {

namespace {

const char* name_of(consequence outcome) {
    switch (outcome) {
        case consequence::loses_text:
            return "loses-text";
        case consequence::kept_aside:
            return "kept-aside";
        case consequence::stops_load:
            return "stops-load";
        default:
            return "none";
    }
}

/// What is not known is left out.
json described(const problem& each) {
    json object = {{"rule", each.broken->id},
                   {"severity", severity_name(each.broken->grade)},
                   {"consequence", name_of(each.outcome())},
                   {"text", utf8(each.text)},
                   {"line", each.line},
                   {"column", each.column},
                   {"width", each.width}};
    const auto add_text = [&](const char* name, const std::string& text) {
        if (!text.empty()) {
            object[name] = utf8(text);
        }
    };
    add_text("entry", each.entry);
    add_text("attribute", each.attribute);
    add_text("accepted", each.accepted);
    if (each.result != 0) {
        object["result"] = each.result;
    }
    if (each.extended != 0) {
        object["extended"] = each.extended;
    }
    return object;
}

}  // namespace

std::string json_report(const std::vector<checked_file>& files) {
    json all = json::array();
    for (const checked_file& checked : files) {
        json problems = json::array();
        for (const problem& each : checked.problems) {
            problems.push_back(described(each));
        }
        all.push_back({{"file", utf8(checked.name)}, {"problems", std::move(problems)}});
    }
    return json{{"files", std::move(all)}}.dump(2) + "\n";
}

}  // namespace cfg32::tool
