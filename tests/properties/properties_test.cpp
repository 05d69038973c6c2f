// What the fuzzers look for, in an ordinary test: the properties hold for the texts of the corpora,
// among them every one that once broke them, and for generated ones. CFG32_SEED makes it others,
// CFG32_ROUNDS more of them.

#include <gmock/gmock.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "environment.h"
#include "generated_texts.h"
#include "property.h"

namespace {

using namespace cfg32;
using namespace cfg32::tests;
namespace fs = std::filesystem;

std::string content_of(const fs::path& file) {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/// A text for a report.
std::string quoted(const std::string& text) {
    std::string out;
    for (const char c : text) {
        const bool is_shown = (c >= ' ' && c <= '~') || c == '\n';
        char code[8];
        snprintf(code, sizeof code, is_shown ? "%c" : "\\x%02x", static_cast<unsigned char>(c));
        out += code;
    }
    return out;
}

struct of_any_text : testing::TestWithParam<fuzz::named_property> {
    const fuzz::named_property& property = GetParam();
    const fs::path fuzz_folder = CFG32_FUZZ_FOLDER;

    std::vector<fs::path> corpus() const {
        const fs::directory_iterator files(fuzz_folder / "corpus" / property.name);
        std::vector<fs::path> all(begin(files), end(files));
        std::sort(all.begin(), all.end());
        return all;
    }

    std::vector<std::string> fragments() const {
        const std::string name = std::string(property.name) + ".dict";
        return fragments_of(content_of(fuzz_folder / "dictionaries" / name));
    }

    void check(const std::string& text) const {
        try {
            property.check(text);
        } catch (const std::exception& e) {
            ADD_FAILURE() << "not so: " << property.promise << "\n"
                          << e.what() << "\nfor:\n"
                          << quoted(text);
        }
    }
};

}  // namespace

TEST_P(of_any_text, HoldsForEveryTextOfTheCorpus) {
    ASSERT_FALSE(corpus().empty());
    for (const fs::path& file : corpus()) {
        SCOPED_TRACE(file);
        check(content_of(file));
    }
}

TEST_P(of_any_text, HoldsForGeneratedTexts) {
    const unsigned long seed = number_from_environment("CFG32_SEED", 53);
    const unsigned long rounds = number_from_environment("CFG32_ROUNDS", 400);
    SCOPED_TRACE("CFG32_SEED=" + std::to_string(seed));
    std::vector<std::string> given;
    for (const fs::path& file : corpus()) {
        given.push_back(content_of(file));
    }
    generated_texts texts(fragments(), given, seed);
    for (unsigned long round = 0; round < rounds && !HasFailure(); ++round) {
        check(texts.next());
    }
}

INSTANTIATE_TEST_SUITE_P(properties, of_any_text, testing::ValuesIn(fuzz::properties),
                         [](const auto& info) { return std::string(info.param.name); });
