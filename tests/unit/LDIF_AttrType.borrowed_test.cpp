// The operations that a syntax borrows from another one.

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "LDIF_Value.h"
#include "failures.h"

using namespace cfg32::tests;

namespace {

constexpr int64_t MAX = std::numeric_limits<int64_t>::max();

struct syntax {
    match_operation* match;
    from_str_operation* fromStr;
    from_bin_operation* fromBin;
    to_str_operation* toStr;
    to_bin_operation* toBin;
    // The families whose operations these are.
    const char* match_lender;
    const char* from_str_lender;
    const char* from_bin_lender;
    const char* to_str_lender;
    const char* to_bin_lender;
};

#define OPERATIONS(family) \
    family##Compare, family##FromStr, family##FromBin, family##ToStr, family##ToBin

const std::map<std::string, syntax> syntaxes = {
    {"ces", {OPERATIONS(ces), "own", "own", "own", "own", "own"}},
    {"cis", {OPERATIONS(cis), "own", "ces", "ces", "ces", "ces"}},
    {"enum", {OPERATIONS(enum), "cis", "own", "cis", "cis", "cis"}},
    {"time", {OPERATIONS(time), "cis", "own", "cis", "cis", "cis"}},
    {"int", {OPERATIONS(int), "own", "own", "own", "ces", "ces"}},
    {"kilo", {OPERATIONS(kilo), "int", "own", "int", "ces", "ces"}},
    {"mask", {OPERATIONS(mask), "int", "own", "own", "int", "int"}},
    {"oid", {OPERATIONS(oid), "cis", "cis", "cis", "cis", "cis"}},
    {"dn", {OPERATIONS(dn), "own", "own", "own", "cis", "cis"}},
    {"dc", {OPERATIONS(dc), "cis", "cis", "cis", "cis", "cis"}},
    {"url", {OPERATIONS(url), "cis", "cis", "cis", "cis", "cis"}},
    {"krbdn", {OPERATIONS(krbdn), "cis", "cis", "cis", "cis", "cis"}},
    {"env", {OPERATIONS(env), "cis", "cis", "cis", "cis", "cis"}},
    {"pw", {OPERATIONS(pw), "own", "own", "ces", "ces", "ces"}},
    {"path", {OPERATIONS(path), "ces", "ces", "ces", "ces", "ces"}},
    {"file", {OPERATIONS(file), "ces", "ces", "ces", "ces", "ces"}},
    {"plugin", {OPERATIONS(plugin), "ces", "ces", "ces", "ces", "ces"}},
};

#undef OPERATIONS

std::string stored(const LDIF_Value& value) {
    std::string text =
        "text " + value.text.str() + ", length " + std::to_string(value.binaryLength);
    for (int i = 0; value.binary && i < value.binaryLength; ++i) {
        text += " " + std::to_string(value.binary.get()[i]);
    }
    return text + (value.dn ? ", dn " + value.dn->str() : "");
}

/// What body gives, or the failure that it throws.
template <class Body>
std::string outcome(Body body) {
    try {
        return body();
    } catch (const LDIF_Exception& e) {
        return "failure " + summary(e) + ", value " + e.value + ", type " +
               (e.attrType && e.attrType->name ? e.attrType->name : "none");
    }
}

std::string text_of_sign(int number) { return number < 0 ? "less" : number > 0 ? "more" : "same"; }

LDIF_Value value_of(const _AttrType* type, const std::string& text) {
    LDIF_Value value(getAttrType(nullptr), text, nullptr);
    value.attrType = type;
    return value;
}

/// Values of all kinds: texts, numbers, DNs.
std::vector<LDIF_Value> samples() {
    std::vector<LDIF_Value> values;
    for (const char* text : {"", "a", "A", "b", "cn=a;o=b", "CN=A, O=B", "T000000", "256"}) {
        values.push_back(value_of(getAttrType(nullptr), text));
    }
    for (const int64_t number : {5, 7, 256}) {
        LDIF_Value value = value_of(getAttrType(nullptr), std::to_string(number));
        value.set_binary(&number, sizeof number);
        values.push_back(value);
    }
    values.push_back(LDIF_Value(getAttrType("oru-slapdAdminDN"), std::string("cn=A;o=b"), nullptr));
    return values;
}

std::vector<_AttrType> constraints() {
    std::vector<_AttrType> types;
    for (const char* name : {"oru-slapdPtaAttrMapping", "oru-slapdSslCipherSpecs", "oru-slapdPort",
                             "oru-slapdCachedAttributeAutoAdjustTime", "oru-slapdSecurity"}) {
        types.push_back(*getAttrType(name));
    }
    types[1].maximum = 65535;
    return types;
}

const char* const sample_texts[] = {"",           "ab",      "abc",     " 256 ",    "255", "70000",
                                    "9999999999", "t235959", "sslonly", "cn=a;o=b", "cn"};

std::vector<std::string> matches(match_operation* match) {
    std::vector<std::string> results;
    const std::vector<LDIF_Value> values = samples();
    for (const LDIF_Value& left : values) {
        for (const LDIF_Value& right : values) {
            results.push_back(outcome([&] { return text_of_sign(match(left, right)); }));
        }
    }
    return results;
}

std::vector<std::string> values_from_str(from_str_operation* fromStr) {
    std::vector<std::string> results;
    for (const _AttrType& type : constraints()) {
        for (const char* text : sample_texts) {
            LDIF_Value value = value_of(&type, "");
            results.push_back(outcome([&] { return fromStr(value, text), stored(value); }));
        }
    }
    return results;
}

std::vector<std::string> values_from_bin(from_bin_operation* fromBin) {
    std::vector<std::string> results;
    for (const _AttrType& type : constraints()) {
        for (const int64_t number : {int64_t{0}, int64_t{255}, int64_t{256}, MAX}) {
            const char* bytes = reinterpret_cast<const char*>(&number);
            const std::pair<const char*, int> inputs[] = {{bytes, 8}, {bytes, 0}, {nullptr, 8}};
            for (const auto& input : inputs) {
                LDIF_Value value = value_of(&type, "");
                results.push_back(outcome([&] {
                    fromBin(value, input.first, input.second);
                    return stored(value);
                }));
            }
        }
    }
    return results;
}

std::vector<std::string> texts_of(to_str_operation* toStr) {
    std::vector<std::string> results;
    for (const LDIF_Value& value : samples()) {
        results.push_back(outcome([&] { return toStr(value); }));
    }
    return results;
}

std::vector<std::string> bytes_of(to_bin_operation* toBin) {
    std::vector<std::string> results;
    for (const LDIF_Value& value : samples()) {
        results.push_back(outcome([&] {
            int length = -1;
            const char* bytes = toBin(value, length);
            return "length " + std::to_string(length) + (bytes == value.binary.get() ? " own" : "");
        }));
    }
    return results;
}

}  // namespace

