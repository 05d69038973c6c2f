#pragma once

#include <memory>
#include <string>
#include <vector>

#include "LDIF_Comment.h"
#include "LDIF_Value.h"

/// One attribute of an entry: the comment lines that preceded it, and its values.
class LDIF_Attribute {
  public:
    /// An empty value makes an attribute without values. Throws what adding the value throws.
    LDIF_Attribute(aes_key_data* key, const std::string& name, const std::string& value);
    /// From a line of the file, of type attr (80/1000 for another).
    LDIF_Attribute(aes_key_data* key, const LDIF_Line& line, const LDIF_Comment& comment);
    /// The same of a name and a value, which may be empty; takes the comment over, if nothing is
    /// thrown.
    LDIF_Attribute(aes_key_data* key, cfg32::attribute_name name, const cfg32::given_text& value,
                   LDIF_Comment&& comment);
    LDIF_Attribute(LDIF_Values&& values, LDIF_Comment&& comment);
    LDIF_Attribute(const LDIF_Attribute& other);
    LDIF_Attribute(LDIF_Attribute&&) noexcept = default;
    LDIF_Attribute& operator=(const LDIF_Attribute& other);
    LDIF_Attribute& operator=(LDIF_Attribute&&) noexcept = default;
    virtual ~LDIF_Attribute() = default;

    // Orders by name, without regard to case.
    int compare(const char* name) const { return this->name().compare(name); }
    int compare(const std::string& name) const { return this->name().compare(name); }
    int compare(const LDIF_Attribute& other) const {
        return values_.typed_name().compare(other.values_.typed_name());
    }
    bool operator==(const LDIF_Attribute& other) const { return compare(other) == 0; }
    bool operator==(const char* name) const { return compare(name) == 0; }
    bool operator<(const LDIF_Attribute& other) const { return compare(other) < 0; }

    /// Takes over the comment and the values of an attribute of the same name; ignores any other.
    LDIF_Attribute& operator+=(const LDIF_Attribute& other);
    LDIF_Attribute& operator+=(LDIF_Attribute&& other);
    LDIF_Attribute& operator+=(const LDIF_Comment& comment);
    LDIF_Attribute& operator+=(const cfg32::given_text& value);

    const cisString& name() const { return values_.name(); }
    const LDIF_Comment& comment() const;
    const LDIF_Values& values() const { return values_; }
    LDIF_Values& values() { return values_; }

    /// The comment and a line for each value.
    virtual std::string str() const;
    void append_to(std::string& out) const;

  private:
    std::unique_ptr<LDIF_Comment> comment_;  // null for none, as most attributes have
    LDIF_Values values_;
};

/// The attributes of an entry, sorted by name, one of each name.
class LDIF_Attributes {
  public:
    using list = std::vector<LDIF_Attribute>;
    using iterator = list::iterator;
    using const_iterator = list::const_iterator;

    LDIF_Attributes() = default;
    /// Of attributes in any order; several of one name are merged into the first.
    explicit LDIF_Attributes(list&& attributes);

    /// Inserts the attribute in its place, or merges it into the one of its name.
    LDIF_Attributes& operator+=(const LDIF_Attribute& attribute);
    LDIF_Attributes& operator+=(LDIF_Attribute&& attribute);
    LDIF_Attributes& operator+=(const LDIF_Attributes& other);
    /// Removes the attribute of that one's name with all its values.
    LDIF_Attributes& operator-=(const LDIF_Attribute& attribute);

    iterator find(const cisString& name);
    const_iterator find(const cisString& name) const;
    /// The same, for many entries.
    const_iterator find(const cfg32::attribute_name& name) const;
    iterator erase(iterator position);
    iterator begin() { return attributes_.begin(); }
    iterator end() { return attributes_.end(); }
    const_iterator begin() const { return attributes_.begin(); }
    const_iterator end() const { return attributes_.end(); }
    bool empty() const { return attributes_.empty(); }
    size_t size() const { return attributes_.size(); }

    std::string str() const;
    void append_to(std::string& out) const;

  private:
    template <class Attribute>
    void add(Attribute&& attribute);

    list attributes_;
};
