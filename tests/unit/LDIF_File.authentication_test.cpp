#include <gmock/gmock.h>

#include <memory>
#include <stdexcept>
#include <string>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "changed_row.h"
#include "failures.h"
#include "temporary_folder.h"

using namespace cfg32::tests;
using testing::HasSubstr;
using testing::Not;

namespace {

constexpr int none = 0;
constexpr int simple = 0x80;
constexpr int not_authenticated = 0;
constexpr int anonymous = 1;
constexpr int administrator = 2;

const char* const admin = "cn=root";
const char* const password = "secret";

struct LDIF_File_authentication : testing::Test {
    temporary_folder folder;

    /// A store whose configuration entry has the lines and an objectclass.
    std::unique_ptr<LDIF_File> store(const std::string& lines, aes_key_data* key = nullptr) {
        return store_of("dn: cn=Configuration\nobjectclass: top\n" + lines, key);
    }

    std::unique_ptr<LDIF_File> store_of(const std::string& entries, aes_key_data* key = nullptr) {
        const std::string path = folder.write("conf", "charset: x\nversion: 1\n\n" + entries);
        return std::make_unique<LDIF_File>(path, "", key);
    }

    std::unique_ptr<LDIF_File> usual_store() {
        return store("oru-slapdAdminDN: cn=root\noru-slapdAdminPW: secret\n");
    }
};

/// The attributes of the store's configuration entry, to give it what no file can.
LDIF_Attributes& configuration(LDIF_File& file) {
    const LDIF_Entry* entry = file.root().find(LDIF_DN(cisString("cn=Configuration")));
    return const_cast<LDIF_Entry*>(entry)->attributes();
}

}  // namespace

TEST_F(LDIF_File_authentication, NobodyIsAuthenticatedAtFirst) {
    EXPECT_EQ(usual_store()->getAuthentication(), not_authenticated);
}

TEST_F(LDIF_File_authentication, CredentialsAreCheckedStepByStep) {
    const auto file = usual_store();
    const std::string too_long(1024, 'x');
    const struct {
        const char* name;
        const char* dn;
        const char* password;
        int method;
        int expected;
    } rows[] = {
        {"method none", nullptr, nullptr, none, anonymous},
        {"method none looks at nothing", "garbage", "wrong", none, anonymous},
        {"method none with the right ones", admin, password, none, anonymous},
        {"another method", admin, password, 1, not_authenticated},
        {"another method without credentials", nullptr, nullptr, 0x81, not_authenticated},
        {"another method", admin, password, -1, not_authenticated},
        {"a SASL bind", admin, password, 0xa3, not_authenticated},
        {"no credentials", nullptr, nullptr, simple, anonymous},
        {"no DN", nullptr, password, simple, not_authenticated},
        {"no password", admin, nullptr, simple, not_authenticated},
        {"an empty DN", "", password, simple, not_authenticated},
        {"an empty password", admin, "", simple, not_authenticated},
        {"both empty", "", "", simple, not_authenticated},
        {"an empty DN and no password", "", nullptr, simple, not_authenticated},
        {"no DN and an empty password", nullptr, "", simple, not_authenticated},
        {"another DN", "cn=other", password, simple, not_authenticated},
        {"a DN below", "cn=x,cn=root", password, simple, not_authenticated},
        {"a blank DN", " ", password, simple, not_authenticated},
        {"a wrong password", admin, "Secret", simple, not_authenticated},
        {"a longer password", admin, "secret ", simple, not_authenticated},
        {"a shorter password", admin, "secre", simple, not_authenticated},
        {"the longest password", admin, too_long.c_str(), simple, not_authenticated},
        {"the right ones", admin, password, simple, administrator},
        {"the DN in another spelling", " CN = Root", password, simple, administrator},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        // From either state before.
        for (const int before : {none, simple}) {
            file->setAuthentication(admin, password, before);
            EXPECT_EQ(file->setAuthentication(row.dn, row.password, row.method), row.expected);
            EXPECT_EQ(file->getAuthentication(), row.expected);
        }
    }
}

TEST_F(LDIF_File_authentication, AnonymousNeedsNoConfigurationEntry) {
    const auto file = store_of("dn: cn=other\nobjectclass: top\n");
    EXPECT_EQ(file->setAuthentication(nullptr, nullptr, simple), anonymous);
    EXPECT_EQ(file->setAuthentication("x", "y", none), anonymous);
}

