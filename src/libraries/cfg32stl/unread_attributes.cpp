#include "unread_attributes.h"

#include <algorithm>
#include <utility>

#include "LDIF_Comment.h"
#include "LDIF_Exception.h"
#include "LDIF_Line.h"
#include "LDIF_Value.h"
#include "line_source.h"
#include "logical_line.h"

namespace cfg32 {

line_start::line_start(std::string_view name) {
    const bool can_stand_there = !name.starts_with('#') && name.find(':') == name.npos;
    name_size_ = can_stand_there ? name.size() : 0;
    text_ = can_stand_there ? std::string(name).append(separator) : "\n";  // which begins no line
}

bool line_start::begins_in_other_case(std::string_view lines) const {
    return lines.size() > name_size_ && lines.substr(name_size_).starts_with(separator) &&
           equal_without_case(lines.substr(0, name_size_),
                              std::string_view(text_).substr(0, name_size_));
}

LDIF_Attributes unread_attributes::read() const {
    LDIF_Attributes::list attributes;
    attributes.reserve(usual_attributes);
    LDIF_Comment pending;
    line_source source(text_.given());
    logical_line line;
    for (int last = line.next(source, 0); line.type != LDIF_Line::endOfFile;
         last = line.next(source, last)) {
        if (line.type == LDIF_Line::comment) {
            pending.append(line.with_newline());
            continue;
        }
        // Not checked again: in another locale it might be refused.
        LDIF_Values values(attribute_name(line.attribute), key_);
        values.add_stored(line.value);
        attributes.emplace_back(std::move(values), std::exchange(pending, {}));
    }
    return LDIF_Attributes(std::move(attributes));
}

namespace {

constexpr size_t longest_search = 64;  // line by line

bool is_short(const LDIF_Attributes& attributes) {
    return attributes.size() <= longest_search &&
           std::ranges::all_of(attributes, [](const LDIF_Attribute& attribute) {
               return attribute.values().size() <= LDIF_Values::longest_scan;
           });
}

bool begins_with_space(std::string_view text) {
    return !text.empty() && is_ascii_space(text.front());
}

/// True for names and values that are what a line of them is read as. They are in ASCII, in one
/// line and without blanks at the end; folded lines can bring some to the front of a value. Behind
/// a comment a line can begin with blanks, which makes no continuation line of it where it stands:
/// they are the front of its name, or there is none.
bool are_read_as_written(const LDIF_Attribute& attribute) {
    const std::string& name = attribute.name().text();
    const auto texts = attribute.values().texts();
    return !name.empty() && !begins_with_space(name) && !texts.empty() &&
           std::ranges::all_of(texts, [](const kept_text& text) {
               return !text.empty() && !begins_with_space(text);
           });
}

}  // namespace

unread_attributes unread_attributes::printed(const LDIF_Attributes& attributes) const {
    if (!is_short(attributes) || !std::ranges::all_of(attributes, are_read_as_written)) {
        return {};
    }
    return {attributes.str(), true, key_};
}

void unread_checker::start(const char* begin) {
    begin_ = begin;
    size_ = 0;
    is_open_ = is_sorted_ = is_canonical_ = true;
    has_password_ = is_commented_ = false;
    last_ = attribute_name("");
    last_values_.clear();
}

void unread_checker::take_comment(const logical_line& line) {
    // One that is converted depends on the locale of the moment.
    is_open_ = is_open_ && line.with_newline().lasts();
    is_commented_ = true;
}

bool unread_checker::take(const logical_line& line, const char* end) {
    const auto size = static_cast<size_t>(end - begin_);
    is_open_ = is_open_ && line.has_separator && line.is_in_ascii() && end[-1] == '\n';
    if (!is_open_) {
        return false;
    }
    attribute_name name(line.attribute);
    is_open_ = false;  // unless nothing is thrown
    const LDIF_Value value(name.type(), line.value, key_);
    is_canonical_ = is_canonical_ && line.is_canonical();
    const bool is_unchanged = value.text.view().data() == line.value.view().data()
                                  ? value.text.size() == line.value.size()
                                  : value.text == line.value.view();
    is_open_ = is_unchanged && follow(name, value.text);
    last_ = std::move(name);
    is_commented_ = false;
    size_ = is_open_ ? size : size_;
    return is_open_;
}

/// Takes the next line's name and value. False for one that must be read at once.
bool unread_checker::follow(const attribute_name& name, std::string_view value) {
    const int order = last_.compare(name);
    is_sorted_ = is_sorted_ && order <= 0;
    is_canonical_ = is_canonical_ && is_sorted_;
    has_password_ = has_password_ || name.type()->match == pwCompare;
    if (order != 0) {
        last_values_.clear();
    }
    // Passwords that are compared may turn out not to be decodable.
    if (has_password_ && (!is_sorted_ || (order == 0 && name.type()->match == pwCompare))) {
        return false;
    }
    if (is_canonical_) {
        // An attribute's comments are printed before its first value, with the name of that.
        const bool is_as_printed =
            order != 0 || (!is_commented_ && last_.get().text() == name.get().text());
        is_canonical_ = is_as_printed && last_values_.size() < LDIF_Values::longest_scan &&
                        !is_repeated(name.type(), value);
        last_values_.push_back(value);
    }
    return true;
}

bool unread_checker::is_repeated(const _AttrType* type, std::string_view value) const {
    return std::ranges::any_of(last_values_, [&](std::string_view own) {
        return LDIF_Value::stored(type, own, key_).compare(LDIF_Value::stored(type, value, key_)) ==
               0;
    });
}

}  // namespace cfg32
