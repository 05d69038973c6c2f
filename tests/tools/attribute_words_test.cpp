// The attribute table in words: what is said of each attribute, what is accepted, which name is
// meant.

#include "schema/attribute_words.h"

#include <gmock/gmock.h>

#include <limits>
#include <set>

#include "LDIF_AttrType.h"
#include "LDIF_Exception.h"
#include "LDIF_Value.h"

using namespace cfg32::tool;

namespace {

bool is_accepted(const _AttrType& type, const std::string& value) {
    try {
        const LDIF_Value made(&type, value, nullptr);
        return true;
    } catch (const LDIF_Exception&) {
        return false;
    }
}

const _AttrType& row(const char* name) { return *find_attribute(name); }

TEST(AttributeWords, EveryAttributeAcceptsItsExample) {
    getAttrType("cn");  // the first look-up counts the rows
    EXPECT_EQ(numAttrs, 197);
    for (int i = 0; i < numAttrs; ++i) {
        const std::string example = example_value(attrMap[i]);
        EXPECT_TRUE(is_accepted(attrMap[i], example)) << attrMap[i].name << ": " << example;
        EXPECT_NE(example, "") << attrMap[i].name;
    }
}

TEST(AttributeWords, AUrlBeginsWithOneOfItsUsualWords) {
    EXPECT_THAT(example_value(row("oru-slapdReferral")), testing::StartsWith("ldap://"));
}

TEST(AttributeWords, NoExampleIsAPlaceholder) {
    for (const _AttrType* type : all_attributes()) {
        EXPECT_NE(example_value(*type), "example") << type->name;
    }
}

struct example_row {
    const char* name;
    const char* value;
};

class ExampleValue : public testing::TestWithParam<example_row> {};

TEST_P(ExampleValue, IsOneThatAnAdministratorCouldMean) {
    EXPECT_EQ(example_value(row(GetParam().name)), GetParam().value);
}

INSTANTIATE_TEST_SUITE_P(Attributes, ExampleValue,
                         testing::Values(example_row{"charset", "UTF-8"},
                                         example_row{"version", "1"},
                                         example_row{"oru-slapdPort", "389"},
                                         example_row{"oru-slapdSecurePort", "636"},
                                         example_row{"oru-slapdPwEncryption", "aes256"},
                                         example_row{"oru-slapdDbName", "people"},
                                         example_row{"oru-slapdAdminDN", "cn=root"},
                                         example_row{"oru-slapdIpAddress", "192.0.2.10"},
                                         example_row{"oru-auditVersion", "3"},
                                         example_row{"oru-slapdPtaAttrMapping", "mail:uid"}));

TEST(AttributeWords, ListsEveryAttributeOnceInOrder) {
    const std::vector<const _AttrType*> rows = all_attributes();
    EXPECT_EQ(rows.size(), 196U);
    for (size_t i = 1; i < rows.size(); ++i) {
        EXPECT_LT(rows[i - 1]->compare(rows[i]->name), 0) << rows[i]->name;
    }
}

TEST(AttributeWords, EveryBoundIsTheLastValueThatIsAccepted) {
    for (const _AttrType* type : all_attributes()) {
        const value_bounds bounds = bounds_of(*type);
        if (bounds.what == bounded::number) {
            EXPECT_TRUE(is_accepted(*type, std::to_string(bounds.minimum))) << type->name;
            EXPECT_TRUE(is_accepted(*type, std::to_string(bounds.maximum))) << type->name;
            EXPECT_FALSE(is_accepted(*type, std::to_string(bounds.minimum - 1))) << type->name;
            EXPECT_FALSE(is_accepted(*type, std::to_string(bounds.maximum + 1))) << type->name;
        }
        if (bounds.what == bounded::length) {
            const auto text = [](int64_t size) {
                return std::string(static_cast<size_t>(size), 'a');
            };
            EXPECT_TRUE(is_accepted(*type, text(bounds.minimum))) << type->name;
            EXPECT_EQ(bounds.minimum > 0 && is_accepted(*type, text(bounds.minimum - 1)), false)
                << type->name;
            EXPECT_EQ(bounds.maximum > 0 && is_accepted(*type, text(bounds.maximum + 1)), false)
                << type->name;
            EXPECT_TRUE(is_accepted(*type, text(bounds.maximum > 0 ? bounds.maximum : 10000)))
                << type->name;
        }
        if (bounds.what == bounded::nothing && syntax_in_words(*type).starts_with("text")) {
            EXPECT_TRUE(is_accepted(*type, "")) << type->name;
            EXPECT_TRUE(is_accepted(*type, std::string(10000, 'a'))) << type->name;
        }
    }
}

TEST(AttributeWords, WordsAreEnforcedExactlyWhereItIsSaid) {
    for (const _AttrType* type : all_attributes()) {
        if (type->enumValues) {
            EXPECT_EQ(is_accepted(*type, "no such word"), !enforces_words(*type)) << type->name;
        }
    }
}

struct accepted_row {
    const char* name;
    const char* words;
};

class AcceptedValues : public testing::TestWithParam<accepted_row> {};

TEST_P(AcceptedValues, AreToldInOneLine) {
    EXPECT_EQ(accepted_values(row(GetParam().name)), GetParam().words);
}

INSTANTIATE_TEST_SUITE_P(
    Attributes, AcceptedValues,
    testing::Values(
        accepted_row{"charset", "text"}, accepted_row{"oru-slapdDbName", "text of 1 to 8 bytes"},
        accepted_row{"oru-slapdServerID", "text of at most 1024 bytes"},
        accepted_row{"cn", "text, upper and lower case alike"},
        accepted_row{"oru-slapdCachedAttribute",
                     "text of 1 to 256 bytes, upper and lower case alike"},
        accepted_row{"oru-slapdReadOnly", "one of: true, false"},
        accepted_row{"oru-slapdEThreadActivate", "one of: S, T, SOT, SAT, any, primarywrite"},
        accepted_row{"oru-slapdProxyBackendServerRole", "one of: any, primarywrite"},
        accepted_row{"oru-slapdPwEncryption",
                     "one of: none, crypt, sha, ssha, md5, aes128, aes192, aes256; "
                     "without a key also imask"},
        accepted_row{"oru-slapdCachedAttributeAutoAdjustTime",
                     "a time of day as Thhmmss, from T000000 to T235959"},
        accepted_row{"oru-slapdPort", "an integer from 1 to 65535"},
        accepted_row{"oru-slapdSizeLimit", "an integer from 0 to 2147483647"},
        accepted_row{"oru-slapdUlimitRSS", "an integer from -1 to 2147483647"},
        accepted_row{"version", "an integer that is 1"},
        accepted_row{"oru-slapdCachedAttributeSize", "a large integer from 0 to 18014398509481982"},
        accepted_row{"oru-slapdSslCipherSpecs",
                     "an integer made of the bits 0xff00, such as 12288"},
        accepted_row{"oru-slapdSupportedACIMechanisms",
                     "text, usually an object identifier: 1.3.99.0.2.26.1 or 1.3.99.0.2.26.2"},
        accepted_row{"oru-slapdAdminDN", "a distinguished name"},
        accepted_row{"oru-slapdSuffix", "a distinguished name, usually not an empty one"},
        accepted_row{"oru-slapdIpAddress", "text, usually a domain name"},
        accepted_row{"oru-slapdReferral",
                     "text, usually a URL that begins with ldap:// or ldaps://"},
        accepted_row{"oru-slapdLogTALMServer", "text, usually a URL"},
        accepted_row{"oru-slapdKrbAdminDN", "text, usually a Kerberos DN"},
        accepted_row{"oru-slapdSetenv", "text, usually NAME=value"},
        accepted_row{"oru-slapdMasterPW",
                     "a password of 1 to 1024 bytes, or one that is encoded already"},
        accepted_row{"oru-slapdLog", "text of 1 to 4096 bytes, usually a path"},
        accepted_row{"oru-slapdIncludeSchema", "text of 1 to 4096 bytes, usually a file name"},
        accepted_row{"oru-slapdPlugin", "text, usually a plug-in directive"}));

TEST(AttributeWords, ARowWithoutANameTakesAnyText) {
    getAttrType("cn");
    EXPECT_EQ(accepted_values(*defaultAttrType), "text");
}

TEST(AttributeWords, EverySyntaxHasItsOwnName) {
    std::set<std::string_view> names;
    std::set<from_str_operation*> operations;
    for (const _AttrType* type : all_attributes()) {
        names.insert(syntax_name(*type));
        operations.insert(type->fromStr);
    }
    EXPECT_EQ(names.size(), 17U);
    EXPECT_EQ(operations.size(), 17U);
}

struct near_row {
    const char* given;
    const char* meant;  // "" for nothing
};

class NearestAttribute : public testing::TestWithParam<near_row> {};

TEST_P(NearestAttribute, IsTheOneThatIsMeant) {
    EXPECT_EQ(nearest_attribute(GetParam().given).value_or(""), GetParam().meant);
}

INSTANTIATE_TEST_SUITE_P(
    Names, NearestAttribute,
    testing::Values(
        near_row{"port", "oru-slapdPort"}, near_row{"oru-slapdPrt", "oru-slapdPort"},
        near_row{"slapdPort", "oru-slapdPort"}, near_row{"PROT", "oru-slapdPort"},
        near_row{"oru-slpadPort", "oru-slapdPort"}, near_row{"oru-slapdPort", "oru-slapdPort"},
        near_row{"ORU-SLAPDPORT", "oru-slapdPort"}, near_row{"cn", "cn"},
        near_row{"objectclas", "objectclass"}, near_row{"sizelimit", "oru-slapdSizeLimit"},
        near_row{"auditbind", "oru-auditBind"}, near_row{"instanceDesc", "nuv-instanceDesc"},
        // as far from oru-slapdSslCipherSpec as from oru-slapdSslCipherSpecs: the table
        // has the second one first
        near_row{"oru-slapdSslCipherSpecx", "oru-slapdSslCipherSpecs"},
        near_row{"oru-slapdWxyz", ""}, near_row{"mail", ""}, near_row{"sn", ""},
        near_row{"oru-slapd", ""}, near_row{"", ""}));

TEST(AttributeWords, NoNameIsNearAWholeLine) {
    EXPECT_EQ(nearest_attribute(std::string(10'000'000, 'a')), std::nullopt);
}

}  // namespace
