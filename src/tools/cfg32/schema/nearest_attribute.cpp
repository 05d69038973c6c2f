// The attribute that a mistyped name means.

#include <algorithm>
#include <cctype>
#include <vector>

#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

/// The names in the order of the table.
constexpr std::string_view names[] = {
#define ATTRIBUTE(name, ...) name,
#include "attributes.def"
#undef ATTRIBUTE
};

/// No name has so many letters, nor one with a third more; a whole line without a colon may.
constexpr size_t longest_given = 100;

std::string lower(std::string_view text) {
    std::string small(text);
    std::transform(small.begin(), small.end(), small.begin(), [](char c) {
        return static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    });
    return small;
}

/// How many letters must be put in, left out, replaced or exchanged with their neighbour.
size_t edit_distance(std::string_view left, std::string_view right) {
    std::vector<std::vector<size_t>> d(left.size() + 1, std::vector<size_t>(right.size() + 1));
    for (size_t i = 0; i <= left.size(); ++i) {
        for (size_t j = 0; j <= right.size(); ++j) {
            if (i == 0 || j == 0) {
                d[i][j] = i + j;
                continue;
            }
            const bool differ = left[i - 1] != right[j - 1];
            d[i][j] = std::min({d[i - 1][j] + 1, d[i][j - 1] + 1, d[i - 1][j - 1] + differ});
            if (i > 1 && j > 1 && left[i - 1] == right[j - 2] && left[i - 2] == right[j - 1]) {
                d[i][j] = std::min(d[i][j], d[i - 2][j - 2] + 1);
            }
        }
    }
    return d[left.size()][right.size()];
}

/// A name without what most names begin with, of which the longest part that is there goes.
std::string_view core_of(std::string_view name) {
    for (const std::string_view beginning : {"oru-slapd", "slapd-", "slapd", "oru-", "nuv-"}) {
        if (name.starts_with(beginning)) {
            return name.substr(beginning.size());
        }
    }
    return name;
}

/// How far a name is from one of the table; a beginning left out is less than a letter. None when
/// more than every third letter that tells names apart is wrong.
std::optional<size_t> farness(std::string_view given, std::string_view known) {
    constexpr size_t letter = 2;
    const size_t whole = edit_distance(given, known);
    const size_t core = edit_distance(core_of(given), core_of(known));
    const size_t bearable = std::max<size_t>(1, core_of(known).size() / 3);
    if (core_of(known).size() < 3 || std::min(whole, core) > bearable) {
        return whole == 0 ? std::optional<size_t>(0) : std::nullopt;
    }
    return std::min(whole * letter, core * letter + 1);
}

}  // namespace

std::optional<std::string> nearest_attribute(std::string_view name) {
    std::optional<std::string> nearest;
    if (name.size() > longest_given) {
        return nearest;
    }
    size_t least = 0;
    for (const std::string_view known : names) {
        const std::optional<size_t> distance = farness(lower(name), lower(known));
        if (distance && (!nearest || *distance < least)) {
            nearest = known;
            least = *distance;
        }
    }
    return nearest;
}

}  // namespace cfg32::tool
