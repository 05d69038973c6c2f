#include "LDIF_Value.h"

#include <gtest/gtest.h>

#include <cstring>
#include <sstream>
#include <stdexcept>
#include <string>

#include "LDIF_AttrType.h"
#include "LDIF_DN.h"
#include "LDIF_Exception.h"
#include "cfg32_platform.h"
#include "failures.h"

using namespace cfg32::tests;
using namespace std::string_literals;

// The address sanitizer shall give what malloc gives for an absurd size: null.
extern "C" __attribute__((weak, visibility("default"))) const char* __asan_default_options() {
    return "allocator_may_return_null=1";
}
extern "C" __attribute__((weak, visibility("default"))) const char* __tsan_default_options() {
    return "allocator_may_return_null=1";
}

namespace {

const char* const source_file = "src/libraries/cfg32stl/LDIF_Value";
const std::string no_to_str = "80/1000 Invalid LDIF_Value detected: attrType->toStr == NULL";
const std::string no_match = "80/1000 Invalid LDIF_Value detected: attrType->match == NULL";

LDIF_Value value_of(const char* attribute, const std::string& text) {
    return LDIF_Value(getAttrType(attribute), text, nullptr);
}

[[noreturn]] void unexpected() { throw std::runtime_error("unexpected"); }
void unexpected_from_str(LDIF_Value&, const cfg32::given_text&) { unexpected(); }
void unexpected_from_bin(LDIF_Value&, const char*, int) { unexpected(); }

void expect_position(const LDIF_Exception& e) {
    EXPECT_EQ(e.srcFile, source_file);
    EXPECT_GT(e.srcLine, 0);
}

}  // namespace

TEST(LDIF_Value, IsMadeByItsSyntax) {
    const LDIF_Value text = value_of("cn", " A b ");
    EXPECT_EQ(text.attrType, getAttrType("cn"));
    EXPECT_EQ(text.str(), " A b ");
    EXPECT_EQ(text.binaryLength, 0);
    EXPECT_FALSE(text.binary);
    EXPECT_FALSE(text.dn);
    EXPECT_EQ(text.key, nullptr);
    const LDIF_Value number = value_of("oru-slapdPort", " 0389 ");
    EXPECT_EQ(number.str(), "389");
    EXPECT_EQ(number.binaryLength, 8);
    const LDIF_Value name = value_of("oru-slapdSuffix", "cn=a;o=b");
    EXPECT_EQ(name.str(), "cn=a, o=b");
    ASSERT_TRUE(name.dn);
}

TEST(LDIF_Value, KeepsItsKey) {
    const unsigned char bytes[16] = {};
    aes_key_data* key = aes_key_data_from_bytes(bytes, sizeof bytes);
    EXPECT_EQ(LDIF_Value(getAttrType("cn"), "a", key).key, key);
    EXPECT_EQ(LDIF_Value(getAttrType("cn"), nullptr, 0, key).key, key);
    aes_key_data_free(key);
}

TEST(LDIF_Value, NeedsAType) {
    const LDIF_Exception text = failure_of([] { LDIF_Value(nullptr, "the text", nullptr); });
    EXPECT_EQ(summary(text),
              "80/1000 Illegal LDIF_Value( string ) constructor: attrType undefined");
    EXPECT_EQ(text.value, "the text");
    expect_position(text);
    const LDIF_Exception bytes = failure_of([] { LDIF_Value(nullptr, "abc", 3, nullptr); });
    EXPECT_EQ(summary(bytes),
              "80/1000 Illegal LDIF_Value( binary ) constructor: attrType undefined");
    EXPECT_EQ(bytes.value, "binary");
    expect_position(bytes);
}

TEST(LDIF_Value, ARefusedTextIsReportedWithItsAttribute) {
    const LDIF_Exception e = failure_of([] { value_of("oru-slapdPort", " 0 "); });
    EXPECT_EQ(summary(e), "21/1015 Integer value out of range");
    EXPECT_EQ(e.value, " 0 ");
    EXPECT_EQ(e.attribute, "oru-slapdPort");
    EXPECT_EQ(e.attrType, getAttrType("oru-slapdPort"));
    expect_position(e);
    ASSERT_TRUE(e.cause);
    EXPECT_EQ(e.cause->srcFile, "src/libraries/cfg32stl/LDIF_AttrType");
    EXPECT_FALSE(e.cause->cause);
}

