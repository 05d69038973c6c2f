// The syntaxes of texts: ces, cis, enum, time.

#include <gtest/gtest.h>

#include <string>

#include "LDIF_AttrType.h"
#include "LDIF_AttrType.syntax.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"
#include "failures.h"

using namespace cfg32::tests;
using namespace std::string_literals;

namespace {

/// A type like that of an attribute of the table, under another name and with other bounds.
_AttrType type_like(const char* attribute, const char* name, int64_t minimum, int64_t maximum) {
    _AttrType type = *getAttrType(attribute);
    type.name = name;
    type.minimum = minimum;
    type.maximum = maximum;
    return type;
}

_AttrType case_exact(const char* name, int64_t minimum, int64_t maximum) {
    return type_like("charset", name, minimum, maximum);
}

/// An unchecked value; the type may be null.
LDIF_Value value_of(const _AttrType* type, const std::string& text = "") {
    LDIF_Value value(getAttrType(nullptr), text, nullptr);
    value.attrType = type;
    return value;
}

std::string accepted(const char* attribute, const std::string& text, aes_key_data* key = nullptr) {
    return LDIF_Value(getAttrType(attribute), text, key).str();
}

std::string refused(const char* attribute, const std::string& text, aes_key_data* key = nullptr) {
    return summary(failure_of([&] { LDIF_Value(getAttrType(attribute), text, key); }));
}

int sign(int number) { return (number > 0) - (number < 0); }

/// What every failure of a syntax carries.
void expect_details(const LDIF_Exception& e, const std::string& value, const _AttrType* type) {
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_AttrType");
    EXPECT_GT(e.srcLine, 0);
    EXPECT_EQ(e.value, value);
    EXPECT_EQ(e.attrType, type);
    EXPECT_FALSE(e.cause);
}

const std::string not_a_word = "21/1017 value not one of attrType.enumValues";
const std::string not_a_time = "21/1017 value for time not valid";
const std::string no_words = "80/1000 Enumerated values undefined";

}  // namespace

// --- ces ------------------------------------------------------------------------------------

TEST(LDIF_AttrType_text, BoundsAreLengthsInBytes) {
    const struct {
        int64_t minimum;
        int64_t maximum;
        size_t length;
        const char* refusal;  // null: accepted
    } rows[] = {
        {0, 0, 0, nullptr},
        {0, 0, 100000, nullptr},
        {3, 1024, 2, "3 to 1024"},
        {3, 1024, 3, nullptr},
        {3, 1024, 1024, nullptr},
        {3, 1024, 1025, "3 to 1024"},
        {0, 8, 0, nullptr},
        {0, 8, 8, nullptr},
        {0, 8, 9, "0 to 8"},
        {7, 7, 6, "7 to 7"},
        {7, 7, 7, nullptr},
        {7, 7, 8, "7 to 7"},
        // a maximum below the minimum is none
        {5, 3, 4, "5 to 0"},
        {5, 3, 5, nullptr},
        {5, 3, 9999, nullptr},
        {1, 0, 0, "1 to 0"},
        {1, 0, 9999, nullptr},
        // a negative minimum is none
        {-3, 0, 0, nullptr},
        {-3, 2, 2, nullptr},
        {-3, 2, 3, "0 to 2"},
        {-3, -1, 100, nullptr},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::to_string(row.minimum) + " to " + std::to_string(row.maximum) + ": " +
                     std::to_string(row.length));
        const _AttrType type = case_exact("someName", row.minimum, row.maximum);
        const std::string text(row.length, 'x');
        LDIF_Value value = value_of(&type);
        if (!row.refusal) {
            cesFromStr(value, text);
            EXPECT_EQ(value.text, text);
            continue;
        }
        const LDIF_Exception e = failure_of([&] { cesFromStr(value, text); });
        EXPECT_EQ(summary(e), "21/1018 someName length must be "s + row.refusal + " characters");
        expect_details(e, text, &type);
    }
    const _AttrType one = case_exact("one", 0, 1);
    EXPECT_THROW(LDIF_Value(&one, "\u00e9", nullptr), LDIF_Exception);
}

TEST(LDIF_AttrType_text, ARefusedLengthNamesTheAttributeOfTheTable) {
    EXPECT_EQ(refused("oru-slapdPtaAttrMapping", "ab"),
              "21/1018 oru-slapdPtaAttrMapping length must be 3 to 1024 characters");
    EXPECT_EQ(refused("oru-slapdErrorLog", ""),
              "21/1018 oru-slapdErrorLog length must be 1 to 4096 characters");
    EXPECT_EQ(accepted("oru-slapdSslCertificate", ""), "");
    EXPECT_EQ(accepted("oru-slapdSslCertificate", std::string(9999, 'x')).size(), 9999U);
}

