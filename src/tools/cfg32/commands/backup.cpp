// cfg32 backup: copies the configuration file now.

#include <fmt/format.h>
#include <memory>

#include <algorithm>

#include "arguments.h"
#include "check/problem.h"
#include "command.h"
#include "configuration.h"
#include "memory_file.h"
#include "whole_file.h"

namespace cfg32::tool {

namespace {

/// A backup that is there may be the last good version: a broken file doesn't take its place.
void require_good(const std::string& name, const std::string& text, const std::string& target) {
    const std::vector<problem> problems = find_problems(text, nullptr);
    if (!is_there(target) || can_be_loaded(problems)) {
        return;
    }
    const auto found = std::find_if(problems.begin(), problems.end(), [](const problem& each) {
        return each.outcome() == consequence::stops_load;
    });
    throw ended(answer_is_no,
                fmt::format("{}:{}: {}; {} stays as it is (name another file to copy to)", name,
                            found->line, found->text, target));
}

int backup(const settings& options, const std::string& given_target) {
    const std::string name = options.file_name();
    const std::string target = given_target.empty() ? options.backup_name() : given_target;
    if (target.empty()) {
        throw ended(usage_error, "--no-backup leaves nothing to do");
    }
    require_bind(options, name);
    // Nobody writes it meanwhile; one who doesn't ask is noticed by the copying.
    const locked_file file = locked_configuration(name);
    require_good(name, text_of(file, name), target);
    copy_file(name, target);
    return done;
}

}  // namespace

action define_backup(CLI::App& parser, settings& options) {
    const auto target = std::make_shared<std::string>();
    add_argument(parser, "backup", "BACKUP", "the copy; else what --backup says, or FILE.bak",
                 *target);
    return [target, &options] { return backup(options, *target); };
}

}  // namespace cfg32::tool
