#include "LDIF_Search.h"

#include <algorithm>
#include <exception>
#include <ostream>
#include <utility>

#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure no_base{32, 32, "Base entry not found"};

/// The text without its parentheses. A closing one counts only where it is the first and the last.
std::string without_parentheses(std::string text) {
    if (text.starts_with('(')) {
        text.erase(0, 1);
        if (!text.empty() && text.find(')') == text.size() - 1) {
            text.pop_back();
        }
    }
    return text;
}

/// The value with its escapes resolved; a broken escape ends it silently.
std::string unescaped(const std::string& text) {
    std::string value;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            value += text[i];
            continue;
        }
        std::string digits = text.substr(i + 1, 2);
        char byte = '\0';
        if (!is_plain(digits) || !hex2byte(digits, byte)) {
            break;
        }
        value += byte;
        i += 2;
    }
    return value;
}

}  // namespace

LDIF_Filter& LDIF_Filter::operator=(const std::string& text) {
    *this = LDIF_Filter();
    std::string term = text;
    term = without_parentheses(stripLeading(term));
    const size_t equals = term.find('=');
    if (equals == 0) {
        return *this;
    }
    std::string name = term.substr(0, equals);
    if (!stripTrailing(name).empty() || equals != std::string::npos) {
        attribute_ = attribute_name(name);
        start_ = line_start(name);
    }
    if (equals == std::string::npos) {
        return *this;
    }
    std::string value = term.substr(equals + 1);
    stripLeading(stripTrailing(value));
    if (!value.empty() && value != "*") {
        any_value_ = false;
        value_ = unescaped(value);
    }
    return *this;
}

bool LDIF_Filter::match(const LDIF_Entry& entry) const {
    if (const unread_attributes* lines = entry.printed_lines()) {
        return match(*lines);
    }
    const LDIF_Attributes& attributes = entry.attributes();
    const auto attribute = attributes.find(attribute_);
    if (attribute == attributes.end()) {
        return false;
    }
    const LDIF_Values& values = attribute->values();
    if (any_value_ || values.empty()) {
        return any_value_;
    }
    const LDIF_Value& wanted = wanted_value(values.key());
    if (equal_ && values.size() <= LDIF_Values::longest_scan) {
        return std::ranges::any_of(values.texts(),
                                   [&](const kept_text& text) { return is_equal(text, wanted); });
    }
    return values.find(wanted) != values.end();
}

/// The same without reading more of the lines than it takes.
bool LDIF_Filter::match(const unread_attributes& lines) const {
    bool is_found = false;
    if (any_value_) {
        lines.for_each_value_of(start_, [&](auto, auto) { return is_found = true; });
        return is_found;
    }
    lines.for_each_value_of(start_, [&](auto, std::string_view value) {
        const LDIF_Value& wanted = wanted_value(lines.key());
        // A line has no NUL, behind which anything may stand in texts that are equal.
        const bool may_be_equal = !equal_ || value.size() == wanted.text.size();
        return is_found = may_be_equal && is_equal(value, wanted);
    });
    return is_found;
}

bool LDIF_Filter::is_equal(std::string_view value, const LDIF_Value& wanted) const {
    return equal_ ? equal_(value, wanted.text)
                  : LDIF_Value::stored(wanted.attrType, value, wanted.key).compare(wanted) == 0;
}

const LDIF_Value& LDIF_Filter::make_wanted_value(aes_key_data* key) const {
    wanted_.emplace(attribute_.type(), value_.c_str(), key);  // a text ends at its NUL
    equal_ = equal_texts_of(*attribute_.type());
    return *wanted_;
}

LDIF_Search_Results::LDIF_Search_Results(const Scope& scope, const LDIF_Filter& filter,
                                         const LDIF_AttrFilter& attributes, bool attributesOnly)
    : scope_(scope), filter_(filter), attributes_(attributes), attributes_only_(attributesOnly) {}

LDIF_Search_Results& LDIF_Search_Results::addEntry(const LDIF_Entry& entry, const bool& isBase) {
    // Below the base one level is the entry alone.
    const Scope scope = !isBase && scope_ == OneLevel ? Base : scope_;
    found_entries found;
    find_matches(entry, scope, filter_, found);
    for (const LDIF_Entry* match : found) {
        add_match(*match);
    }
    return *this;
}