TEST(LDIF_AttrType_text, ARefusedLengthOfATypeWithoutNameStartsWithTheLength) {
    const _AttrType type = case_exact(nullptr, 2, 4);
    LDIF_Value value = value_of(&type);
    EXPECT_EQ(summary(failure_of([&] { cesFromStr(value, "x"); })),
              "21/1018 length must be 2 to 4 characters");
}

TEST(LDIF_AttrType_text, TheMessageOfARefusedLengthIsCutTo79Bytes) {
    const std::string name(60, 'n');
    const _AttrType type = case_exact(name.c_str(), 2, 4);
    LDIF_Value value = value_of(&type);
    const std::string whole = name + " length must be 2 to 4 characters";
    EXPECT_EQ(failure_of([&] { cesFromStr(value, "x"); }).msg, whole.substr(0, 79));
}

TEST(LDIF_AttrType_text, TextIsNotTrimmed) {
    EXPECT_EQ(accepted("charset", "  a \t"), "  a \t");
    EXPECT_EQ(accepted("cn", "  a \t"), "  a \t");
}

TEST(LDIF_AttrType_text, WithoutTypeEveryTextIsAccepted) {
    LDIF_Value value = value_of(nullptr);
    cesFromStr(value, std::string(5000, 'x'));
    EXPECT_EQ(value.text.size(), 5000U);
    cisFromStr(value, "");
    EXPECT_EQ(value.text, "");
    EXPECT_EQ(value.binaryLength, 0);
    EXPECT_FALSE(value.binary);
}

TEST(LDIF_AttrType_text, CaseExactTextsCompareByTheirBytes) {
    const struct {
        std::string left;
        std::string right;
        int order;
    } rows[] = {
        {"a", "a", 0},   {"", "", 0},       {"a", "A", 1},      {"A", "a", -1},
        {"a", "ab", -1}, {"", "a", -1},     {"a\xc3", "ab", 1}, {"a\0b"s, "a\0c"s, -1},
        {"a", "a ", -1}, {"a\0b"s, "a", 1},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.left + " and " + row.right);
        const _AttrType* type = getAttrType(nullptr);
        EXPECT_EQ(sign(cesCompare(value_of(type, row.left), value_of(type, row.right))), row.order);
    }
}

TEST(LDIF_AttrType_text, TextsAreHandedOutAsStored) {
    EXPECT_EQ(cesToStr(value_of(nullptr, " a\tB ")), " a\tB ");
}

TEST(LDIF_AttrType_text, BytesAreRefusedInTheNameOfCes) {
    for (const char* attribute : {"charset", "cn", "oru-slapdReferral", "oru-slapdLog",
                                  "oru-slapdSecurity", "oru-slapdAdminPW", "oru-slapdSuffix"}) {
        SCOPED_TRACE(attribute);
        const _AttrType* type = getAttrType(attribute);
        LDIF_Value value = value_of(type, "");
        const LDIF_Exception e = failure_of([&] { type->fromBin(value, "x", 1); });
        EXPECT_EQ(summary(e), "92/1008 Binary representation undefined for syntax: ces");
        expect_details(e, "<binary>", type);
    }
}

TEST(LDIF_AttrType_text, NoBytesLeaveTheValueEmpty) {
    const _AttrType* type = getAttrType("charset");
    EXPECT_EQ(LDIF_Value(type, nullptr, 5, nullptr).text, "");
    EXPECT_EQ(LDIF_Value(type, "x", 0, nullptr).text, "");
    EXPECT_EQ(LDIF_Value(type, "x", -1, nullptr).text, "");
}

TEST(LDIF_AttrType_text, BytesAreHandedOutWhereThereAreSome) {
    LDIF_Value value = value_of(getAttrType("charset"), "some text");
    int length = -1;
    const LDIF_Exception e = failure_of([&] { cesToBin(value, length); });
    EXPECT_EQ(summary(e), "92/1008 Binary representation undefined for syntax: ces");
    expect_details(e, "some text", getAttrType("charset"));
    EXPECT_EQ(length, 0);
    value.set_binary("abc", 3);
    EXPECT_EQ(std::string(cesToBin(value, length), 3), "abc");
    EXPECT_EQ(length, 3);
}

