// cfg32 restore: puts a backup back.

#include <fmt/format.h>
#include <sys/stat.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <cstring>

#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "check/check_report.h"
#include "check/problem.h"
#include "command.h"
#include "diff/unified_diff.h"
#include "file_lock.h"
#include "memory_file.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string backup;
    bool is_confirmed = false;
};

bool is_there(const std::string& name) {
    struct stat status;
    return stat(name.c_str(), &status) == 0;
}

bool is_same(const std::string& left, const std::string& right) {
    struct stat left_status;
    struct stat right_status;
    return stat(left.c_str(), &left_status) == 0 && stat(right.c_str(), &right_status) == 0 &&
           is_same_file(left_status, right_status);
}

/// Where the file that is replaced is kept: never in the place of the backup that replaces it.
std::string keeping_place(const settings& options, const std::string& source) {
    if (options.has_no_backup || !options.backup_option.empty()) {
        const std::string place = options.backup_name();
        if (is_same(place, source)) {
            throw ended(usage_error, "what is restored can't be overwritten: " + place);
        }
        return place;
    }
    const std::string place = options.file_name() + ".before-restore";
    return is_same(place, source) ? options.file_name() + ".before-undo" : place;
}

void require_loadable(const std::string& name, const std::string& text, aes_key_data* key) {
    const std::vector<problem> problems = find_problems(text, key);
    if (problems.empty()) {
        return;
    }
    tell(text_report({{name, text, problems}}));
    const bool is_loadable = std::none_of(
        problems.begin(), problems.end(),
        [](const problem& each) { return each.broken->outcome == consequence::stops_load; });
    if (!is_loadable) {
        throw ended(answer_is_no, name + " can't be loaded; nothing was restored");
    }
}

bool is_wanted(const arguments& given) {
    return given.is_confirmed || !is_interactive() || ask("Restore? [y/n]", "yn") == 'y';
}

/// Makes the file anew when it is gone.
void copy_back(const std::string& source, const std::string& name) {
    struct stat status;
    if (stat(source.c_str(), &status) != 0 ||
        !copyFile(source.c_str(), name.c_str(), nullptr, nullptr, status.st_mode)) {
        throw ended(failed,
                    fmt::format("{} can't be copied to {}: {}", source, name, strerror(errno)));
    }
}

int restore(const settings& options, const arguments& given) {
    const std::string name = options.file_name();
    const std::string source = given.backup.empty() ? name + ".bak" : given.backup;
    const std::string keep = keeping_place(options, source);
    const key passwords(options);
    const std::string wanted = read_configuration(source);
    require_loadable(source, wanted, passwords.get());
    const bool is_missing = !is_there(name);
    const std::string present = is_missing ? std::string() : read_configuration(name);
    if (present == wanted) {
        fmt::print("unchanged\n");
        return done;
    }
    fmt::print("{}", unified_diff(present, wanted, name));
    fflush(stdout);
    if (options.is_dry_run) {
        return done;
    }
    if (!is_wanted(given)) {
        return answer_is_no;
    }
    if (is_missing) {
        copy_back(source, name);
    } else {
        LDIF_File::replace(name, keep, wanted, present);
    }
    return done;
}

}  // namespace

action define_restore(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    parser.add_option("backup", given->backup, "the backup; else FILE.bak")->type_name("BACKUP");
    parser.add_flag("--yes", given->is_confirmed, "don't ask at a terminal");
    parser.footer("What is replaced is kept as FILE.before-restore, or where --backup says.");
    return [given, &options] { return restore(options, *given); };
}

}  // namespace cfg32::tool
