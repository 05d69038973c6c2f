#include "exempt_dn.h"

#include <algorithm>
#include <iterator>

namespace cfg32::fuzz {

namespace {

bool is_read_differently(const LDIF_RDN& rdn) {
    const auto& pairs = rdn.pairs();
    return std::any_of(pairs.begin(), std::prev(pairs.end()), [](const LDIF_RDN_pair& pair) {
        return pair.value.form == LDIF_RDN_value::plain && !pair.value.text().ends_with(' ');
    });
}

}  // namespace

bool is_read_differently(const LDIF_DN& dn) {
    return std::any_of(dn.rdns().begin(), dn.rdns().end(),
                       [](const LDIF_RDN& rdn) { return is_read_differently(rdn); });
}

bool is_exempt(const LDIF_Value& value) {
    if (value.attrType->match != dnCompare) {
        return false;
    }
    // Where there is no DN, the text tells it all.
    return value.dn && is_read_differently(*value.dn);
}

}  // namespace cfg32::fuzz
