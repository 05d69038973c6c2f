// What may stand at the end of a command line, told from the commands' own parsers.

#include "completion/completion_words.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdlib>
#include <iterator>
#include <string_view>

#include "LDIF_AttrType.h"
#include "cfg32.h"
#include "configuration.h"
#include "memory_file.h"
#include "outcome.h"
#include "schema/attribute_words.h"
#include "settings.h"

namespace cfg32::tool {

namespace {

using option_list = std::vector<const CLI::Option*>;

/// A command line up to the word that is to be completed.
class typed_line {
  public:
    explicit typed_line(const CLI::App& program) : program_(program) {}

    void take(const std::string& word);
    completion_words complete(const std::string& last) const;

  private:
    option_list known_options() const;
    const CLI::Option* option_named(std::string_view name) const;
    const CLI::Option* next_argument() const;
    std::string argument_of_type(std::string_view type) const;
    std::vector<std::string> entry_names() const;
    std::vector<std::string> administrators() const;

    void take_long_option(std::string_view word);
    void take_short_options(std::string_view word);
    void take_argument(const std::string& word);
    void take_value(const CLI::Option* option, std::string_view value);

    std::vector<candidate> commands() const;
    std::vector<candidate> option_names() const;
    completion_words values(const CLI::Option& option) const;
    std::vector<candidate> words_of_attribute() const;