TEST(LDIF_AttrType_text, RepresentationsThatASyntaxLacksAreReportedByItsName) {
    const _AttrType* type = getAttrType("cn");
    const cfg32::throw_site site("/somewhere/src/libraries/cfg32stl/LDIF_AttrType.text.cpp", 12);
    const LDIF_Exception text =
        failure_of([&] { StringSyntaxNotImplemented(site, "photo", type, "the value"); });
    EXPECT_EQ(summary(text), "92/1009 String representation undefined for syntax: photo");
    expect_details(text, "the value", type);
    EXPECT_EQ(text.srcLine, 12);
    const LDIF_Exception bytes =
        failure_of([&] { BinarySyntaxNotImplemented(site, "photo", type, "the value"); });
    EXPECT_EQ(summary(bytes), "92/1008 Binary representation undefined for syntax: photo");
    expect_details(bytes, "the value", type);
    EXPECT_EQ(bytes.srcLine, 12);
}

// --- cis ------------------------------------------------------------------------------------

TEST(LDIF_AttrType_text, CaseIgnoringTextsCompareWithoutCase) {
    const _AttrType* type = getAttrType("cn");
    const auto compare = [&](const std::string& left, const std::string& right) {
        return cisCompare(value_of(type, left), value_of(type, right));
    };
    EXPECT_EQ(compare("", ""), 0);
    EXPECT_EQ(compare("", "a"), -1);
    EXPECT_EQ(compare("a", ""), 1);
    EXPECT_EQ(compare("TRUE", "true"), 0);
    EXPECT_LT(compare("a", "B"), 0);
    EXPECT_GT(compare("B", "a"), 0);
    EXPECT_LT(compare("a", "ab"), 0);
}

// --- enum -----------------------------------------------------------------------------------

TEST(LDIF_AttrType_text, WordsAreAcceptedInAnyCaseAndKeepTheirSpelling) {
    EXPECT_EQ(accepted("oru-slapdSecurity", "sslonly"), "sslonly");
    EXPECT_EQ(accepted("oru-slapdSecurity", "SSLTLS"), "SSLTLS");
    EXPECT_EQ(accepted("oru-slapdReadOnly", "TrUe"), "TrUe");
    EXPECT_EQ(accepted("oru-slapdLogMgmtFrequency", "MIN"), "MIN");
    for (const char* text : {"SSL3", "", "SSL ", " SSL", "SS", "SSLO"}) {
        EXPECT_EQ(refused("oru-slapdSecurity", text), not_a_word) << text;
    }
}

TEST(LDIF_AttrType_text, EveryWordOfARowIsAccepted) {
    getAttrType(nullptr);
    for (int i = 0; i < numAttrs; ++i) {
        if (attrMap[i].fromStr != enumFromStr) {
            continue;
        }
        for (const char* const* word = attrMap[i].enumValues; *word; ++word) {
            EXPECT_EQ(accepted(attrMap[i].name, *word), *word) << attrMap[i].name;
        }
        EXPECT_EQ(refused(attrMap[i].name, "no such word"), not_a_word) << attrMap[i].name;
    }
}

TEST(LDIF_AttrType_text, TheConditionsRunOnIntoTheServerRoles) {
    for (const char* word : {"S", "T", "SOT", "SAT", "any", "primarywrite"}) {
        EXPECT_EQ(accepted("oru-slapdEThreadActivate", word), word);
    }
    EXPECT_EQ(refused("oru-slapdEThreadActivate", "all"), not_a_word);
    EXPECT_EQ(accepted("oru-slapdProxyBackendServerRole", "any"), "any");
    EXPECT_EQ(accepted("oru-slapdProxyBackendServerRole", "primarywrite"), "primarywrite");
    EXPECT_EQ(refused("oru-slapdProxyBackendServerRole", "SAT"), not_a_word);
}

TEST(LDIF_AttrType_text, ARefusedWordIsReportedWithItsType) {
    const _AttrType* type = getAttrType("oru-slapdSecurity");
    LDIF_Value value = value_of(type);
    expect_details(failure_of([&] { enumFromStr(value, "SSL3"); }), "SSL3", type);
}

TEST(LDIF_AttrType_text, WordsNeedATypeWithAList) {
    LDIF_Value without_type = value_of(nullptr);
    const LDIF_Exception e = failure_of([&] { enumFromStr(without_type, "true"); });
    EXPECT_EQ(summary(e), no_words);
    expect_details(e, "true", nullptr);
    _AttrType without_list = *getAttrType("oru-slapdReadOnly");
    without_list.enumValues = nullptr;
    LDIF_Value value = value_of(&without_list);
    EXPECT_EQ(summary(failure_of([&] { enumFromStr(value, "true"); })), no_words);
}

