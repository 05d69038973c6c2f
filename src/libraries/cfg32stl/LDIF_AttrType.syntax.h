#pragma once

// What the code of the syntaxes shares.

#include <cstddef>
#include <string>
#include <string_view>

#include "LDIF_AttrType.h"
#include "failure.h"

namespace cfg32 {

/// What goes with a match, beside the operations of the table.
struct match_support {
    equal_texts* equal;  ///< of stored texts; null where they don't tell all
    size_t (*hash)(const LDIF_Value&, hash_kind);  ///< equal values have equal ones
    void (*complete)(LDIF_Value&);  ///< what a value needs beside its text; null for nothing
};

extern const match_support ces_match;
extern const match_support cis_match;
extern const match_support int_match;
extern const match_support dn_match;
extern const match_support pw_match;

/// Throws a failure that carries the offending text and the value's attribute type.
[[noreturn]] void refuse(const failure& kind, const LDIF_Value& value, std::string_view text,
                         const throw_site& site = {});

/// The same with a message that was put together; kind's text is not used.
[[noreturn]] void refuse_with_message(const failure& kind, const char* message,
                                      const LDIF_Value& value, std::string_view text,
                                      const throw_site& site = {});

/// Lengths that a text may have; an upper bound of 0 is none.
struct length_bounds {
    long lower;
    long upper;

    bool allow(size_t length) const {
        return static_cast<long>(length) >= lower &&
               (upper == 0 || static_cast<long>(length) <= upper);
    }
};

}  // namespace cfg32

/// Throws "Binary representation undefined for syntax: " (92/1008), or "String ..." (92/1009).
[[noreturn]] void BinarySyntaxNotImplemented(const cfg32::throw_site& site, const char* family,
                                             const _AttrType* type, const std::string& value);
[[noreturn]] void StringSyntaxNotImplemented(const cfg32::throw_site& site, const char* family,
                                             const _AttrType* type, const std::string& value);