namespace {

using open_entries = std::vector<std::pair<const LDIF_Entry*, LDIF_Entry::list::const_iterator>>;

/// Throws the failure again, from within each of the entries that were entered. It does not
/// recurse: a tree may be deeper than a stack.
[[noreturn]] void fail_within(open_entries open, std::exception_ptr failure) {
    for (; !open.empty(); open.pop_back()) {
        const LDIF_Entry& entry = *open.back().first;
        try {
            // KEPT: the entry is told by its whole text, not by its DN.
            with_boundary(
                in("LDIF_Search_Results::addEntry()"), [&] { std::rethrow_exception(failure); },
                [&](LDIF_Exception& e) { e.entryDn = shown(entry); });
        } catch (...) {
            failure = std::current_exception();
        }
    }
    std::rethrow_exception(failure);
}

}  // namespace

void cfg32::find_matches(const LDIF_Entry& base, LDIF_Search_Results::Scope scope,
                         const LDIF_Filter& filter, found_entries& found) {
    const bool is_one_level = scope == LDIF_Search_Results::OneLevel;
    found.clear();
    open_entries open;  // from the base down
    const LDIF_Entry* matched = nullptr;
    const auto match = [&](const LDIF_Entry& entry) {
        matched = &entry;
        const bool is_match = filter.match(entry);
        matched = nullptr;
        return is_match;
    };
    try {
        if (match(base) && !is_one_level) {
            found.push_back(&base);
        }
        if (scope != LDIF_Search_Results::Base) {
            open.emplace_back(&base, base.children().begin());
        }
        while (!open.empty()) {
            auto& [parent, next] = open.back();
            if (next == parent->children().end()) {
                open.pop_back();
                continue;
            }
            const LDIF_Entry& entry = *next++;
            if (next != parent->children().end()) {
                // Entries and their texts are far apart: the memory has time to answer.
                __builtin_prefetch(next->unread().text().data());
            }
            if (match(entry)) {
                found.push_back(&entry);
            }
            if (!is_one_level && !entry.children().empty()) {
                open.emplace_back(&entry, entry.children().begin());
            }
        }
    } catch (...) {
        if (matched) {
            open.emplace_back(matched, matched->children().end());
        }
        if (open.empty()) {
            throw;
        }
        fail_within(std::move(open), std::current_exception());
    }
}

void LDIF_Search_Results::add_match(const LDIF_Entry& entry) {
    LDIF_Entry found = entry.header();
    for (const LDIF_Attribute& attribute : entry.attributes()) {
        if (attributes_.empty() || attributes_.contains(attribute.name())) {
            found += attribute;
        }
    }
    entries_.push_back(std::move(found));
}

std::ostream& operator<<(std::ostream& out, const LDIF_Search_Results& results) {
    const size_t count = results.entries().size();
    out << count << " entr" << (count == 1 ? "y" : "ies") << " found.\n";
    for (const LDIF_Entry& entry : results.entries()) {
        out << "\n" << entry.name().text() << ": " << entry.dn() << "\n";
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            const std::string& name = attribute.name().text();
            if (results.attributes_only()) {
                out << name << "\n";
                continue;
            }
            for (const LDIF_Value& value : attribute.values()) {
                out << name << ": " << value << "\n";
            }
        }
    }
    return out;
}

LDIF_Search_Results LDIF_File::search(const LDIF_DN& base, const LDIF_Search_Results::Scope& scope,
                                      const LDIF_Filter& filter, const LDIF_AttrFilter& attributes,
                                      bool attributesOnly) const {
    const auto body = [&] {
        LDIF_Search_Results results(scope, filter, attributes, attributesOnly);
        results += base_entry(dn_path(base));
        return results;
    };
    return with_system_error(in("LDIF_File::search()"), body, no_details);
}

const found_entries& LDIF_File::matches(const dn_path& base,
                                        const LDIF_Search_Results::Scope& scope,
                                        const LDIF_Filter& filter) const {
    const auto body = [&] { find_matches(base_entry(base), scope, filter, found_); };
    with_system_error(in("LDIF_File::search()"), body, no_details);
    return found_;
}

const LDIF_Entry& LDIF_File::base_entry(const dn_path& dn) const {
    const LDIF_Entry* entry = root_.find(dn);
    if (!entry) {
        raise(no_base);
    }
    return *entry;
}
