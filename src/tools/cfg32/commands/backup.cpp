// cfg32 backup: copies the configuration file now.

#include <fmt/format.h>
#include <sys/stat.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <cstring>

#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "check/problem.h"
#include "command.h"
#include "disk.h"
#include "file_lock.h"
#include "memory_file.h"

namespace cfg32::tool {

namespace {

/// A backup that is there may be the last good version: a broken file doesn't take its place.
void require_good(const std::string& name, const std::string& target) {
    struct stat status;
    if (stat(target.c_str(), &status) != 0) {
        return;
    }
    const std::vector<problem> problems = find_problems(read_configuration(name), nullptr);
    const auto found = std::find_if(problems.begin(), problems.end(), [](const problem& each) {
        return each.broken->outcome == consequence::stops_load;
    });
    if (found != problems.end()) {
        throw ended(answer_is_no,
                    fmt::format("{}:{}: {}; {} stays as it is (name another file to copy to)", name,
                                found->line, found->text, target));
    }
}

int backup(const settings& options, const std::string& given_target) {
    const std::string name = options.file_name();
    const std::string target = given_target.empty() ? options.backup_name() : given_target;
    if (target.empty()) {
        throw ended(usage_error, "--no-backup leaves nothing to do");
    }
    require_good(name, target);
    const locked_file file(name.c_str(), O_RDONLY, LOCK_SH);
    if (!file || !copyFile(name.c_str(), target.c_str(), nullptr, nullptr, file.status().st_mode)) {
        throw ended(failed,
                    fmt::format("{} can't be copied to {}: {}", name, target, strerror(errno)));
    }
    return done;
}

}  // namespace

action define_backup(CLI::App& parser, settings& options) {
    const auto target = std::make_shared<std::string>();
    parser.add_option("backup", *target, "the copy; else what --backup says, or FILE.bak")
        ->type_name("BACKUP");
    return [target, &options] { return backup(options, *target); };
}

}  // namespace cfg32::tool