TEST_F(LDIF_File_authentication, EmptyCredentialsDoNotSearch) {
    const auto file = store_of("dn: cn=other\nobjectclass: top\n");
    EXPECT_EQ(file->setAuthentication("", password, simple), not_authenticated);
    EXPECT_EQ(file->setAuthentication(admin, "", simple), not_authenticated);
    EXPECT_EQ(file->setAuthentication(admin, password, 5), not_authenticated);
}

TEST_F(LDIF_File_authentication, MissingConfigurationEntryIsReportedAndKeepsTheState) {
    const auto file = store_of("dn: cn=other\nobjectclass: top\n");
    ASSERT_EQ(file->setAuthentication(nullptr, nullptr, none), anonymous);
    const LDIF_Exception e = failure_of([&] { file->setAuthentication(admin, password, simple); });
    EXPECT_EQ(summary(e), "32/32 Base entry not found");
    EXPECT_EQ(e.entryDn, "cn=Configuration");
    EXPECT_EQ(e.configFile, file->getFileName());
    EXPECT_EQ(e.srcFile, "src/libraries/cfg32stl/LDIF_File");
    EXPECT_TRUE(e.cause);
    EXPECT_EQ(file->getAuthentication(), anonymous);
}

TEST_F(LDIF_File_authentication, ConfigurationWithoutAnObjectclassAuthenticatesNobody) {
    const auto file =
        store_of("dn: cn=Configuration\noru-slapdAdminDN: cn=root\noru-slapdAdminPW: secret\n");
    EXPECT_EQ(file->setAuthentication(admin, password, simple), not_authenticated);
}

TEST_F(LDIF_File_authentication, ConfigurationWithoutAccountAuthenticatesNobody) {
    EXPECT_EQ(store("")->setAuthentication(admin, password, simple), not_authenticated);
    EXPECT_EQ(store("oru-slapdAdminDN: cn=root\n")->setAuthentication(admin, password, simple),
              not_authenticated);
}

TEST_F(LDIF_File_authentication, WithoutAnAdministratorsNameOnlyThePasswordCounts) {
    const auto file = store("oru-slapdAdminPW: secret\n");
    EXPECT_EQ(file->setAuthentication("cn=anybody", password, simple), administrator);
    EXPECT_EQ(file->setAuthentication("no name", password, simple), administrator);
    EXPECT_EQ(file->setAuthentication("cn=anybody", "wrong", simple), not_authenticated);
}

TEST_F(LDIF_File_authentication, EmptyListOfNamesIsNotChecked) {
    const auto file = usual_store();
    configuration(*file) -= LDIF_Attribute(nullptr, "oru-slapdAdminDN", "");
    configuration(*file) += LDIF_Attribute(nullptr, "oru-slapdAdminDN", "");
    EXPECT_EQ(file->setAuthentication("no name", password, simple), administrator);
}

TEST_F(LDIF_File_authentication, EmptyListOfPasswordsAcceptsAnyPassword) {
    const auto file = usual_store();
    configuration(*file) -= LDIF_Attribute(nullptr, "oru-slapdAdminPW", "");
    configuration(*file) += LDIF_Attribute(nullptr, "oru-slapdAdminPW", "");
    EXPECT_EQ(file->setAuthentication(admin, "anything", simple), administrator);
    EXPECT_EQ(file->setAuthentication("cn=other", "anything", simple), not_authenticated);
    EXPECT_EQ(file->setAuthentication(admin, "", simple), not_authenticated);
}

TEST_F(LDIF_File_authentication, OnlyTheFirstValuesCount) {
    const auto file = store(
        "oru-slapdAdminDN: cn=root\noru-slapdAdminDN: cn=second\n"
        "oru-slapdAdminPW: secret\noru-slapdAdminPW: another\n");
    EXPECT_EQ(file->setAuthentication("cn=root", "secret", simple), administrator);
    EXPECT_EQ(file->setAuthentication("cn=second", "secret", simple), not_authenticated);
    EXPECT_EQ(file->setAuthentication("cn=root", "another", simple), not_authenticated);
}

