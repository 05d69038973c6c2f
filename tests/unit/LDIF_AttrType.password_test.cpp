// The syntax of passwords, with the routines of the default platform library.

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <stdexcept>
#include <string>

#include "LDIF_AttrType.h"
#include "LDIF_Value.h"
#include "cfg32_platform.h"
#include "failing_new.h"
#include "failures.h"
#include "password.h"

using namespace cfg32::tests;
using namespace std::string_literals;

namespace {

const char* const source_file = "src/libraries/cfg32stl/LDIF_AttrType";
const char* const length_message = "21/1018 Password length must be 1 to 1024 characters";

struct key_deleter {
    void operator()(aes_key_data* key) const { aes_key_data_free(key); }
};
using key_pointer = std::unique_ptr<aes_key_data, key_deleter>;

key_pointer key_of(size_t size, unsigned char first = 1) {
    unsigned char bytes[32];
    for (unsigned char& byte : bytes) {
        byte = first++;
    }
    return key_pointer(aes_key_data_from_bytes(bytes, size));
}

const _AttrType* pw_type() { return getAttrType("oru-slapdAdminPW"); }

LDIF_Value password(const std::string& text, aes_key_data* key = nullptr) {
    return LDIF_Value(pw_type(), text, key);
}

/// An unchecked value; the type may be null.
LDIF_Value value_of(const _AttrType* type, const std::string& text = "") {
    LDIF_Value value(getAttrType(nullptr), text, nullptr);
    value.attrType = type;
    return value;
}

int sign(int number) { return (number > 0) - (number < 0); }

/// Printable text that can't be compressed by much.
std::string random_text(size_t length) {
    std::mt19937 engine(43);
    std::string text;
    while (text.size() < length) {
        text += static_cast<char>('!' + engine() % 94);
    }
    return text;
}

void expect_failure(const LDIF_Exception& e, const std::string& summary, const std::string& value,
                    const _AttrType* type) {
    EXPECT_EQ(cfg32::tests::summary(e), summary);
    EXPECT_EQ(e.srcFile, source_file);
    EXPECT_GT(e.srcLine, 0);
    EXPECT_EQ(e.value, value);
    EXPECT_EQ(e.attrType, type);
}

std::string unexpected_to_str(const LDIF_Value&) { throw std::runtime_error("unexpected"); }

std::string failing_to_str(const LDIF_Value&) {
    throw LDIF_Exception("some/source", 12, 53, 1003, "refused");
}

}  // namespace

TEST(LDIF_AttrType_password, TheTagsHaveNoTerminatingNul) {
    const auto text = [](const auto& tag) { return std::string(tag, sizeof tag); };
    EXPECT_EQ(text(SHA_BRACED), "{SHA}");
    EXPECT_EQ(text(SSHA_BRACED), "{SSHA}");
    EXPECT_EQ(text(MD5_BRACED), "{MD5}");
    EXPECT_EQ(text(crypt_BRACED), "{crypt}");
    EXPECT_EQ(text(iMASK_BRACED), "{iMASK}");
    EXPECT_EQ(text(AES128_BRACED), "{AES128}");
    EXPECT_EQ(text(AES192_BRACED), "{AES192}");
    EXPECT_EQ(text(AES256_BRACED), "{AES256}");
    EXPECT_EQ(text(VLDL_BRACED), "{VLDL}");
}

TEST(LDIF_AttrType_password, AClearTextIsStoredEncodedByTheKey) {
    const struct {
        size_t key_size;
        const char* tag;
    } rows[] = {{0, "{iMASK}>"}, {16, "{AES128}"}, {24, "{AES192}"}, {32, "{AES256}"}};
    for (const auto& row : rows) {
        const key_pointer key = row.key_size != 0 ? key_of(row.key_size) : nullptr;
        const LDIF_Value value = password("secret", key.get());
        EXPECT_TRUE(value.text.view().starts_with(row.tag)) << value.text;
        EXPECT_EQ(value.text.view().find("secret"), std::string::npos);
        EXPECT_EQ(value.str(), value.text);
        EXPECT_EQ(value.binaryLength, 0);
        EXPECT_FALSE(value.binary);
        EXPECT_EQ(value.compare("secret"s), 0);
        EXPECT_NE(value.compare("Secret"s), 0);
    }
}

TEST(LDIF_AttrType_password, EveryPasswordAttributeIsEncoded) {
    for (const char* name :
         {"oru-slapdAdminPW", "oru-slapdDbUserPW", "oru-slapdLdapCrlPassword", "oru-slapdMasterPW",
          "oru-slapdPeerPW", "oru-slapdSslKeyDatabasePW", "oru-slapdSslPKCS11TokenPW",
          "oru-slapdProxyPw", "oru-slapdPtaBindPW"}) {
        const LDIF_Value value(getAttrType(name), "secret", nullptr);
        EXPECT_TRUE(value.text.view().starts_with("{iMASK}>")) << name;
        EXPECT_EQ(summary(failure_of(
                      [&] { LDIF_Value(getAttrType(name), std::string(1025, 'a'), nullptr); })),
                  length_message);
    }
}

