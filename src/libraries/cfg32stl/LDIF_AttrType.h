#pragma once

// The built-in schema: which attributes the server understands, and the syntax and constraints of
// their values. The rows stand in attributes.def, their word lists in enumerations.h, the syntaxes
// in syntaxes.def with their code in LDIF_AttrType.<family>.cpp.

#include <cstdint>
#include <string>

class LDIF_Value;

// The operations of a syntax.
using match_operation = int(const LDIF_Value& left, const LDIF_Value& right);
using from_str_operation = void(LDIF_Value& value, const std::string& text);
using from_bin_operation = void(LDIF_Value& value, const char* bytes, int length);
using to_str_operation = std::string(const LDIF_Value& value);
using to_bin_operation = const char*(const LDIF_Value& value, int& length);

/// One row of the table: an attribute, its syntax and its constraints.
struct _AttrType {
    const char* name;             ///< null only in the last row
    match_operation* match;       ///< compares two values
    from_str_operation* fromStr;  ///< checks a text and fills the value, or throws
    from_bin_operation* fromBin;  ///< the same for bytes
    to_str_operation* toStr;
    to_bin_operation* toBin;
    const char* const* enumValues;  ///< words, ended by null; null for none
    int64_t bitmask;                ///< bits that a mask value may have; 0 for none
    int64_t minimum;                ///< of a number, or of a text's length in bytes
    int64_t maximum;
    bool isSingle;  ///< at most one value

    /// strcasecmp of the row's name with name.
    int compare(const char* other) const;
    bool operator<(const _AttrType& other) const { return compare(other.name) < 0; }
};

extern _AttrType attrMapArray[];          ///< the rows and a terminating row without a name
extern _AttrType* const attrMap;          ///< its first row
extern int numAttrs;                      ///< rows with a name; 0 until the first look-up
extern const _AttrType* defaultAttrType;  ///< the terminating row; null until the first look-up

/// Counts and sorts the rows. getAttrType() does so once, whichever thread comes first.
void initAttrMap();

/// The row of that name, in any case, among the sorted rows lo up to but not including hi; null
/// when there is none.
const _AttrType* searchAttrMap(const char* name, int lo, int hi);

/// The row of that name, in any case; the default row (any text, any number of values) for a name
/// that is null or not in the table.
const _AttrType* getAttrType(const char* name);

#define SYNTAX(family, ...)             \
    match_operation family##Compare;    \
    from_str_operation family##FromStr; \
    from_bin_operation family##FromBin; \
    to_str_operation family##ToStr;     \
    to_bin_operation family##ToBin;
#include "syntaxes.def"
#undef SYNTAX

class cisString;

namespace cfg32 {

/// The row's name, once for all attributes that are spelled so. The row is one with a name, and
/// lives after the first look-up.
const cisString& name_of(const _AttrType& row);

/// A hash of the value that goes with its type's match: equal values have equal hashes.
size_t hash_of(const LDIF_Value& value);

}  // namespace cfg32