TEST(LDIF_AttrType_borrowed, EveryBorrowedOperationDoesWhatTheLendersDoes) {
    EXPECT_EQ(syntaxes.size(), 17U);
    const auto is_borrowed = [](const char* lender) { return std::string(lender) != "own"; };
    for (const auto& [family, own] : syntaxes) {
        SCOPED_TRACE(family);
        if (is_borrowed(own.match_lender)) {
            EXPECT_EQ(matches(own.match), matches(syntaxes.at(own.match_lender).match));
        }
        if (is_borrowed(own.from_str_lender)) {
            EXPECT_EQ(values_from_str(own.fromStr),
                      values_from_str(syntaxes.at(own.from_str_lender).fromStr));
        }
        if (is_borrowed(own.from_bin_lender)) {
            EXPECT_EQ(values_from_bin(own.fromBin),
                      values_from_bin(syntaxes.at(own.from_bin_lender).fromBin));
        }
        if (is_borrowed(own.to_str_lender)) {
            EXPECT_EQ(texts_of(own.toStr), texts_of(syntaxes.at(own.to_str_lender).toStr));
        }
        if (is_borrowed(own.to_bin_lender)) {
            EXPECT_EQ(bytes_of(own.toBin), bytes_of(syntaxes.at(own.to_bin_lender).toBin));
        }
    }
}

// Else the test above could not tell one lender from another.
TEST(LDIF_AttrType_borrowed, OwnOperationsDifferFromEachOther) {
    std::set<std::vector<std::string>> matched;
    for (const char* family : {"ces", "cis", "int", "dn", "pw"}) {
        matched.insert(matches(syntaxes.at(family).match));
    }
    EXPECT_EQ(matched.size(), 5U);
    std::set<std::vector<std::string>> from_text;
    for (const char* family : {"ces", "enum", "time", "int", "kilo", "mask", "dn"}) {
        from_text.insert(values_from_str(syntaxes.at(family).fromStr));
    }
    EXPECT_EQ(from_text.size(), 7U);
    std::set<std::vector<std::string>> from_bytes;
    for (const char* family : {"ces", "int", "mask", "dn"}) {
        from_bytes.insert(values_from_bin(syntaxes.at(family).fromBin));
    }
    EXPECT_EQ(from_bytes.size(), 4U);
}

TEST(LDIF_AttrType_borrowed, UrlsAndObjectIdentifiersAreNotHeldToTheirLists) {
    for (const char* name : {"oru-slapdMasterReferral", "oru-slapdReferral", "oru-slapdPtaURL",
                             "oru-slapdLogTALMServer", "oru-slapdSupportedACIMechanisms"}) {
        for (const char* text : {"http://host", "ldap://host", "no scheme", "", "1.2.3"}) {
            EXPECT_EQ(LDIF_Value(getAttrType(name), text, nullptr).str(), text) << name;
        }
    }
}

TEST(LDIF_AttrType_borrowed, PathsAreNotLookedUpInTheFileSystem) {
    for (const char* name : {"oru-slapdErrorLog", "oru-slapdIncludeSchema", "oru-slapdKrbKeyTab"}) {
        EXPECT_EQ(LDIF_Value(getAttrType(name), "/no/such/file ", nullptr).str(), "/no/such/file ");
    }
}
