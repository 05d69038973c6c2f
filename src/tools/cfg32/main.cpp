// The administrator's command.

#include <sodium.h>
#include <sys/prctl.h>

#include <clocale>
#include <cstdio>

#include "LDIF_Exception.h"
#include "choice_option.h"
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

/// Help without the rules that tie options together: the descriptions tell them.
class plain_help : public CLI::Formatter {
  public:
    std::string make_option_opts(const CLI::Option* option) const override {
        const std::string type = option->get_type_name();
        return type.empty() ? "" : " " + type;
    }
};

constexpr const char* shared_options = "Options of every command";

void add_shared_options(CLI::App& parser, settings& options) {
    const auto add = [&](const char* names, std::string& value, const char* type,
                         const char* description) {
        return parser.add_option(names, value, description)->type_name(type)->group(shared_options);
    };
    add("-f,--file", options.file, "FILE", "the configuration file; else the server's own");
    const auto dn =
        add("-D,--bind-dn", options.bind_dn, "DN", "bind as the administrator; else anonymously");
    const auto prompt =
        parser
            .add_flag("-W,--ask-password", options.asks_password, "with -D: ask for the password")
            ->group(shared_options);
    const auto file = add("-y,--password-file", options.password_file, "FILE",
                          "with -D: the password is the first line of a file");
    add("--key-file", options.key_file, "FILE", "the key of encoded passwords");
    const auto backup = add("--backup", options.backup_option, "FILE",
                            "where a change puts the file of before; else FILE.bak");
    parser.add_flag("--no-backup", options.has_no_backup, "make no backup")
        ->group(shared_options)
        ->excludes(backup);
    prompt->needs(dn)->excludes(file);
    file->needs(dn);
    add_choice<color_choice>(parser, "--color", options.color,
                             {{"auto", color_choice::automatic},
                              {"always", color_choice::always},
                              {"never", color_choice::never}},
                             "else auto, which respects NO_COLOR")
        ->group(shared_options);
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
        if (!ferror(stdout)) {  // which is told at the end
            complain(e.what());
        }
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
    if (sodium_init() < 0) {
        complain("there is no source of random numbers");
        return failed;
    }
    settings options;
    action chosen;
    CLI::App parser("Reads, checks and changes the configuration file of the directory server.",
                    "cfg32");
    parser.require_subcommand(1);
    parser.set_version_flag("--version", "cfg32 " CFG32_VERSION);
    parser.formatter(std::make_shared<plain_help>());
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
