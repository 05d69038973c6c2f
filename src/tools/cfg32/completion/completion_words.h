#pragma once

// What may stand at the end of a command line, told from the commands' own parsers.

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace cfg32::tool {

struct candidate {
    std::string text;
    std::string description;  ///< or empty
};

/// What completes a word: the candidates, or the names of files, which shells know best.
struct completion_words {
    bool are_files = false;
    std::vector<candidate> words;
};

/// What may take the place of the last of the words, of which the first is the program. Candidates
/// need not begin with what is typed of it already.
completion_words complete(const CLI::App& program, const std::vector<std::string>& words);

}  // namespace cfg32::tool
