// The whole run of the command: its options, the command they choose, and how it ends.

#include "command_line.h"

#include <fmt/format.h>
#include <sodium.h>
#include <sys/prctl.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <clocale>
#include <csignal>
#include <cstdio>
#include <iostream>
#include <span>

#include "LDIF_Exception.h"
#include "arguments.h"
#include "command.h"
#include "outcome.h"
#include "terminal.h"

namespace cfg32::tool {

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
    add_argument(parser, "-f,--file", "FILE", "the configuration file; else the server's own",
                 options.file);
    add_argument(parser, "-D,--bind-dn", "DN", "bind as the administrator; else anonymously",
                 options.bind_dn);
    add_flag(parser, "-W,--ask-password", "with -D: ask for the password", options.asks_password);
    add_argument(parser, "-y,--password-file", "FILE",
                 "with -D: the password is the first line of a file", options.password_file);
    add_argument(parser, "--key-file", "FILE", "the key of encoded passwords", options.key_file);
    add_argument(parser, "--backup", "FILE",
                 "where a change puts the file of before; else FILE.bak", options.backup_option);
    add_flag(parser, "--no-backup", "make no backup", options.has_no_backup);
    add_choice(parser, "--color", "else auto, which respects NO_COLOR", options.color,
               {{"auto", color_choice::automatic},
                {"always", color_choice::always},
                {"never", color_choice::never}});
    for (CLI::Option* option : parser.get_options()) {
        if (option != parser.get_help_ptr() && option != parser.get_version_ptr()) {
            option->group(shared_options);
        }
    }
    exclude(parser, "--no-backup", "--backup");
    exclude(parser, "-W", "-y");
    for (const char* password : {"-W", "-y"}) {
        parser.get_option(password)->needs(parser.get_option("-D"));
    }
}

/// The options that go with a command's traits. They are taken before its name as well.
void add_options_of(unsigned traits, CLI::App& parser, settings& options, const char* group) {
    if (traits & changes) {
        parser
            .add_flag("-n,--dry-run", options.is_dry_run,
                      "show the change as a diff and leave the file alone")
            ->group(group);
    }
    if (traits & prints) {
        parser.add_flag("--json", options.is_json, "print JSON")->group(group);
    }
}

/// A command with a parser of its own.
struct parsed_command {
    const command* row;
    CLI::App* parser;
    action carry_out;
};

std::vector<parsed_command> add_commands(CLI::App& parser, settings& options) {
    std::vector<parsed_command> added;
    for (const command& row : commands()) {
        CLI::App* own = parser.add_subcommand(row.name, row.summary)->fallthrough();
        own->footer("`cfg32 --help` lists the options of every command.");
        add_options_of(row.traits, *own, options, "Options");
        added.push_back({&row, own, row.define(*own, options)});
    }
    return added;
}

/// An option that a command takes but has no use for is a mistake.
void require_useful(const settings& options, const command& chosen) {
    const auto require = [&](bool is_given, unsigned trait, const char* option) {
        if (is_given && !(chosen.traits & trait)) {
            throw ended(usage_error, fmt::format("{} takes no {}", chosen.name, option));
        }
    };
    require(!options.bind_dn.empty(), binds, "-D");
    require(options.is_dry_run, changes, "-n");
    require(options.is_json, prints, "--json");
}

/// The parser would take the next word for the value of "--option=".
void require_values(std::span<char* const> arguments) {
    for (const std::string_view argument : arguments) {
        if (argument == "--") {
            return;
        }
        if (argument.starts_with("--") && argument.find('=') == argument.size() - 1) {
            throw ended(usage_error, std::string(argument) + " is empty");
        }
    }
}

int tell_usage_error(const CLI::App& parser, const CLI::ParseError& e) {
    const auto chosen = parser.get_subcommands();
    const std::vector<std::string> unknown = parser.remaining();
    const bool lacks_command = chosen.empty() && e.get_name() == "RequiredError";
    const std::string message = !lacks_command    ? message_of(e)
                                : unknown.empty() ? "no command is given"
                                                  : "no command is called " + unknown.front();
    complain(fmt::format("{}\n  hint: `cfg32 {}--help` tells what there is", message,
                         chosen.empty() ? "" : chosen.front()->get_name() + " "));
    return usage_error;
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

/// Text of another character set than the locale's can't be read: a locale that is not there is
/// worth a word.
void choose_locale() {
    if (!setlocale(LC_ALL, "")) {
        complain(
            "the locale that the environment names is not installed: text is taken for ASCII "
            "(LC_ALL=C.UTF-8 is always there)");
    }
}

}  // namespace

int run_command_line(int argc, char** argv) {
    keep_memory_private();
    signal(SIGXFSZ, SIG_IGN);  // a file that may not grow is a failure like a full disk
    choose_locale();
    if (sodium_init() < 0) {
        complain("there is no source of random numbers");
        return failed;
    }
    settings options;
    CLI::App parser("Reads, checks and changes the configuration file of the directory server.",
                    "cfg32");
    parser.require_subcommand(1);
    parser.set_version_flag("--version", "cfg32 " CFG32_VERSION);
    parser.formatter(std::make_shared<plain_help>());
    add_shared_options(parser, options);
    add_options_of(changes | prints, parser, options, "");
    const std::vector<parsed_command> all = add_commands(parser, options);
    try {
        const std::span<char* const> arguments(argv, static_cast<size_t>(argc));
        require_values(arguments);
        parse(parser, arguments);
    } catch (const CLI::Success& asked_for_help) {
        parser.exit(asked_for_help);
        std::cout.flush();
        return flushed(done);
    } catch (const CLI::ParseError& e) {
        return tell_usage_error(parser, e);
    } catch (const ended& e) {
        complain(e.what());
        return e.status();
    }
    choose_color(options.color);
    const auto chosen = std::find_if(
        all.begin(), all.end(), [](const parsed_command& each) { return each.parser->parsed(); });
    return flushed(run([&] {
        require_useful(options, *chosen->row);
        return chosen->carry_out();
    }));
}

}  // namespace cfg32::tool
