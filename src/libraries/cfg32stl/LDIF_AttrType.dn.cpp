// The syntax of distinguished names.

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_DN.h"
#include "LDIF_Value.h"
#include "dn_path.h"

using namespace cfg32;

namespace {

/// The value's DN, as it keeps it or as its text tells it.
dn_path path_of(const LDIF_Value& value) {
    if (value.dn) {
        return dn_path(*value.dn);
    }
    return with_context([&] { return dn_path(value.shown()); },
                        [&](LDIF_Exception& e) {
                            e.value = value.text.str();
                            e.attrType = value.attrType;
                        });
}

size_t hash_of_dn(const LDIF_Value& value, hash_kind kind) {
    const dn_path path = path_of(value);
    size_t hash = hash_seed;
    for (size_t i = 0; i < path.size(); ++i) {
        hash = path.hash(i, hash, kind);
    }
    return hash;
}

}  // namespace

const match_support cfg32::dn_match{nullptr, hash_of_dn, nullptr};

int dnCompare(const LDIF_Value& left, const LDIF_Value& right) {
    const dn_path left_path = path_of(left);
    return left_path.compare(path_of(right));
}

void dnFromStr(LDIF_Value& value, const given_text& text) {
    if (!text.empty() && kept_dn::is_simple(text)) {
        value.text = text;
        return;
    }
    const auto body = [&] {
        value.dn = std::make_unique<LDIF_DN>(cisString(text.str()));
        const std::string normalised = value.dn->str();
        value.text = normalised == text.view() ? text : given_text(normalised);
    };
    with_context(body, [&](LDIF_Exception& e) {
        e.value = text.str();
        e.attrType = value.attrType;
    });
}

void dnFromBin(LDIF_Value& value, const char* bytes, int length) {
    cisFromBin(value, bytes, length);
    dnFromStr(value, value.text.str());
}
