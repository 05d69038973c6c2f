#pragma once

// A load checks every line, but most entries are never asked for. So it builds no attributes where
// it can tell what they will be; the entry keeps the place of their lines, and reads them when
// somebody looks.

#include <cstdint>
#include <string_view>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_Attribute.h"
#include "LDIF_Util.h"

struct aes_key_data;

namespace cfg32 {

class logical_line;

/// Room that most entries do with while they are read.
inline constexpr size_t usual_attributes = 16;

/// Attribute lines that were checked, with the comment lines between them, in a text that lasts.
class unread_attributes {
  public:
    unread_attributes() = default;
    unread_attributes(std::string_view text, bool is_canonical, aes_key_data* key)
        : text_(text.data()),
          size_(static_cast<uint32_t>(text.size())),
          is_canonical_(is_canonical),
          key_(key) {}

    bool empty() const { return size_ == 0; }
    std::string_view text() const { return {text_, size_}; }
    /// True when the attributes are printed as they stand there.
    bool is_canonical() const { return is_canonical_; }

    /// Reads what was checked. Memory may be exhausted; nothing else can fail.
    LDIF_Attributes read() const;

    // Of canonical ones: calls use(name, value) for each value, in order.
    template <class Use>
    void for_each_value(Use use) const;
    /// Of canonical ones: calls use(name, value) for the values of that attribute until it returns
    /// true.
    template <class Use>
    void for_each_value_of(std::string_view name, Use use) const;

    aes_key_data* key() const { return key_; }

  private:
    static constexpr std::string_view separator = ": ";

    const char* text_ = nullptr;
    uint32_t size_ = 0;
    bool is_canonical_ = false;
    aes_key_data* key_ = nullptr;
};

template <class Use>
void unread_attributes::for_each_value(Use use) const {
    for (std::string_view rest = text(); !rest.empty();) {
        const std::string_view line = rest.substr(0, rest.find('\n'));
        rest.remove_prefix(line.size() + 1);
        if (line.front() != '#') {
            const size_t colon = line.find(separator.front());
            use(line.substr(0, colon), line.substr(colon + separator.size()));
        }
    }
}

template <class Use>
void unread_attributes::for_each_value_of(std::string_view name, Use use) const {
    if (name.find(separator.front()) != name.npos) {
        return;  // no attribute is called so, though a line may begin so
    }
    bool is_found = false;
    for (std::string_view rest = text(); !rest.empty(); rest.remove_prefix(rest.find('\n') + 1)) {
        if (rest.front() == '#') {
            continue;
        }
        if (rest.size() > name.size() && rest.substr(name.size()).starts_with(separator) &&
            equal_without_case(rest.substr(0, name.size()), name)) {
            const std::string_view value = rest.substr(name.size() + separator.size());
            is_found = true;
            if (use(rest.substr(0, name.size()), value.substr(0, value.find('\n')))) {
                return;
            }
        } else if (is_found || compare_without_case(rest.substr(0, 1), name.substr(0, 1)) > 0) {
            return;  // they are sorted
        }
    }
}

/// Checks the attribute lines of an entry that are to be left unread.
class unread_lines {
  public:
    explicit unread_lines(aes_key_data* key) : key_(key) {}

    /// Begins an entry, whose attribute lines start there.
    void start(const char* begin);

    void take_comment(const logical_line& line);
    /// Takes an attribute line that ends there. False for one that must be read at once: the
    /// syntax refuses or changes it, or it could fail to be read again.
    bool take(const logical_line& line, const char* end);

    /// What was taken up to the last attribute line.
    unread_attributes taken() const { return {{begin_, size_}, is_canonical_, key_}; }

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
