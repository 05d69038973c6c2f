#pragma once

#include <cstdlib>
#include <iosfwd>
#include <list>
#include <memory>
#include <string>
#include <unordered_map>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "cisString.h"

class LDIF_Exception;
struct aes_key_data;

namespace cfg32 {

struct free_deleter {
    void operator()(void* memory) const { free(memory); }
};

}  // namespace cfg32

namespace cfg32 {

/// An attribute's name as the caller wrote it. Where that is the table's spelling it is kept there.
class attribute_name {
  public:
    attribute_name(const std::string& name, const _AttrType& type);
    attribute_name(const attribute_name& other);
    attribute_name(attribute_name&&) noexcept = default;
    attribute_name& operator=(const attribute_name& other);
    attribute_name& operator=(attribute_name&&) noexcept = default;
    ~attribute_name() = default;

    const cisString& get() const { return own_ ? *own_ : *table_; }

  private:
    const cisString* table_ = nullptr;
    std::unique_ptr<cisString> own_;
};

}  // namespace cfg32

/// A value of a type, checked by the type's syntax when it is made. The syntaxes read and fill the
/// members.
class LDIF_Value {
  public:
    const _AttrType* attrType;  ///< not owned
    std::string text;           ///< as the syntax stores it: a DN normalised, a password encoded
    int binaryLength = 0;       ///< in bytes; at least 1 exactly when there is a binary form
    std::unique_ptr<char, cfg32::free_deleter> binary;  ///< of integers: 8 bytes
    std::unique_ptr<LDIF_DN> dn;                        ///< of distinguished names
    aes_key_data* key;                                  ///< for passwords; may be null, not owned

    /// Throws what the syntax throws, completed by the text and the attribute's name.
    LDIF_Value(const _AttrType* type, const char* text, aes_key_data* key);
    LDIF_Value(const _AttrType* type, const std::string& text, aes_key_data* key);
    LDIF_Value(const _AttrType* type, const void* bytes, int length, aes_key_data* key);
    LDIF_Value(const LDIF_Value& other);
    LDIF_Value(LDIF_Value&&) noexcept = default;
    LDIF_Value& operator=(const LDIF_Value& other);
    LDIF_Value& operator=(LDIF_Value&&) noexcept = default;
    ~LDIF_Value() = default;

    std::string str() const;
    /// By the type's match. The text is made a value first, so one that the syntax refuses throws.
    int compare(const LDIF_Value& other) const;
    int compare(const std::string& other) const;
    bool operator==(const std::string& other) const { return compare(other) == 0; }

    /// Gives the value a binary form, a copy of the bytes.
    void set_binary(const void* bytes, int length);

  private:
    void check(const std::string& given);
};

std::ostream& operator<<(std::ostream& out, const LDIF_Value& value);

/// The values of one attribute, in the order they were added and free of duplicates, which the
/// syntax's own comparison finds. Whether an attribute may have more than one is not looked at
/// here.
class LDIF_Values {
  public:
    using list = std::list<LDIF_Value>;

    LDIF_Values(const std::string& name, aes_key_data* key);
    LDIF_Values(const LDIF_Values& other);
    LDIF_Values(LDIF_Values&&) noexcept = default;
    /// Replaces everything; every value is checked again by the syntax.
    LDIF_Values& operator=(const LDIF_Values& other);
    LDIF_Values& operator=(LDIF_Values&&) noexcept = default;
    ~LDIF_Values() = default;

    // A value is added as text and checked by this list's syntax; an equal one is dropped.
    LDIF_Values& operator+=(const std::string& text);
    LDIF_Values& operator+=(const LDIF_Value& value);
    /// Values before one that is refused stay added.
    LDIF_Values& operator+=(const LDIF_Values& other);
    /// Removes the value equal to the text, if there is one.
    LDIF_Values& operator-=(const std::string& text);
    void clear();

    list::const_iterator find(const std::string& text) const;
    list::iterator find(const std::string& text);
    /// The value that is equal by the syntax.
    list::const_iterator find(const LDIF_Value& value) const;
    /// Returns the value that followed.
    list::const_iterator erase(list::const_iterator value);
    list::const_iterator begin() const { return values_.begin(); }
    list::const_iterator end() const { return values_.end(); }
    bool empty() const { return values_.empty(); }
    size_t size() const { return values_.size(); }

    const cisString& name() const { return name_.get(); }  ///< as the caller wrote it
    const _AttrType* type() const { return type_; }
    aes_key_data* key() const { return key_; }

    /// A line "name: value" for each value.
    std::string str() const;
    void append_to(std::string& out) const;

  private:
    using hash_index = std::unordered_multimap<size_t, list::iterator>;

    void add(const std::string& text);
    void complete(LDIF_Exception& e) const;
    void complete(LDIF_Exception& e, const std::string& text) const;
    list::iterator position_of(const LDIF_Value& value);
    void index_values();
    void forget(list::const_iterator value);

    list values_;
    const _AttrType* type_;
    cfg32::attribute_name name_;
    aes_key_data* key_;
    std::unique_ptr<hash_index> index_;  // of long lists only
};
