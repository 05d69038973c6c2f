// Problems as workflow commands of GitHub Actions, which shows them at their lines.

#include <fmt/format.h>

#include <string_view>

#include "check/check_report.h"
#include "utf8.h"

namespace cfg32::tool {

namespace {

/// The characters as "%" and two hexadecimal digits.
std::string escaped(std::string_view text, std::string_view characters) {
    std::string out;
    for (const char c : text) {
        const bool is_escaped = characters.find(c) != std::string_view::npos;
        out +=
            is_escaped ? fmt::format("%{:02X}", static_cast<unsigned char>(c)) : std::string(1, c);
    }
    return out;
}

std::string message(const std::string& text) { return escaped(utf8(text), "%\r\n"); }
std::string property(const std::string& text) { return escaped(utf8(text), "%\r\n:,"); }

}  // namespace

std::string github_report(const std::vector<checked_file>& files) {
    std::string text;
    for (const checked_file& checked : files) {
        for (const problem& each : checked.problems) {
            const std::string accepted =
                each.accepted.empty() ? "" : " (accepted: " + each.accepted + ")";
            text +=
                fmt::format("::{} file={},line={},col={},title={}::{}\n",
                            severity_name(each.broken->grade), property(checked.name), each.line,
                            each.column, property(each.broken->id), message(each.text + accepted));
        }
    }
    return text;
}

}  // namespace cfg32::tool
