#pragma once

#include <array>
#include <cstdint>
#include <cstdlib>
#include <iosfwd>
#include <iterator>
#include <map>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "LDIF_Util.h"
#include "cisString.h"
#include "kept_text.h"

class LDIF_Exception;
struct aes_key_data;

namespace cfg32 {

/// The bytes of a value. Those of a number need no memory of their own.
class binary_form {
  public:
    const char* get() const { return number_ ? number_->data() : bytes_.get(); }
    explicit operator bool() const { return get(); }
    void reset() { *this = {}; }
    /// Copies the bytes. False when there is no memory for them.
    bool assign(const void* bytes, size_t length);

  private:
    struct free_deleter {
        void operator()(char* memory) const { free(memory); }
    };

    std::optional<std::array<char, sizeof(int64_t)>> number_;
    std::unique_ptr<char, free_deleter> bytes_;
};

}  // namespace cfg32

/// A value of a type, checked by the type's syntax when it is made. The syntaxes read and fill the
/// members.
class LDIF_Value {
  public:
    const _AttrType* attrType;    ///< not owned
    cfg32::kept_text text;        ///< as the syntax stores it: a DN normalised, a password encoded
    int binaryLength = 0;         ///< in bytes; at least 1 exactly when there is a binary form
    cfg32::binary_form binary;    ///< of integers: 8 bytes
    std::unique_ptr<LDIF_DN> dn;  ///< of distinguished names; null where the text tells it all
    aes_key_data* key;            ///< for passwords; may be null, not owned

    /// Throws what the syntax throws, completed by the text and the attribute's name.
    LDIF_Value(const _AttrType* type, const char* text, aes_key_data* key);
    LDIF_Value(const _AttrType* type, const std::string& text, aes_key_data* key)
        : LDIF_Value(type, cfg32::given_text(text), key) {}
    LDIF_Value(const _AttrType* type, const cfg32::given_text& text, aes_key_data* key);
    LDIF_Value(const _AttrType* type, const void* bytes, int length, aes_key_data* key);
    LDIF_Value(const LDIF_Value& other);
    LDIF_Value(LDIF_Value&&) noexcept = default;
    LDIF_Value& operator=(const LDIF_Value& other);
    LDIF_Value& operator=(LDIF_Value&&) noexcept = default;
    ~LDIF_Value() = default;

    /// One that was checked before, of the text that its syntax stored then. It stands in that
    /// text, which must outlive it.
    static LDIF_Value stored(const _AttrType* type, std::string_view text, aes_key_data* key);

    std::string str() const;
    /// The same, as a part of the value.
    std::string_view shown() const;
    /// By the type's match. The text is made a value first, so one that the syntax refuses throws.
    int compare(const LDIF_Value& other) const;
    int compare(const std::string& other) const;
    bool operator==(const std::string& other) const { return compare(other) == 0; }

    /// Gives the value a binary form, a copy of the bytes.
    void set_binary(const void* bytes, int length);

  private:
    LDIF_Value(const _AttrType* type, aes_key_data* key) : attrType(type), key(key) {}
    void check(const cfg32::given_text& given);
};

std::ostream& operator<<(std::ostream& out, const LDIF_Value& value);

/// The values of one attribute, in the order they were added and free of duplicates, which the
/// syntax's own comparison finds. Whether an attribute may have more than one is not looked at
/// here.
///
/// Of a value the list keeps no more than the text that the syntax stored. Who looks at one gets an
/// LDIF_Value made of it, which stands in the list and lasts until the list is changed.
class LDIF_Values {
  public:
    class const_iterator;

    /// More values than this are searched through an index.
    static constexpr size_t longest_scan = 16;

    LDIF_Values(const std::string& name, aes_key_data* key)
        : LDIF_Values(cfg32::attribute_name(name), key) {}
    LDIF_Values(cfg32::attribute_name name, aes_key_data* key)
        : name_(std::move(name)), key_(key) {}
    LDIF_Values(const LDIF_Values& other);
    LDIF_Values(LDIF_Values&&) noexcept = default;
    /// Replaces everything; every value is checked again by the syntax.
    LDIF_Values& operator=(const LDIF_Values& other);
    LDIF_Values& operator=(LDIF_Values&&) noexcept = default;
    ~LDIF_Values() = default;

    /// Adds a text that its syntax has stored before, unless there is an equal value.
    void add_stored(const cfg32::given_text& text);
    // A value is added as text and checked by this list's syntax; an equal one is dropped.
    LDIF_Values& operator+=(const cfg32::given_text& text);
    LDIF_Values& operator+=(const LDIF_Value& value);
    /// Values before one that is refused stay added.
    LDIF_Values& operator+=(const LDIF_Values& other) { return merge(other, false); }
    LDIF_Values& operator+=(LDIF_Values&& other) { return merge(other, true); }
    /// Removes the value equal to the text, if there is one.
    LDIF_Values& operator-=(const std::string& text);
    void clear();

