// What is seen of passwords.

#include <gtest/gtest.h>

#include "hidden_passwords.h"

using namespace cfg32::tool;
using namespace std::string_literals;

namespace {

struct row {
    std::string given;
    std::string shown;  // "" for the same
};

const row lines[] = {
    // Stored ones.
    {"oru-slapdAdminPW: secret", "oru-slapdAdminPW: ********"},
    {"ORU-SLAPDADMINPW: secret", "ORU-SLAPDADMINPW: ********"},
    {"oru-slapdAdminPW: {iMASK}>secret", "oru-slapdAdminPW: ********"},
    {"oru-slapdAdminPW: {imask}>secret", "oru-slapdAdminPW: ********"},
    {"oru-slapdAdminPW: >secret", "oru-slapdAdminPW: ********"},
    {"oru-slapdAdminPW: {AES256}abc", ""},
    {"oru-slapdAdminPW: {sha}abc", ""},
    {"oru-slapdAdminPW:", ""},
    {"oru-slapdAdminPW", ""},
    // Mistyped names.
    {"oru-slapdAdmin_PW: secret", "oru-slapdAdmin_PW: ********"},
    {"oru-slapdAdmin PW: secret", "oru-slapdAdmin ********"},
    {"oru-slapd AdminPW secret", "oru-slapd ********"},
    {"oru-slapd\u00c4dminPW: secret", "oru-slapd\u00c4dminPW: ********"},
    {"oru-slapdAdmniWP: secret", "oru-slapdAdmniWP: ********"},
    {"oru-slapdDbUserPassword: secret", "oru-slapdDbUserPassword: ********"},
    {"AdminPassword: secret", "AdminPassword: ********"},
    {"password: secret", "password: ********"},
    {"userPassword: {SSHA}secret", "userPassword: ********"},
    {"oru-slapdAdminPWsecret", "oru-slapdAdminPW********"},
    {"oru-slapdAdminPWsecret: x", "oru-slapdAdminPW********"},
    {"oru-slapdAdminPW.secret: x", "oru-slapdAdminPW********"},
    {"userPasswordsecret", "userPassword********"},
    {"My_password is secret: x", "My_password ********"},
    {"My long password: secret", "My ********"},
    {"\"oru-slapdAdminPW\": secret", "\"oru-slapdAdminPW********"},
    {":oru-slapdAdminPW: secret", ":oru-slapdAdminPW: ********"},
    {"oru-slapdPwEncryptoin: rot13", "oru-slapdPwEncryptoin: ********"},
    // Others.
    {"oru-slapdPwEncryption: rot13", ""},
    {"oru-slapdPtaMigratePwd: true", ""},
    {"oru-slapdAdminDN: cn=password", ""},
    {"oru-slapdAdminDN cn=password", ""},
    {"oru-slapdPrt: 389", ""},
    {"cn", ""},
    {"", ""},
    {"# The secret's place is told below", ""},
    // Comments.
    {"# oru-slapdAdminPW: secret", "# oru-slapdAdminPW: ********"},
    {"##oru-slapdAdminPW secret", "##oru-slapdAdminPW ********"},
    {"# old password: secret", "# old ********"},
    // Kept lines.
    {"oru-slapdInvalidLine: oru-slapdAdminPW secret",
     "oru-slapdInvalidLine: oru-slapdAdminPW ********"},
    {"oru-slapdInvalidLine: oru-slapdAdm: inPW: secret",
     "oru-slapdInvalidLine: oru-slapdAdm: ********"},
    {"oru-slapdInvalidLine: oru-slapdPort: pass", ""},
    // What is not seen of a line.
    {"\roru-slapdAdminPW: secret\r", "\roru-slapdAdminPW: ********"},
    {"oru-slapd\rAdminPW: secret", "oru-slapd\rAdminPW: ********"},
    {"oru-slapdAdmin\0PW: secret"s, "oru-slapdAdmin\0PW: ********"s},
    {"oru-slapd\xff"
     "AdminPW: secret",
     "oru-slapd\xff"
     "AdminPW: ********"},
    {"\xfforu-slapdAdminPW: \xff"
     "secret",
     "\xfforu-slapdAdminPW: \xff********"},
};

TEST(HiddenPasswords, AreNotSeenInALine) {
    for (const row& each : lines) {
        EXPECT_EQ(shown_line(each.given), each.shown.empty() ? each.given : each.shown);
    }
}

struct value_row {
    std::string name;
    std::string value;
    std::string shown;
};

TEST(HiddenPasswords, AreNotSeenInAValue) {
    const value_row rows[] = {
        {"oru-slapdAdminPW", "{imask}>secret", "********"},
        {"oru-slapdAdminPW", "{AES256}abc", "{AES256}abc"},
        {"oru-slapdAdmin PW", "secret", "********"},
        {"oru-slapdAdminWP", "secret", "********"},
        {"userPassword", "secret", "********"},
        {"userPassword", "", ""},
        {"oru-slapdPwEncryption", "aes256", "aes256"},
        {"oru-slapdInvalidLine", "oru-slapdAdm: inPW: secret", "oru-slapdAdm: ********"},
        {"nuv-instanceDesc", "password: none", "password: none"},
    };
    for (const value_row& each : rows) {
        EXPECT_EQ(shown_value(each.name, each.value), each.shown) << each.name;
    }
}

TEST(HiddenPasswords, OnlyTheTableMakesAPasswordAttribute) {
    EXPECT_TRUE(is_password_attribute("ORU-slapdAdminPW"));
    EXPECT_FALSE(is_password_attribute("userPassword"));
    EXPECT_TRUE(is_password_line("userPassword: x"));
}

}  // namespace