TEST(LDIF_Value, RefusedBytesAreReportedWithTheirAttribute) {
    const LDIF_Exception e = failure_of([] { LDIF_Value(getAttrType("cn"), "abc", 3, nullptr); });
    EXPECT_EQ(summary(e), "92/1008 Binary representation undefined for syntax: ces");
    EXPECT_EQ(e.attribute, "cn");
    EXPECT_EQ(e.attrType, getAttrType("cn"));
    expect_position(e);
    ASSERT_TRUE(e.cause);
}

TEST(LDIF_Value, WhatNobodyExpectedIsTheSystemErrorOfTheConstructor) {
    _AttrType type = *getAttrType("cn");
    type.fromStr = unexpected_from_str;
    type.fromBin = unexpected_from_bin;
    const LDIF_Exception text = failure_of([&] { LDIF_Value(&type, "a", nullptr); });
    EXPECT_EQ(summary(text), "80/1000 System error in LDIF_Value( string ) constructor");
    EXPECT_EQ(text.value, "a");
    EXPECT_EQ(text.attribute, "cn");
    expect_position(text);
    const LDIF_Exception bytes = failure_of([&] { LDIF_Value(&type, "a", 1, nullptr); });
    EXPECT_EQ(summary(bytes), "80/1000 System error in LDIF_Value( binary ) constructor");
    EXPECT_EQ(bytes.attribute, "cn");
    expect_position(bytes);
}

TEST(LDIF_Value, ANullTextIsASystemError) {
    const char* const text = nullptr;
    EXPECT_EQ(summary(failure_of([&] { LDIF_Value(getAttrType("cn"), text, nullptr); })),
              "80/1000 System error in LDIF_Value( string ) constructor");
}

TEST(LDIF_Value, ACopyHasABinaryFormOfItsOwn) {
    const LDIF_Value number = value_of("oru-slapdPort", "389");
    const LDIF_Value copy(number);
    EXPECT_EQ(copy.attrType, number.attrType);
    EXPECT_EQ(copy.text, "389");
    EXPECT_EQ(copy.binaryLength, 8);
    ASSERT_TRUE(copy.binary);
    EXPECT_NE(copy.binary.get(), number.binary.get());
    EXPECT_EQ(memcmp(copy.binary.get(), number.binary.get(), 8), 0);
}

TEST(LDIF_Value, ACopyHasAParsedDnOfItsOwn) {
    const LDIF_Value name = value_of("oru-slapdSuffix", "cn=a;o=b");
    const LDIF_Value copy(name);
    ASSERT_TRUE(copy.dn);
    EXPECT_NE(copy.dn.get(), name.dn.get());
    EXPECT_TRUE(*copy.dn == *name.dn);
}

TEST(LDIF_Value, AssignmentReplacesEverything) {
    LDIF_Value target = value_of("oru-slapdSuffix", "cn=a");
    target = value_of("oru-slapdPort", "389");
    EXPECT_EQ(target.attrType, getAttrType("oru-slapdPort"));
    EXPECT_EQ(target.text, "389");
    EXPECT_EQ(target.binaryLength, 8);
    EXPECT_FALSE(target.dn);
    const LDIF_Value name = value_of("oru-slapdSuffix", "o=\"b\"");
    target = name;
    EXPECT_EQ(target.text, "o=\"b\"");
    EXPECT_EQ(target.binaryLength, 0);
    EXPECT_FALSE(target.binary);
    ASSERT_TRUE(target.dn);
    const LDIF_Value& self = target;
    target = self;
    EXPECT_EQ(target.text, "o=\"b\"");
    EXPECT_TRUE(target.dn);
}

TEST(LDIF_Value, AValueWhoseBinaryFormAndLengthDisagreeIsNotCopied) {
    const struct {
        bool has_form;
        int length;
        const char* summary;
    } rows[] = {
        {true, 0, "80/1000 Invalid LDIF_Value detected: binaryLength < 1"},
        {false, 8, "80/1000 Invalid LDIF_Value detected: binaryLength != 0"},
        {false, -1, "80/1000 Invalid LDIF_Value detected: binaryLength != 0"},
    };
    for (const auto& row : rows) {
        LDIF_Value wrong = value_of("oru-slapdPort", "389");
        if (!row.has_form) {
            wrong.binary.reset();
        }
        wrong.binaryLength = row.length;
        LDIF_Value target = value_of("cn", "a");
        const LDIF_Exception assigned = failure_of([&] { target = wrong; });
        EXPECT_EQ(summary(assigned), row.summary);
        expect_position(assigned);
        EXPECT_EQ(summary(failure_of([&] { LDIF_Value copy(wrong); })), row.summary);
    }
}

