// How the commands describe their arguments and options to the parser.

#include "arguments.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace cfg32::tool {

namespace {

template <class Value>
void add(CLI::App& parser, const char* names, const char* type, const char* description,
         Value& value, presence needed) {
    parser.add_option(names, value, description)
        ->type_name(type)
        ->required(needed == presence::required);
}

std::string joined(const std::vector<std::string>& words) {
    std::string text;
    for (const std::string& word : words) {
        text += (text.empty() ? "" : "|") + word;
    }
    return text;
}

}  // namespace

void add_argument(CLI::App& parser, const char* names, const char* type, const char* description,
                  std::string& value, presence needed) {
    add(parser, names, type, description, value, needed);
}

void add_argument(CLI::App& parser, const char* names, const char* type, const char* description,
                  std::vector<std::string>& values, presence needed) {
    add(parser, names, type, description, values, needed);
}

void add_flag(CLI::App& parser, const char* names, const char* description, bool& value) {
    CLI::Option* option = parser.add_flag(names, value, description);
    if (*description == '\0') {
        option->group("");
    }
}

void add_words(CLI::App& parser, const char* names, const char* description,
               const std::vector<std::string>& words, std::function<void(size_t)> choose,
               presence needed) {
    const auto choose_word = [words, choose = std::move(choose)](const std::string& given) {
        choose(std::find(words.begin(), words.end(), given) - words.begin());
    };
    parser.add_option_function<std::string>(names, choose_word, description)
        ->type_name(joined(words))
        ->check(CLI::IsMember(words).description(""))
        ->required(needed == presence::required);
}

void exclude(CLI::App& parser, const char* name, const char* other_name) {
    parser.get_option(name)->excludes(parser.get_option(other_name));
}

void make_json_short(CLI::App& parser) {
    parser.get_option("--json")->description("the same as --format json");
    exclude(parser, "--json", "--format");
}

void add_footer(CLI::App& parser, const std::string& line) {
    parser.footer(line + "\n" + parser.get_footer());
}

void add_attribute_of_entry(CLI::App& parser, attribute_of_entry& given) {
    add_argument(parser, "dn", "DN", "the entry", given.dn, presence::required);
    add_argument(parser, "attribute", "ATTR", "its attribute", given.attribute, presence::required);
}

const CLI::App& program_of(const CLI::App& command) { return *command.get_parent(); }

}  // namespace cfg32::tool