    const CLI::App& program_;
    const CLI::App* command_ = nullptr;    // the one that was typed
    const CLI::Option* valued_ = nullptr;  // the option whose value comes next
    std::vector<std::string> arguments_;   // of the command
    std::string file_;                     // the value of -f
    bool are_options_over_ = false;        // after "--"
};

bool takes_value(const CLI::Option& option) { return option.get_items_expected_max() > 0; }

/// The type as it is named for people: "DN", "FILE".
std::string type_of(const CLI::Option& option) {
    const std::string type = option.get_type_name();
    return type.substr(0, type.find(':'));
}

/// The words of a type such as "table|json".
std::vector<candidate> choices_of(const CLI::Option& option) {
    const std::string type = type_of(option);
    std::vector<candidate> words;
    if (type.find('|') == std::string::npos) {
        return words;
    }
    for (std::string& word : CLI::detail::split(type, '|')) {
        words.push_back({std::move(word), ""});
    }
    return words;
}

std::string with_home(const std::string& file_name) {
    const char* home = getenv("HOME");
    return home && file_name.starts_with("~/") ? home + file_name.substr(1) : file_name;
}

void append_names(std::vector<candidate>& words, const char* dashes,
                  const std::vector<std::string>& names, const std::string& description) {
    for (const std::string& name : names) {
        words.push_back({dashes + name, description});
    }
}

option_list visible_options(const CLI::App& parser) {
    return parser.get_options([](const CLI::Option* option) {
        return !option->get_positional() && !option->get_group().empty();
    });
}

/// The options of the command and those that every command shares.
option_list typed_line::known_options() const {
    option_list shared = visible_options(program_);
    if (!command_) {
        return shared;
    }
    option_list options = visible_options(*command_);
    std::copy_if(shared.begin(), shared.end(), std::back_inserter(options),
                 [&](const CLI::Option* each) { return each != program_.get_help_ptr(); });
    return options;
}

const CLI::Option* typed_line::option_named(std::string_view name) const {
    const option_list options = known_options();
    const auto is_named = [&](const CLI::Option* option) {
        return option->check_name(std::string(name));
    };
    const auto found = std::find_if(options.begin(), options.end(), is_named);
    return found == options.end() ? nullptr : *found;
}

option_list arguments_of(const CLI::App& command) {
    return command.get_options([](const CLI::Option* option) { return option->get_positional(); });
}

/// The argument that comes next; the last one may be there several times.
const CLI::Option* typed_line::next_argument() const {
    size_t taken = arguments_.size();
    for (const CLI::Option* argument : arguments_of(*command_)) {
        const auto most = static_cast<size_t>(argument->get_items_expected_max());
        if (taken < most) {
            return argument;
        }
        taken -= most;
    }
    return nullptr;
}

std::string typed_line::argument_of_type(std::string_view type) const {
    size_t position = 0;
    for (const CLI::Option* argument : arguments_of(*command_)) {
        if (position < arguments_.size() && type_of(*argument) == type) {
            return arguments_[position];
        }
        ++position;
    }
    return {};
}

/// What a file holds, as far as it can be used; nothing when it can't be read.
std::vector<entry> entries_of_file(const std::string& typed_name) try {
    settings options;
    options.file = with_home(typed_name);
    const std::string name = options.file_name();
    const configuration file(options, name, read_without_waiting(name));
    return entries_below(file.root(), CFG_SCOPE_SUBTREE);
} catch (const ended&) {
    return {};
}

/// The DNs of the file that the line names.
std::vector<std::string> typed_line::entry_names() const {
    std::vector<std::string> names;
    for (const entry& each : entries_of_file(file_)) {
        names.push_back(each.dn);
    }
    return names;
}

/// The DNs that the file that the line names lets bind.
std::vector<std::string> typed_line::administrators() const {
    std::vector<std::string> names;
    for (const entry& each : entries_of_file(file_)) {
        for (const attribute& stored : each.attributes) {
            if (cisString(stored.name) == "oru-slapdAdminDN") {
                names.insert(names.end(), stored.values.begin(), stored.values.end());
            }
        }
    }
    return names;
}

void typed_line::take(const std::string& word) {
    if (valued_) {
        return take_value(valued_, word);
    }
    if (are_options_over_ || word.size() < 2 || word.front() != '-') {
        return take_argument(word);
    }
    if (word == "--") {
        are_options_over_ = true;
        return;
    }
    word.starts_with("--") ? take_long_option(word) : take_short_options(word);
}

void typed_line::take_long_option(std::string_view word) {
    const size_t equals = word.find('=');
    const CLI::Option* option = option_named(word.substr(0, equals));
    if (option && equals != std::string_view::npos) {
        take_value(option, word.substr(equals + 1));
    } else if (option && takes_value(*option)) {
        valued_ = option;
    }
}

/// One letter after the other; the rest after one that takes a value is its value.
void typed_line::take_short_options(std::string_view word) {
    for (size_t i = 1; i < word.size(); ++i) {
        const CLI::Option* option = option_named(std::string{'-', word[i]});
        if (option && takes_value(*option)) {
            if (i + 1 < word.size()) {
                take_value(option, word.substr(i + 1));
            } else {
                valued_ = option;
            }
            return;
        }
    }
}

void typed_line::take_argument(const std::string& word) {
    if (command_) {
        arguments_.push_back(word);
    } else {
        const auto is_named = [&](const CLI::App* app) { return app->check_name(word); };
        const auto found = program_.get_subcommands(is_named);
        command_ = found.empty() ? nullptr : found.front();
    }
}

void typed_line::take_value(const CLI::Option* option, std::string_view value) {
    if (option->check_name("--file")) {
        file_ = value;
    }
    valued_ = nullptr;
}

completion_words typed_line::complete(const std::string& last) const {
    if (valued_) {
        return values(*valued_);
    }
    if (!are_options_over_ && last.starts_with('-')) {
        const size_t equals = last.find('=');
        const CLI::Option* option = option_named(last.substr(0, equals));
        if (equals == std::string::npos || !option) {
            return {false, option_names()};
        }
        completion_words found = values(*option);
        for (candidate& word : found.words) {
            word.text.insert(0, last, 0, equals + 1);
        }
        return found;
    }
    if (!command_) {
        return {false, commands()};
    }
    const CLI::Option* argument = next_argument();
    return argument ? values(*argument) : completion_words();
}

std::vector<candidate> typed_line::commands() const {
    std::vector<candidate> words;
    for (const CLI::App* command : program_.get_subcommands({})) {
        words.push_back({command->get_name(), command->get_description()});
    }
    return words;
}

std::vector<candidate> typed_line::option_names() const {
    std::vector<candidate> words;
    for (const CLI::Option* option : known_options()) {
        append_names(words, "--", option->get_lnames(), option->get_description());
        append_names(words, "-", option->get_snames(), option->get_description());
    }
    return words;
}

completion_words typed_line::values(const CLI::Option& option) const {
    const std::string type = type_of(option);
    completion_words found{false, choices_of(option)};
    if (type == "FILE" || type == "BACKUP") {
        found.are_files = true;
    } else if (option.check_name("--bind-dn")) {
        append_names(found.words, "", administrators(), "");
    } else if (type == "DN") {
        append_names(found.words, "", entry_names(), "");
    } else if (type == "ATTR") {
        for (const _AttrType* row : all_attributes()) {
            found.words.push_back({row->name, accepted_values(*row)});
        }
    } else if (type == "VALUE") {
        found.words = words_of_attribute();
    }
    return found;
}

/// The words that the attribute before a value takes.
std::vector<candidate> typed_line::words_of_attribute() const {
    const _AttrType* row = find_attribute(argument_of_type("ATTR"));
    std::vector<candidate> words;
    for (const char* const* word = row ? row->enumValues : nullptr; word && *word; ++word) {
        words.push_back({*word, ""});
    }
    return words;
}

}  // namespace

completion_words complete(const CLI::App& program, const std::vector<std::string>& words) {
    typed_line line(program);
    for (size_t i = 1; i + 1 < words.size(); ++i) {
        line.take(words[i]);
    }
    return words.size() < 2 ? completion_words() : line.complete(words.back());
}

}  // namespace cfg32::tool
