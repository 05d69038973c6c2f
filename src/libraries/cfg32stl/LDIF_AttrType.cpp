// The attribute table and its look-up.

#include "LDIF_AttrType.h"

#include <strings.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <iterator>
#include <limits>
#include <utility>
#include <vector>

#include "LDIF_Util.h"
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

consteval int count_of_name(const char* name) {
    int count = 0;
    for (const checked_row& row : rows) {
        count += __builtin_strcmp(row.name, name) == 0;
    }
    return count;
}

consteval bool names_are_unique() {
    for (const checked_row& row : rows) {
        const int wanted = __builtin_strcmp(row.name, "oru-slapdIdleTimeOut") == 0 ? 2 : 1;
        if (count_of_name(row.name) != wanted) {
            return false;
        }
    }
    return true;
}

consteval bool bounds_are_in_order() {
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

namespace cfg32 {

/// The rows by their names: a load looks one up for every line. It finds what searchAttrMap() does.
class name_table {
  public:
    using named_type = attribute_name::named_type;

    name_table() {
        initAttrMap();
        const auto count = static_cast<size_t>(numAttrs);
        rows_.reserve(count + 2);
        for (size_t i = 0; i < count; ++i) {
            rows_.push_back({attrMap[i].name, &attrMap[i]});
        }
        for (const named_type& row : rows_) {
            const _AttrType* found = searchAttrMap(row.name.c_str(), 0, numAttrs);
            *slot_of(row.name.text()) = &rows_[static_cast<size_t>(found - attrMap)];
        }
        // What no attribute is called, but every entry has.
        rows_.push_back({"dn", defaultAttrType});
        *slot_of("dn") = &rows_.back();
        rows_.push_back({"", defaultAttrType});
        attribute_name::first_ = rows_.data();
        attribute_name::last_ = &rows_.back();
    }

    /// Null for a name without a row.
    const named_type* find(std::string_view name) const {
        return *const_cast<name_table*>(this)->slot_of(name);
    }

  private:
    static constexpr size_t slots = 1024;  // a power of two, several times the number of rows
    static_assert(std::size(rows) * 4 < slots);

    /// Where the row of that name is, or would be.
    const named_type** slot_of(std::string_view name) {
        size_t at = hash(name);
        while (slots_[at % slots] && !is_named(*slots_[at % slots], name)) {
            ++at;
        }
        return &slots_[at % slots];
    }

    static bool is_named(const named_type& row, std::string_view name) {
        const std::string& own = row.name.text();
        return own.size() == name.size() && (own == name || equal_without_case(own, name));
    }

    /// Of eight characters in the middle, eight at the end, and the length: the names begin mostly
    /// alike.
    static size_t hash(std::string_view name) {
        constexpr uint64_t prime = 0x9e3779b97f4a7c15;
        const uint64_t middle = eight_characters(name.substr(name.size() / 2));
        const uint64_t end =
            eight_characters(name.substr(name.size() - std::min(name.size(), 8UL)));
        return ((middle * prime ^ end) + name.size()) * prime >> 32;
    }

    /// The first eight characters, or all there are. Letters of either case differ in one bit.
    static uint64_t eight_characters(std::string_view text) {
        constexpr uint64_t without_case = 0x2020202020202020;
        uint64_t characters = 0;
        if (text.size() >= sizeof characters) {
            memcpy(&characters, text.data(), sizeof characters);
        } else {
            for (const char c : text) {
                characters = characters << 8 | static_cast<unsigned char>(c);
            }
        }
        return characters | without_case;
    }

    std::vector<named_type> rows_;
    std::array<const named_type*, slots> slots_{};
};

const attribute_name::named_type* attribute_name::first_ = nullptr;
const attribute_name::named_type* attribute_name::last_ = nullptr;

}  // namespace cfg32

namespace {

const name_table& table() {
    // Initialised once, also when many threads make the first look-up together.
    // Nor is it released: what is called when the process ends may still look something up.
    static const name_table& names = *new name_table;
    return names;
}

}  // namespace

attribute_name::attribute_name(std::string_view name) {
    const named_type* row = table().find(name);
    if (const size_t nul = row ? name.npos : name.find('\0'); nul != name.npos) {
        row = table().find(name.substr(0, nul));
    }
    if (name.empty()) {
        named_ = last_;
    } else if (row && row->name.text() == name) {
        named_ = row;
    } else {
        named_ = new named_type{std::string(name), row ? row->type : defaultAttrType};
    }
}

attribute_name::attribute_name(const attribute_name& other)
    : named_(other.is_own() ? new named_type(*other.named_) : other.named_) {}

int attribute_name::compare_names(const attribute_name& other) const {
    // The rows are in the order of their names.
    if (type()->name && other.type()->name) {
        return static_cast<int>(type() > other.type()) - static_cast<int>(type() < other.type());
    }
    return get().compare(other.get());
}

const _AttrType* getAttrType(const char* name) {
    const name_table& names = table();
    const name_table::named_type* row = name ? names.find(name) : nullptr;
    return row ? row->type : defaultAttrType;
}
