// The syntaxes of numbers: int, kilo, mask.

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <limits>
#include <string>

#include "LDIF_AttrType.h"
#include "LDIF_Value.h"
#include "failures.h"
#include "utf8_locale.h"

using namespace cfg32::tests;

namespace {

constexpr int64_t smallest = std::numeric_limits<int64_t>::min();
constexpr int64_t largest = std::numeric_limits<int64_t>::max();

const std::string invalid = "21/1016 Value is not valid integer syntax";
const std::string out_of_range = "21/1015 Integer value out of range";
const std::string not_comparable = "18/1000 integer compare on non-integer value";
const std::string no_bitmask = "80/1000 Bitmask undefined";
const std::string outside_mask = "21/1019 Bits in value are not within bitmask constraint";

_AttrType type_like(const char* attribute, int64_t minimum, int64_t maximum) {
    _AttrType type = *getAttrType(attribute);
    type.name = "number";
    type.minimum = minimum;
    type.maximum = maximum;
    return type;
}

/// An unchecked value; the type may be null.
LDIF_Value value_of(const _AttrType* type, const std::string& text = "") {
    LDIF_Value value(getAttrType(nullptr), text, nullptr);
    value.attrType = type;
    return value;
}

/// "text number", as the binary form holds the number.
std::string stored(const LDIF_Value& value) {
    int64_t number = 0;
    EXPECT_EQ(value.binaryLength, 8);
    EXPECT_TRUE(value.binary);
    if (value.binary && value.binaryLength == 8) {
        memcpy(&number, value.binary.get(), sizeof number);
    }
    return value.text.str() + " " + std::to_string(number);
}

/// What a type makes of a text: "text number" or the failure.
std::string parsed(const _AttrType* type, const std::string& text) {
    try {
        return stored(LDIF_Value(type, text, nullptr));
    } catch (const LDIF_Exception& e) {
        return summary(e);
    }
}

std::string parsed(const char* attribute, const std::string& text) {
    return parsed(getAttrType(attribute), text);
}

std::string from_bytes(const _AttrType* type, int64_t number) {
    try {
        return stored(LDIF_Value(type, &number, sizeof number, nullptr));
    } catch (const LDIF_Exception& e) {
        return summary(e);
    }
}

void expect_details(const LDIF_Exception& e, const std::string& value, const _AttrType* type) {
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_AttrType");
    EXPECT_GT(e.srcLine, 0);
    EXPECT_EQ(e.value, value);
    EXPECT_EQ(e.attrType, type);
}

struct row {
    const char* text;
    std::string result;
};

}  // namespace

// --- int ------------------------------------------------------------------------------------

TEST(LDIF_AttrType_number, AnIntegerIsDigitsWithASignAndBlanksAround) {
    const _AttrType unbounded = type_like("version", 0, 0);
    const row rows[] = {
        {"0", "0 0"},
        {"-0", "0 0"},
        {"+0", "0 0"},
        {"389", "389 389"},
        {"  389\t", "389 389"},
        {"\n389\r\n", "389 389"},
        {"+010", "10 10"},
        {"-007", "-7 -7"},
        {"0000000000000000000000000000005", "5 5"},
        {"2147483647", "2147483647 2147483647"},
        {"-2147483648", "-2147483648 -2147483648"},
        {"2147483648", out_of_range},
        {"2147483649", out_of_range},
        {"-2147483649", out_of_range},
        {"2147483650", out_of_range},
        {"4294967296", out_of_range},
        {"4294967297", out_of_range},
        {"-4294967295", out_of_range},
        {"99999999999999999999999999", out_of_range},
        {"18446744073709551616", out_of_range},
        {"", invalid},
        {"   ", invalid},
        {"-", invalid},
        {"+", invalid},
        {"+-5", invalid},
        {"--5", invalid},
        {"- 5", invalid},
        {"5-", invalid},
        {"38a", invalid},
        {"a38", invalid},
        {"3 8", invalid},
        {"0x10", invalid},
        {"1.0", invalid},
        {"1e3", invalid},
        {"1,000", invalid},
        {"99999999999999999999999999a", invalid},
    };
    for (const row& row : rows) {
        EXPECT_EQ(parsed(&unbounded, row.text), row.result) << row.text;
    }
}

