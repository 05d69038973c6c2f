#include "LDIF_Entry.h"

#include <algorithm>
#include <ostream>

#include "child_index.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure illegal_line{80, 1000, "Illegal constructor LDIF_Entry( LDIF_Line::"};
constexpr failure not_a_child{80, 1000, "["};

/// The line's DN, if the line is one.
kept_dn dn_of(const LDIF_Line& line) {
    if (line.type != LDIF_Line::dn) {
        raise(illegal_line, std::string(line_type_name(line.type)) + " );");
    }
    return kept_dn(given_text(line.value));
}

}  // namespace

LDIF_Entry::LDIF_Entry() = default;
LDIF_Entry::LDIF_Entry(LDIF_Entry&&) noexcept = default;

LDIF_Entry::LDIF_Entry(LDIF_DN dn) : name_("dn"), dn_(std::move(dn)) {}

LDIF_Entry::LDIF_Entry(attribute_name name, kept_dn dn, LDIF_Comment&& comment)
    : name_(std::move(name)), dn_(std::move(dn)), comment_(std::move(comment)) {}

LDIF_Entry::LDIF_Entry(const LDIF_Line& line, const LDIF_Comment& comment)
    : name_(line.attribute), dn_(dn_of(line)), comment_(comment) {}

LDIF_Entry::LDIF_Entry(const LDIF_Entry& other)
    : children_(other.children_),
      attributes_(other.attributes()),
      name_(other.name_),
      depth_(other.depth_),
      dn_(other.dn_),
      comment_(other.comment_) {
    index_children();
}

LDIF_Entry& LDIF_Entry::operator=(const LDIF_Entry& other) {
    LDIF_Entry copy(other);
    return *this = std::move(copy);
}

LDIF_Entry& LDIF_Entry::operator=(LDIF_Entry&& other) noexcept = default;

LDIF_Entry::~LDIF_Entry() {
    // The children's children are taken out of them first, so that no destructor recurses down a
    // deep tree.
    while (!children_.empty()) {
        children_.splice(children_.end(), children_.front().children_);
        children_.pop_front();
    }
}

LDIF_Entry& LDIF_Entry::operator+=(const LDIF_Comment& comment) {
    comment_ += comment;
    return *this;
}

LDIF_Entry& LDIF_Entry::operator+=(const LDIF_Attribute& attribute) {
    attributes() += attribute;
    return *this;
}

LDIF_Entry& LDIF_Entry::operator+=(LDIF_Attribute&& attribute) {
    attributes() += std::move(attribute);
    return *this;
}

LDIF_Entry& LDIF_Entry::operator+=(LDIF_Entry& child) {
    list node(1, child);
    LDIF_Entry& received = place(node);
    child.depth_ = (node.empty() ? received.children_.back() : node.front()).depth_;
    return received;
}

LDIF_Entry& LDIF_Entry::operator+=(LDIF_Entry&& child) {
    list node;
    node.push_back(std::move(child));
    try {
        return place(node);
    } catch (...) {
        child = std::move(node.front());
        throw;
    }
}

/// Places the one entry of node, whose relative DN is relative to this entry's parent.
LDIF_Entry& LDIF_Entry::place(list& node) {
    LDIF_Entry& child = node.front();
    const dn_path dn(child.dn_);
    if (!leads_to(dn, child.depth_)) {
        raise(not_a_child,
              child.relative_dn().str() + "] is not child of [" + relative_dn().str() + "]");
    }
    return child.relative_size() == relative_size()
               ? absorb(child)
               : hang(node, dn, child.depth_ + relative_size());
}

LDIF_Entry* LDIF_Entry::place_below(list& node) {
    const kept_dn& dn = node.front().dn_;
    return dn.ends_with(dn_) ? &hang(node, dn_path(dn), dn_.size()) : nullptr;
}

/// True when the relative DN stands in the other DN from that RDN on.
bool LDIF_Entry::leads_to(const dn_path& dn, size_t from) const {
    return relative_size() == 0 || dn_path(dn_).has_equal_part(depth_, dn, from, relative_size());
}

/// Hangs the entry of node, whose DN is dn, below this one, to which the first depth RDNs lead.
LDIF_Entry& LDIF_Entry::hang(list& node, const dn_path& dn, size_t depth) {
    LDIF_Entry& child = node.front();
    LDIF_Entry* parent = this;
    while (const child_index* index = parent->index()) {
        LDIF_Entry* next = index->equal_or_ancestor(dn, depth);
        if (!next) {
            break;
        }
        if (depth + next->relative_size() == dn.size()) {
            child.depth_ = depth;
            return next->absorb(child);
        }
        depth += next->relative_size();
        parent = next;
    }
    child.depth_ = depth;
    child.take_descendants_from(*parent, dn);
    parent->append(node, dn);
    return *parent;
}

/// Merges an entry of the same DN into this one.
LDIF_Entry& LDIF_Entry::absorb(LDIF_Entry& again) {
    comment_ += again.comment_;
    attributes() += again.attributes();
    again.index_.reset();
    while (!again.children_.empty()) {
        list node;
        node.splice(node.end(), again.children_, again.children_.begin());
        hang(node, dn_path(node.front().dn_), node.front().depth_);
    }
    return *this;
}

/// Takes over the parent's children that belong below this entry, which is to be their sibling.
void LDIF_Entry::take_descendants_from(LDIF_Entry& parent, const dn_path& dn) {
    child_index* index = parent.index();
    if (!index) {
        return;
    }
    const std::vector<list::iterator> descendants = index->descendants(*this, dn);
    if (children_.empty() && !descendants.empty()) {
        index_ = index->split(*this, dn, descendants);
        for (const list::iterator descendant : descendants) {
            descendant->depth_ += relative_size();
            children_.splice(children_.end(), parent.children_, descendant);
        }
        return;
    }
    for (const list::iterator descendant : descendants) {
        list node;
        index->erase(descendant);
        node.splice(node.end(), parent.children_, descendant);
        hang(node, dn_path(descendant->dn_), descendant->depth_ + relative_size());
    }
}

