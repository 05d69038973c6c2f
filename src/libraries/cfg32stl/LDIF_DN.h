#pragma once

// Distinguished names: RFC 1779 syntax ("," or ";" between RDNs, quoted values, "oid." prefixes),
// of which RFC 4514 is the successor. The classes are values. The constructors that take a
// cisString& parse from the front of the text, remove what they parsed and leave the rest, without
// leading whitespace, to the caller. All of them throw LDIF_Exception with 34/1011 to 34/1014 for
// text that breaks the grammar.

#include <cstddef>
#include <iosfwd>
#include <string>
#include <vector>

#include "LDIF_Util.h"
#include "cisString.h"

/// The attribute type of one part of an RDN, without an "oid." prefix.
class LDIF_RDN_attribute : public cisString {
  public:
    LDIF_RDN_attribute() = default;
    explicit LDIF_RDN_attribute(cisString& text);
    explicit LDIF_RDN_attribute(std::string&& name) : cisString(std::move(name)) {}

    std::string str() const { return text_; }
};

/// The value of one part of an RDN, its escapes resolved.
class LDIF_RDN_value : public cisString {
  public:
    /// How the value was written, and is written again.
    enum Form { hex, quoted, plain };

    LDIF_RDN_value() = default;
    explicit LDIF_RDN_value(cisString& text);
    LDIF_RDN_value(std::string&& bytes, Form form) : cisString(std::move(bytes)), form(form) {}

    /// Throws LDIF_Exception 34/1013 for an empty value.
    virtual std::string str() const;
    void append_to(std::string& out) const;

    int form = quoted;
};

/// One "attribute=value" of an RDN. Values compare without regard to case, whatever their form.
class LDIF_RDN_pair {
  public:
    LDIF_RDN_attribute attribute;
    LDIF_RDN_value value;

    explicit LDIF_RDN_pair(cisString& text);
    /// Throws LDIF_Exception 34/1011 for an empty attribute.
    LDIF_RDN_pair(LDIF_RDN_attribute&& attribute, LDIF_RDN_value&& value);
    LDIF_RDN_pair(const LDIF_RDN_pair&) = default;
    LDIF_RDN_pair(LDIF_RDN_pair&&) noexcept = default;
    LDIF_RDN_pair& operator=(const LDIF_RDN_pair&) = default;
    LDIF_RDN_pair& operator=(LDIF_RDN_pair&&) noexcept = default;
    virtual ~LDIF_RDN_pair() = default;

    virtual int compare(const LDIF_RDN_pair& other) const;
    virtual std::string str() const;
    void append_to(std::string& out) const;
    virtual bool operator==(const LDIF_RDN_pair& other) const { return compare(other) == 0; }
    virtual bool operator<(const LDIF_RDN_pair& other) const { return compare(other) < 0; }
    virtual bool operator>(const LDIF_RDN_pair& other) const { return compare(other) > 0; }
    virtual bool operator!=(const LDIF_RDN_pair& other) const { return compare(other) != 0; }
    virtual bool operator<=(const LDIF_RDN_pair& other) const { return compare(other) <= 0; }
    virtual bool operator>=(const LDIF_RDN_pair& other) const { return compare(other) >= 0; }
};

/// One step of a DN: its pairs, sorted and without equal ones.
class LDIF_RDN {
  public:
    LDIF_RDN() = default;
    explicit LDIF_RDN(cisString& text);
    /// Of pairs in any order; of equal ones the first is kept.
    explicit LDIF_RDN(std::vector<LDIF_RDN_pair>&& pairs);
    LDIF_RDN(const LDIF_RDN&) = default;
    LDIF_RDN(LDIF_RDN&&) noexcept = default;
    LDIF_RDN& operator=(const LDIF_RDN&) = default;
    LDIF_RDN& operator=(LDIF_RDN&&) noexcept = default;
    virtual ~LDIF_RDN() = default;

