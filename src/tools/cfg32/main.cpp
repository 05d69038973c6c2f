// The administrator's command.

#include <fmt/format.h>
#include <sodium.h>
#include <sys/prctl.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <clocale>
#include <cstdio>
#include <iostream>
#include <span>

#include "LDIF_Exception.h"
#include "arguments.h"
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

/// An empty name is an unset variable of a script, and means nothing that should be guessed.
const CLI::Validator not_empty(
    [](const std::string& text) { return text.empty() ? std::string("is empty") : std::string(); },
    "");

constexpr const char* shared_options = "Options of every command";

void add_shared_options(CLI::App& parser, settings& options) {
    const auto add = [&](const char* names, std::string& value, const char* type,
                         const char* description) {
        return parser.add_option(names, value, description)
            ->type_name(type)
            ->check(not_empty)
            ->group(shared_options);
    };
    const auto add_flag = [&](const char* names, bool& value, const char* description) {
        return parser.add_flag(names, value, description)->group(shared_options);
    };
    add("-f,--file", options.file, "FILE", "the configuration file; else the server's own");
    const auto dn =
        add("-D,--bind-dn", options.bind_dn, "DN", "bind as the administrator; else anonymously");
    const auto prompt =
        add_flag("-W,--ask-password", options.asks_password, "with -D: ask for the password");
    const auto file = add("-y,--password-file", options.password_file, "FILE",
                          "with -D: the password is the first line of a file");
    add("--key-file", options.key_file, "FILE", "the key of encoded passwords");
    const auto backup = add("--backup", options.backup_option, "FILE",
                            "where a change puts the file of before; else FILE.bak");
    add_flag("--no-backup", options.has_no_backup, "make no backup")->excludes(backup);
    prompt->needs(dn)->excludes(file);
    file->needs(dn);
    add_choice(parser, "--color", "else auto, which respects NO_COLOR", options.color,
               {{"auto", color_choice::automatic},
                {"always", color_choice::always},
                {"never", color_choice::never}});
    parser.get_option("--color")->group(shared_options);
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
void require_values(std::span<char*> arguments) {
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
    const std::string message = !lacks_command    ? e.what()
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

int main(int argc, char** argv) {
    keep_memory_private();
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
        require_values({argv, static_cast<size_t>(argc)});
        parser.parse(argc, argv);
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