TEST_F(LDIF_File_authentication, EntryMayBeSpelledInAnotherWay) {
    const auto file = store_of(
        "dn: CN=CONFIGURATION\nOBJECTCLASS: top\nORU-SLAPDADMINDN: cn=root\n"
        "Oru-SlapdAdminPw: secret\n");
    EXPECT_EQ(file->setAuthentication(admin, password, simple), administrator);
}

TEST_F(LDIF_File_authentication, EncodedPasswordOfTheFileIsCompared) {
    const auto file = usual_store();
    file->flush();
    EXPECT_THAT(folder.read("conf"), Not(HasSubstr("secret")));
    LDIF_File again(folder.file("conf"), "", nullptr);
    EXPECT_EQ(again.setAuthentication(admin, password, simple), administrator);
    EXPECT_EQ(again.setAuthentication(admin, "wrong", simple), not_authenticated);
}

TEST_F(LDIF_File_authentication, PasswordEncodedWithAKeyNeedsIt) {
    const unsigned char bytes[16] = {1, 2, 3};
    const std::unique_ptr<aes_key_data, void (*)(aes_key_data*)> key(
        aes_key_data_from_bytes(bytes, sizeof bytes),
        [](aes_key_data* k) { aes_key_data_free(k); });
    ASSERT_TRUE(key);
    const auto file = store("oru-slapdAdminDN: cn=root\noru-slapdAdminPW: secret\n", key.get());
    EXPECT_EQ(file->setAuthentication(admin, password, simple), administrator);
    EXPECT_EQ(file->setAuthentication(admin, "wrong", simple), not_authenticated);
    file->flush();
    EXPECT_THAT(folder.read("conf"), HasSubstr("{AES128}"));
    LDIF_File without_key(folder.file("conf"), "", nullptr);
    ASSERT_EQ(without_key.setAuthentication(nullptr, nullptr, simple), anonymous);
    const LDIF_Exception e =
        failure_of([&] { without_key.setAuthentication(admin, password, simple); });
    EXPECT_EQ(e.ldapErr, 84);
    EXPECT_EQ(e.extErr, 1000);
    EXPECT_EQ(e.entryDn, "cn=Configuration");
    EXPECT_EQ(e.configFile, folder.file("conf"));
    EXPECT_EQ(without_key.getAuthentication(), anonymous);
}

TEST_F(LDIF_File_authentication, CredentialsThatTheSyntaxRefusesAreReportedAndKeepTheState) {
    const auto file = usual_store();
    ASSERT_EQ(file->setAuthentication(admin, password, simple), administrator);
    const std::string too_long(1025, 'x');
    const struct {
        const char* dn;
        const char* password;
        const char* expected;
    } rows[] = {
        {"garbage", password, "34/1013 Missing RDN value: garbage"},
        {"cn=a=b", password, "34/1014 Invalid character in RDN value: ="},
        {admin, too_long.c_str(), "21/1018 Password length must be 1 to 1024 characters"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.dn);
        const LDIF_Exception e =
            failure_of([&] { file->setAuthentication(row.dn, row.password, simple); });
        EXPECT_EQ(summary(e), row.expected);
        EXPECT_EQ(e.entryDn, "cn=Configuration");
        EXPECT_EQ(e.configFile, file->getFileName());
        EXPECT_EQ(file->getAuthentication(), administrator);
    }
}

TEST_F(LDIF_File_authentication, UnexpectedFailureIsASystemErrorAndKeepsTheState) {
    const auto file = usual_store();
    ASSERT_EQ(file->setAuthentication(admin, password, simple), administrator);
    changed_row failing("oru-slapdAdminDN");
    failing->match = [](const LDIF_Value&, const LDIF_Value&) -> int {
        throw std::runtime_error("unexpected");
    };
    const LDIF_Exception e = failure_of([&] { file->setAuthentication(admin, password, simple); });
    EXPECT_EQ(summary(e), "80/1000 System error in LDIF_File::setAuthentication()");
    EXPECT_EQ(e.configFile, file->getFileName());
    EXPECT_EQ(file->getAuthentication(), administrator);
}

TEST_F(LDIF_File_authentication, StateOutlivesAReload) {
    const auto file = usual_store();
    ASSERT_EQ(file->setAuthentication(admin, password, simple), administrator);
    folder.touch("conf", 1);
    EXPECT_EQ(file->refresh(), 1);
    EXPECT_EQ(file->getAuthentication(), administrator);
}
