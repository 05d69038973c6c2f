// The syntax of distinguished names.

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_DN.h"
#include "LDIF_Value.h"

using namespace cfg32;

namespace {

/// The value's DN: the one it keeps, or else one parsed from its text into parsed.
const LDIF_DN& dn_of(const LDIF_Value& value, LDIF_DN& parsed) {
    if (value.dn) {
        return *value.dn;
    }
    const auto body = [&]() -> const LDIF_DN& { return parsed = cisString(value.str()); };
    return with_context(body, [&](LDIF_Exception& e) {
        e.value = value.text;
        e.attrType = value.attrType;
    });
}

}  // namespace

size_t cfg32::dnHash(const LDIF_Value& value) {
    LDIF_DN parsed;
    return dn_of(value, parsed).hash();
}

int dnCompare(const LDIF_Value& left, const LDIF_Value& right) {
    LDIF_DN parsed_left;
    LDIF_DN parsed_right;
    return dn_of(left, parsed_left).compare(dn_of(right, parsed_right));
}

void dnFromStr(LDIF_Value& value, const std::string& text) {
    const auto body = [&] {
        value.dn = std::make_unique<LDIF_DN>(cisString(text));
        value.text = value.dn->str();
    };
    with_context(body, [&](LDIF_Exception& e) {
        e.value = text;
        e.attrType = value.attrType;
    });
}

void dnFromBin(LDIF_Value& value, const char* bytes, int length) {
    cisFromBin(value, bytes, length);
    dnFromStr(value, std::string(value.text));
}
