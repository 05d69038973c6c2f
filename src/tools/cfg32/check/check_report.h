#pragma once

// How problems are printed.

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "check/problem.h"

namespace cfg32::tool {

/// "error" or "warning".
const char* severity_name(severity grade);

/// What was checked: a file, its text and its problems.
struct checked_file {
    std::string name;
    std::string text;
    std::vector<problem> problems;
};

using report_printer = std::function<void(std::string_view piece)>;

/// For people, as compilers print: "file:line:column: error: text [rule]", the line with a caret
/// under the place, and what would be accepted. Coloured if standard output is.
std::string text_report(const std::vector<checked_file>& files);
/// In pieces: all of it may be much longer than the files, as each problem names its entry.
void json_report(const std::vector<checked_file>& files, const report_printer& print);
/// SARIF 2.1.0, for code-scanning services.
std::string sarif_report(const std::vector<checked_file>& files);
/// The workflow commands of GitHub Actions.
std::string github_report(const std::vector<checked_file>& files);

}  // namespace cfg32::tool
