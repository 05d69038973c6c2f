#include "LDIF_Attribute.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure illegal_line{80, 1000, "Illegal constructor LDIF_Attribute( LDIF_Line::"};

/// Among more attributes than this a name is searched for by halves.
constexpr size_t longest_scan = 32;

}  // namespace

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, const std::string& name, const std::string& value)
    : values_(name, key) {
    if (!value.empty()) {
        values_ += value;
    }
}

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, const LDIF_Line& line,
                               const LDIF_Comment& comment)
    : values_(line.attribute, key) {
    if (line.type != LDIF_Line::attr) {
        raise(illegal_line, std::string(line_type_name(line.type)) + " );");
    }
    values_ += line.value;
    *this += comment;
}

LDIF_Attribute::LDIF_Attribute(aes_key_data* key, attribute_name name, const given_text& value,
                               LDIF_Comment&& comment)
    : values_(std::move(name), key) {
    values_ += value;
    if (!comment.empty()) {
        comment_ = std::make_unique<LDIF_Comment>(std::move(comment));
    }
}

LDIF_Attribute::LDIF_Attribute(LDIF_Values&& values, LDIF_Comment&& comment)
    : comment_(comment.empty() ? nullptr : std::make_unique<LDIF_Comment>(std::move(comment))),
      values_(std::move(values)) {}

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

LDIF_Attribute& LDIF_Attribute::operator+=(LDIF_Attribute&& other) {
    if (*this == other) {
        if (comment_) {
            *this += other.comment();
        } else {
            comment_ = std::move(other.comment_);
        }
        values_ += std::move(other.values_);
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

LDIF_Attribute& LDIF_Attribute::operator+=(const given_text& value) {
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

namespace {

/// The first attribute whose name is not before the given one.
template <class Attributes>
auto place_of(Attributes& attributes, const attribute_name& name) {
    const auto is_before = [&](const LDIF_Attribute& own) {
        return own.values().typed_name().compare(name) < 0;
    };
    if (attributes.size() > longest_scan) {
        return std::partition_point(attributes.begin(), attributes.end(), is_before);
    }
    // Attributes arrive mostly in order, or repeat the last name: from the end that is the first
    // comparison.
    auto place = attributes.end();
    while (place != attributes.begin() && !is_before(*std::prev(place))) {
        --place;
    }
    return place;
}

}  // namespace

LDIF_Attributes::LDIF_Attributes(list&& attributes) {
    if (attributes.size() > longest_scan) {
        // Otherwise each would have to move all behind its place.
        std::ranges::stable_sort(
            attributes, [](const LDIF_Attribute& l, const LDIF_Attribute& r) { return l < r; });
    }
    attributes_.reserve(attributes.size());
    for (LDIF_Attribute& attribute : attributes) {
        add(std::move(attribute));
    }
    // In no more memory than they need.
    attributes_ = list(std::make_move_iterator(begin()), std::make_move_iterator(end()));
}

template <class Attribute>
void LDIF_Attributes::add(Attribute&& attribute) {
    const iterator place = place_of(attributes_, attribute.values().typed_name());
    if (place != end() && *place == attribute) {
        *place += std::forward<Attribute>(attribute);
    } else {
        attributes_.insert(place, std::forward<Attribute>(attribute));
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
    return attributes_.erase(position);
}

LDIF_Attributes::iterator LDIF_Attributes::find(const cisString& name) {
    const const_iterator found = std::as_const(*this).find(name);
    return begin() + (found - std::as_const(*this).begin());
}

LDIF_Attributes::const_iterator LDIF_Attributes::find(const cisString& name) const {
    return find(attribute_name(name.text()));
}

LDIF_Attributes::const_iterator LDIF_Attributes::find(const attribute_name& name) const {
    const auto order = [&](const LDIF_Attribute& own) {
        return own.values().typed_name().compare(name);
    };
    const auto is_reached = [&](const LDIF_Attribute& own) { return order(own) >= 0; };
    const const_iterator place = size() > longest_scan ? place_of(attributes_, name)
                                                       : std::find_if(begin(), end(), is_reached);
    return place != end() && order(*place) == 0 ? place : end();
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
