// How the commands describe their arguments and options to the parser.

#include "arguments.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace cfg32::tool {

namespace {

/// What goes before a word that the parser shall not look into: it takes one in brackets for a
/// list, and one behind "--" for an option all the same, if an argument went before the "--".
constexpr char guard = '\x1';

const CLI::Validator without_guard(
    [](std::string& word) {
        word.erase(0, word.starts_with(guard) ? 1 : 0);
        return std::string();
    },
    "");

const CLI::Validator not_empty(
    [](const std::string& word) { return std::string(word.empty() ? "is empty" : ""); }, "");

/// assign(words) takes what is given.
template <class Assign>
CLI::Option* add(CLI::App& parser, const char* names, const char* type, const char* description,
                 presence needed, Assign assign) {
    const auto take = [assign](CLI::results_t words) {
        assign(std::move(words));
        return true;
    };
    return parser.add_option(names, take, description)
        ->type_name(type)
        ->required(needed == presence::required)
        ->transform(without_guard);
}

CLI::Option* add_all(CLI::App& parser, const char* names, const char* type, const char* description,
                     std::vector<std::string>& values, presence needed) {
    return add(parser, names, type, description, needed,
               [&values](CLI::results_t&& words) { values = std::move(words); })
        ->expected(1, CLI::detail::expected_max_vector_size)
        ->allow_extra_args();
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
    add(parser, names, type, description, needed, [&value](CLI::results_t&& words) {
        value = std::move(words.front());
    })->check(not_empty);
}

void add_argument(CLI::App& parser, const char* names, const char* type, const char* description,
                  std::vector<std::string>& values, presence needed) {
    add_all(parser, names, type, description, values, needed)->check(not_empty);
}

void add_values(CLI::App& parser, const char* description, std::vector<std::string>& values,
                presence needed) {
    add_all(parser, "value", "VALUE", description, values, needed);
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
    add(parser, names, joined(words).c_str(), description, needed,
        [words, choose = std::move(choose)](const CLI::results_t& given) {
            const auto chosen = std::find(words.begin(), words.end(), given.front());
            choose(static_cast<size_t>(chosen - words.begin()));
        })
        ->check(CLI::IsMember(words).description(""));
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

void parse(CLI::App& parser, std::span<char* const> arguments) {
    std::vector<std::string> words;
    bool is_behind_mark = false;
    for (std::string word : arguments.subspan(1)) {
        if (!is_behind_mark && word == "--") {
            is_behind_mark = true;
            continue;
        }
        if (is_behind_mark || word.starts_with('[') || word.starts_with(guard)) {
            word.insert(word.begin(), guard);
        }
        words.push_back(std::move(word));
    }
    std::reverse(words.begin(), words.end());  // as the parser wants them
    parser.parse(std::move(words));
}

std::string message_of(const CLI::ParseError& e) {
    std::string message = e.what();
    std::erase(message, guard);
    return message;
}

const CLI::App& program_of(const CLI::App& command) { return *command.get_parent(); }

}  // namespace cfg32::tool
