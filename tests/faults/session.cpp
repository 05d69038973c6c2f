#include "session.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace cfg32::tests {

// Written with another nonce each time, an encoded password would make two texts differ.
const std::string configuration_head =
    "charset: UTF-8\n"
    "version: 1\n"
    "\n"
    "dn: cn=Configuration\n"
    "cn: Configuration\n"
    "objectclass: top\n"
    "oru-slapdAdminDN: cn=root\n"
    "oru-slapdAdminPW: "
    "{iMASK}>EPK0/+iYcvHdt9wCmaF2/62aIEx+Hhw+A/IErYO3F0IfN6C+zmEYm2ih\n";

session::session(const std::string& config, const std::string& backup) : handle_(cfg_init()) {
    EXPECT_NE(handle_, nullptr);
    EXPECT_EQ(cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, config.c_str()), CFG_SUCCESS);
    if (!backup.empty()) {
        EXPECT_EQ(cfg_set_option(handle_, CFG_OPT_BACKUP_FILE, backup.c_str()), CFG_SUCCESS);
    }
}

session::~session() { cfg_unbind(handle_); }

int session::bind() { return cfg_bind_s(handle_, "cn=root", "correct horse", CFG_AUTH_SIMPLE); }

int session::bind_as_anybody() { return cfg_bind_s(handle_, nullptr, nullptr, CFG_AUTH_SIMPLE); }

int session::modify(const attribute_change& what) {
    attribute_change copy = what;  // the records take what they could change
    std::vector<char*> values;
    for (std::string& value : copy.values) {
        values.push_back(value.data());
    }
    values.push_back(nullptr);
    LDAPMod record{};
    record.mod_op = copy.operation;
    record.mod_type = copy.attribute.data();
    record.mod_values = values.data();
    LDAPMod* records[] = {&record, nullptr};
    return cfg_modify_s(handle_, copy.dn.c_str(), records);
}

int session::search(const std::string& base, const std::string& attribute,
                    std::set<std::string>& values) {
    CfgMessage* found = nullptr;
    const int code =
        cfg_search_s(handle_, base.c_str(), CFG_SCOPE_BASE, nullptr, nullptr, 0, &found);
    values.clear();
    if (char** all = cfg_get_values(handle_, found, attribute.c_str())) {
        values.insert(all, all + cfg_count_values(all));
        cfg_value_free(all);
    }
    cfg_msgfree(found);
    return code;
}

int session::flush() { return cfg_flush_s(handle_); }

std::string session::report() const {
    const char* text = cfg_dump_exception(handle_);
    return text ? text : "";
}

std::string configuration_folder::backup_text() const {
    std::ifstream in(backup(), std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

std::vector<std::string> configuration_folder::other_files() const {
    std::vector<std::string> names;
    const auto folder = std::filesystem::path(config()).parent_path();
    for (const auto& file : std::filesystem::directory_iterator(folder)) {
        if (file.path() != config() && file.path() != backup()) {
            names.push_back(file.path().filename());
        }
    }
    return names;
}

std::string as_written(const std::string& text) {
    const configuration_folder folder(text);
    session writer(folder.config());
    EXPECT_EQ(writer.bind_as_anybody(), CFG_SUCCESS) << writer.report();
    EXPECT_EQ(writer.flush(), CFG_SUCCESS) << writer.report();
    return folder.text();
}

std::string as_written_after(const std::string& text, const attribute_change& what) {
    const configuration_folder folder(text);
    session writer(folder.config());
    EXPECT_EQ(writer.bind_as_anybody(), CFG_SUCCESS) << writer.report();
    EXPECT_EQ(writer.modify(what), CFG_SUCCESS) << writer.report();
    return folder.text();
}

void work_in_memory() {
    const char* const place = "/dev/shm";
    if (access(place, W_OK | X_OK) == 0) {
        setenv("TMPDIR", place, 0);
    }
}

}  // namespace cfg32::tests
