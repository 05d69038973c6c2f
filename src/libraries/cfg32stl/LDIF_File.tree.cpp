// Drawing the tree of entries as text.

#include <utility>
#include <vector>

#include "LDIF_File.h"

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
    drawing(const drawing_style& style, std::set<LDIF_DN>& undefined, const std::string& prefix)
        : style_(style), undefined_(undefined), prefix_(prefix) {}

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
    void note_missing(const LDIF_Entry& entry);

    const drawing_style& style_;
    std::set<LDIF_DN>& undefined_;
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
        note_missing(entry);
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

/// Notes the ancestors that are missing between the entry and its parent in the tree.
void drawing::note_missing(const LDIF_Entry& entry) {
    LDIF_DN missing = entry.dn();
    for (size_t count = entry.relative_size(); count > 1; --count) {
        missing.remove_leaf();
        undefined_.insert(missing);
    }
}

}  // namespace

std::string IA5_TreeView(const LDIF_Entry& entry, std::set<LDIF_DN>& undefined,
                         const std::string& prefix) {
    return drawing(plain, undefined, prefix).of(entry, false);
}

std::string OEM_TreeView(const LDIF_Entry& entry, bool last, std::set<LDIF_DN>& undefined,
                         const std::string& prefix) {
    return drawing(code_page_437, undefined, prefix).of(entry, last);
}

std::string LDIF_File::treeView(bool oem) const {
    std::set<LDIF_DN> undefined;
    std::string text =
        oem ? OEM_TreeView(root_, true, undefined, {}) : IA5_TreeView(root_, undefined, {});
    if (!undefined.empty()) {
        text += "\n* the following entries are undefined:\n";
    }
    for (const LDIF_DN& dn : undefined) {
        text.append(dn.str()).append("\n");
    }
    return text;
}
