#pragma once

// A load checks every line, but most entries are never asked for, and fewer are changed. So it
// builds no attributes where it can tell what they will be: the entry keeps the place of their
// lines. Canonical lines, which are what is printed of the attributes, are searched and printed as
// they stand; others are read and written anew in that form at their first use.

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_Attribute.h"
#include "LDIF_Util.h"
#include "kept_text.h"

struct aes_key_data;

namespace cfg32 {

class logical_line;

/// Room that most entries do with while they are read.
inline constexpr size_t usual_attributes = 16;

/// What stands before the values of an attribute in canonical lines.
class line_start {
  public:
    static constexpr std::string_view separator = ": ";

    explicit line_start(std::string_view name);

    /// True when a line of that attribute stands at the front.
    bool begins(std::string_view lines) const {
        return may_be_equal_without_case(lines.front(), text_.front()) &&
               (lines.starts_with(text_) || begins_in_other_case(lines));
    }
    /// True when a line of an attribute that is sorted behind does.
    bool is_before(std::string_view lines) const {
        return compare_without_case(lines.substr(0, 1), std::string_view(text_).substr(0, 1)) > 0;
    }
    size_t name_size() const { return name_size_; }
    size_t size() const { return text_.size(); }

  private:
    bool begins_in_other_case(std::string_view lines) const;

    std::string text_;
    size_t name_size_;
};

/// Attribute lines that were checked, with the comment lines between them.
class unread_attributes {
  public:
    unread_attributes() = default;
    unread_attributes(const given_text& text, bool is_canonical, aes_key_data* key)
        : text_(text), is_canonical_(is_canonical), key_(key) {}

    bool empty() const { return text_.empty(); }
    std::string_view text() const { return text_; }
    /// True when the attributes are printed as they stand there.
    bool is_canonical() const { return is_canonical_; }

    /// Reads what was checked. Memory may be exhausted; nothing else can fail.
    LDIF_Attributes read() const;

    /// Canonical lines that are read as these attributes; none when there are no such lines, or
    /// when arrays are the faster to look through.
    unread_attributes printed(const LDIF_Attributes& attributes) const;

    // Of canonical ones: calls use(name, value) for each value, in order.
    template <class Use>
    void for_each_value(Use use) const;
    /// Of canonical ones: calls use(name, value) for the values of one attribute until it returns
    /// true.
    template <class Use>
    void for_each_value_of(const line_start& start, Use use) const;

    aes_key_data* key() const { return key_; }

  private:
    kept_text text_;
    bool is_canonical_ = false;
    aes_key_data* key_ = nullptr;
};

template <class Use>
void unread_attributes::for_each_value(Use use) const {
    for (std::string_view rest = text(); !rest.empty();) {
        const std::string_view line = rest.substr(0, rest.find('\n'));
        rest.remove_prefix(line.size() + 1);
        if (line.front() != '#') {
            const size_t colon = line.find(line_start::separator.front());
            use(line.substr(0, colon), line.substr(colon + line_start::separator.size()));
        }
    }
}

template <class Use>
void unread_attributes::for_each_value_of(const line_start& start, Use use) const {
    bool is_found = false;
    for (std::string_view rest = text(); !rest.empty();) {
        if (start.begins(rest)) {
            const std::string_view name = rest.substr(0, start.name_size());
            rest.remove_prefix(start.size());
            const std::string_view value = rest.substr(0, rest.find('\n'));
            if (use(name, value)) {
                return;
            }
            is_found = true;
            rest.remove_prefix(value.size() + 1);
        } else if (rest.front() != '#' && (is_found || start.is_before(rest))) {
            return;  // they are sorted
        } else {
            rest.remove_prefix(rest.find('\n') + 1);
        }
    }
}

/// Checks the attribute lines of an entry that are to be left unread.
class unread_checker {
  public:
    explicit unread_checker(aes_key_data* key) : key_(key) {}

    /// Begins an entry, whose attribute lines start there.
    void start(const char* begin);

    void take_comment(const logical_line& line);
    /// Takes an attribute line that ends there. False for one that must be read at once: the
    /// syntax refuses or changes it, or it could fail to be read again.
    bool take(const logical_line& line, const char* end);

    /// What was taken up to the last attribute line.
    unread_attributes taken() const {
        return {given_text::lasting({begin_, size_}), is_canonical_, key_};
    }

  private:
    bool follow(const attribute_name& name, std::string_view value);
    bool is_repeated(const _AttrType* type, std::string_view value) const;

    aes_key_data* key_;
    const char* begin_ = nullptr;
    size_t size_ = 0;
    bool is_open_ = false;  // no line was refused
    bool is_sorted_ = true;
    bool is_canonical_ = true;
    bool has_password_ = false;
    bool is_commented_ = false;  // the line that follows
    attribute_name last_{""};
    std::vector<std::string_view> last_values_;  // while everything is canonical
};

}  // namespace cfg32
