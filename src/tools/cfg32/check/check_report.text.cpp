// Problems for people.

#include <fmt/format.h>

#include <algorithm>

#include "check/check_report.h"
#include "check/file_text.h"
#include "check/source_excerpt.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

/// Line numbers are aligned up to this many digits.
constexpr size_t number_width = 5;

std::string heading(const std::string& name, const problem& each) {
    const std::string where = fmt::format("{}:{}:{}:", harmless(name), each.line, each.column);
    const auto& grade = each.broken->grade == severity::error ? style::error : style::warning;
    return fmt::format("{} {} {} {}\n", styled(stdout, style::place, where),
                       styled(stdout, grade, fmt::format("{}:", severity_name(each.broken->grade))),
                       harmless(each.text),
                       styled(stdout, style::place, fmt::format("[{}]", each.broken->id)));
}

std::string body(const file_text& file, source_excerpts& excerpts, const problem& each) {
    const std::string number = fmt::format("{:>{}}", each.line, number_width);
    const std::string margin(number.size(), ' ');
    std::string text;
    // The text of that line would have nothing to do with it.
    const bool is_elsewhere = each.broken == &kind::leftover_copy;
    if (each.line <= file.line_count() && !is_elsewhere) {
        const source_excerpt shown = excerpts.of(each);
        text += fmt::format("{} | {}\n", number, shown.line);
        text += fmt::format("{} | {}{}\n", margin, shown.indent,
                            styled(stdout, style::marker, shown.marker));
    }
    if (!each.accepted.empty()) {
        text += fmt::format("{} = accepted: {}\n", margin, harmless(each.accepted));
    }
    return text;
}

std::string counted(size_t count, const std::string& what) {
    return count == 0 ? "" : fmt::format("{} {}{}", count, what, count == 1 ? "" : "s");
}

std::string summary(size_t errors, size_t warnings) {
    const bool has_both = errors > 0 && warnings > 0;
    return counted(errors, "error") + (has_both ? ", " : "") + counted(warnings, "warning") +
           (errors + warnings > 0 ? "\n" : "");
}

}  // namespace

const char* severity_name(severity grade) { return grade == severity::error ? "error" : "warning"; }

std::string text_report(const std::vector<checked_file>& files) {
    std::string text;
    size_t errors = 0;
    size_t warnings = 0;
    for (const checked_file& checked : files) {
        const file_text file(checked.text);
        source_excerpts excerpts(file);
        for (const problem& each : checked.problems) {
            text += heading(checked.name, each) + body(file, excerpts, each);
            ++(each.broken->grade == severity::error ? errors : warnings);
        }
    }
    return text + summary(errors, warnings);
}

}  // namespace cfg32::tool