    /// Inserts a pair in its place; one that is there already is dropped.
    virtual LDIF_RDN& operator+=(const LDIF_RDN_pair& pair);
    virtual std::string str() const;
    void append_to(std::string& out) const;
    /// Pair by pair. An RDN that is a beginning of the other is the greater.
    virtual int compare(const LDIF_RDN& other) const;
    virtual bool operator==(const LDIF_RDN& other) const { return compare(other) == 0; }
    virtual bool operator<(const LDIF_RDN& other) const { return compare(other) < 0; }
    virtual bool operator>(const LDIF_RDN& other) const { return compare(other) > 0; }
    virtual bool operator!=(const LDIF_RDN& other) const { return compare(other) != 0; }
    virtual bool operator<=(const LDIF_RDN& other) const { return compare(other) <= 0; }
    virtual bool operator>=(const LDIF_RDN& other) const { return compare(other) >= 0; }

    const std::vector<LDIF_RDN_pair>& pairs() const { return pairs_; }
    /// Equal RDNs have equal hashes. Continues the hash of the RDNs before it.
    size_t hash(size_t seed, cfg32::hash_kind kind = cfg32::present_hash_kind()) const;

  private:
    std::vector<LDIF_RDN_pair> pairs_;
};

/// A distinguished name. Stored root first: rdns()[0] is the last RDN of the text. The empty DN
/// stands for the root above all entries.
class LDIF_DN {
  public:
    LDIF_DN() = default;
    LDIF_DN(const cisString& text) { *this = text; }
    LDIF_DN(const LDIF_DN&) = default;
    LDIF_DN(LDIF_DN&&) noexcept = default;
    LDIF_DN& operator=(const LDIF_DN&) = default;
    LDIF_DN& operator=(LDIF_DN&&) noexcept = default;
    virtual ~LDIF_DN() = default;

    /// Parses text and puts its RDNs on the root side of what the DN holds already; assign to an
    /// empty DN. A failed parse leaves the RDNs that stood before the failure.
    virtual LDIF_DN& operator=(const cisString& text);
    /// Appends an RDN on the leaf side.
    virtual LDIF_DN& operator+=(const LDIF_RDN& rdn);
    /// The nearest common ancestor; empty when the roots differ.
    virtual LDIF_DN intersection(const LDIF_DN& other) const;
    /// Removes from the root side what this DN has in common with ancestor.
    virtual LDIF_DN& operator-=(const LDIF_DN& ancestor);
    /// The canonical form: leaf first, joined by ", ".
    virtual std::string str() const;
    void append_to(std::string& out) const;
    /// RDN by RDN from the root. An ancestor is greater than its descendants.
    virtual int compare(const LDIF_DN& other) const;
    virtual bool operator==(const LDIF_DN& other) const { return compare(other) == 0; }
    virtual bool operator<(const LDIF_DN& other) const { return compare(other) < 0; }
    virtual bool operator>(const LDIF_DN& other) const { return compare(other) > 0; }
    virtual bool operator!=(const LDIF_DN& other) const { return compare(other) != 0; }
    virtual bool operator<=(const LDIF_DN& other) const { return compare(other) <= 0; }
    virtual bool operator>=(const LDIF_DN& other) const { return compare(other) >= 0; }

    const std::vector<LDIF_RDN>& rdns() const { return rdns_; }
    bool empty() const { return rdns_.empty(); }
    /// Equal DNs have equal hashes.
    size_t hash() const;
    /// Removes the most specific RDN; the DN must not be empty.
    void remove_leaf() { rdns_.pop_back(); }
    /// Removes the count RDNs nearest the root.
    void remove_root_side(size_t count);

  private:
    std::vector<LDIF_RDN> rdns_;
};

std::ostream& operator<<(std::ostream& out, const LDIF_RDN_pair& pair);
std::ostream& operator<<(std::ostream& out, const LDIF_RDN& rdn);
std::ostream& operator<<(std::ostream& out, const LDIF_DN& dn);
