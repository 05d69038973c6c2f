// Telling what an update did, or would do.

#include <fmt/format.h>

#include <nlohmann/json.hpp>

#include "change/update.h"
#include "diff/unified_diff.h"
#include "json_text.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

json as_json(const settings& options, const update_result& result) {
    json skipped = json::array();
    for (const skipped_record& each : result.skipped) {
        skipped.push_back(
            {{"line", each.line}, {"dn", utf8(each.dn)}, {"reason", utf8(each.reason)}});
    }
    json document = {
        {"file", utf8(options.file_name())},
        {"result", result.is_changed ? "changed" : "unchanged"},
        {"dryRun", options.is_dry_run},
    };
    if (options.is_dry_run) {
        document["diff"] =
            utf8(unified_diff(result.before, result.after, options.file_name(), false));
    }
    document["skipped"] = std::move(skipped);
    return document;
}

std::string plain_text(const settings& options, const update_result& result) {
    if (!result.is_changed) {
        return "unchanged\n";
    }
    return options.is_dry_run ? unified_diff(result.before, result.after, options.file_name()) : "";
}

}  // namespace

int print_result(const settings& options, const update_result& result) {
    for (const skipped_record& each : result.skipped) {
        complain("skipped: " + each.reason);
    }
    if (options.is_json) {
        print_json(as_json(options, result));
    } else {
        fmt::print("{}", plain_text(options, result));
    }
    return result.skipped.empty() ? done : failed;
}

}  // namespace cfg32::tool
