// Changes of many values in one call, and a file in which there is nothing.

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <string>
#include <vector>

#include "cfg32.h"
#include "environment.h"
#include "large_file.h"
#include "small_stack.h"
#include "temporary_folder.h"

using namespace cfg32::tests;

namespace {

const std::string head =
    "charset: UTF-8\nversion: 1\n\ndn: cn=Configuration\ncn: Configuration\n\n";

size_t part_of(size_t usual, size_t real) {
    return count_of({"", usual, real, nullptr, nullptr, nullptr, nullptr, 0});
}

/// A handle and a file with a list of values.
class value_list {
  public:
    value_list() : handle_(cfg_init()) {
        cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, folder_.write("oruslapd.conf", head).c_str());
        EXPECT_EQ(cfg_bind_s(handle_, nullptr, nullptr, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    }
    value_list(const value_list&) = delete;
    value_list& operator=(const value_list&) = delete;
    ~value_list() { cfg_unbind(handle_); }

    /// Of the numbers from one to another, without that.
    void change(int operation, size_t from, size_t to) {
        std::vector<std::string> texts;
        for (; from < to; ++from) {
            texts.push_back(std::to_string(from));
        }
        std::vector<char*> values;
        for (std::string& text : texts) {
            values.push_back(text.data());
        }
        values.push_back(nullptr);
        char name[] = "list";
        LDAPMod record{};
        record.mod_op = operation;
        record.mod_type = name;
        record.mod_values = values.data();
        LDAPMod* records[] = {&record, nullptr};
        ASSERT_EQ(cfg_modify_s(handle_, "cn=Configuration", records), CFG_SUCCESS);
    }

    /// In the order in which they stand.
    std::vector<std::string> values() {
        CfgMessage* found = nullptr;
        EXPECT_EQ(
            cfg_search_s(handle_, "cn=Configuration", CFG_SCOPE_BASE, "(cn=*)", nullptr, 0, &found),
            CFG_SUCCESS);
        char** list = cfg_get_values(handle_, found, "list");
        std::vector<std::string> copies(list, list + cfg_count_values(list));
        cfg_value_free(list);
        cfg_msgfree(found);
        return copies;
    }

    std::string text() const { return folder_.read("oruslapd.conf"); }

  private:
    temporary_folder folder_;
    CfgHandle* handle_;
};

std::vector<std::string> numbers(size_t from, size_t to) {
    std::vector<std::string> list;
    for (; from < to; ++from) {
        list.push_back(std::to_string(from));
    }
    return list;
}

}  // namespace

TEST(LongList, IsAddedDeletedInPartAndReplaced) {
    on_a_small_stack([] {
        const size_t count = part_of(10'000, 100'000);
        value_list list;
        list.change(LDAP_MOD_ADD, 0, count);
        list.change(LDAP_MOD_ADD, count / 2, count + 1);  // all but one are there
        EXPECT_EQ(list.values(), numbers(0, count + 1));
        list.change(LDAP_MOD_DELETE, 0, 1);
        list.change(LDAP_MOD_DELETE, count, count + 1);
        EXPECT_EQ(list.values(), numbers(1, count));
        list.change(LDAP_MOD_DELETE, 1, count / 2);
        EXPECT_EQ(list.values(), numbers(count / 2, count));
        list.change(LDAP_MOD_REPLACE, count / 2 + 1, count + count / 2);
        EXPECT_EQ(list.values(), numbers(count / 2 + 1, count + count / 2));
        list.change(LDAP_MOD_DELETE, 0, 2 * count);
        EXPECT_EQ(list.text(), head);
    });
}

TEST(FileOfNuls, HasNothingInItAndIsLeftAlone) {
    const size_t size = part_of(1'000'000, 100'000'000);
    for (const char* ending : {"", "\n"}) {
        const temporary_folder folder;
        const std::string text = std::string(size, '\0') + ending;
        CfgHandle* handle = cfg_init();
        cfg_set_option(handle, CFG_OPT_CONFIG_FILE, folder.write("nul", text).c_str());
        EXPECT_EQ(cfg_bind_s(handle, nullptr, nullptr, CFG_AUTH_SIMPLE), CFG_SUCCESS);
        CfgMessage* found = nullptr;
        EXPECT_EQ(cfg_search_s(handle, "cn=Configuration", CFG_SCOPE_BASE, "", nullptr, 0, &found),
                  CFG_NO_SUCH_OBJECT);
        EXPECT_EQ(cfg_bind_s(handle, "cn=root", "secret", CFG_AUTH_SIMPLE), CFG_NO_SUCH_OBJECT);
        EXPECT_TRUE(folder.read("nul") == text);
        cfg_unbind(handle);
    }
}
