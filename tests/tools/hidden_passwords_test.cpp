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
    // Of a line that was not ended, or with a name that was broken.
    {"oru-slapdPort: 389 oru-slapdAdminPW: secret",
     "oru-slapdPort: 389 oru-slapdAdminPW: ********"},
    {"oru-slapdPort: xoru-slapdAdminPW: secret", "oru-slapdPort: xoru-slapdAdminPW: ********"},
    {"x: oru-slapdAdminPW= secret", "x: oru-slapdAdminPW= ********"},
    {"x: oru-slapdAdminPW: {AES256}abc", ""},
    {"# old value: oru-slapdAdminPW: secret", "# old value: oru-slapdAdminPW: ********"},
    {"oru-slapdAdm:inPW: secret", "oru-slapdAdm:inPW: ********"},
    {"oru-slap::dAdminPW: secret", "oru-slap::dAdminPW: ********"},
    {"oru\u2010slapd\u2010Admin\u2010P\u2010W: secret",
     "oru\u2010slapd\u2010Admin\u2010P\u2010W: ********"},
    {"nuv-instanceDesc: the adminPW of old, see below: none", ""},
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

TEST(HiddenPasswords, WhatIsKeptInWhatIsKeptIsHidden) {
    std::string line = "oru-slapdAdminPW: secret";
    for (int i = 0; i < 2000; ++i) {
        line = "oru-slapdInvalidLine: " + line;
    }
    EXPECT_EQ(shown_line(line).find("secret"), std::string::npos);
    std::string kept = "oru-slapdInvalidLine: ";
    for (int i = 0; i < 40; ++i) {
        kept += "oru-slapdInvalidLine=";
    }
    EXPECT_EQ(shown_line(kept + "z: z: z: z").find('z'), std::string::npos);
}

TEST(HiddenPasswords, TheLineBelowANameWithoutAPasswordIsOne) {
    EXPECT_TRUE(is_password_below("oru-slapdAdminPW:", "secret"));
    EXPECT_TRUE(is_password_below("oru-slapdAdminPW: \r", "secret"));
    EXPECT_FALSE(is_password_below("oru-slapdAdminPW: x", "secret"));
    EXPECT_FALSE(is_password_below("oru-slapdAdminPW:", "cn: x"));
    EXPECT_FALSE(is_password_below("oru-slapdAdminPW:", "# x"));
    EXPECT_FALSE(is_password_below("oru-slapdAdminPW:", ""));
    EXPECT_FALSE(is_password_below("oru-slapdPort:", "secret"));
    const std::vector<std::string> given = {"oru-slapdAdminPW:", "Isar:", "x:"};
    const std::vector<std::string> shown = {"oru-slapdAdminPW:", "********", "x:"};
    EXPECT_EQ(shown_values("oru-slapdInvalidLine", given), shown);
}

TEST(HiddenPasswords, AreNotSeenInAMessage) {
    EXPECT_EQ(shown_text("entry: cn=xoru-slapdAdminPW: secret\nport: 1\n"),
              "entry: cn=xoru-slapdAdminPW: ********\nport: 1\n");
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
