// What two texts have in common.
//
// The comparison proper takes time and memory by the number of lines and of differences, which a
// file of many megabytes whose entries were all sorted anew does not allow. So it is given pieces
// only: the common beginning and end are cut off, the rest is divided at the lines that stand once
// in each text, and of a piece only the lines are compared that both sides have.

#include "diff/matching_lines.h"

#include <algorithm>
#include <dtl/dtl.hpp>
#include <unordered_map>

namespace cfg32::tool {

namespace {

using lines = std::vector<std::string_view>;

/// A piece of both texts, without its end.
struct piece {
    matching_line begin;
    matching_line end;

    bool is_empty() const { return begin.before == end.before || begin.after == end.after; }
};

/// Where both sides have more lines, and none of them divides the piece, nothing is compared.
constexpr size_t most_compared = 2000;

/// How often a line stands on each side of a piece, and where it was last.
struct occurrences {
    int number;  ///< takes the line's place in comparisons
    size_t before_count = 0;
    size_t after_count = 0;
    matching_line last = {};

    bool is_unique() const { return before_count == 1 && after_count == 1; }
    bool is_shared() const { return before_count > 0 && after_count > 0; }
};

using line_index = std::unordered_map<std::string_view, occurrences>;

class comparison {
  public:
    comparison(const lines& before, const lines& after) : before_(before), after_(after) {}

    std::vector<matching_line> run() {
        match({{0, 0}, {before_.size(), after_.size()}}, &comparison::divide);
        return std::move(matches_);
    }

  private:
    using step = void (comparison::*)(const piece&);

    void match(piece rest, step match_middle);
    void divide(const piece& whole);
    void compare(const piece& whole);
    line_index index_of(const piece& whole) const;

    bool is_same(size_t before, size_t after) const { return before_[before] == after_[after]; }

    const lines& before_;
    const lines& after_;
    std::vector<matching_line> matches_;
};

/// Notes what is the same at the beginning and at the end, and has the middle matched.
void comparison::match(piece rest, step match_middle) {
    while (!rest.is_empty() && is_same(rest.begin.before, rest.begin.after)) {
        matches_.push_back(rest.begin);
        ++rest.begin.before;
        ++rest.begin.after;
    }
    piece middle = rest;
    while (!middle.is_empty() && is_same(middle.end.before - 1, middle.end.after - 1)) {
        --middle.end.before;
        --middle.end.after;
    }
    if (!middle.is_empty()) {
        (this->*match_middle)(middle);
    }
    for (matching_line place = middle.end; place.before < rest.end.before;) {
        matches_.push_back(place);
        ++place.before;
        ++place.after;
    }
}

line_index comparison::index_of(const piece& whole) const {
    line_index index;
    const auto at = [&](std::string_view line) -> occurrences& {
        return index.try_emplace(line, occurrences{static_cast<int>(index.size())}).first->second;
    };
    for (size_t i = whole.begin.before; i < whole.end.before; ++i) {
        occurrences& line = at(before_[i]);
        ++line.before_count;
        line.last.before = i;
    }
    for (size_t i = whole.begin.after; i < whole.end.after; ++i) {
        occurrences& line = at(after_[i]);
        ++line.after_count;
        line.last.after = i;
    }
    return index;
}

/// The longest part of the places, which are in the order of one text, that is also in the order of
/// the other (patience sorting).
std::vector<matching_line> in_order(const std::vector<matching_line>& places) {
    constexpr size_t none = ~size_t{0};
    std::vector<size_t> tops;  // of the piles: indices of places
    std::vector<size_t> previous(places.size(), none);
    for (size_t i = 0; i < places.size(); ++i) {
        const auto pile =
            std::lower_bound(tops.begin(), tops.end(), places[i].after,
                             [&](size_t top, size_t after) { return places[top].after < after; });
        previous[i] = pile == tops.begin() ? none : *(pile - 1);
        pile == tops.end() ? tops.push_back(i) : void(*pile = i);
    }
    std::vector<matching_line> found;
    for (size_t i = tops.empty() ? none : tops.back(); i != none; i = previous[i]) {
        found.push_back(places[i]);
    }
    std::reverse(found.begin(), found.end());
    return found;
}

/// Matches the lines that stand once on each side, and what is between them.
void comparison::divide(const piece& whole) {
    const line_index index = index_of(whole);
    std::vector<matching_line> unique;
    for (size_t i = whole.begin.before; i < whole.end.before; ++i) {
        const occurrences& line = index.at(before_[i]);
        if (line.is_unique()) {
            unique.push_back(line.last);
        }
    }
    matching_line begin = whole.begin;
    for (const matching_line& place : in_order(unique)) {
        match({begin, place}, &comparison::compare);
        matches_.push_back(place);
        begin = {place.before + 1, place.after + 1};
    }
    match({begin, whole.end}, &comparison::compare);
}

/// One side of a comparison: the lines that the other side has, too.
struct compared_side {
    std::vector<int> numbers;
    std::vector<size_t> places;

    void add(const occurrences& line, size_t place) {
        if (line.is_shared()) {
            numbers.push_back(line.number);
            places.push_back(place);
        }
    }
};

void comparison::compare(const piece& whole) {
    const line_index index = index_of(whole);
    compared_side before;
    compared_side after;
    for (size_t i = whole.begin.before; i < whole.end.before; ++i) {
        before.add(index.at(before_[i]), i);
    }
    for (size_t i = whole.begin.after; i < whole.end.after; ++i) {
        after.add(index.at(after_[i]), i);
    }
    if (std::min(before.numbers.size(), after.numbers.size()) > most_compared ||
        before.numbers.empty()) {
        return;
    }
    dtl::Diff<int> diff(before.numbers, after.numbers);
    diff.compose();
    size_t from = 0;
    size_t to = 0;
    for (const auto& [line, how] : diff.getSes().getSequence()) {
        if (how.type == dtl::SES_COMMON) {
            matches_.push_back({before.places[from], after.places[to]});
        }
        from += how.type != dtl::SES_ADD ? 1 : 0;
        to += how.type != dtl::SES_DELETE ? 1 : 0;
    }
}

}  // namespace

std::vector<std::string_view> lines_of(std::string_view text) {
    std::vector<std::string_view> found;
    while (!text.empty()) {
        const size_t end = std::min(text.find('\n'), text.size() - 1);
        found.push_back(text.substr(0, end + 1));
        text.remove_prefix(end + 1);
    }
    return found;
}

std::vector<matching_line> matching_lines(const lines& before, const lines& after) {
    return comparison(before, after).run();
}

}  // namespace cfg32::tool
