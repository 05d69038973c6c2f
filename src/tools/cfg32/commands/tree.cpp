// cfg32 tree: draws the tree of entries.

#include <fmt/format.h>

#include <algorithm>
#include <array>
#include <nlohmann/json.hpp>
#include <set>

#include "LDIF_File.h"
#include "choice_option.h"
#include "command.h"
#include "configuration.h"
#include "json_text.h"

namespace cfg32::tool {

namespace {

enum drawing_style { unicode, ascii, cp437 };

struct arguments {
    drawing_style style = unicode;
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

std::string lines_in_unicode(std::string_view drawing) {
    std::string text;
    while (!drawing.empty()) {
        const size_t end = std::min(drawing.find('\n'), drawing.size() - 1) + 1;
        text += in_unicode(drawing.substr(0, end));
        drawing.remove_prefix(end);
    }
    return text;
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

/// The drawing, and below it the DNs of the entries that are missing: what is marked with "*"
/// hangs below them.
std::string drawing_of(const LDIF_Entry& tree, drawing_style style) {
    std::set<LDIF_DN> missing;
    std::string text =
        style == ascii ? IA5_TreeView(tree, missing, {}) : OEM_TreeView(tree, true, missing, {});
    text.erase(0, text.starts_with('\n') ? 1 : 0);
    if (style == unicode) {
        text = lines_in_unicode(text);
    }
    if (!missing.empty()) {
        text += "\n* the following entries are undefined:\n";
    }
    for (const LDIF_DN& dn : missing) {
        text += dn.str() + "\n";
    }
    return text;
}

/// The DNs between an entry and the one it hangs below, the nearest to the entry first.
json missing_ancestors(const LDIF_Entry& node) {
    json list = json::array();
    LDIF_DN dn = node.dn();
    const size_t count = node.relative_dn().rdns().size();
    // Above a suffix nothing is missing.
    const bool is_suffix = count == dn.rdns().size();
    for (size_t i = 1; i < count && !is_suffix; ++i) {
        dn.remove_leaf();
        list.push_back(utf8(dn.str()));
    }
    return list;
}

void print_as_json(const configuration& file, const LDIF_Entry& tree) {
    json list = json::array();
    for_each_in_preorder(tree, [&](const LDIF_Entry& node) {
        if (!node.is_root()) {
            list.push_back({{"dn", utf8(node.dn().str())},
                            {"depth", node.dn().rdns().size()},
                            {"missingAncestors", missing_ancestors(node)}});
        }
    });
    print_json({{"file", utf8(file.name())},
                {"entries", std::move(list)},
                {"leftOut", json_of(file.left_out())}});
}

int tree(const settings& options, const arguments& given) {
    const configuration file(options);
    const LDIF_Entry drawn =
        tree_from(given.base.empty() ? file.root() : file.entry_at(given.base));
    if (options.is_json) {
        print_as_json(file, drawn);
    } else {
        fmt::print("{}", drawing_of(drawn, given.style));
    }
    return done;
}

}  // namespace

action define_tree(CLI::App& parser, settings& options) {
    const auto given = std::make_shared<arguments>();
    add_choice<drawing_style>(parser, "--style", given->style,
                              {{"unicode", unicode}, {"ascii", ascii}, {"cp437", cp437}},
                              "the characters to draw with; else unicode");
    parser.add_option("base", given->base, "the entry to begin at; else all")->type_name("DN");
    return [given, &options] { return tree(options, *given); };
}

}  // namespace cfg32::tool
