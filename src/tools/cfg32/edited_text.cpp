// The text that an editor works on.

#include "edited_text.h"

#include <algorithm>
#include <set>
#include <tuple>

#include "entry_text.h"
#include "memory_file.h"

namespace cfg32::tool {

namespace {

/// What stays of a problem, which must outlive it, when lines above it come and go.
auto identity_of(const problem& each) {
    return std::tuple(each.broken, std::string_view(each.attribute),
                      std::string_view(each.entry.str()));
}

using identities = std::multiset<decltype(identity_of(problem()))>;

identities identities_of(const std::vector<problem>& problems) {
    identities all;
    for (const problem& each : problems) {
        all.insert(identity_of(each));
    }
    return all;
}

int lines_of(std::string_view text) {
    return static_cast<int>(std::count(text.begin(), text.end(), '\n'));
}

/// Where lines of the whole text with the draft stand: in the draft, or in the file of before.
struct line_map {
    int first;     // of the part, and of the draft in its place
    int in_part;   // lines
    int in_draft;  // lines

    bool is_in_draft(int line) const { return line >= first && line < first + in_draft; }
    int mapped(int line) const {
        return is_in_draft(line) ? line - first + 1
               : line < first    ? line
                                 : line - in_draft + in_part;
    }
    /// Mends the place that the problem has, and the one that it tells of.
    void apply_to(problem& each) const {
        const std::string told = "line " + std::to_string(each.other_line);
        const size_t place = each.other_line > 0 ? each.text.find(told) : std::string::npos;
        if (place != std::string::npos) {
            const bool is_same = is_in_draft(each.line) == is_in_draft(each.other_line);
            each.other_line = mapped(each.other_line);
            each.text.replace(place, told.size(),
                              "line " + std::to_string(each.other_line) +
                                  (is_same                  ? ""
                                   : is_in_draft(each.line) ? " of the file"
                                                            : " of what you edited"));
        }
        each.line = mapped(each.line);
    }
};

}  // namespace

edited_text::edited_text(const std::string& file_name, const std::string& dn)
    : before_(read_configuration(file_name)), end_(before_.size()) {
    if (!dn.empty()) {
        const entry_text place = find_entry_text(before_, dn);
        begin_ = place.begin;
        end_ = place.end;
        first_line_ = place.first_line;
    }
}

std::string edited_text::with(const std::string& draft) const {
    const std::string rest = before_.substr(end_);
    const bool runs_on = !draft.empty() && draft.back() != '\n' && !rest.empty();
    return before_.substr(0, begin_) + draft + (runs_on ? "\n" : "") + rest;
}

edited_text::findings edited_text::check(const std::string& draft, aes_key_data* key) const {
    findings found{{}, {}, true};
    const std::vector<problem> before = find_problems(before_, key);
    identities old = identities_of(before);
    const std::vector<problem> all = find_problems(with(draft), key);
    found.is_loadable = can_be_loaded(all);
    const bool is_whole_file = end_ - begin_ == before_.size();
    const bool runs_on = !draft.empty() && draft.back() != '\n';
    const line_map lines{first_line_, lines_of(part()),
                         lines_of(draft) + (is_whole_file || runs_on ? 1 : 0)};
    for (problem each : all) {
        const auto known = old.find(identity_of(each));
        const bool is_new = known == old.end();
        if (!is_new) {
            old.erase(known);
        }
        const bool is_in_draft = lines.is_in_draft(each.line);
        lines.apply_to(each);
        if (is_in_draft) {
            found.in_draft.push_back(std::move(each));
        } else if (is_new || each.outcome() == consequence::stops_load) {
            found.elsewhere.push_back(std::move(each));
        }
    }
    return found;
}

}  // namespace cfg32::tool
