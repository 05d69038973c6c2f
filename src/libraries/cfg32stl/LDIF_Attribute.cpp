#include "LDIF_Attribute.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure illegal_line{80, 1000, "Illegal constructor LDIF_Attribute( LDIF_Line::"};

/// More attributes than this are found through an index.
constexpr size_t longest_scan = 64;

}  // namespace

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, const std::string& name, const std::string& value)
    : values_(name, key) {
    if (!value.empty()) {
        values_ += value;
    }
}

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, const LDIF_Line& line,
                               const LDIF_Comment& comment)
    : LDIF_Attribute(key, line, LDIF_Comment(comment)) {}

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, const LDIF_Line& line, LDIF_Comment&& comment)
    : values_(line.attribute, key) {
    if (line.type != LDIF_Line::attr) {
        raise(illegal_line, std::string(line_type_name(line.type)) + " );");
    }
    values_ += line.value;
    if (!comment.empty()) {
        comment_ = std::make_unique<LDIF_Comment>(std::move(comment));
    }
}

LDIF_Attribute::LDIF_Attribute(const LDIF_Attribute& other)
    : comment_(other.comment_ ? std::make_unique<LDIF_Comment>(*other.comment_) : nullptr),
      values_(other.values_) {}

const LDIF_Comment& LDIF_Attribute::comment() const {
    static const LDIF_Comment none;
    return comment_ ? *comment_ : none;
}

LDIF_Attribute& LDIF_Attribute::operator=(const LDIF_Attribute& other) {
    // A plain copy: assigning the values would parse them again.
    LDIF_Attribute copy(other);
    return *this = std::move(copy);
}

LDIF_Attribute& LDIF_Attribute::operator+=(const LDIF_Attribute& other) {
    if (*this == other) {
        *this += other.comment();
        values_ += other.values_;
    }
    return *this;
}

LDIF_Attribute& LDIF_Attribute::operator+=(const LDIF_Comment& comment) {
    if (comment_) {
        *comment_ += comment;
    } else if (!comment.empty()) {
        comment_ = std::make_unique<LDIF_Comment>(comment);
    }
    return *this;
}

LDIF_Attribute& LDIF_Attribute::operator+=(const std::string& value) {
    values_ += value;
    return *this;
}

std::string LDIF_Attribute::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Attribute::append_to(std::string& out) const {
    comment().append_to(out);
    values_.append_to(out);
}

LDIF_Attributes& LDIF_Attributes::operator=(const LDIF_Attributes& other) {
    LDIF_Attributes copy(other);
    return *this = std::move(copy);
}

/// The first attribute whose name is not before the given one.
LDIF_Attributes::iterator LDIF_Attributes::place_of(const cisString& name) {
    if (index_) {
        const auto entry = index_->lower_bound(&name);
        return entry == index_->end() ? attributes_.end() : entry->second;
    }
    // Attributes arrive mostly in order, or repeat the last name: from the end that is the first
    // comparison.
    iterator place = attributes_.end();
    while (place != attributes_.begin() && std::prev(place)->name() >= name) {
        --place;
    }
    return place;
}

template <class Attribute>
void LDIF_Attributes::add(Attribute&& attribute) {
    const iterator place = place_of(attribute.name());
    if (place != attributes_.end() && *place == attribute) {
        *place += attribute;
        return;
    }
    const iterator added = attributes_.insert(place, std::forward<Attribute>(attribute));
    if (index_) {
        index_->emplace(&added->name(), added);
    } else if (attributes_.size() > longest_scan) {
        index_ = std::make_unique<name_index>();
        for (iterator i = attributes_.begin(); i != attributes_.end(); ++i) {
            index_->emplace(&i->name(), i);
        }
    }
}

LDIF_Attributes& LDIF_Attributes::operator+=(const LDIF_Attribute& attribute) {
    add(attribute);
    return *this;
}

LDIF_Attributes& LDIF_Attributes::operator+=(LDIF_Attribute&& attribute) {
    add(std::move(attribute));
    return *this;
}

LDIF_Attributes& LDIF_Attributes::operator+=(const LDIF_Attributes& other) {
    // Merged into itself, a set finds each of its attributes again and adds none.
    for (const LDIF_Attribute& attribute : other) {
        add(attribute);
    }
    return *this;
}

LDIF_Attributes& LDIF_Attributes::operator-=(const LDIF_Attribute& attribute) {
    const iterator found = find(attribute.name());
    if (found != end()) {
        erase(found);
    }
    return *this;
}

LDIF_Attributes::iterator LDIF_Attributes::erase(iterator position) {
    if (index_) {
        index_->erase(&position->name());
    }
    return attributes_.erase(position);
}

LDIF_Attributes::iterator LDIF_Attributes::find(const cisString& name) {
    const iterator place = place_of(name);
    return place != end() && place->name() == name ? place : end();
}

LDIF_Attributes::const_iterator LDIF_Attributes::find(const cisString& name) const {
    return const_cast<LDIF_Attributes*>(this)->find(name);
}

LDIF_Attributes::const_iterator LDIF_Attributes::find(const cisString& name,
                                                      const _AttrType& type) const {
    if (index_ || &type == defaultAttrType) {
        return find(name);
    }
    // A name that is in the table has a row of its own.
    return std::find_if(begin(), end(), [&](const LDIF_Attribute& attribute) {
        return attribute.values().type() == &type;
    });
}

std::string LDIF_Attributes::str() const {
    std::string text;
    append_to(text);
    return text;
}

void LDIF_Attributes::append_to(std::string& out) const {
    for (const LDIF_Attribute& attribute : attributes_) {
        attribute.append_to(out);
    }
}
