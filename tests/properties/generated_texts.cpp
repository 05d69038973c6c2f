#include "generated_texts.h"

#include <algorithm>
#include <stdexcept>

namespace cfg32::tests {

namespace {

/// Takes a character, or what is escaped, from the front of a quoted text.
char take(std::string_view& text) {
    const auto skip = [&](size_t count) { text.remove_prefix(count); };
    char taken = text.at(0);
    skip(1);
    if (taken == '\\') {
        taken = text.at(0);
        skip(1);
        if (taken == 'x') {
            taken = static_cast<char>(std::stoi(std::string(text.substr(0, 2)), nullptr, 16));
            skip(2);
        }
    }
    return taken;
}

}  // namespace

std::vector<std::string> fragments_of(std::string_view dictionary) {
    std::vector<std::string> fragments;
    while (!dictionary.empty()) {
        std::string_view line = dictionary.substr(0, dictionary.find('\n'));
        dictionary.remove_prefix(std::min(line.size() + 1, dictionary.size()));
        if (line.size() < 2 || line.front() != '"' || line.back() != '"') {
            throw std::invalid_argument("no quoted text: " + std::string(line));
        }
        line = line.substr(1, line.size() - 2);
        std::string& fragment = fragments.emplace_back();
        while (!line.empty()) {
            fragment += take(line);
        }
    }
    return fragments;
}

std::string generated_texts::next() { return below(2) == 0 ? of_fragments() : of_given(); }

std::string generated_texts::of_fragments() {
    constexpr size_t most = 30;
    std::string text;
    for (size_t left = below(most); left > 0; --left) {
        text += fragment();
    }
    return text;
}

std::string generated_texts::of_given() {
    constexpr size_t most_changes = 6;
    std::string text = given_[below(given_.size())];
    for (size_t left = below(most_changes); left > 0; --left) {
        change(text);
    }
    return text;
}

void generated_texts::change(std::string& text) {
    constexpr size_t most_erased = 20;
    const size_t place = below(text.size() + 1);
    switch (below(4)) {
        case 0:
            text.insert(place, fragment());
            break;
        case 1:
            text.erase(place, below(most_erased));
            break;
        case 2:  // some of it once more
            text.insert(place, text.substr(below(text.size() + 1), below(most_erased)));
            break;
        default:
            if (place < text.size()) {
                text[place] = static_cast<char>(below(256));
            }
    }
}

}  // namespace cfg32::tests