TEST(LDIF_AttrType_text, TheLengthOfAWordIsCheckedFirst) {
    const _AttrType type = type_like("oru-slapdReadOnly", "bounded", 5, 9);
    LDIF_Value value = value_of(&type);
    EXPECT_EQ(summary(failure_of([&] { enumFromStr(value, "true"); })),
              "21/1018 bounded length must be 5 to 9 characters");
    enumFromStr(value, "false");
    EXPECT_EQ(value.text, "false");
}

TEST(LDIF_AttrType_text, AWordOfATypeWithoutNameIsChecked) {
    const _AttrType type = type_like("oru-slapdPwEncryption", nullptr, 0, 0);
    LDIF_Value value = value_of(&type);
    enumFromStr(value, "SHA");
    EXPECT_EQ(value.text, "SHA");
    EXPECT_EQ(summary(failure_of([&] { enumFromStr(value, "imask"); })), not_a_word);
}

TEST(LDIF_AttrType_text, TheMaskingSchemeIsAWordOnlyWithoutKey) {
    const unsigned char bytes[16] = {};
    aes_key_data* key = aes_key_data_from_bytes(bytes, sizeof bytes);
    ASSERT_NE(key, nullptr);
    EXPECT_EQ(accepted("oru-slapdPwEncryption", "imask"), "imask");
    EXPECT_EQ(accepted("oru-slapdPwEncryption", "iMASK"), "iMASK");
    EXPECT_EQ(refused("oru-slapdPwEncryption", "imask", key), not_a_word);
    EXPECT_EQ(accepted("oru-slapdPwEncryption", "AES256", key), "AES256");
    EXPECT_EQ(refused("oru-slapdPwEncryption", "imask2"), not_a_word);
    EXPECT_EQ(refused("oru-slapdSecurity", "imask"), not_a_word);
    const _AttrType other_case = type_like("oru-slapdPwEncryption", "ORU-SLAPDPWENCRYPTION", 0, 0);
    LDIF_Value value = value_of(&other_case);
    enumFromStr(value, "IMask");
    EXPECT_EQ(value.text, "IMask");
    aes_key_data_free(key);
}

// --- time -----------------------------------------------------------------------------------

TEST(LDIF_AttrType_text, ATimeOfDayIsTAndThreeFields) {
    for (const char* text : {"T235959", "t000000", "T000000", "T123456", "T010203",
                             // a field is read as atoi reads it
                             "T1x2y3z", "T 1 2 3", "T+1+2+3"}) {
        EXPECT_EQ(accepted("oru-slapdCachedAttributeAutoAdjustTime", text), text);
    }
    for (const char* text : {"T240000", "T236000", "T235960", "T990000", "X120000", "0120000",
                             "T0x0000", "T000x00", "T00000x", "Tx10000", "T00-100", "T-10000",
                             "T0000-1", "T0 0000", "Tab0000", "T+00000", " T12000"}) {
        EXPECT_EQ(refused("oru-slapdCachedAttributeAutoAdjustTime", text), not_a_time) << text;
    }
    for (const char* text : {"", "T1200", "T12000", "T1200000", "T120000 "}) {
        EXPECT_EQ(refused("oru-slapdCachedAttributeAutoAdjustTime", text),
                  "21/1018 oru-slapdCachedAttributeAutoAdjustTime "
                  "length must be 7 to 7 characters")
            << text;
    }
}

TEST(LDIF_AttrType_text, ARefusedTimeIsReportedWithItsType) {
    const _AttrType* type = getAttrType("oru-slapdCachedAttributeAutoAdjustTime");
    LDIF_Value value = value_of(type);
    expect_details(failure_of([&] { timeFromStr(value, "T240000"); }), "T240000", type);
}

TEST(LDIF_AttrType_text, ATimeThatNoLengthBoundsIsRefusedWhenFieldsAreMissing) {
    const _AttrType type = type_like("oru-slapdCachedAttributeAutoAdjustTime", "unbounded", 0, 0);
    for (const char* text : {"", "T", "T1", "T12", "T123", "T1234"}) {
        LDIF_Value value = value_of(&type);
        EXPECT_EQ(summary(failure_of([&] { timeFromStr(value, text); })), not_a_time) << text;
    }
}

// The words are those of enum.
TEST(LDIF_AttrType_text, ATimeWithoutTypeIsReportedAsWordsUndefined) {
    LDIF_Value value = value_of(nullptr);
    const LDIF_Exception e = failure_of([&] { timeFromStr(value, "T120000"); });
    EXPECT_EQ(summary(e), no_words);
    expect_details(e, "T120000", nullptr);
}
