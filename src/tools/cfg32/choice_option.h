#pragma once

#include <CLI/CLI.hpp>
#include <string>
#include <utility>
#include <vector>

namespace cfg32::tool {

/// Adds an option that takes one of some words, each of which stands for a value.
template <class Value>
CLI::Option* add_choice(CLI::App& parser, const std::string& names, Value& chosen,
                        const std::vector<std::pair<std::string, Value>>& words,
                        const std::string& description) {
    const auto choose = [&chosen, words](const std::string& given) {
        for (const auto& [word, value] : words) {
            if (word == given) {
                chosen = value;
            }
        }
    };
    std::vector<std::string> names_of_words;
    std::string shown;
    for (const auto& [word, value] : words) {
        names_of_words.push_back(word);
        shown += (shown.empty() ? "" : "|") + word;
    }
    return parser.add_option_function<std::string>(names, choose, description)
        ->type_name(shown)
        ->check(CLI::IsMember(names_of_words).description(""));
}

}  // namespace cfg32::tool
