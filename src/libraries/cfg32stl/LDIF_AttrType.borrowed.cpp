// The operations that one syntax borrows from another, made from the table of syntaxes.

#include <algorithm>
#include <iterator>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Value.h"

using namespace cfg32;

// A borrowed operation calls the lender's; for an own one nothing is made here, and the link fails
// if it is not written.
#define LEND_MATCH(family, lender)                                         \
    int family##Compare(const LDIF_Value& left, const LDIF_Value& right) { \
        return lender##Compare(left, right);                               \
    }                                                                      \
    size_t cfg32::family##Hash(const LDIF_Value& value) { return lender##Hash(value); }
#define LEND_FROM_STR(family, lender)                                  \
    void family##FromStr(LDIF_Value& value, const std::string& text) { \
        lender##FromStr(value, text);                                  \
    }
#define LEND_FROM_BIN(family, lender)                                        \
    void family##FromBin(LDIF_Value& value, const char* bytes, int length) { \
        lender##FromBin(value, bytes, length);                               \
    }
#define LEND_TO_STR(family, lender) \
    std::string family##ToStr(const LDIF_Value& value) { return lender##ToStr(value); }
#define LEND_TO_BIN(family, lender)                                   \
    const char* family##ToBin(const LDIF_Value& value, int& length) { \
        return lender##ToBin(value, length);                          \
    }

#define FROM_own(lend, family)
#define FROM_ces(lend, family) lend(family, ces)
#define FROM_cis(lend, family) lend(family, cis)
#define FROM_int(lend, family) lend(family, int)

// clang-format off
#define SYNTAX(family, match, fromStr, fromBin, toStr, toBin) \
    FROM_##match(LEND_MATCH, family)                          \
    FROM_##fromStr(LEND_FROM_STR, family)                     \
    FROM_##fromBin(LEND_FROM_BIN, family)                     \
    FROM_##toStr(LEND_TO_STR, family)                         \
    FROM_##toBin(LEND_TO_BIN, family)
// clang-format on
#include "syntaxes.def"
#undef SYNTAX

namespace {

struct hashed_match {
    match_operation* match;
    size_t (*hash)(const LDIF_Value&);
};

#define SYNTAX(family, ...) {family##Compare, family##Hash},
constexpr hashed_match hashes[] = {
#include "syntaxes.def"
};
#undef SYNTAX

}  // namespace

size_t cfg32::hash_of(const LDIF_Value& value) {
    const auto belongs = [&](const hashed_match& row) {
        return row.match == value.attrType->match;
    };
    const hashed_match* row = std::find_if(std::begin(hashes), std::end(hashes), belongs);
    return row == std::end(hashes) ? 0 : row->hash(value);
}
