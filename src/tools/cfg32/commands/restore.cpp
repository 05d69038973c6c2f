// cfg32 restore: puts a backup back.

#include <fmt/format.h>
#include <sys/stat.h>
#include <memory>

#include "LDIF_File.h"
#include "arguments.h"
#include "cfg32.h"
#include "check/check_report.h"
#include "check/problem.h"
#include "command.h"
#include "configuration.h"
#include "diff/unified_diff.h"
#include "terminal.h"
#include "whole_file.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string backup;
    bool is_confirmed = false;
};

/// Where the file that is replaced is kept: never in the place of the backup that replaces it.
std::string keeping_place(const settings& options, const std::string& source) {
    if (options.has_no_backup || !options.backup_option.empty()) {
        std::string place = options.backup_name();
        if (is_same(place, source)) {
            throw ended(usage_error, "what is restored can't be overwritten: " + place);
        }
        return place;
    }
    std::string place = options.file_name() + ".before-restore";
    return is_same(place, source) ? options.file_name() + ".before-undo" : place;
}

/// The backup that the last write made. A restore that did not come to its end made one, too.
std::string newest_backup(const settings& options) {
    const std::string name = options.file_name();
    std::string newest = name + ".bak";
    if (is_there(name) && read_configuration(name).starts_with(unfinished_mark)) {
        for (const char* other : {".before-restore", ".before-undo"}) {
            const std::string candidate = name + other;
            newest = is_newer(candidate, newest) ? candidate : newest;
        }
    }
    return newest;
}

void require_loadable(const std::string& name, const std::string& text, aes_key_data* key) {
    const std::vector<problem> problems = find_problems(text, key);
    if (problems.empty()) {
        return;
    }
    tell(text_report({{name, text, problems}}));
    if (!can_be_loaded(problems)) {
        throw ended(answer_is_no, name + " can't be loaded; nothing was restored");
    }
}

/// Overwriting is confirmed by a person or by an option.
void require_confirmation(const arguments& given) {
    if (given.is_confirmed) {
        return;
    }
    if (!can_be_asked()) {
        throw ended(usage_error, "nobody can be asked here: --yes restores");
    }
    if (ask("Restore? [y/n]", "yn") != 'y') {
        throw ended(answer_is_no, "nothing was restored");
    }
}

/// Makes the missing file again; where a link means it, there.
void put_back(const std::string& source, const std::string& name, const std::string& wanted) {
    if (read_configuration(source) != wanted) {
        fail(CFG_BUSY, source + " was changed meanwhile; nothing was restored: try again");
    }
    copy_file(source, target_of(name));
}

int restore(const settings& options, const arguments& given) {
    const std::string name = options.file_name();
    const std::string source = given.backup.empty() ? newest_backup(options) : given.backup;
    const std::string keep = keeping_place(options, source);
    const key passwords(options);
    const std::string wanted = read_configuration(source);
    require_loadable(source, wanted, passwords.get());
    const bool is_missing = !is_there(name);
    const std::string present = is_missing ? std::string() : read_configuration(name);
    require_bind(options, is_missing ? source : name);
    if (present == wanted && !is_missing) {
        fmt::print("unchanged\n");
        return done;
    }
    fmt::print("{}", unified_diff(present, wanted, name));
    if (fflush(stdout) != 0) {
        throw ended(failed, "what would change can't be shown; nothing was restored");
    }
    if (options.is_dry_run) {
        return done;
    }
    require_confirmation(given);
    is_missing ? put_back(source, name, wanted) : replace_file(name, keep, wanted, present);
    return done;
}

}  // namespace

action define_restore(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_argument(parser, "backup", "BACKUP", "the backup; else FILE.bak", given->backup);
    add_flag(parser, "--yes", "don't ask", given->is_confirmed);
    add_footer(parser, "What is replaced is kept as FILE.before-restore, or where --backup says.");
    return [given, &options] { return restore(options, *given); };
}

}  // namespace cfg32::tool