/// Appends the entry of node to the children.
void LDIF_Entry::append(list& node, const dn_path& dn) {
    if (!index()) {
        index_ = std::make_unique<child_index>();
    }
    index_->insert(node.begin(), dn);
    children_.splice(children_.end(), node);
}

void LDIF_Entry::index_children() {
    auto index = children_.empty() ? nullptr : std::make_unique<child_index>();
    for (auto child = children_.begin(); child != children_.end(); ++child) {
        // cppcheck-suppress iterators1  ; the index is one of that list
        index->insert(child, dn_path(child->dn_));
    }
    index_ = std::move(index);
}

/// The index of the children, made anew where the locale asks for it.
child_index* LDIF_Entry::index() const {
    if (index_ && !index_->is_good()) {
        const_cast<LDIF_Entry*>(this)->index_children();
    }
    return index_.get();
}

std::string LDIF_Entry::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Entry::append_to(std::string& out) const {
    comment_.append_to(out);
    if (!is_root()) {
        dn_.append_to(out.append(name().text()).append(": "));
        out += '\n';
    }
    if (const unread_attributes* lines = printed_lines()) {
        out += lines->text();
    } else {
        attributes().append_to(out);
    }
    if (ends_with_blank_line()) {
        out += '\n';
    }
}

size_t LDIF_Entry::line_count() const {
    size_t count = comment_.line_count() + (is_root() ? 0 : 1);
    if (printed_lines()) {
        return count;
    }
    for (const LDIF_Attribute& attribute : attributes()) {
        count += attribute.comment().line_count() + attribute.values().size();
    }
    return count + (ends_with_blank_line() ? 1 : 0);
}

/// An entry does; the root only where the first entry does not bring a blank line itself.
bool LDIF_Entry::ends_with_blank_line() const {
    return !is_root() ||
           (!children_.empty() && !children_.front().comment_.begins_with_blank_line());
}

LDIF_Attributes& LDIF_Entry::read_unread() const {
    attributes_ = unread_.read();
    unread_ = {};
    return attributes_;
}

/// Most entries are searched and printed again and again, and never changed: lines are shorter than
/// what is read of them, and stand together.
bool LDIF_Entry::print_unread() const {
    LDIF_Attributes attributes = unread_.read();
    unread_ = unread_.printed(attributes);
    if (unread_.empty()) {
        attributes_ = std::move(attributes);
    }
    return !unread_.empty();
}

LDIF_Entry& LDIF_Entry::clear() { return *this = LDIF_Entry(); }

LDIF_Entry* LDIF_Entry::find(const LDIF_DN& dn) {
    return const_cast<LDIF_Entry*>(std::as_const(*this).find(dn));
}

const LDIF_Entry* LDIF_Entry::find(const LDIF_DN& dn) const { return find(dn_path(dn)); }

const LDIF_Entry* LDIF_Entry::find(const dn_path& path) const {
    if (!leads_to(path, 0)) {
        return nullptr;
    }
    const LDIF_Entry* entry = this;
    size_t depth = relative_size();
    while (entry && depth < path.size()) {
        const child_index* index = entry->index();
        entry = index ? index->equal_or_ancestor(path, depth) : nullptr;
        depth += entry ? entry->relative_size() : 0;
    }
    return entry;
}

LDIF_Entry* LDIF_Entry::parent_of(const LDIF_Entry& descendant) {
    const dn_path path(descendant.dn_);
    LDIF_Entry* parent = nullptr;
    LDIF_Entry* entry = this;
    for (size_t depth = relative_size(); entry && entry != &descendant;) {
        parent = entry;
        const child_index* index = entry->index();
        entry = index ? index->equal_or_ancestor(path, depth) : nullptr;
        depth += entry ? entry->relative_size() : 0;
    }
    return entry ? parent : nullptr;
}

void LDIF_Entry::erase(LDIF_Entry& child) {
    child_index& index = *this->index();
    const list::iterator position = index.position_of(child);
    index.erase(position);
    children_.erase(position);
    if (children_.empty()) {
        index_.reset();
    }
}

LDIF_DN LDIF_Entry::relative_dn() const { return dn_.without_root_side(depth_); }

LDIF_Entry LDIF_Entry::header() const {
    LDIF_Entry copy;
    copy.name_ = name_;
    copy.dn_ = dn_;
    copy.depth_ = depth_;
    return copy;
}

namespace {

template <class Printable>
std::string text_or(const Printable& printable, const std::string& otherwise) {
    try {
        return printable.str();
    } catch (const LDIF_Exception&) {
        return otherwise;
    }
}

}  // namespace

std::string cfg32::shown(const LDIF_DN& dn) {
    std::string text;
    for (auto rdn = dn.rdns().rbegin(); rdn != dn.rdns().rend(); ++rdn) {
        // An empty value is what can't be printed.
        text += text_or(*rdn, rdn->pairs().front().attribute.str() + "=") + ", ";
    }
    text.resize(text.empty() ? 0 : text.size() - 2);
    return text;
}

std::string cfg32::shown(const LDIF_Entry& entry) { return text_or(entry, {}); }

std::ostream& operator<<(std::ostream& out, const LDIF_Entry& top) {
    for_each_in_preorder(top, [&](const LDIF_Entry& entry) { out << entry.str(); });
    return out;
}
