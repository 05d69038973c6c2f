// The attribute that a mistyped name means.

#include <algorithm>
#include <array>
#include <bit>
#include <iterator>
#include <limits>
#include <numeric>
#include <unordered_map>
#include <vector>

#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

/// No name has so many letters, nor one with a third more; a whole line without a colon may.
constexpr size_t longest_given = 100;

constexpr size_t too_far = std::numeric_limits<size_t>::max() / 4;

std::string lower(std::string_view text) {
    std::string small(text);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c | 0x20) : c; });
    return small;
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

/// A text in lower case, and a bit for each letter that it has.
struct letters {
    explicit letters(std::string_view given) : text(given) {
        for (const char c : text) {
            set |= uint64_t{1} << (static_cast<unsigned char>(c) % 64);
        }
    }

    std::string_view text;
    uint64_t set = 0;
};

/// A name as it is compared.
struct compared_name {
    explicit compared_name(std::string_view name)
        : small(lower(name)), whole(small), core(core_of(small)) {}
    compared_name(const compared_name&) = delete;  // its parts point into it
    compared_name& operator=(const compared_name&) = delete;

    std::string small;
    letters whole;
    letters core;
};

struct known_name {
    explicit known_name(std::string_view given) : name(given), compared(given) {}

    std::string_view name;
    compared_name compared;
};

/// The names in the order of the table.
const auto& known_names() {
    static const known_name names[] = {
#define ATTRIBUTE(name, ...) known_name(name),
#include "attributes.def"
#undef ATTRIBUTE
    };
    return names;
}

/// Of that many edits none adds or takes away more than one kind of letter.
bool may_be_within(const letters& left, const letters& right, size_t bound) {
    const size_t more = std::max(left.text.size(), right.text.size()) -
                        std::min(left.text.size(), right.text.size());
    const auto missing = static_cast<size_t>(std::popcount(left.set & ~right.set));
    const auto added = static_cast<size_t>(std::popcount(right.set & ~left.set));
    return more <= bound && missing <= bound && added <= bound;
}

/// How many letters must be put in, left out, replaced or exchanged with their neighbour; too_far
/// for more than the bound. Only what lies that near to the diagonal is looked at.
size_t edit_distance(const letters& left_letters, const letters& right_letters, size_t bound) {
    const std::string_view left = left_letters.text;
    const std::string_view right = right_letters.text;
    if (!may_be_within(left_letters, right_letters, bound)) {
        return too_far;
    }
    using row = std::array<size_t, 2 * longest_given>;
    row first, second, third;
    row *before = &first, *last = &second, *next = &third;  // in turn
    // The cells beside those that are looked at are too far.
    const auto end_of = [&](size_t i) { return std::min(right.size(), i + bound); };
    std::iota(last->begin(), last->begin() + end_of(0) + 1, 0);
    (*last)[end_of(0) + 1] = too_far;
    for (size_t i = 1; i <= left.size(); ++i) {
        const size_t start = i > bound ? i - bound : 1;
        const size_t end = end_of(i);
        (*next)[start - 1] = start == 1 ? i : too_far;
        (*next)[end + 1] = too_far;
        size_t least = (*next)[start - 1];
        for (size_t j = start; j <= end; ++j) {
            const bool differ = left[i - 1] != right[j - 1];
            size_t cell = std::min({(*last)[j] + 1, (*next)[j - 1] + 1, (*last)[j - 1] + differ});
            if (i > 1 && j > 1 && left[i - 1] == right[j - 2] && left[i - 2] == right[j - 1]) {
                cell = std::min(cell, (*before)[j - 2] + 1);
            }
            (*next)[j] = cell;
            least = std::min(least, cell);
        }
        if (least > bound) {
            return too_far;
        }
        std::swap(before, last);
        std::swap(last, next);
    }
    return (*last)[right.size()] > bound ? too_far : (*last)[right.size()];
}

/// How far a name is from one of the table; a beginning left out is less than a letter. None when
/// more than every third letter that tells names apart is wrong.
std::optional<size_t> farness(const compared_name& given, const compared_name& known) {
    constexpr size_t letter = 2;
    if (known.core.text.size() < 3) {
        return given.small == known.small ? std::optional<size_t>(0) : std::nullopt;
    }
    const size_t bearable = std::max<size_t>(1, known.core.text.size() / 3);
    const size_t whole = edit_distance(given.whole, known.whole, bearable);
    const size_t core = edit_distance(given.core, known.core, bearable);
    const size_t distance = std::min(whole * letter, core * letter + 1);
    return distance < too_far ? std::optional(distance) : std::nullopt;
}

std::vector<std::string_view> all_near(std::string_view name) {
    std::vector<std::string_view> near;
    const compared_name given(name);
    size_t least = too_far;
    for (const known_name& known : known_names()) {
        const std::optional<size_t> distance = farness(given, known.compared);
        if (distance) {
            near.insert(*distance < least ? near.begin() : near.end(), known.name);
            least = std::min(least, *distance);
        }
    }
    return near;
}

}  // namespace

/// The same few names are asked for again and again.
std::vector<std::string_view> near_attributes(std::string_view name) {
    constexpr size_t most_answers = 256;
    thread_local std::unordered_map<std::string, std::vector<std::string_view>> answers;
    if (name.size() > longest_given) {
        return {};
    }
    const std::string key(name);
    if (const auto known = answers.find(key); known != answers.end()) {
        return known->second;
    }
    if (answers.size() == most_answers) {
        answers.clear();
    }
    return answers.emplace(key, all_near(name)).first->second;
}

std::optional<std::string> nearest_attribute(std::string_view name) {
    const std::vector<std::string_view> near = near_attributes(name);
    return near.empty() ? std::nullopt : std::optional<std::string>(near.front());
}

}  // namespace cfg32::tool
