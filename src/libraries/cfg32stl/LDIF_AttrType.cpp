// The attribute table and its look-up.

#include "LDIF_AttrType.h"

#include <strings.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <limits>

#include "enumerations.h"

using namespace cfg32;
using namespace cfg32::enumerations;

namespace {

constexpr int64_t MAX = std::numeric_limits<int64_t>::max();
constexpr bool single = true;
constexpr bool multi = false;

}  // namespace

#define ATTRIBUTE(name, family, words, mask, minimum, maximum, values)                             \
    {name, family##Compare, family##FromStr, family##FromBin, family##ToStr, family##ToBin, words, \
     mask, minimum,         maximum,         values},

constinit _AttrType attrMapArray[] = {
#include "attributes.def"
    ATTRIBUTE(nullptr, ces, none, 0, 0, 0, multi)};

#undef ATTRIBUTE

_AttrType* const attrMap = attrMapArray;
int numAttrs = 0;
const _AttrType* defaultAttrType = nullptr;

// What must hold of the table is checked when it is compiled.
namespace {

struct checked_row {
    const char* name;
    int64_t minimum;
    int64_t maximum;
};

#define ATTRIBUTE(name, family, words, mask, minimum, maximum, values) {name, minimum, maximum},
constexpr checked_row rows[] = {
#include "attributes.def"
};
#undef ATTRIBUTE

constexpr int count_of_name(const char* name) {
    int count = 0;
    for (const checked_row& row : rows) {
        count += __builtin_strcmp(row.name, name) == 0;
    }
    return count;
}

constexpr bool names_are_unique() {
    for (const checked_row& row : rows) {
        const int wanted = __builtin_strcmp(row.name, "oru-slapdIdleTimeOut") == 0 ? 2 : 1;
        if (count_of_name(row.name) != wanted) {
            return false;
        }
    }
    return true;
}

constexpr bool bounds_are_in_order() {
    for (const checked_row& row : rows) {
        if (row.maximum != 0 && row.minimum > row.maximum) {
            return false;
        }
    }
    return true;
}

static_assert(std::size(rows) == 197);
static_assert(names_are_unique());
static_assert(bounds_are_in_order());

}  // namespace

int _AttrType::compare(const char* other) const { return strcasecmp(name, other); }

void initAttrMap() {
    int count = 0;
    while (attrMap[count].name) {
        ++count;
    }
    std::sort(attrMap, attrMap + count);
    numAttrs = count;
    defaultAttrType = attrMap + count;
}

const _AttrType* searchAttrMap(const char* name, int lo, int hi) {
    while (lo < hi) {
        const int mid = lo + ((hi - lo) >> 1);
        const int order = attrMap[mid].compare(name);
        if (order == 0) {
            return &attrMap[mid];
        }
        if (order < 0) {
            lo = mid + 1;
        } else {
            hi = mid;
        }
    }
    return nullptr;
}

const _AttrType* getAttrType(const char* name) {
    // Initialised once, also when many threads make the first look-up together.
    [[maybe_unused]] static const bool initialised = (initAttrMap(), true);
    const _AttrType* row = name ? searchAttrMap(name, 0, numAttrs) : nullptr;
    return row ? row : defaultAttrType;
}
