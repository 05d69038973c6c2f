// The administrator's command.

#include <sys/prctl.h>

#include <CLI/CLI.hpp>
#include <clocale>
#include <cstdio>

#include "LDIF_Exception.h"
#include "command.h"
#include "outcome.h"
#include "terminal.h"

using namespace cfg32::tool;

namespace {

/// No core dump shows a password, and no other process looks into this one.
void keep_memory_private() {
#ifndef __SANITIZE_ADDRESS__  // the leak check at the end is such a look
    prctl(PR_SET_DUMPABLE, 0);
#endif
}

void add_shared_options(CLI::App& parser, settings& options) {
    const auto group = parser.add_option_group("Options of every command");
    group->add_option("-f,--file", options.file, "the configuration file; else the server's own")
        ->type_name("FILE");
    const auto dn = group->add_option("-D,--bind-dn", options.bind_dn,
                                      "bind as this administrator; else anonymously");
    const auto prompt = group->add_flag("-W,--ask-password", options.asks_password,
                                        "ask for the administrator's password");
    const auto file = group->add_option("-y,--password-file", options.password_file,
                                        "read that password from the first line of a file");
    group->add_option("--key-file", options.key_file, "the key of encoded passwords")
        ->type_name("FILE");
    const auto backup = group
                            ->add_option("--backup", options.backup_option,
                                         "where a change puts the file of before; else FILE.bak")
                            ->type_name("FILE");
    group->add_flag("--no-backup", options.has_no_backup, "make no backup")->excludes(backup);
    dn->type_name("DN");
    file->type_name("FILE");
    prompt->needs(dn)->excludes(file);
    file->needs(dn);
    const std::map<std::string, color_choice> choices = {{"auto", color_choice::automatic},
                                                         {"always", color_choice::always},
                                                         {"never", color_choice::never}};
    group->add_option("--color", options.color, "auto, always or never; NO_COLOR is respected")
        ->type_name("WHEN")
        ->transform(CLI::Transformer(choices));
}

/// Runs a command; tells what ends it.
int run(const action& carry_out) {
    try {
        return carry_out();
    } catch (const ended& end) {
        complain(end.what());
        return end.status();
    } catch (const LDIF_Exception& e) {
        complain(report(e));
    } catch (const std::exception& e) {
        complain(e.what());
    }
    return failed;
}

/// A result that did not arrive is none.
int flushed(int status) {
    if (fflush(stdout) == 0 && !ferror(stdout)) {
        return status;
    }
    complain("standard output can't be written");
    return failed;
}

}  // namespace

int main(int argc, char** argv) {
    keep_memory_private();
    setlocale(LC_ALL, "");
    settings options;
    action chosen;
    CLI::App parser("Reads, checks and changes the configuration file of the directory server.",
                    "cfg32");
    parser.require_subcommand(1);
    parser.set_version_flag("--version", "cfg32 " CFG32_VERSION);
    add_shared_options(parser, options);
    for (const command& row : commands()) {
        CLI::App* sub = parser.add_subcommand(row.name, row.summary)->fallthrough();
        const action carry_out = row.define(*sub, options);
        sub->callback([&chosen, carry_out] { chosen = carry_out; });
    }
    try {
        parser.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        return parser.exit(e) == 0 ? done : usage_error;
    }
    choose_color(options.color);
    return flushed(run(chosen));
}
