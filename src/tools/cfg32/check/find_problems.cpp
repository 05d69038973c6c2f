// Every problem of a text: of what stands there, and of what a load sees of its last line.

#include <algorithm>
#include <iterator>
#include <map>
#include <unordered_map>

#include "LDIF_Line.h"
#include "check/file_text.h"
#include "check/findings.h"
#include "check/problem_finder.h"
#include "check/shown_lines.h"
#include "hidden_passwords.h"
#include "line_source.h"

namespace cfg32::tool {

namespace {

/// A text whose last line has no newline. The line may have been cut off, so a load does without
/// its value: what a load does follows from the text as it is, but what is wrong with the line is
/// told of the value that stands there.
class cut_off_text {
  public:
    cut_off_text(std::string_view text, aes_key_data* key)
        : file_(text),
          written_(std::string(text) + "\n"),
          line_(file_.beginning_of(file_.line_count())),
          loaded_(problem_finder(text, key).run()),
          meant_(problem_finder(written_, key).run()) {}

    std::vector<problem> problems();

  private:
    bool is_at_end(const problem& each) const { return each.line >= line_; }
    LDIF_Line cut_off_line() const;
    void take_what_is_loaded();
    problem missing_newline(const LDIF_Line& line) const;

    const file_text file_;
    const std::string written_;
    const int line_;  // where the last logical line begins
    std::vector<problem> loaded_;
    std::vector<problem> meant_;
    std::multimap<const rule*, const problem*> rest_;  // of the loaded ones at the end
};

std::vector<problem> cut_off_text::problems() {
    const LDIF_Line line = cut_off_line();
    const bool has_value = line.type == LDIF_Line::attr || line.type == LDIF_Line::dn;
    if (!has_value || line.value.empty()) {
        return loaded_;
    }
    std::erase_if(meant_, [&](const problem& each) { return !is_at_end(each); });
    take_what_is_loaded();
    meant_.push_back(missing_newline(line));
    std::erase_if(loaded_, [&](const problem& each) { return is_at_end(each); });
    std::move(meant_.begin(), meant_.end(), std::back_inserter(loaded_));
    sort_by_place(loaded_);
    return std::move(loaded_);
}

/// The last line as it is written.
LDIF_Line cut_off_text::cut_off_line() const {
    const std::string_view all = file_.readable();
    const auto begin = static_cast<size_t>(file_.line(line_).data() - file_.text().data());
    const std::string text = std::string(all.substr(begin)) + "\n";
    cfg32::line_source source(text);
    LDIF_Line line;
    line.next(source, 0);
    return line;
}

/// A load may see the same in what is left of the line. Each of its problems is taken once.
void cut_off_text::take_what_is_loaded() {
    for (const problem& each : loaded_) {
        if (is_at_end(each)) {
            rest_.emplace(each.broken, &each);
        }
    }
    for (problem& each : meant_) {
        const auto same = rest_.lower_bound(each.broken);
        if (same == rest_.end() || same->first != each.broken) {
            each.own_outcome = consequence::none;
            each.result = each.extended = 0;
            each.first_left_out = each.last_left_out = 0;
            continue;
        }
        each.first_left_out = same->second->first_left_out;
        each.last_left_out = same->second->last_left_out;
        rest_.erase(same);
    }
}

/// What a load finds wrong with the rest of the line is the missing newline's fault.
problem cut_off_text::missing_newline(const LDIF_Line& line) const {
    const int last = file_.line_count();
    findings made;
    problem& found =
        made.add(kind::missing_final_newline, {last, count_characters(file_.line(last)) + 1, 1},
                 "last line has no newline at its end: its value is not used");
    found.attribute = line.type == LDIF_Line::attr ? shown_line(line.attribute) : "";
    for (const auto& [broken, each] : rest_) {
        found.own_outcome = std::max(found.outcome(), each->outcome());
        found.result = std::max(found.result, each->result);
        found.first_left_out = std::max(found.first_left_out, each->first_left_out);
        found.last_left_out = std::max(found.last_left_out, each->last_left_out);
    }
    shown_lines(file_).hide_length(found);
    return found;
}

std::vector<problem> problems_of_lines(std::string_view text, aes_key_data* key) {
    const bool is_cut_off = !text.empty() && text.back() != '\n';
    std::vector<problem> problems =
        is_cut_off ? cut_off_text(text, key).problems() : problem_finder(text, key).run();
    std::unordered_map<const std::string*, shared_text> entries;  // by where the written ones stand
    for (problem& each : problems) {
        each.text = shown_text(each.text);
        const auto [shown, is_new] = entries.try_emplace(&each.entry.str());
        if (is_new) {
            shown->second = shared_text(shown_text(each.entry.str()));
        }
        each.entry = shown->second;
    }
    return problems;
}

}  // namespace

/// Behind byte order marks everything is judged as if they were not there.
std::vector<problem> find_problems(std::string_view text, aes_key_data* key) {
    const int width = count_characters(byte_order_mark);
    int begin = 1;  // the column behind the marks
    findings marks;
    for (; text.starts_with(byte_order_mark); begin += width) {
        marks
            .add(kind::byte_order_mark, {1, begin, width},
                 "byte order mark, which becomes part of the first name: remove it")
            .accepted = "UTF-8 without a byte order mark";
        text.remove_prefix(byte_order_mark.size());
    }
    std::vector<problem> problems = problems_of_lines(text, key);
    for (problem& each : problems) {
        each.column += each.line == 1 ? begin - 1 : 0;
    }
    problems.insert(problems.begin(), std::move_iterator(marks.all().begin()),
                    std::move_iterator(marks.all().end()));
    return problems;
}

}  // namespace cfg32::tool
