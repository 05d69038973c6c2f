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
    }
#define LEND_FROM_STR(family, lender)                                 \
    void family##FromStr(LDIF_Value& value, const given_text& text) { \
        lender##FromStr(value, text);                                 \
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

#define SUPPORT_own(family) family##_match
#define SUPPORT_ces(family) ces_match
#define SUPPORT_cis(family) cis_match
#define SUPPORT_int(family) int_match

struct supported_match {
    match_operation* match;
    const match_support* support;
};

#define SYNTAX(family, match, ...) {family##Compare, &SUPPORT_##match(family)},
constexpr supported_match supported[] = {
#include "syntaxes.def"
};
#undef SYNTAX

/// Null for a match that is not of the table.
const match_support* support_of(const _AttrType& type) {
    const auto belongs = [&](const supported_match& row) { return row.match == type.match; };
    const supported_match* row = std::find_if(std::begin(supported), std::end(supported), belongs);
    return row == std::end(supported) ? nullptr : row->support;
}

}  // namespace

equal_texts* cfg32::equal_texts_of(const _AttrType& type) {
    const match_support* support = support_of(type);
    return support ? support->equal : nullptr;
}

size_t cfg32::hash_of(const LDIF_Value& value, hash_kind kind) {
    const match_support* support = support_of(*value.attrType);
    return support ? support->hash(value, kind) : 0;
}

void cfg32::complete(LDIF_Value& value) {
    const match_support* support = support_of(*value.attrType);
    if (support && support->complete) {
        support->complete(value);
    }
}
