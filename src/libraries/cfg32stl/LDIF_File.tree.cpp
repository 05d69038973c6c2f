// Drawing the tree of entries as text.

#include <utility>
#include <vector>

#include "LDIF_File.h"
#include "tree_drawing.h"

using cfg32::drawing_characters;
using cfg32::missing_entries;

namespace {

/// What a drawing is made of.
struct drawing_style {
    const char* corner;   ///< before the last child of an entry
    const char* tee;      ///< before every other
    const char* suffix;   ///< before an entry directly below the root
    const char* bar;      ///< what a child adds to the prefix when more follow
    const char* blank;    ///< what the last one adds
    const char* between;  ///< after the prefix, on a line of its own before each child
};

constexpr drawing_style plain = {"+- ", "+- ", "- ", "    |", "     ", "    |\n"};
// Corner, tee, horizontal and vertical line of code page 437, as single bytes.
constexpr drawing_style code_page_437 = {"\xC0\xC4 ", "\xC3\xC4 ", "\xC4 ",
                                         "    \xB3",  "     ",     nullptr};

/// Draws an entry and everything below it. It does not recurse: a tree may be deeper than a stack.
class drawing {
  public:
    drawing(const drawing_style& style, missing_entries& missing, const std::string& prefix)
        : style_(style), missing_(missing), prefix_(prefix) {}

    std::string of(const LDIF_Entry& top, bool is_last);

  private:
    /// An entry some of whose children are drawn.
    struct level {
        const LDIF_Entry* entry;
        LDIF_Entry::list::const_iterator next;
        size_t prefix;  ///< length of the prefix of its own line
    };

    void draw(const LDIF_Entry& entry, bool is_last);
    void draw_next_child();

    const drawing_style& style_;
    missing_entries& missing_;
    std::string prefix_;
    std::string text_;
    std::vector<level> open_;
};

std::string drawing::of(const LDIF_Entry& top, bool is_last) {
    draw(top, is_last);
    while (!open_.empty()) {
        prefix_.resize(open_.back().prefix);
        if (open_.back().next == open_.back().entry->children().end()) {
            open_.pop_back();
        } else {
            draw_next_child();
        }
    }
    return std::move(text_);
}

/// Draws the entry's own line. prefix_ is its prefix.
void drawing::draw(const LDIF_Entry& entry, bool is_last) {
    open_.push_back({&entry, entry.children().begin(), prefix_.size()});
    if (entry.is_root()) {
        return;
    }
    if (prefix_.empty()) {
        text_.append(style_.suffix).append(entry.relative_dn().str()).append(" (suffix)\n");
        return;
    }
    text_.append(prefix_, 0, prefix_.size() - 1);
    text_.append(is_last ? style_.corner : style_.tee).append(entry.relative_dn().str());
    if (entry.relative_size() > 1) {
        text_ += " *";
        missing_.add_above(entry);
    }
    text_ += '\n';
}

void drawing::draw_next_child() {
    const LDIF_Entry& parent = *open_.back().entry;
    const LDIF_Entry& child = *open_.back().next++;
    if (parent.is_root()) {
        text_ += '\n';
        return draw(child, false);
    }
    if (style_.between) {
        text_.append(prefix_).append(style_.between);
    }
    const bool is_last = open_.back().next == parent.children().end();
    prefix_ += is_last ? style_.blank : style_.bar;
    draw(child, is_last);
}

}  // namespace

std::string cfg32::tree_drawing(drawing_characters characters, const LDIF_Entry& top, bool is_last,
                                missing_entries& missing, const std::string& prefix) {
    const bool is_ascii = characters == drawing_characters::ascii;
    return drawing(is_ascii ? plain : code_page_437, missing, prefix).of(top, is_last);
}

namespace {

/// The same, with what is missing in a set of the caller's.
std::string drawn(drawing_characters characters, const LDIF_Entry& entry, bool is_last,
                  std::set<LDIF_DN>& undefined, const std::string& prefix) {
    missing_entries missing;
    std::string text = cfg32::tree_drawing(characters, entry, is_last, missing, prefix);
    missing.copy_to(undefined);
    return text;
}

}  // namespace

std::string IA5_TreeView(const LDIF_Entry& entry, std::set<LDIF_DN>& undefined,
                         const std::string& prefix) {
    return drawn(drawing_characters::ascii, entry, false, undefined, prefix);
}

std::string OEM_TreeView(const LDIF_Entry& entry, bool last, std::set<LDIF_DN>& undefined,
                         const std::string& prefix) {
    return drawn(drawing_characters::code_page_437, entry, last, undefined, prefix);
}

std::string LDIF_File::treeView(bool oem) const {
    missing_entries missing;
    const drawing_characters characters =
        oem ? drawing_characters::code_page_437 : drawing_characters::ascii;
    std::string text = cfg32::tree_drawing(characters, root_, true, missing, {});
    if (!missing.empty()) {
        text += "\n* the following entries are undefined:\n";
    }
    missing.for_each([&](const std::string& dn) { text.append(dn).append("\n"); });
    return text;
}
