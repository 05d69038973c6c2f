#pragma once

#include <iosfwd>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "LDIF_Entry.h"
#include "cisString.h"

/// The filter of a search: one attribute and optionally one value, matched exactly by the
/// attribute's syntax. At first it matches every entry that has an objectclass.
class LDIF_Filter {
  public:
    LDIF_Filter() = default;
    LDIF_Filter(const std::string& text) { *this = text; }
    LDIF_Filter(const LDIF_Filter&) = default;
    LDIF_Filter& operator=(const LDIF_Filter&) = default;
    virtual ~LDIF_Filter() = default;

    /// Parses "(attribute=value)", "(attribute=*)" or "(attribute)", the parentheses optional. A
    /// backslash and two hexadecimal digits are a byte of the value (RFC 4515, 3).
    LDIF_Filter& operator=(const std::string& text);

    /// Throws what the attribute's syntax throws for the value.
    virtual bool match(const LDIF_Entry& entry) const;

    const cisString& attribute() const { return attribute_.get(); }
    const std::string& value() const { return value_; }
    bool any_value() const { return any_value_; }

  private:
    bool match(const cfg32::unread_attributes& lines) const;
    bool is_equal(std::string_view value, const LDIF_Value& wanted) const;
    const LDIF_Value& wanted_value(aes_key_data* key) const {
        return wanted_ && wanted_->key == key ? *wanted_ : make_wanted_value(key);
    }
    const LDIF_Value& make_wanted_value(aes_key_data* key) const;

    cfg32::attribute_name attribute_{"objectclass"};
    cfg32::line_start start_{"objectclass"};  // of that attribute's lines
    std::string value_;
    bool any_value_ = true;  // the attribute's presence is all that counts
    // Made once there is a value to compare with.
    mutable std::optional<LDIF_Value> wanted_;
    mutable cfg32::equal_texts* equal_ = nullptr;
};

/// The names of the wanted attributes; empty means all.
using LDIF_AttrFilter = std::set<cisString>;

/// What a search found: copies of the entries, reduced to the wanted attributes.
class LDIF_Search_Results {
  public:
    enum Scope { Base, OneLevel, Subtree };  // the scope numbers of LDAP (RFC 4511, 4.5.1.2)

    LDIF_Search_Results(const Scope& scope, const LDIF_Filter& filter,
                        const LDIF_AttrFilter& attributes, bool attributesOnly);

    /// Adds what the scope reaches from the base on.
    LDIF_Search_Results& operator+=(const LDIF_Entry& base) { return addEntry(base, true); }
    LDIF_Search_Results& addEntry(const LDIF_Entry& entry, const bool& isBase);

    const std::vector<LDIF_Entry>& entries() const { return entries_; }
    bool attributes_only() const { return attributes_only_; }

  private:
    void add_match(const LDIF_Entry& entry);

    std::vector<LDIF_Entry> entries_;
    Scope scope_;
    LDIF_Filter filter_;
    LDIF_AttrFilter attributes_;
    bool attributes_only_;  // only of how the results are printed
};

std::ostream& operator<<(std::ostream& out, const LDIF_Search_Results& results);

namespace cfg32 {

using found_entries = std::vector<const LDIF_Entry*>;

/// Finds the entries that the scope reaches from the base on and the filter matches, each before
/// those below it. They stay the tree's.
void find_matches(const LDIF_Entry& base, LDIF_Search_Results::Scope scope,
                  const LDIF_Filter& filter, found_entries& found);

}  // namespace cfg32