TEST(LDIF_AttrType_password, AClearTextHas1To1024Bytes) {
    const std::string longest(1024, 'a');
    const LDIF_Value value = password(longest);
    EXPECT_NE(value.text, longest);
    EXPECT_TRUE(value.text.view().starts_with("{iMASK}>"));
    EXPECT_EQ(value.compare(longest), 0);
    EXPECT_EQ(password("a").compare("a"s), 0);
    for (const std::string& text : {std::string(1025, 'a'), std::string(70000, 'a'), ""s}) {
        LDIF_Value refused = value_of(pw_type());
        expect_failure(failure_of([&] { pwFromStr(refused, text); }), length_message, text,
                       pw_type());
    }
}

// Unlike in ces, bounds of 0 do not mean unbounded.
TEST(LDIF_AttrType_password, BoundsThatTheTypeLacksAre1And1024) {
    const struct {
        int64_t minimum;
        int64_t maximum;
        size_t length;
        const char* refusal;  // null: accepted
    } rows[] = {
        {0, 0, 0, "1 to 1024"},    {0, 0, 1, nullptr},        {0, 0, 1024, nullptr},
        {0, 0, 1025, "1 to 1024"}, {-4, -4, 0, "1 to 1024"},  {5, 3, 4, "5 to 1024"},
        {5, 3, 5, nullptr},        {5, 3, 1025, "5 to 1024"}, {5, 8, 9, "5 to 8"},
        {5, 8, 8, nullptr},        {5, 8, 4, "5 to 8"},       {0, 1, 2, "1 to 1"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(std::to_string(row.minimum) + " to " + std::to_string(row.maximum) + ": " +
                     std::to_string(row.length));
        _AttrType type = *pw_type();
        type.minimum = row.minimum;
        type.maximum = row.maximum;
        LDIF_Value value = value_of(&type);
        const std::string text(row.length, 'a');
        if (!row.refusal) {
            EXPECT_NO_THROW(pwFromStr(value, text));
            continue;
        }
        EXPECT_EQ(summary(failure_of([&] { pwFromStr(value, text); })),
                  "21/1018 Password length must be "s + row.refusal + " characters");
    }
    LDIF_Value without_type = value_of(nullptr);
    expect_failure(failure_of([&] { pwFromStr(without_type, std::string(1025, 'a')); }),
                   length_message, std::string(1025, 'a'), nullptr);
    pwFromStr(without_type, "secret");
    EXPECT_TRUE(without_type.text.view().starts_with("{iMASK}>"));
}

TEST(LDIF_AttrType_password, AnEncodedTextIsStoredAsGivenWhateverItsLength) {
    const std::string masked = password("secret").text.str();
    for (const std::string& text : {"{SHA}x"s, "{ssha}" + std::string(5000, 'x'), "{crypt}x"s,
                                    "{AES256}no base64"s, "{VLDL}x"s, masked, masked.substr(7)}) {
        EXPECT_EQ(password(text).text, text);
    }
}

TEST(LDIF_AttrType_password, TheLengthOfAClearTextEndsAtANul) {
    const LDIF_Value value = password("abc\0def"s);
    EXPECT_TRUE(value.text.view().starts_with("{iMASK}>"));
    EXPECT_EQ(pwCompare(value, password("abc")), 0);
    EXPECT_EQ(summary(failure_of([] { password("\0abc"s); })), length_message);
}

TEST(LDIF_AttrType_password, AClearTextThatTheRoutineCannotEncodeIsRefused) {
    const std::string text = random_text(1024);
    LDIF_Value value = value_of(pw_type());
    expect_failure(failure_of([&] { pwFromStr(value, text); }), "83/1000 format_password();", text,
                   pw_type());
    EXPECT_EQ(value.text, "");
}

TEST(LDIF_AttrType_password, BytesAreRefused) {
    const LDIF_Value value = password("secret");
    int length = 0;
    EXPECT_EQ(summary(failure_of([&] { pwToBin(value, length); })),
              "92/1008 Binary representation undefined for syntax: ces");
    EXPECT_EQ(summary(failure_of([] { LDIF_Value(pw_type(), "secret", 6, nullptr); })),
              "92/1008 Binary representation undefined for syntax: ces");
    EXPECT_EQ(pwToStr(value), value.text);
}

TEST(LDIF_AttrType_password, PasswordsAreEqualWhenTheirClearTextsAre) {
    const key_pointer key16 = key_of(16);
    const key_pointer key32 = key_of(32, 99);
    aes_key_data* const keys[] = {nullptr, key16.get(), key32.get()};
    for (aes_key_data* left : keys) {
        for (aes_key_data* right : keys) {
            const LDIF_Value one = password("secret", left);
            const LDIF_Value other = password("secret", right);
            EXPECT_NE(one.text, other.text);
            EXPECT_EQ(pwCompare(one, other), 0);
        }
    }
}

TEST(LDIF_AttrType_password, ClearTextsCompareByTheirBytes) {
    const struct {
        const char* left;
        const char* right;
        int order;
    } rows[] = {{"a", "a", 0}, {"a", "b", -1},  {"b", "a", 1},
                {"a", "A", 1}, {"a", "ab", -1}, {"a\xc3", "ab", 1}};
    for (const auto& row : rows) {
        EXPECT_EQ(sign(pwCompare(password(row.left), password(row.right))), row.order)
            << row.left << " and " << row.right;
    }
}

TEST(LDIF_AttrType_password, AnEmptyValueIsLessThanEveryPassword) {
    const LDIF_Value empty = value_of(pw_type());
    const LDIF_Value some = password("a");
    EXPECT_EQ(pwCompare(empty, empty), 0);
    EXPECT_EQ(pwCompare(empty, some), -1);
    EXPECT_EQ(pwCompare(some, empty), 1);
}

TEST(LDIF_AttrType_password, AMaskedTextWithoutItsTagIsDecoded) {
    const LDIF_Value whole = password("secret");
    const LDIF_Value without_tag = value_of(pw_type(), whole.str().substr(7));
    ASSERT_EQ(without_tag.text.view().front(), '>');
    EXPECT_EQ(pwCompare(without_tag, password("secret")), 0);
    EXPECT_EQ(pwCompare(password("secret"), without_tag), 0);
    EXPECT_EQ(cfg32::decoder_input(">abc"), "{iMASK}>abc");
    EXPECT_EQ(cfg32::decoder_input("{SHA}>"), "{SHA}>");
}

TEST(LDIF_AttrType_password, AValueThatCannotBeDecodedIsReportedWithItsSide) {
    const key_pointer key = key_of(16);
    const key_pointer other_key = key_of(16, 50);
    LDIF_Value of_other_key = password("secret", key.get());
    of_other_key.key = other_key.get();
    LDIF_Value of_no_key = password("secret", key.get());
    of_no_key.key = nullptr;
    for (const LDIF_Value& wrong :
         {value_of(pw_type(), "{SHA}hash"), value_of(pw_type(), "in clear"),
          value_of(pw_type(), ">no mask"), of_other_key, of_no_key}) {
        SCOPED_TRACE(wrong.text);
        const LDIF_Value some = password("secret");
        expect_failure(failure_of([&] { pwCompare(wrong, some); }),
                       "84/1000 unformat_password(left);", wrong.str(), pw_type());
        expect_failure(failure_of([&] { pwCompare(some, wrong); }),
                       "84/1000 unformat_password(right);", wrong.str(), pw_type());
        expect_failure(failure_of([&] { pwCompare(wrong, wrong); }),
                       "84/1000 unformat_password(left);", wrong.str(), pw_type());
        expect_failure(failure_of([&] { pwCompare(value_of(pw_type()), wrong); }),
                       "84/1000 unformat_password(right);", wrong.str(), pw_type());
    }
}

TEST(LDIF_AttrType_password, WhatNobodyExpectedIsTheSystemErrorOfTheOperation) {
    _AttrType type = *pw_type();
    type.toStr = unexpected_to_str;
    const LDIF_Value wrong = value_of(&type);
    const LDIF_Value some = password("secret");
    for (const bool is_left : {true, false}) {
        const LDIF_Exception e =
            failure_of([&] { is_left ? pwCompare(wrong, some) : pwCompare(some, wrong); });
        EXPECT_EQ(summary(e), "80/1000 System error in pwCompare()");
        EXPECT_EQ(e.srcFile, source_file);
    }
}

TEST(LDIF_AttrType_password, ExhaustedMemoryIsTheSystemErrorOfTheOperation) {
    int failures = 0;
    for (long which = 0;; ++which) {
        LDIF_Value value = value_of(pw_type());
        std::unique_ptr<LDIF_Exception> failure;
        failing_allocation failing(which);
        try {
            pwFromStr(value, "secret");
        } catch (const LDIF_Exception& e) {
            failure = std::make_unique<LDIF_Exception>(e);
        }
        if (!failing.happened()) {
            break;
        }
        ASSERT_TRUE(failure);
        EXPECT_EQ(summary(*failure), "80/1000 System error in pwFromStr()");
        EXPECT_EQ(failure->srcFile, source_file);
        ++failures;
    }
    EXPECT_GT(failures, 0);
}

TEST(LDIF_AttrType_password, AFailureOfTheLibraryPassesUnchanged) {
    _AttrType type = *pw_type();
    type.toStr = failing_to_str;
    const LDIF_Exception e = failure_of([&] { pwCompare(value_of(&type), password("secret")); });
    EXPECT_EQ(summary(e), "53/1003 refused");
    EXPECT_EQ(e.srcFile, "some/source");
    EXPECT_EQ(e.srcLine, 12);
    EXPECT_FALSE(e.cause);
}
