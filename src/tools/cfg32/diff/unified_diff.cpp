// Printing what differs between two versions of a file.

#include "diff/unified_diff.h"

#include <fmt/format.h>

#include <algorithm>

#include "diff/matching_lines.h"
#include "hidden_passwords.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

constexpr size_t context = 3;

/// Lines of the one text, without the end, that lines of the other take the place of.
struct difference {
    matching_line begin;
    matching_line end;
};

std::vector<difference> differences(const std::vector<matching_line>& matches,
                                    const matching_line& end) {
    std::vector<difference> found;
    matching_line begin = {0, 0};
    const auto end_at = [&](const matching_line& place) {
        if (begin.before < place.before || begin.after < place.after) {
            found.push_back({begin, place});
        }
        begin = {place.before + 1, place.after + 1};
    };
    for (const matching_line& match : matches) {
        end_at(match);
    }
    end_at(end);
    return found;
}

bool begins_with_space(std::string_view line) {
    return line.starts_with(' ') || line.starts_with('\t');
}

/// Comment lines and blank ones are not continued.
bool may_be_continued(std::string_view line) { return line != "\n" && !line.starts_with('#'); }

/// A longer line is not judged again with each line that continues it. Nobody writes such lines by
/// hand, and a write joins them.
constexpr size_t longest_judged = 1024;

/// A line, without its newline, as people may see it: hidden where that is not known. first is the
/// line that it continues.
std::string shown_continuation(std::string_view first, std::string_view line) {
    if (first.size() <= longest_judged) {
        const std::string joined =
            std::string(first.substr(0, first.find('\n'))).append(line.substr(1));
        if (shown_line(joined) == joined) {
            return std::string(line);
        }
    }
    return " " + std::string(hidden_text);
}

/// The lines of a text as people may see them, asked for from the front to the back.
class visible_lines {
  public:
    explicit visible_lines(std::string_view text) : lines_(lines_of(text)) {}

    const std::vector<std::string_view>& as_they_are() const { return lines_; }
    size_t size() const { return lines_.size(); }
    std::string at(size_t number);

  private:
    size_t first_of(size_t number);

    std::vector<std::string_view> lines_;
    size_t last_asked_ = 0;
    size_t first_ = 0;  // of the one that was asked for last
};

/// The line that this one continues, or itself. A long one is not gone back over for each of its
/// lines.
size_t visible_lines::first_of(size_t number) {
    size_t first = number;
    while (first > 0 && first != last_asked_ && begins_with_space(lines_[first]) &&
           may_be_continued(lines_[first - 1])) {
        --first;
    }
    first_ = first == last_asked_ ? first_ : first;
    last_asked_ = number;
    return first_;
}

std::string visible_lines::at(size_t number) {
    std::string_view line = lines_[number];
    const bool is_whole = line.ends_with('\n');
    line.remove_suffix(is_whole ? 1 : 0);
    if (number > 0 && is_password_below(lines_[number - 1], line)) {
        line = hidden_text;
    }
    const size_t first = first_of(number);
    const size_t indent = std::min(line.find_first_not_of(" \t"), line.size());
    const std::string text =
        first < number ? shown_continuation(lines_[first], line)
                       : std::string(line.substr(0, indent)) + shown_line(line.substr(indent));
    return printable(text) + (is_whole ? "\n" : "\n\\ No newline at end of file\n");
}

class printer {
  public:
    printer(const std::string& before, const std::string& after, bool is_for_people)
        : before_(before), after_(after), is_for_people_(is_for_people) {}

    std::string run(const std::string& name);

  private:
    using position = std::vector<difference>::const_iterator;

    std::string in_style(const fmt::text_style& style, const std::string& text) const;
    void append_hunk(position first, position last);
    void append_context(size_t from, size_t to);
    void append_difference(const difference& each);

    visible_lines before_;
    visible_lines after_;
    bool is_for_people_;
    std::string text_;
};

std::string printer::run(const std::string& name) {
    const std::vector<difference> all =
        differences(matching_lines(before_.as_they_are(), after_.as_they_are()),
                    {before_.size(), after_.size()});
    if (all.empty()) {
        return {};
    }
    text_ = in_style(style::place, "--- " + name + "\n");
    text_ += in_style(style::place, "+++ " + name + "\n");
    for (auto first = all.begin(); first != all.end();) {
        auto last = first + 1;
        while (last != all.end() && last->begin.before - (last - 1)->end.before <= 2 * context) {
            ++last;
        }
        append_hunk(first, last);
        first = last;
    }
    return std::move(text_);
}

/// The newline stays outside of the style, as terminals expect it.
std::string printer::in_style(const fmt::text_style& style, const std::string& text) const {
    return is_for_people_ ? styled(stdout, style, text.substr(0, text.size() - 1)) + "\n" : text;
}

/// "begin,count" as a hunk's head has it.
std::string range(size_t begin, size_t end) {
    const size_t count = end - begin;
    return count == 1 ? fmt::format("{}", begin + 1)
                      : fmt::format("{},{}", count == 0 ? begin : begin + 1, count);
}

void printer::append_hunk(position first, position last) {
    const difference& front = *first;
    const difference& back = *(last - 1);
    const size_t lead = std::min(context, front.begin.before);
    const size_t trail = std::min(context, before_.size() - back.end.before);
    text_ +=
        in_style(style::hunk, fmt::format("@@ -{} +{} @@\n",
                                          range(front.begin.before - lead, back.end.before + trail),
                                          range(front.begin.after - lead, back.end.after + trail)));
    append_context(front.begin.before - lead, front.begin.before);
    for (auto each = first; each != last; ++each) {
        append_difference(*each);
        append_context(each->end.before,
                       each + 1 == last ? each->end.before + trail : (each + 1)->begin.before);
    }
}

void printer::append_context(size_t from, size_t to) {
    for (; from < to; ++from) {
        text_ += " " + before_.at(from);
    }
}

void printer::append_difference(const difference& each) {
    for (size_t i = each.begin.before; i < each.end.before; ++i) {
        text_ += in_style(style::removed, "-" + before_.at(i));
    }
    for (size_t i = each.begin.after; i < each.end.after; ++i) {
        text_ += in_style(style::added, "+" + after_.at(i));
    }
}

}  // namespace

std::string unified_diff(const std::string& before, const std::string& after,
                         const std::string& name, bool is_for_people) {
    return printer(before, after, is_for_people).run(name);
}

}  // namespace cfg32::tool