    const_iterator find(const std::string& text) const;
    /// The value that is equal by the syntax.
    const_iterator find(const LDIF_Value& value) const;
    /// Returns the value that followed. It leaves a gap until somebody asks for texts().
    const_iterator erase(const const_iterator& value);
    const_iterator begin() const;
    const_iterator end() const;
    bool empty() const { return size() == 0; }
    size_t size() const;

    /// What is kept of the values. None of them moves in memory before it is removed.
    std::span<const cfg32::kept_text> texts() const;

    const cisString& name() const { return name_.get(); }  ///< as the caller wrote it
    const _AttrType* type() const { return name_.type(); }
    const cfg32::attribute_name& typed_name() const { return name_; }
    aes_key_data* key() const { return key_; }

    /// A line "name: value" for each value.
    std::string str() const;
    void append_to(std::string& out) const;

  private:
    // By the values' hashes, where they stand in the list.
    struct hash_index {
        cfg32::hash_kind kind = cfg32::present_hash_kind();
        std::unordered_multimap<size_t, size_t, cfg32::mixed_hash> positions;
    };

    // By where the text stands.
    using dn_map = std::map<const char*, LDIF_DN>;

    struct several {
        void close_gaps();
        hash_index* good_index();

        std::vector<cfg32::kept_text> texts;
        size_t gaps = 0;                    // texts without value, of what was erased
        std::unique_ptr<hash_index> index;  // of many only
        std::unique_ptr<dn_map> dns;        // of values whose text does not tell all of the DN
    };

    LDIF_Values& merge(const LDIF_Values& other, bool takes_over);
    void add(const cfg32::given_text& text);
    void append(LDIF_Value&& value);
    several& more_than_a_text();
    void complete(LDIF_Exception& e) const;
    void complete(LDIF_Exception& e, std::string_view text) const;
    LDIF_Value value_of(std::string_view text) const;
    std::span<const cfg32::kept_text> texts_and_gaps() const;
    size_t position_of(const LDIF_Value& value) const;
    size_t indexed_position_of(const LDIF_Value& value) const;
    const hash_index& index() const;
    void remove(size_t position);
    void forget(size_t position);

    cfg32::attribute_name name_;
    aes_key_data* key_;
    cfg32::kept_text first_;            // where a text is all there is
    std::unique_ptr<several> several_;  // where there is more
};

/// Makes the values of a list.
class LDIF_Values::const_iterator {
  public:
    using iterator_category = std::input_iterator_tag;
    using value_type = LDIF_Value;
    using difference_type = ptrdiff_t;
    using reference = LDIF_Value;

    class pointer {
      public:
        explicit pointer(LDIF_Value&& value) : value_(std::move(value)) {}
        const LDIF_Value* operator->() const { return &value_; }

      private:
        LDIF_Value value_;
    };

    LDIF_Value operator*() const { return list_->value_of(list_->texts_and_gaps()[position_]); }
    pointer operator->() const { return pointer(**this); }
    const_iterator& operator++() { return *this = const_iterator(list_, position_ + 1); }
    const_iterator operator++(int) { return std::exchange(*this, {list_, position_ + 1}); }
    bool operator==(const const_iterator&) const = default;

  private:
    friend class LDIF_Values;
    static constexpr size_t behind_all = ~size_t{};  // whether gaps are closed or not

    /// The first value from that position on.
    const_iterator(const LDIF_Values* list, size_t position) : list_(list), position_(position) {
        const auto texts = list->texts_and_gaps();
        while (position_ < texts.size() && !texts[position_].has_value()) {
            ++position_;
        }
        if (position_ >= texts.size()) {
            position_ = behind_all;
        }
    }

    const LDIF_Values* list_;
    size_t position_;
};

inline LDIF_Values::const_iterator LDIF_Values::begin() const { return {this, 0}; }
inline LDIF_Values::const_iterator LDIF_Values::end() const {
    return {this, const_iterator::behind_all};
}

inline size_t LDIF_Values::size() const {
    return texts_and_gaps().size() - (several_ ? several_->gaps : 0);
}

inline std::span<const cfg32::kept_text> LDIF_Values::texts() const {
    if (several_ && several_->gaps > 0) {
        several_->close_gaps();
    }
    return texts_and_gaps();
}

inline std::span<const cfg32::kept_text> LDIF_Values::texts_and_gaps() const {
    if (several_) {
        return several_->texts;
    }
    return {&first_, first_.has_value() ? 1U : 0U};
}
