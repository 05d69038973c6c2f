#pragma once

#include <cstddef>
#include <string_view>
#include <vector>

namespace cfg32::tool {

/// A line that two texts have in common: its place in each.
struct matching_line {
    size_t before;
    size_t after;
};

/// The lines of a text, each with its newline.
std::vector<std::string_view> lines_of(std::string_view text);

/// Lines that two texts have in common, in the order of both: as many as can be found in time that
/// does not explode, whatever the texts are.
std::vector<matching_line> matching_lines(const std::vector<std::string_view>& before,
                                          const std::vector<std::string_view>& after);

}  // namespace cfg32::tool
