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
    add_text("entry", each.entry.str());
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

/// Prints an array as it is printed within the whole: its members on lines of their own, below each
/// other and two more blanks to the right than what newline begins.
template <class Member, class Print>
void print_array(const std::vector<Member>& members, const std::string& newline,
                 const report_printer& print, Print print_member) {
    print("[");
    for (const Member& member : members) {
        print((&member == members.data() ? "" : ",") + newline + "  ");
        print_member(member);
    }
    print(members.empty() ? "]" : newline + "]");
}

/// The lines of a printed value, but the first, further to the right.
std::string moved_to_the_right(std::string_view text, const std::string& newline) {
    std::string moved;
    size_t end = 0;
    while ((end = text.find('\n')) != std::string_view::npos) {
        moved.append(text.substr(0, end)).append(newline);
        text.remove_prefix(end + 1);
    }
    return moved.append(text);
}

}  // namespace

void json_report(const std::vector<checked_file>& files, const report_printer& print) {
    print("{\n  \"files\": ");
    print_array(files, "\n  ", print, [&](const checked_file& checked) {
        print("{\n      \"file\": " + json(utf8(checked.name)).dump() + ",\n      \"problems\": ");
        print_array(checked.problems, "\n      ", print, [&](const problem& each) {
            print(moved_to_the_right(described(each).dump(2), "\n        "));
        });
        print("\n    }");
    });
    print("\n}\n");
}

}  // namespace cfg32::tool
