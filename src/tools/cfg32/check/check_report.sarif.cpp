// Problems as SARIF 2.1.0 (OASIS), which code-scanning services read.

#include <fmt/format.h>

#include <nlohmann/json.hpp>

#include "check/check_report.h"
#include "utf8.h"

namespace cfg32::tool {

namespace {

using json = nlohmann::ordered_json;

constexpr const char* schema =
    "https://docs.oasis-open.org/sarif/sarif/v2.1.0/errata01/os/schemas/sarif-schema-2.1.0.json";

/// RFC 3986, section 2.3, and what separates the parts of a path.
bool stands_in_path(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') ||
           std::string_view("-._~/").find(c) != std::string_view::npos;
}

std::string uri(const std::string& path) {
    std::string text = path.starts_with('/') ? "file://" : "";
    for (const char c : path) {
        text += stands_in_path(c) ? std::string(1, c)
                                  : fmt::format("%{:02X}", static_cast<unsigned char>(c));
    }
    return text;
}

json described_rules() {
    json all = json::array();
    for (const rule* each : rules) {
        all.push_back({{"id", each->id},
                       {"shortDescription", {{"text", each->summary}}},
                       {"defaultConfiguration", {{"level", severity_name(each->grade)}}}});
    }
    return all;
}

json location(const std::string& name, const problem& each) {
    const json region = {{"startLine", each.line},
                         {"startColumn", each.column},
                         {"endColumn", each.column + each.width}};
    return {{"physicalLocation", {{"artifactLocation", {{"uri", uri(name)}}}, {"region", region}}}};
}

json result(const std::string& name, const problem& each) {
    const std::string text =
        each.text + (each.accepted.empty() ? "" : " (accepted: " + each.accepted + ")");
    return {{"ruleId", each.broken->id},
            {"ruleIndex", index_of(*each.broken)},
            {"level", severity_name(each.broken->grade)},
            {"message", {{"text", utf8(text)}}},
            {"locations", json::array({location(name, each)})}};
}

}  // namespace

std::string sarif_report(const std::vector<checked_file>& files) {
    json results = json::array();
    for (const checked_file& checked : files) {
        for (const problem& each : checked.problems) {
            results.push_back(result(checked.name, each));
        }
    }
    const json driver = {
        {"name", "cfg32"}, {"version", CFG32_VERSION}, {"rules", described_rules()}};
    json run = {{"tool", {{"driver", driver}}},
                {"columnKind", "unicodeCodePoints"},
                {"results", std::move(results)}};
    const json log = {
        {"$schema", schema}, {"version", "2.1.0"}, {"runs", json::array({std::move(run)})}};
    return log.dump(2) + "\n";
}

}  // namespace cfg32::tool