TEST(LDIF_AttrType_number, BlanksAndDigitsAreThoseOfWideCharacters) {
    REQUIRE_UTF8();
    const _AttrType unbounded = type_like("version", 0, 0);
    EXPECT_EQ(parsed(&unbounded, "\u30005\u3000"), "5 5");
    EXPECT_EQ(parsed(&unbounded, "\uff15"), invalid);
}

TEST(LDIF_AttrType_number, AnIntegerLiesBetweenItsBounds) {
    EXPECT_EQ(parsed("oru-slapdPort", " 389 "), "389 389");
    EXPECT_EQ(parsed("oru-slapdPort", "1"), "1 1");
    EXPECT_EQ(parsed("oru-slapdPort", "65535"), "65535 65535");
    EXPECT_EQ(parsed("oru-slapdPort", "0"), out_of_range);
    EXPECT_EQ(parsed("oru-slapdPort", "65536"), out_of_range);
    EXPECT_EQ(parsed("oru-slapdPort", "38a"), invalid);
    EXPECT_EQ(parsed("version", "1"), "1 1");
    EXPECT_EQ(parsed("version", "2"), out_of_range);
    EXPECT_EQ(parsed("oru-slapdSizeLimit", "-1"), out_of_range);
    EXPECT_EQ(parsed("oru-slapdSizeLimit", "2147483647"), "2147483647 2147483647");
    EXPECT_EQ(parsed("oru-slapdSizeLimit", "2147483648"), out_of_range);
    EXPECT_EQ(parsed("oru-slapdUlimitRSS", "-1"), "-1 -1");
    EXPECT_EQ(parsed("oru-slapdUlimitRSS", "-2"), out_of_range);
    const _AttrType negative = type_like("version", -5, 0);
    EXPECT_EQ(parsed(&negative, "1"), out_of_range);
    EXPECT_EQ(parsed(&negative, "-5"), "-5 -5");
    const _AttrType reversed = type_like("version", 1, 0);
    EXPECT_EQ(parsed(&reversed, "1"), out_of_range);
}

TEST(LDIF_AttrType_number, ARefusedNumberIsReportedWithItsTextAndType) {
    const _AttrType* type = getAttrType("oru-slapdPort");
    for (const char* text : {" 38a ", " 0 ", "99999999999"}) {
        LDIF_Value value = value_of(type);
        expect_details(failure_of([&] { intFromStr(value, text); }), text, type);
    }
}

TEST(LDIF_AttrType_number, WithoutTypeANumberHasNoBounds) {
    LDIF_Value value = value_of(nullptr);
    intFromStr(value, "-7");
    EXPECT_EQ(stored(value), "-7 -7");
    const int64_t number = largest;
    intFromBin(value, reinterpret_cast<const char*>(&number), 8);
    EXPECT_EQ(stored(value), "9223372036854775807 9223372036854775807");
    kiloFromStr(value, "5000000000");
    EXPECT_EQ(stored(value), "5000000000 5000000000");
}

TEST(LDIF_AttrType_number, ANumberInBytesIsPrinted) {
    const _AttrType* type = getAttrType("oru-slapdUlimitRSS");
    EXPECT_EQ(from_bytes(type, 5), "5 5");
    EXPECT_EQ(from_bytes(type, -1), "-1 -1");
    EXPECT_EQ(from_bytes(type, -2), out_of_range);
    EXPECT_EQ(from_bytes(type, smallest), out_of_range);
    EXPECT_EQ(from_bytes(type, largest), "9223372036854775807 9223372036854775807");
    const LDIF_Exception e = failure_of([&] {
        const int64_t number = -2;
        LDIF_Value value = value_of(type);
        intFromBin(value, reinterpret_cast<const char*>(&number), 8);
    });
    expect_details(e, "-2", type);
}

