// cfg32 search: prints entries.

#include <fmt/format.h>
#include <memory>

#include <algorithm>

#include "arguments.h"
#include "cfg32.h"
#include "command.h"
#include "configuration.h"
#include "json_text.h"
#include "ldif_writer.h"
#include "schema/attribute_words.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

struct arguments {
    std::string base = "cn=Configuration";
    int scope = CFG_SCOPE_SUBTREE;
    std::string filter;
    std::vector<std::string> attributes;
    bool is_not_wrapped = false;
};

/// In a list of wanted attributes (RFC 4511, 4.5.1.8). Its other one, 1.1, is the name of none.
constexpr const char* every_attribute = "*";

bool is_wanted(const arguments& given, const attribute& found) {
    const auto means = [&](const std::string& name) {
        return name == every_attribute || cisString(name) == found.name;
    };
    return given.attributes.empty() ||
           std::any_of(given.attributes.begin(), given.attributes.end(), means);
}

/// A first word that can't be a filter is the first of the attributes.
void tell_filter_from_attribute(arguments& given) {
    if (!given.filter.empty() && given.filter.find_first_of("=(") == std::string::npos) {
        given.attributes.insert(given.attributes.begin(), std::exchange(given.filter, {}));
    }
}

[[noreturn]] void refuse_filter(const std::string& filter) {
    throw ended(usage_error,
                filter + " is no filter: it is one term, attribute=value or attribute=*");
}

/// What the library's filters can't say would be taken for something else: it finds nothing, or
/// everything.
void require_simple(const std::string& filter) {
    std::string_view term = filter;
    if (term.starts_with('(') != term.ends_with(')')) {
        refuse_filter(filter);
    }
    if (term.starts_with('(')) {
        term = term.substr(1, term.size() - 2);
    }
    const std::string_view name = term.substr(0, term.find('='));
    const std::string_view value = term.substr(std::min(name.size() + 1, term.size()));
    const bool has_pattern = value != "*" && value.find('*') != std::string_view::npos;
    if (name.empty() || name.find_first_of("()&|!<>~*") != std::string_view::npos || has_pattern ||
        value.starts_with('(')) {
        refuse_filter(filter);
    }
}

/// A name that the table does not have may be mistyped.
void note_unknown(const std::string& name) {
    const auto meant = find_attribute(name) ? std::nullopt : nearest_attribute(name);
    if (meant) {
        complain(fmt::format("the server knows no attribute {}; did you mean {}?", name, *meant));
    }
}

void note_unknown_names(const arguments& given) {
    const std::string& filter = given.filter;
    if (!filter.empty()) {
        const size_t begin = filter.starts_with('(') ? 1 : 0;
        note_unknown(filter.substr(begin, filter.find_first_of("=)") - begin));
    }
    for (const std::string& name : given.attributes) {
        note_unknown(name);
    }
}

/// Without a filter every entry is meant, also one without an objectclass.
std::vector<entry> found_entries(const configuration& file, const arguments& given) {
    std::vector<entry> entries = given.filter.empty()
                                     ? entries_below(file.entry_at(given.base), given.scope)
                                     : file.search(given.base, given.scope, given.filter);
    for (entry& found : entries) {
        std::erase_if(found.attributes,
                      [&](const attribute& each) { return !is_wanted(given, each); });
    }
    return entries;
}

int search(const settings& options, const arguments& given) {
    const configuration file(options);
    const std::vector<entry> entries = found_entries(file, given);
    if (options.is_json) {
        print_entries(entries, file);
    } else {
        for (const entry& found : entries) {
            fmt::print("{}", ldif(found, !given.is_not_wrapped));
        }
    }
    return entries.empty() ? answer_is_no : done;
}

}  // namespace

action define_search(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_argument(parser, "-b,--base", "DN", "where to begin; else cn=Configuration", given->base);
    add_choice(parser, "-s,--scope",
               "that entry, those directly below it, or all from it on; else sub", given->scope,
               {{"base", CFG_SCOPE_BASE}, {"one", CFG_SCOPE_ONELEVEL}, {"sub", CFG_SCOPE_SUBTREE}});
    add_flag(parser, "--no-wrap", "don't fold long lines", given->is_not_wrapped);
    add_argument(parser, "filter", "FILTER",
                 "attribute=value, or attribute=* for any value; else every entry", given->filter);
    add_argument(parser, "attributes", "ATTR", "the attributes to print; else all",
                 given->attributes);
    return [given, &options] {
        tell_filter_from_attribute(*given);
        if (!given->filter.empty()) {
            require_simple(given->filter);
        }
        note_unknown_names(*given);
        return search(options, *given);
    };
}

}  // namespace cfg32::tool
