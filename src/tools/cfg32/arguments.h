#pragma once

// How the commands describe their arguments and options to the parser. Its header takes longer to
// compile than all that a command does: few files include it.

#include <functional>
#include <span>
#include <string>
#include <utility>
#include <vector>

namespace CLI {
class App;
class ParseError;
}  // namespace CLI

namespace cfg32::tool {

enum class presence { optional, required };

/// Adds an argument ("dn") or an option with a value ("-b,--base"). The type is what stands for the
/// value in the help. An empty one is a usage error: it comes from a variable of a script that is
/// not set, and means nothing that should be guessed.
void add_argument(CLI::App& parser, const char* names, const char* type, const char* description,
                  std::string& value, presence needed = presence::optional);
/// The same for all the arguments that follow.
void add_argument(CLI::App& parser, const char* names, const char* type, const char* description,
                  std::vector<std::string>& values, presence needed = presence::optional);

/// Adds an attribute's values: all the arguments that follow, also empty ones.
void add_values(CLI::App& parser, const char* description, std::vector<std::string>& values,
                presence needed = presence::optional);

/// Adds an option without a value. One without a description is not in the help.
void add_flag(CLI::App& parser, const char* names, const char* description, bool& value);

/// Adds an argument or option that takes one of some words, and calls the function with the number
/// of the one that is given.
void add_words(CLI::App& parser, const char* names, const char* description,
               const std::vector<std::string>& words, std::function<void(size_t)> choose,
               presence needed = presence::optional);

/// Words that stand for values.
template <class Value>
using choices = std::vector<std::pair<std::string, Value>>;

/// Adds an argument or option that takes one of these words.
template <class Value>
void add_choice(CLI::App& parser, const char* names, const char* description, Value& chosen,
                const choices<Value>& offered, presence needed = presence::optional) {
    std::vector<std::string> words;
    std::vector<Value> values;
    for (const auto& [word, value] : offered) {
        words.push_back(word);
        values.push_back(value);
    }
    add_words(
        parser, names, description, words,
        [&chosen, values](size_t number) { chosen = values[number]; }, needed);
}

/// Takes the one only without the other.
void exclude(CLI::App& parser, const char* name, const char* other_name);

/// Makes --json short for --format json.
void make_json_short(CLI::App& parser);

/// Adds --format to a command that prints JSON as one of its formats.
template <class Value>
void add_format(CLI::App& parser, const char* description, Value& chosen,
                const choices<Value>& offered) {
    add_choice(parser, "--format", description, chosen, offered);
    make_json_short(parser);
}

/// Adds a line to the end of the command's help.
void add_footer(CLI::App& parser, const std::string& line);

/// An attribute of an entry, which several commands work on.
struct attribute_of_entry {
    std::string dn;
    std::string attribute;
};

/// Adds the arguments that name it.
void add_attribute_of_entry(CLI::App& parser, attribute_of_entry& given);

/// Parses the program's arguments, each as it is. Throws CLI::ParseError.
void parse(CLI::App& parser, std::span<char* const> arguments);

/// What the error says, with the words as they were given.
std::string message_of(const CLI::ParseError& e);

/// The parser of the whole command line, of which the given one is a command's.
const CLI::App& program_of(const CLI::App& command);

}  // namespace cfg32::tool
