#pragma once

#include <iosfwd>
#include <list>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "LDIF_Attribute.h"
#include "LDIF_Comment.h"
#include "LDIF_DN.h"
#include "LDIF_Line.h"
#include "cisString.h"
#include "dn_path.h"
#include "unread_attributes.h"

namespace cfg32 {
class child_index;
}

/// An entry and the tree below it. The root of a whole tree is an entry without name and DN; it
/// holds the attributes that stand before the first DN line of the file.
///
/// An entry's place follows from its DN alone. Its relative DN together with those of its ancestors
/// is its DN. No two siblings have equal relative DNs and none is an ancestor of another, so an
/// entry whose parent is missing hangs below its nearest existing ancestor.
class LDIF_Entry {
  public:
    /// In the order they were added. A list: entries stay where they are when siblings go.
    using list = std::list<LDIF_Entry>;

    LDIF_Entry();
    explicit LDIF_Entry(LDIF_DN dn);
    /// From a line of the file, of type dn (80/1000 for another). Throws what parsing a DN throws.
    LDIF_Entry(const LDIF_Line& line, const LDIF_Comment& comment);
    /// The same of the line's name and DN.
    LDIF_Entry(cfg32::attribute_name name, cfg32::kept_dn dn, LDIF_Comment&& comment);
    LDIF_Entry(const LDIF_Entry& other);
    LDIF_Entry(LDIF_Entry&& other) noexcept;
    LDIF_Entry& operator=(const LDIF_Entry& other);
    LDIF_Entry& operator=(LDIF_Entry&& other) noexcept;
    virtual ~LDIF_Entry();

    virtual LDIF_Entry& operator+=(const LDIF_Comment& comment);
    virtual LDIF_Entry& operator+=(const LDIF_Attribute& attribute);
    /// Places a copy of child and its subtree into the tree below this entry, or merges it into
    /// the entry that has its DN already; child's relative DN is made relative to where it went.
    /// Returns the new parent or the entry merged into. Throws 80/1000 when the child's place is
    /// not below this entry; the tree is then unchanged.
    virtual LDIF_Entry& operator+=(LDIF_Entry& child);
    LDIF_Entry& operator+=(LDIF_Attribute&& attribute);
    /// The same without a copy. After a failure the child is what it was.
    LDIF_Entry& operator+=(LDIF_Entry&& child);

    /// The same of the one entry of node, which is taken out of it unless it was merged.
    LDIF_Entry& place(list& node);
    /// The same of an entry whose DN is a full one, if that is plainly written as this entry's with
    /// something before it; null if not. It goes where place() of the tree's root would put it.
    LDIF_Entry* place_below(list& node);

    /// The entry in file form, without its children.
    virtual std::string str() const;
    void append_to(std::string& out) const;

    /// The lines of its file form; while it has unread ones, the lines before those.
    size_t line_count() const;

    /// Empties everything, children included.
    virtual LDIF_Entry& clear();

    /// The entry of that DN, which is relative to this entry's parent (for the root: a full DN), or
    /// null.
    virtual LDIF_Entry* find(const LDIF_DN& dn);
    const LDIF_Entry* find(const LDIF_DN& dn) const;
    const LDIF_Entry* find(const cfg32::dn_path& path) const;

    /// The parent of an entry somewhere below this one; null when it is not there.
    LDIF_Entry* parent_of(const LDIF_Entry& descendant);

    /// Removes a child with everything below it.
    void erase(LDIF_Entry& child);

    bool is_root() const { return name().empty(); }
    const cisString& name() const { return name_.get(); }  ///< of the DN line, as it was written
    LDIF_DN dn() const { return dn_.dn(); }
    const cfg32::kept_dn& named_dn() const { return dn_; }
    LDIF_DN relative_dn() const;
    /// How many RDNs of the DN, from the root side, lead to the parent in the tree; the others are
    /// the relative DN.
    size_t depth() const { return depth_; }
    /// How many RDNs the relative DN has.
    size_t relative_size() const { return dn_.size() - depth_; }
    const LDIF_Comment& comment() const { return comment_; }
    const LDIF_Attributes& attributes() const { return read_attributes(); }
    LDIF_Attributes& attributes() { return read_attributes(); }
    /// Makes these the attributes of an entry that has none.
    void leave_unread(cfg32::unread_attributes&& lines) { unread_ = std::move(lines); }
    const cfg32::unread_attributes& unread() const { return unread_; }
    /// The attribute lines as they are printed, until somebody looks at the attributes; null if
    /// there are none. Lines that are written otherwise are written anew for it.
    const cfg32::unread_attributes* printed_lines() const {
        return unread_.is_canonical() || (!unread_.empty() && print_unread()) ? &unread_ : nullptr;
    }
    const list& children() const { return children_; }

    /// A copy of what names the entry, without comment, attributes and children.
    LDIF_Entry header() const;

  private:
    bool leads_to(const cfg32::dn_path& dn, size_t from) const;
    LDIF_Entry& hang(list& node, const cfg32::dn_path& dn, size_t depth);
    LDIF_Entry& absorb(LDIF_Entry& again);
    void take_descendants_from(LDIF_Entry& parent, const cfg32::dn_path& dn);
    void append(list& node, const cfg32::dn_path& dn);
    void index_children();
    cfg32::child_index* index() const;
    bool ends_with_blank_line() const;
    LDIF_Attributes& read_attributes() const {
        return unread_.empty() ? attributes_ : read_unread();
    }
    LDIF_Attributes& read_unread() const;
    bool print_unread() const;

    // What a search looks at stands together.
    mutable cfg32::unread_attributes unread_;  // then there are no others
    list children_;
    mutable LDIF_Attributes attributes_;
    cfg32::attribute_name name_{""};
    size_t depth_ = 0;
    cfg32::kept_dn dn_;
    LDIF_Comment comment_;
    std::unique_ptr<cfg32::child_index> index_;  // of children_, null when there are none
};

/// Writes the entry and then everything below it, each entry before its children.
std::ostream& operator<<(std::ostream& out, const LDIF_Entry& entry);

namespace cfg32 {

// For reports: the text; of a name that can't be printed what can be, of such an entry "".
std::string shown(const LDIF_DN& dn);
std::string shown(const LDIF_Entry& entry);

/// Calls visit(entry) for the entry and everything below it, each entry before its children. It
/// doesn't recurse: a tree may be deeper than a stack.
template <class Visit>
void for_each_in_preorder(const LDIF_Entry& top, Visit visit) {
    using position = LDIF_Entry::list::const_iterator;
    std::vector<std::pair<position, position>> open;
    const auto enter = [&](const LDIF_Entry& entry) {
        visit(entry);
        open.emplace_back(entry.children().begin(), entry.children().end());
    };
    enter(top);
    while (!open.empty()) {
        if (open.back().first == open.back().second) {
            open.pop_back();
        } else {
            enter(*open.back().first++);
        }
    }
}

}  // namespace cfg32
