#include "diff/difference.h"

#include <gtest/gtest.h>

#include <map>
#include <random>
#include <set>

#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "change/ldif_reader.h"
#include "change/update.h"
#include "hidden_passwords.h"
#include "key.h"
#include "ldif_writer.h"
#include "password.h"
#include "temporary_folder.h"

namespace cfg32::tool {

namespace {

constexpr unsigned seed = 4711;
constexpr int pairs_of_files = 400;

/// Makes files of which each two have much in common. No attribute has a second value that takes
/// only one: a load lets it pass, but no change does.
class random_files {
  public:
    std::string next() {
        std::string text = one_of({"", "version: 1\n", "charset: UTF-8\n"});
        text += "\n";
        names_.clear();
        for (unsigned count = below(7); count > 0; --count) {
            text += entry();
        }
        return text;
    }

  private:
    unsigned below(unsigned count) { return static_cast<unsigned>(random_() % count); }

    std::string one_of(std::initializer_list<const char*> words) {
        return *(words.begin() + below(static_cast<unsigned>(words.size())));
    }

    std::string dn() {
        std::string name = one_of({"cn=a", "cn=B", "ou=c"});
        for (unsigned depth = below(3); depth > 0; --depth) {
            name += one_of({", cn=a", ",CN=b", ", ou=c"});
        }
        return name;
    }

    std::string entry() {
        const std::string name = dn();
        if (!names_.insert(LDIF_DN(cisString(name))).second) {
            return {};
        }
        std::string text = one_of({"", "# A comment.\n"}) + "dn: " + name + "\n";
        std::set<std::string> single;
        for (unsigned count = below(6); count > 0; --count) {
            const std::string line = one_of(
                {"cn: x", "cn: X", "cn: y", "oru-slapdPort: 1", "oru-slapdPort: 2",
                 "oru-slapdReferral: ldap://one", "oru-slapdReferral: ldap://two",
                 "oru-slapdReferral: LDAP://TWO", "oru-slapdReferral: ldap://three", "x-unknown: 1",
                 "x-unknown: 2", "oru-slapdLogMessages: true", "oru-slapdPeerPW: Isar",
                 "oru-slapdPeerPW: Inn", "oru-slapdMasterDN: cn=a,o=b",
                 "oru-slapdMasterDN: CN=A, O=B", "objectclass: top", "objectclass: z", "no colon"});
            const std::string attribute = line.substr(0, line.find(':'));
            const bool is_single = getAttrType(attribute.c_str())->isSingle;
            if (!is_single || single.insert(attribute).second) {
                text += line + "\n";
            }
        }
        return text + "\n";
    }

    std::mt19937 random_{seed};
    std::set<LDIF_DN> names_;
};

std::string lower(std::string text) {
    for (char& c : text) {
        c = static_cast<char>(tolower(static_cast<unsigned char>(c)));
    }
    return text;
}

std::string decoded(const std::string& stored, aes_key_data* key) {
    char* clear = nullptr;
    EXPECT_TRUE(unformat_password(decoder_input(stored).c_str(), &clear, key, CFG32_PASSWORD_FLAG));
    std::string text(clear ? clear : "");
    _slapd_utils_decode_buffer_free(&clear);
    return text;
}

/// What a file says, apart from order, case, comments and the form of passwords.
using content = std::map<std::string, std::map<std::string, std::set<std::string>>>;

content content_of(const LDIF_Entry& root, aes_key_data* key) {
    content all;
    for_each_in_preorder(root, [&](const LDIF_Entry& entry) {
        auto& attributes = all[entry.is_root() ? "" : lower(entry.dn().str())];
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            const std::string& name = attribute.name().text();
            for (const LDIF_Value& value : attribute.values()) {
                attributes[lower(name)].insert(
                    is_password_attribute(name) ? decoded(value.str(), key) : lower(value.str()));
            }
        }
    });
    return all;
}

std::string ldif_of(const std::vector<change_record>& records) {
    std::string text;
    for (const change_record& each : records) {
        text += ldif(each);
    }
    return text;
}

std::vector<change_record> records_of(const std::string& text) {
    std::vector<change_record> records;
    for (const auto& each : read_ldif(text, change_record::modify)) {
        const auto* error = std::get_if<ldif_error>(&each);
        EXPECT_FALSE(error) << (error ? error->text : "") << "\n" << text;
        if (!error) {
            records.push_back(std::get<change_record>(each));
        }
    }
    return records;
}

class difference : public testing::TestWithParam<bool> {
  protected:
    void SetUp() override {
        if (GetParam()) {
            folder.write("key", std::string(32, 'k'));
            chmod(folder.file("key").c_str(), 0600);
            options.key_file = folder.file("key");
        }
        options.file = folder.file("from");
        options.has_no_backup = true;
    }

    /// Loaded a second time when the first load had to put lines aside: they read back without
    /// blanks at their ends.
    const LDIF_File& load(const std::string& name, const std::string& text, aes_key_data* key) {
        folder.write(name, text);
        for (int i = 0; i < 2; ++i) {
            files_[name] = std::make_unique<LDIF_File>(folder.file(name), "", key);
        }
        return *files_[name];
    }

    tests::temporary_folder folder;
    settings options;

  private:
    std::map<std::string, std::unique_ptr<LDIF_File>> files_;
};

TEST_P(difference, CarriedOutOnOneFileGivesTheContentOfTheOther) {
    const key passwords(options);
    random_files files;
    for (int i = 0; i < pairs_of_files; ++i) {
        const std::string text = files.next();
        const LDIF_File& from = load("from", text, passwords.get());
        const LDIF_File& to = load("to", files.next(), passwords.get());
        const content wanted = content_of(to.root(), passwords.get());
        const bool is_same = content_of(from.root(), passwords.get()) == wanted;
        const std::string changes = ldif_of(changes_between(from.root(), to.root()));
        EXPECT_EQ(changes.empty(), is_same) << text << changes;
        EXPECT_EQ(differences(from.root(), to.root()).empty(), is_same) << text << changes;
        update(options, records_of(changes), {});
        const LDIF_File changed(folder.file("from"), "", passwords.get());
        EXPECT_EQ(content_of(changed.root(), passwords.get()), wanted) << text << changes;
        ASSERT_FALSE(HasFailure());
    }
}

INSTANTIATE_TEST_SUITE_P(WithAndWithoutKey, difference, testing::Bool());

}  // namespace

}  // namespace cfg32::tool
