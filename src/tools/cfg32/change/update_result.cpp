// Telling what an update did, or would do.

#include <fmt/format.h>

#include <nlohmann/json.hpp>

#include "change/update.h"
#include "diff/unified_diff.h"
#include "hidden_passwords.h"
#include "json_text.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

json as_json(const settings& options, const update_result& result) {
    json skipped = json::array();
    for (const skipped_record& each : result.skipped) {
        json object = json::object();
        if (each.line > 0) {
            object["line"] = each.line;
        }
        object["dn"] = utf8(shown_text(each.dn));
        object["reason"] = utf8(shown_text(each.reason));
        skipped.push_back(std::move(object));
    }
    json document = {
        {"file", utf8(options.file_name())},
        {"result", result.is_changed ? "changed" : "unchanged"},
        {"dryRun", options.is_dry_run},
    };
    if (options.is_dry_run) {
        document["diff"] =
            utf8(unified_diff(result.canonical, result.after, options.file_name(), false));
    }
    document["skipped"] = std::move(skipped);
    return document;
}

std::string plain_text(const settings& options, const update_result& result) {
    if (!result.is_changed) {
        return "unchanged\n";
    }
    return options.is_dry_run ? unified_diff(result.canonical, result.after, options.file_name())
                              : "";
}

}  // namespace

/// A write puts the whole file in one form, which would hide the change in the diff.
void note_rewriting(const settings& options, const update_result& result) {
    if (options.is_dry_run && result.is_changed && result.canonical != result.before) {
        complain(options.file_name() +
                 ": besides, the write sorts attributes, joins continued lines and prints names in "
                 "one form");
    }
}

int print_result(const settings& options, const update_result& result) {
    for (const skipped_record& each : result.skipped) {
        complain("skipped: " + each.reason);
    }
    if (options.is_json) {
        print_json(as_json(options, result));
    } else {
        fmt::print("{}", plain_text(options, result));
    }
    note_rewriting(options, result);
    return result.skipped.empty() ? done : failed;
}

}  // namespace cfg32::tool
