#pragma once

// The built-in schema: which attributes the server understands, and the syntax and constraints of
// their values. The rows stand in attributes.def, their word lists in enumerations.h, the syntaxes
// in syntaxes.def with their code in LDIF_AttrType.<family>.cpp.

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

#include "LDIF_Util.h"
#include "cisString.h"
#include "kept_text.h"

class LDIF_Value;

// The operations of a syntax.
using match_operation = int(const LDIF_Value& left, const LDIF_Value& right);
using from_str_operation = void(LDIF_Value& value, const cfg32::given_text& text);
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

namespace cfg32 {

/// An attribute's name as it is written, and the row that goes with it. Where that is the table's
/// spelling, the name is kept there, once for all attributes.
class attribute_name {
  public:
    explicit attribute_name(std::string_view name);
    attribute_name(const attribute_name& other);
    attribute_name(attribute_name&& other) noexcept : named_(std::exchange(other.named_, last_)) {}
    attribute_name& operator=(const attribute_name& other) { return *this = attribute_name(other); }
    attribute_name& operator=(attribute_name&& other) noexcept {
        std::swap(named_, other.named_);
        return *this;
    }
    ~attribute_name() {
        if (is_own()) {
            delete named_;
        }
    }

    const cisString& get() const { return named_->name; }
    const _AttrType* type() const { return named_->type; }

    /// As the names' compare() orders them.
    int compare(const attribute_name& other) const {
        return named_ == other.named_ ? 0 : compare_names(other);
    }

    struct named_type {
        cisString name;
        const _AttrType* type;
    };

  private:
    friend class name_table;

    int compare_names(const attribute_name& other) const;
    bool is_own() const { return named_ < first_ || named_ > last_; }

    // The table's, once there is a name; the last one is for those without.
    static const named_type* first_;
    static const named_type* last_;

    const named_type* named_;
};

/// Tells whether two texts that the syntax of one type has stored are those of equal values.
using equal_texts = bool(std::string_view left, std::string_view right);

/// The one that goes with the type's match; null where a value is more than its text.
equal_texts* equal_texts_of(const _AttrType& type);

/// A hash of the value that goes with its type's match: equal values have equal hashes.
size_t hash_of(const LDIF_Value& value, hash_kind kind = present_hash_kind());

/// Gives a value that has only its text what else its type's match needs.
void complete(LDIF_Value& value);

}  // namespace cfg32