TEST(LDIF_AttrType_number, TheLengthOfBytesIsNotLookedAt) {
    const _AttrType* type = getAttrType("oru-slapdSizeLimit");
    const int64_t number = 77;
    for (const int length : {0, 1, 8, -1}) {
        EXPECT_EQ(stored(LDIF_Value(type, &number, length, nullptr)), "77 77");
        EXPECT_EQ(stored(LDIF_Value(type, nullptr, length, nullptr)), "0 0");
    }
}

// Bytes are held to the bounds also when both are 0, unlike text.
TEST(LDIF_AttrType_number, BoundsOfZeroHoldForBytesButNotForText) {
    const _AttrType type = type_like("version", 0, 0);
    EXPECT_EQ(parsed(&type, "5"), "5 5");
    EXPECT_EQ(from_bytes(&type, 5), out_of_range);
    EXPECT_EQ(from_bytes(&type, 0), "0 0");
}

TEST(LDIF_AttrType_number, BytesNeedNotBeAligned) {
    char bytes[9];
    const int64_t number = 42;
    memcpy(bytes + 1, &number, sizeof number);
    EXPECT_EQ(stored(LDIF_Value(getAttrType("oru-slapdPort"), bytes + 1, 8, nullptr)), "42 42");
}

TEST(LDIF_AttrType_number, NumbersHandOutTheirEightBytes) {
    for (const char* attribute :
         {"oru-slapdPort", "oru-slapdCachedAttributeSize", "oru-slapdSslCipherSpecs"}) {
        const LDIF_Value value(getAttrType(attribute), "256", nullptr);
        int length = 0;
        int64_t number = 0;
        memcpy(&number, value.attrType->toBin(value, length), sizeof number);
        EXPECT_EQ(number, 256);
        EXPECT_EQ(length, 8);
        EXPECT_EQ(value.str(), "256");
    }
}

// The sign is the reverse of every other syntax.
TEST(LDIF_AttrType_number, ComparingNumbersGivesTheSignOfRightMinusLeft) {
    const _AttrType type = type_like("version", smallest, largest);
    const auto compare = [&](int64_t left, int64_t right) {
        return intCompare(LDIF_Value(&type, &left, 8, nullptr),
                          LDIF_Value(&type, &right, 8, nullptr));
    };
    EXPECT_EQ(compare(5, 7), 1);
    EXPECT_EQ(compare(7, 5), -1);
    EXPECT_EQ(compare(7, 7), 0);
    EXPECT_EQ(compare(-1, 1), 1);
    EXPECT_EQ(compare(smallest, largest), 1);
    EXPECT_EQ(compare(largest, smallest), -1);
}

TEST(LDIF_AttrType_number, OnlyNumbersCanBeComparedAsNumbers) {
    const _AttrType* type = getAttrType("oru-slapdPort");
    const LDIF_Value number(type, "389", nullptr);
    const LDIF_Value text = value_of(type, "no number");
    LDIF_Value short_form = value_of(type, "short");
    short_form.set_binary("1234", 4);
    const struct {
        const LDIF_Value* left;
        const LDIF_Value* right;
        const char* offender;
    } rows[] = {{&text, &number, "no number"},
                {&number, &text, "no number"},
                {&short_form, &number, "short"},
                {&number, &short_form, "short"}};
    for (const auto& row : rows) {
        const LDIF_Exception e = failure_of([&] { intCompare(*row.left, *row.right); });
        EXPECT_EQ(summary(e), not_comparable);
        expect_details(e, row.offender, type);
    }
}

// --- kilo -----------------------------------------------------------------------------------

TEST(LDIF_AttrType_number, ALargeIntegerReachesTwiceTheKilobytesOf64Bits) {
    const std::string limit = "18014398509481982";
    const row rows[] = {
        {"0", "0 0"},
        {" +5 ", "5 5"},
        {"007", "7 7"},
        {"2147483648", "2147483648 2147483648"},
        {limit.c_str(), limit + " " + limit},
        {"18014398509481983", out_of_range},
        {"180143985094819820", out_of_range},
        {"180143985094819830", out_of_range},
        {"1801439850948198300", out_of_range},
        {"18446744073709551616", out_of_range},
        {"184467440737095516160", out_of_range},
        {"-1", out_of_range},
        {"", invalid},
        {"-", invalid},
        {"5k", invalid},
        {"5 K", invalid},
        {"0x5", invalid},
    };
    for (const row& row : rows) {
        EXPECT_EQ(parsed("oru-slapdCachedAttributeSize", row.text), row.result) << row.text;
    }
}

