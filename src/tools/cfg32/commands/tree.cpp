// cfg32 tree: draws the tree of entries.

#include <fmt/format.h>
#include <langinfo.h>
#include <memory>

#include <algorithm>
#include <array>
#include <nlohmann/json.hpp>
#include <vector>

#include "LDIF_File.h"
#include "arguments.h"
#include "command.h"
#include "configuration.h"
#include "hidden_passwords.h"
#include "json_text.h"
#include "terminal.h"
#include "tree_drawing.h"

namespace cfg32::tool {

namespace {

enum drawing_style { unicode, ascii, cp437 };

/// Line-drawing characters where the locale has them.
drawing_style default_style() {
    return std::string_view(nl_langinfo(CODESET)) == "UTF-8" ? unicode : ascii;
}

struct arguments {
    drawing_style style = default_style();
    std::string base;
};

/// What stands for the line-drawing bytes of code page 437 in Unicode, as UTF-8.
struct glyph {
    char byte;
    const char* text;
};
constexpr std::array glyphs = {glyph{'\xC0', "└"}, glyph{'\xC3', "├"}, glyph{'\xC4', "─"},
                               glyph{'\xB3', "│"}, glyph{' ', " "}};

/// A line of a drawing with the glyphs at its front in Unicode; what follows is a name.
std::string in_unicode(std::string_view line) {
    std::string text;
    while (!line.empty()) {
        const auto found = std::find_if(glyphs.begin(), glyphs.end(), [&](const glyph& each) {
            return each.byte == line.front();
        });
        if (found == glyphs.end()) {
            break;
        }
        text += found->text;
        line.remove_prefix(1);
    }
    return text.append(line);
}

/// A tree with an entry and everything below it, without attributes.
LDIF_Entry tree_from(const LDIF_Entry& base) {
    LDIF_Entry tree;
    for_each_in_preorder(base, [&](const LDIF_Entry& each) {
        if (!each.is_root()) {
            tree += LDIF_Entry(each.dn());
        }
    });
    return tree;
}

/// What is missing above an entry. Above a suffix nothing is.
missing_entries missing_above(const LDIF_Entry& entry) {
    missing_entries missing;
    if (entry.depth() > 0) {
        missing.add_above(entry);
    }
    return missing;
}

/// The first line of a drawing that begins at an entry: it is no suffix, but ancestors of it may be
/// missing.
void mark_base(std::string& drawing, const LDIF_Entry& base, missing_entries& missing) {
    constexpr std::string_view suffix = " (suffix)";
    missing.add_above(base);
    drawing.replace(drawing.find('\n') - suffix.size(), suffix.size(),
                    base.relative_size() > 1 ? " *" : "");
}

void print_text(std::string_view text) { fmt::print("{}", printable(shown_text(text))); }

/// Prints the drawing, and below it the DNs of the entries that are missing: what is marked with
/// "*" hangs below them. Of one entry there may be thousands, each almost as long as its DN, so
/// they are never held together.
void print_drawing(const LDIF_Entry& base, drawing_style style) {
    const LDIF_Entry tree = tree_from(base);
    missing_entries missing;
    const drawing_characters characters =
        style == ascii ? drawing_characters::ascii : drawing_characters::code_page_437;
    std::string text = tree_drawing(characters, tree, true, missing, {});
    text.erase(0, text.starts_with('\n') ? 1 : 0);
    if (!base.is_root() && base.depth() > 0) {
        mark_base(text, base, missing);
    }
    for (std::string_view rest = text; !rest.empty();) {
        const size_t end = std::min(rest.find('\n'), rest.size() - 1) + 1;
        const std::string_view line = rest.substr(0, end);
        print_text(style == unicode ? in_unicode(line) : std::string(line));
        rest.remove_prefix(end);
    }
    if (!missing.empty()) {
        print_text("\n* the following entries are undefined:\n");
    }
    missing.for_each([](const std::string& dn) { print_text(dn + "\n"); });
}

void print_as_json(const configuration& file, const LDIF_Entry& base) {
    json list = json::array();
    std::vector<size_t> above;  // how many RDNs lead to each entry that is drawn above this one
    for_each_in_preorder(base, [&](const LDIF_Entry& node) {
        if (node.is_root()) {
            return;
        }
        while (!above.empty() && above.back() > node.depth()) {
            above.pop_back();
        }
        json missing = json::array();
        missing_above(node).for_each(
            [&](const std::string& dn) { missing.push_back(utf8(shown_text(dn))); });
        list.push_back({{"dn", utf8(shown_text(node.dn().str()))},
                        {"depth", above.size()},
                        {"missingAncestors", std::move(missing)}});
        above.push_back(node.named_dn().size());
    });
    print_objects(std::move(list), file);
}

int tree(const settings& options, const arguments& given) {
    const configuration file(options);
    const LDIF_Entry& base = given.base.empty() ? file.root() : file.entry_at(given.base);
    if (options.is_json) {
        print_as_json(file, base);
    } else {
        print_drawing(base, given.style);
    }
    return done;
}

}  // namespace

action define_tree(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_choice(parser, "--style", "the characters to draw with; else what the locale has",
               given->style, {{"unicode", unicode}, {"ascii", ascii}, {"cp437", cp437}});
    add_argument(parser, "base", "DN", "the entry to begin at; else all", given->base);
    return [given, &options] { return tree(options, *given); };
}

}  // namespace cfg32::tool
