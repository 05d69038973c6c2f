#pragma once

// The entries of a file that is checked, put together as a load does it.

#include <deque>
#include <map>
#include <string>
#include <unordered_map>
#include <vector>

#include "LDIF_Attribute.h"
#include "LDIF_DN.h"
#include "check/findings.h"
#include "cisString.h"

namespace cfg32::tool {

/// By name. An entry may have so many that a sorted array would be moved all the time.
using checked_attributes = std::map<cisString, LDIF_Attribute>;

/// A DN line and the attribute lines below it.
struct entry_section {
    LDIF_DN dn;
    shared_text written;  ///< the DN as it is written
    place where{};        ///< of the DN
    int first = 0;        ///< the DN line
    int last = 0;         ///< line of the last attribute
    checked_attributes attributes;
    bool is_left_out = false;
    bool has_kept_line = false;      ///< one that a load would keep aside
    std::vector<problem*> stopping;  ///< what a load stops at, unless all of it is left out
};

class checked_entries {
  public:
    checked_entries(findings& found, const file_text& file) : found_(found), file_(file) {}

    /// Adds an attribute of one value. Throws what a load would throw, after which it keeps the
    /// line aside. is_told: duplicates and second values are reported.
    void add(entry_section& section, LDIF_Attribute&& attribute, int line, bool is_told);
    /// Adds a version or charset attribute above all entries; line 0 for one that a load adds.
    void add_header(LDIF_Attribute&& attribute, int line);
    /// True when there is an entry of that DN.
    bool has(const LDIF_DN& dn) { return find(dn) != nullptr; }
    /// Ends a section: its entry is new, or merged.
    void close(entry_section&& section);

    /// What can be said when all sections are there.
    void finish();

  private:
    /// Taken apart, a DN takes many times the room of its text, so it is read again where it is
    /// asked for.
    struct checked_entry {
        LDIF_DN dn() const { return LDIF_DN(cisString(written.str())); }

        shared_text written;
        place where;
        checked_attributes attributes;
        struct lines {
            place where;  // of the DN
            int first;
            int last;
        };
        std::vector<lines> sections;
    };

    checked_entry* find(const LDIF_DN& dn);
    checked_entry* find(const LDIF_DN& dn, size_t hash);
    void merge(checked_entry& known, entry_section& section);
    void merge(LDIF_Attribute& known, const LDIF_Attribute& again, const entry_section& section);
    void report_second_value(const LDIF_Attribute& attribute, int line, const shared_text& entry);
    void check_ancestors(const checked_entry& entry, const LDIF_DN& dn);
    void check_writing(const checked_entry& entry, const LDIF_DN& dn);
    std::string why_unwritable(const checked_entry& entry, const LDIF_DN& dn) const;
    std::string why_unwritable(const LDIF_Attribute& attribute) const;
    int line_of(const LDIF_Value& value) const;

    findings& found_;
    const file_text& file_;
    std::deque<checked_entry> entries_;
    std::unordered_multimap<size_t, checked_entry*> by_dn_;
    std::unordered_map<const char*, int> value_lines_;  // by where its text stands
    bool is_rewritten_ = false;                         // by a load that keeps lines aside
};

}  // namespace cfg32::tool
