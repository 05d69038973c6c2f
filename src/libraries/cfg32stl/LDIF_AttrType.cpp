// The attribute table and its look-up.

#include "LDIF_AttrType.h"

#include <strings.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <iterator>
#include <limits>
#include <vector>

#include "cisString.h"
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

namespace {

/// The rows by their names: a load looks one up for every line. It finds what searchAttrMap() does.
class row_index {
  public:
    row_index() {
        initAttrMap();
        for (int i = 0; i < numAttrs; ++i) {
            const _AttrType* row = searchAttrMap(attrMap[i].name, 0, numAttrs);
            *slot_of(row->name) = row;
        }
    }

    const _AttrType* find(const char* name) const {
        return *const_cast<row_index*>(this)->slot_of(name);
    }

  private:
    static constexpr size_t slots = 1024;  // a power of two, several times the number of rows
    static_assert(std::size(rows) * 4 < slots);

    /// Where the row of that name is, or would be.
    const _AttrType** slot_of(const char* name) {
        size_t at = hash(name);
        while (rows_[at % slots] && rows_[at % slots]->compare(name) != 0) {
            ++at;
        }
        return &rows_[at % slots];
    }

    static size_t hash(const char* name) {
        constexpr size_t prime = 0x100000001b3;  // FNV-1a
        constexpr char lower_case = 0x20;
        size_t hash = 0;
        for (; *name != '\0'; ++name) {
            hash = (hash ^ static_cast<unsigned char>(*name | lower_case)) * prime;
        }
        return hash ^ (hash >> 32);
    }

    std::array<const _AttrType*, slots> rows_{};
};

}  // namespace

const cisString& cfg32::name_of(const _AttrType& row) {
    static const std::vector<cisString> names = [] {
        std::vector<cisString> all;
        all.reserve(static_cast<size_t>(numAttrs));
        for (int i = 0; i < numAttrs; ++i) {
            all.emplace_back(attrMap[i].name);
        }
        return all;
    }();
    return names[static_cast<size_t>(&row - attrMap)];
}

const _AttrType* getAttrType(const char* name) {
    // Initialised once, also when many threads make the first look-up together.
    static const row_index index;
    const _AttrType* row = name ? index.find(name) : nullptr;
    return row ? row : defaultAttrType;
}