// A negative one is printed as the unsigned number with the same bits.
TEST(LDIF_AttrType_number, ALargeIntegerPrintsUnsigned) {
    const _AttrType type = type_like("oru-slapdCachedAttributeSize", 0, 0);
    EXPECT_EQ(parsed(&type, "-1"), "18446744073709551615 -1");
    EXPECT_EQ(parsed(&type, "-18014398509481982"), "18428729675200069634 -18014398509481982");
    EXPECT_EQ(parsed(&type, "-18014398509481983"), out_of_range);
}

TEST(LDIF_AttrType_number, ALargeIntegerLiesBetweenItsBounds) {
    const _AttrType type = type_like("oru-slapdCachedAttributeSize", 10, 20);
    EXPECT_EQ(parsed(&type, "9"), out_of_range);
    EXPECT_EQ(parsed(&type, "10"), "10 10");
    EXPECT_EQ(parsed(&type, "21"), out_of_range);
    EXPECT_EQ(from_bytes(&type, 20), "20 20");
    EXPECT_EQ(from_bytes(&type, 21), out_of_range);
}

// --- mask -----------------------------------------------------------------------------------

TEST(LDIF_AttrType_number, AMaskHasOnlyPermittedBits) {
    const row rows[] = {
        {"0", "0 0"},          {"256", "256 256"},           {" +65280 ", "65280 65280"},
        {"255", outside_mask}, {"257", outside_mask},        {"65536", outside_mask},
        {"-1", outside_mask},  {"2147483648", out_of_range}, {"0xff00", invalid},
        {"", invalid},
    };
    for (const row& row : rows) {
        EXPECT_EQ(parsed("oru-slapdSslCipherSpecs", row.text), row.result) << row.text;
    }
    const _AttrType* type = getAttrType("oru-slapdSslCipherSpecs");
    LDIF_Value value = value_of(type);
    expect_details(failure_of([&] { maskFromStr(value, "255"); }), "255", type);
}

TEST(LDIF_AttrType_number, AMaskInBytesIsHeldToBoundsAndBits) {
    _AttrType type = type_like("oru-slapdSslCipherSpecs", 0, 65535);
    EXPECT_EQ(from_bytes(&type, 256), "256 256");
    EXPECT_EQ(from_bytes(&type, 255), outside_mask);
    EXPECT_EQ(from_bytes(&type, 65536), out_of_range);
    type.maximum = 0;
    EXPECT_EQ(from_bytes(&type, 256), out_of_range);
    EXPECT_EQ(from_bytes(&type, 0), "0 0");
}

TEST(LDIF_AttrType_number, AMaskNeedsATypeWithABitmask) {
    _AttrType without_bits = type_like("oru-slapdSslCipherSpecs", 0, 65535);
    without_bits.bitmask = 0;
    for (const _AttrType* type :
         {static_cast<const _AttrType*>(nullptr), static_cast<const _AttrType*>(&without_bits)}) {
        LDIF_Value value = value_of(type);
        const LDIF_Exception text = failure_of([&] { maskFromStr(value, "no number"); });
        EXPECT_EQ(summary(text), no_bitmask);
        expect_details(text, "no number", type);
        const LDIF_Exception bytes = failure_of([&] { maskFromBin(value, "12345678", 8); });
        EXPECT_EQ(summary(bytes), no_bitmask);
        expect_details(bytes, "<binary>", type);
    }
}

TEST(LDIF_AttrType_number, ANegativeBitmaskPermitsTheHighestBits) {
    _AttrType type = type_like("oru-slapdSslCipherSpecs", smallest, largest);
    type.bitmask = smallest | 0xff00;
    EXPECT_EQ(from_bytes(&type, smallest),
              std::to_string(smallest) + " " + std::to_string(smallest));
    EXPECT_EQ(from_bytes(&type, 0x100), "256 256");
    EXPECT_EQ(from_bytes(&type, 0x10000), outside_mask);
}
