// cfg32 diff: tells what differs between two files.

#include <fmt/format.h>
#include <memory>

#include <nlohmann/json.hpp>

#include "arguments.h"
#include "command.h"
#include "configuration.h"
#include "diff/difference.h"
#include "hidden_passwords.h"
#include "json_text.h"
#include "ldif_writer.h"
#include "terminal.h"

namespace cfg32::tool {

namespace {

enum diff_format { as_ldif, as_text, as_json };

struct arguments {
    std::string from;
    std::string to;
    diff_format format = as_ldif;
};

/// A password in a change record is as safe as it is stored.
bool is_readable_password(const modification& change) {
    for (const std::string& value : change.values) {
        if (shown_value(change.attribute, value) != value) {
            return true;
        }
    }
    return false;
}

void print_ldif(const std::vector<change_record>& records) {
    bool has_readable_password = false;
    for (const change_record& record : records) {
        fmt::print("{}", ldif(record));
        for (const modification& change : record.modifications) {
            has_readable_password = has_readable_password || is_readable_password(change);
        }
    }
    if (has_readable_password) {
        complain(
            "masked passwords, which anybody can decode, are in this output: guard it like the "
            "file");
    }
}

void note_unspeakable(const std::vector<entry_difference>& found) {
    const std::string name = unspeakable_name(found);
    if (!name.empty()) {
        complain("these changes do not lead to the other file: as a name in LDIF, \"" + name +
                 "\" would be taken for another, or not at all");
    }
}

struct kind_of_change {
    char mark;
    const char* word;
    const fmt::text_style* style;
};

const kind_of_change& kind_of(entry_difference::kind change) {
    static const fmt::text_style plain;
    static const kind_of_change kinds[] = {
        {'+', "added", &style::added}, {'-', "removed", &style::removed}, {' ', "changed", &plain}};
    return kinds[change];
}

void print_values(char mark, const fmt::text_style& look, const std::string& name,
                  const std::vector<std::string>& values) {
    for (const std::string& value : shown_values(name, values)) {
        const std::string line = fmt::format("{}   {}: {}", mark, name, value);
        fmt::print("{}\n", styled(stdout, look, printable(line)));
    }
}

void print_text(const std::vector<entry_difference>& found) {
    for (const entry_difference& each : found) {
        const kind_of_change& kind = kind_of(each.change);
        const std::string dn = each.entry->is_root()
                                   ? "above all entries"
                                   : printable(shown_text(each.entry->dn().str()));
        fmt::print("{}\n", styled(stdout, *kind.style, fmt::format("{} {}", kind.mark, dn)));
        for (const attribute_difference& attribute : each.attributes) {
            print_values('-', style::removed, attribute.name, attribute.removed);
            print_values('+', style::added, attribute.name, attribute.added);
        }
    }
}

json json_of(const std::string& name, const std::vector<std::string>& values) {
    json list = json::array();
    for (const std::string& value : shown_values(name, values)) {
        list.push_back(utf8(value));
    }
    return list;
}

void print_as_json(const arguments& given, const std::vector<entry_difference>& found) {
    json entries = json::array();
    for (const entry_difference& each : found) {
        json attributes = json::array();
        for (const attribute_difference& attribute : each.attributes) {
            attributes.push_back({{"name", utf8(attribute.name)},
                                  {"removed", json_of(attribute.name, attribute.removed)},
                                  {"added", json_of(attribute.name, attribute.added)}});
        }
        entries.push_back({{"dn", utf8(shown_text(each.entry->dn().str()))},
                           {"change", kind_of(each.change).word},
                           {"attributes", std::move(attributes)}});
    }
    print_json({{"from", utf8(given.from)}, {"to", utf8(given.to)}, {"entries", entries}});
}

int diff(const settings& options, const arguments& given) {
    const configuration from(options, given.from);
    const configuration to(options, given.to);
    const progress comparing("Comparing");
    const std::vector<entry_difference> found = differences(from.root(), to.root());
    if (options.is_json || given.format == as_json) {
        print_as_json(given, found);
    } else if (given.format == as_text) {
        print_text(found);
    } else {
        print_ldif(changes_between(from.root(), to.root()));
        note_unspeakable(found);
    }
    return found.empty() ? done : answer_is_no;
}

}  // namespace

action define_diff(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_argument(parser, "from", "FILE", "the file of before", given->from, presence::required);
    add_argument(parser, "to", "FILE", "the file of after", given->to, presence::required);
    add_format(parser, "changes that `cfg32 modify` takes, lines to read, or JSON; else ldif",
               given->format, {{"ldif", as_ldif}, {"text", as_text}, {"json", as_json}});
    return [given, &options] { return diff(options, *given); };
}

}  // namespace cfg32::tool
