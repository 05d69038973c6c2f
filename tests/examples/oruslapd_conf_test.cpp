// Promises about the example configuration.

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <memory>
#include <set>
#include <string>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "temporary_folder.h"
#include "tree_description.h"
#include "utf8_locale.h"

using cfg32::for_each_in_preorder;
using cfg32::tests::description;
using cfg32::tests::temporary_folder;

namespace {

std::string example(const char* name) {
    std::ifstream in(std::string(CFG32_EXAMPLES) + "/" + name, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

using key_pointer = std::unique_ptr<aes_key_data, void (*)(aes_key_data*)>;

key_pointer example_key() {
    const std::string bytes = example("oruslapd.key");
    const auto* data = reinterpret_cast<const unsigned char*>(bytes.data());
    return {aes_key_data_from_bytes(data, bytes.size()),
            [](aes_key_data* key) { aes_key_data_free(key); }};
}

struct oruslapd_conf : testing::Test {
    void SetUp() override {
        REQUIRE_UTF8();
        path = folder.write("oruslapd.conf", example("oruslapd.conf"));
        file = std::make_unique<LDIF_File>(path, "", key.get());
    }

    template <class Use>
    void for_each_attribute(Use use) const {
        for_each_in_preorder(file->root(), [&](const LDIF_Entry& entry) {
            for (const LDIF_Attribute& attribute : entry.attributes()) {
                use(attribute);
            }
        });
    }

    temporary_folder folder;
    key_pointer key = example_key();
    std::string path;
    std::unique_ptr<LDIF_File> file;
};

}  // namespace

TEST_F(oruslapd_conf, LoadsWithoutAnInvalidLine) {
    EXPECT_EQ(folder.read("oruslapd.conf"), example("oruslapd.conf"));
}

TEST_F(oruslapd_conf, UsesMostOfTheTable) {
    int entries = -1;  // less the root
    std::set<const _AttrType*> used;
    for_each_in_preorder(file->root(), [&](const LDIF_Entry&) { ++entries; });
    for_each_attribute([&](const LDIF_Attribute& attribute) {
        if (attribute.values().type()->name) {
            used.insert(attribute.values().type());
        }
    });
    EXPECT_GE(entries, 60);
    EXPECT_GE(used.size(), 120U);
}

TEST_F(oruslapd_conf, EveryEntryHasItsParent) {
    int orphans = 0;
    for_each_in_preorder(file->root(), [&](const LDIF_Entry& entry) {
        orphans += entry.relative_dn().rdns().size() > 1 ? 1 : 0;
    });
    EXPECT_EQ(orphans, 0);
}

TEST_F(oruslapd_conf, SingleValuedAttributesHaveOneValue) {
    for_each_attribute([&](const LDIF_Attribute& attribute) {
        EXPECT_TRUE(!attribute.values().type()->isSingle || attribute.values().size() == 1)
            << attribute.name().text();
    });
}

TEST_F(oruslapd_conf, EveryPasswordIsStoredEncodedAndAllButTheHashedOneDecode) {
    const std::string text = example("oruslapd.conf");
    int passwords = 0;
    int hashed = 0;
    for_each_attribute([&](const LDIF_Attribute& attribute) {
        if (attribute.values().type()->match != getAttrType("oru-slapdAdminPW")->match) {
            return;
        }
        const LDIF_Value& value = *attribute.values().begin();
        ++passwords;
        // A text that is not encoded would have been encoded anew.
        EXPECT_NE(text.find(value.text), std::string::npos) << value.text;
        if (value.str().starts_with("{SSHA}")) {
            ++hashed;
        } else {
            EXPECT_EQ(value.compare(value), 0) << value.text;
        }
    });
    EXPECT_GE(passwords, 9);
    EXPECT_EQ(hashed, 1);
}

TEST_F(oruslapd_conf, IsWrittenSoThatItReadsBack) {
    const std::string tree = description(*file);
    file->flush();
    const std::string written = folder.read("oruslapd.conf");
    LDIF_File again(path, "", key.get());
    EXPECT_EQ(description(again), tree);
    again.flush();
    EXPECT_EQ(folder.read("oruslapd.conf"), written);
}
