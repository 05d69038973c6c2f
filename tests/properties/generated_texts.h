#pragma once

#include <random>
#include <string>
#include <string_view>
#include <vector>

namespace cfg32::tests {

/// The fragments of a fuzzer's dictionary: a quoted text in each line, with \\, \" and \xHH in it.
std::vector<std::string> fragments_of(std::string_view dictionary);

/// Texts put together of fragments, and given texts with a few changes. The same seed makes the
/// same texts.
class generated_texts {
  public:
    generated_texts(std::vector<std::string> fragments, std::vector<std::string> given,
                    unsigned long seed)
        : fragments_(std::move(fragments)), given_(std::move(given)), random_(seed) {}

    std::string next();

  private:
    size_t below(size_t count) { return random_() % count; }
    const std::string& fragment() { return fragments_[below(fragments_.size())]; }
    std::string of_fragments();
    std::string of_given();
    void change(std::string& text);

    const std::vector<std::string> fragments_;
    const std::vector<std::string> given_;
    std::mt19937 random_;
};

}  // namespace cfg32::tests