TEST(LDIF_Value, ABinaryFormOfAnyLengthIsCopied) {
    const std::string bytes = "more than a number";
    LDIF_Value value = value_of("oru-slapdPort", "389");
    value.set_binary(bytes.data(), static_cast<int>(bytes.size()));
    const LDIF_Value copy(value);
    ASSERT_EQ(copy.binaryLength, static_cast<int>(bytes.size()));
    EXPECT_NE(copy.binary.get(), value.binary.get());
    EXPECT_EQ(std::string_view(copy.binary.get(), bytes.size()), bytes);
}

TEST(LDIF_Value, ABinaryFormThatNoMemoryHoldsIsNotCopied) {
    LDIF_Value huge = value_of("oru-slapdPort", "389");
    huge.binaryLength = -1;  // nearly all of the address space, as a size
    const LDIF_Exception e = failure_of([&] { LDIF_Value copy(huge); });
    EXPECT_EQ(summary(e), "90/1000 Allocation failed");
    expect_position(e);
}

TEST(LDIF_Value, HasNoTextWithoutTheOperationOfAType) {
    _AttrType type = *getAttrType("cn");
    type.toStr = nullptr;
    const LDIF_Value without_operation(&type, "a", nullptr);
    const LDIF_Exception e = failure_of([&] { without_operation.str(); });
    EXPECT_EQ(summary(e), no_to_str);
    EXPECT_EQ(summary(failure_of([&] { without_operation.shown(); })), no_to_str);
    expect_position(e);
    LDIF_Value without_type = value_of("cn", "a");
    without_type.attrType = nullptr;
    EXPECT_EQ(summary(failure_of([&] { without_type.str(); })), no_to_str);
}

TEST(LDIF_Value, IsNotComparedWithoutTheOperationOfAType) {
    _AttrType type = *getAttrType("cn");
    type.match = nullptr;
    const LDIF_Value without_operation(&type, "a", nullptr);
    LDIF_Value without_type = value_of("cn", "a");
    without_type.attrType = nullptr;
    for (const LDIF_Value* value :
         {&without_operation, static_cast<const LDIF_Value*>(&without_type)}) {
        const LDIF_Exception e = failure_of([&] { value->compare(value_of("cn", "a")); });
        EXPECT_EQ(summary(e), no_match);
        expect_position(e);
        EXPECT_EQ(summary(failure_of([&] { value->compare("a"s); })), no_match);
        EXPECT_EQ(summary(failure_of([&] { (void)(*value == "a"s); })), no_match);
    }
}

TEST(LDIF_Value, ComparesByItsOwnTypesSyntax) {
    EXPECT_EQ(value_of("cn", "A").compare(value_of("charset", "a")), 0);
    EXPECT_LT(value_of("charset", "A").compare(value_of("cn", "a")), 0);
    EXPECT_EQ(value_of("oru-slapdPort", "5").compare(value_of("oru-slapdPort", "7")), 1);
    const LDIF_Value port = value_of("oru-slapdPort", "5");
    EXPECT_EQ(summary(failure_of([&] { port.compare(value_of("cn", "5")); })),
              "18/1000 integer compare on non-integer value");
}

TEST(LDIF_Value, ComparesWithATextThatItsSyntaxAccepts) {
    const LDIF_Value port = value_of("oru-slapdPort", "389");
    EXPECT_EQ(port.compare(" +0389 "s), 0);
    EXPECT_TRUE(port == "389"s);
    EXPECT_FALSE(port == "390"s);
    EXPECT_EQ(port.compare("390"s), 1);
    EXPECT_EQ(summary(failure_of([&] { port.compare("0"s); })),
              "21/1015 Integer value out of range");
    EXPECT_EQ(summary(failure_of([&] { (void)(port == ""s); })),
              "21/1016 Value is not valid integer syntax");
    EXPECT_TRUE(value_of("cn", "") == ""s);
    EXPECT_EQ(value_of("cn", "").compare("a"s), -1);
}

TEST(LDIF_Value, StreamsItsText) {
    std::ostringstream out;
    out << value_of("oru-slapdSuffix", "cn=a;o=b");
    EXPECT_EQ(out.str(), "cn=a, o=b");
}
