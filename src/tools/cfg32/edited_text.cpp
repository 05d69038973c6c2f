// The text that an editor works on.

#include "edited_text.h"

#include <algorithm>
#include <set>
#include <tuple>

#include "entry_text.h"
#include "memory_file.h"

namespace cfg32::tool {

namespace {

/// What stays of a problem when lines above it come and go.
auto identity_of(const problem& each) {
    return std::tuple(each.broken, each.entry, each.attribute);
}

using identities = std::multiset<decltype(identity_of(problem()))>;

identities identities_of(const std::vector<problem>& problems) {
    identities all;
    for (const problem& each : problems) {
        all.insert(identity_of(each));
    }
    return all;
}

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
    identities old = identities_of(find_problems(before_, key));
    const std::vector<problem> all = find_problems(with(draft), key);
    found.is_loadable = can_be_loaded(all);
    const auto lines = static_cast<int>(std::count(draft.begin(), draft.end(), '\n')) + 1;
    for (problem each : all) {
        const auto known = old.find(identity_of(each));
        const bool is_new = known == old.end();
        if (!is_new) {
            old.erase(known);
        }
        const int line = each.line - (first_line_ - 1);
        if (line >= 1 && line <= lines) {
            each.line = line;
            found.in_draft.push_back(std::move(each));
        } else if (is_new || each.outcome() == consequence::stops_load) {
            found.elsewhere.push_back(std::move(each));
        }
    }
    return found;
}

}  // namespace cfg32::tool
