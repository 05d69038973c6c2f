// Threads in the library at the same time. Each has handles and files of its own; what they share
// is the library. The thread sanitizer sees what they would do to each other.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <barrier>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "cfg32.h"
#include "cfg32_platform.h"
#include "temporary_folder.h"

using cfg32::tests::temporary_folder;

namespace {

constexpr size_t thread_count = 8;
constexpr int rounds = 6;

const std::string configuration = "cn=Configuration";
const char password[] = "correct horse";
const std::string added = "cn=Added, cn=Configuration";

/// Key data that all threads use.
class shared_key {
  public:
    shared_key() : key_(aes_key_data_from_bytes(bytes_.data(), bytes_.size())) {}
    shared_key(const shared_key&) = delete;
    shared_key& operator=(const shared_key&) = delete;
    ~shared_key() { aes_key_data_free(key_); }

    aes_key_data* get() const { return key_; }

  private:
    const std::array<unsigned char, 32> bytes_ = {1, 2, 3};
    aes_key_data* const key_;
};

/// What a thread has for itself. It is made while no other thread is in the library, because that
/// sets the locale of the process.
class own_session {
  public:
    explicit own_session(const shared_key& key) : handle_(cfg_init()), key_(key) {
        folder_.write("oruslapd.conf",
                      "charset: UTF-8\nversion: 1\n\n"
                      "dn: cn=Configuration\ncn: Configuration\nobjectclass: top\n"
                      "oru-slapdAdminDN: cn=root\noru-slapdAdminPW: "
                      "{iMASK}>EPK0/+iYcvHdt9wCmaF2/62aIEx+Hhw+A/IErYO3F0IfN6C+zmEYm2ih\n\n"
                      "dn: cn=Supplier, cn=Configuration\ncn: Supplier\nobjectclass: top\n"
                      "oru-slapdMasterDN: cn=supplier\noru-slapdMasterPW: Grüße\n"
                      "a line without a colon\n\n"
                      "dn: cn=Ämter + cn=Tür, cn=Configuration\ncn: Tür\n\n");
    }
    own_session(const own_session&) = delete;
    own_session& operator=(const own_session&) = delete;
    ~own_session() { cfg_unbind(handle_); }

    CfgHandle* handle() const { return handle_; }
    void name_the_files() const;
    void use() const;
    void fail() const;

  private:
    int bind(const char* text) const {
        return cfg_bind_s(handle_, "cn=root", text, CFG_AUTH_SIMPLE);
    }
    int modify(const std::string& dn, int operation, const char* name, const char* value) const;
    void change() const;
    void search() const;
    void look_at_options() const;
    void expect_failure(int code) const;

    const temporary_folder folder_;
    CfgHandle* const handle_;
    const shared_key& key_;
};

void own_session::name_the_files() const {
    cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, folder_.file("oruslapd.conf").c_str());
    cfg_set_option(handle_, CFG_OPT_BACKUP_FILE, folder_.file("oruslapd.bak").c_str());
    cfg_set_option(handle_, CFG_OPT_KEY_DATA, key_.get());
}

int own_session::modify(const std::string& dn, int operation, const char* name,
                        const char* value) const {
    std::string own_name = name;
    std::string own_value = value;
    char* values[] = {own_value.data(), nullptr};
    LDAPMod record{};
    record.mod_op = operation;
    record.mod_type = own_name.data();
    record.mod_values = values;
    LDAPMod* records[] = {&record, nullptr};
    return operation == LDAP_MOD_ADD && dn == added ? cfg_add_s(handle_, dn.c_str(), records)
                                                    : cfg_modify_s(handle_, dn.c_str(), records);
}

/// Everything that the interface offers, once.
void own_session::use() const {
    ASSERT_EQ(bind(password), CFG_SUCCESS) << cfg_dump_exception(handle_);
    search();
    change();
    look_at_options();
    for (const int style : {0, 1}) {
        const char* tree = cfg_tree_view(handle_, style);
        EXPECT_TRUE(tree && strstr(tree, "cn=Supplier")) << style;
        cfg_reset(handle_);
    }
    fail();
}

void own_session::search() const {
    char name[] = "oru-slapdMasterPW";
    char* names[] = {name, nullptr};
    CfgMessage* found = nullptr;
    ASSERT_EQ(cfg_search_s(handle_, configuration.c_str(), CFG_SCOPE_SUBTREE,
                           "(oru-slapdMasterPW=Grüße)", names, 0, &found),
              CFG_SUCCESS);
    ASSERT_EQ(cfg_count_entries(handle_, found), 1);
    CfgCursor* cursor = nullptr;
    char* attribute = cfg_first_attribute(handle_, found, &cursor);
    char** values = cfg_get_values(handle_, found, attribute);
    EXPECT_TRUE(values && std::string(values[0]) == "Grüße");
    cfg_value_free(values);
    cfg_memfree(attribute);
    EXPECT_EQ(cfg_next_attribute(handle_, found, cursor), nullptr);
    cfg_ber_free(cursor);
    char* dn = cfg_get_dn(handle_, found);
    EXPECT_STREQ(dn, "cn=Supplier, cn=Configuration");
    cfg_memfree(dn);
    cfg_msgfree(found);
}

void own_session::change() const {
    EXPECT_EQ(modify(added, LDAP_MOD_ADD, "cn", "Added"), CFG_SUCCESS);
    EXPECT_EQ(modify(added, LDAP_MOD_ADD, "description", "one"), CFG_SUCCESS);
    EXPECT_EQ(modify(added, LDAP_MOD_REPLACE, "description", "two"), CFG_SUCCESS);
    EXPECT_EQ(modify(added, LDAP_MOD_REPLACE, "oru-slapdMasterPW", "another"), CFG_SUCCESS);
    EXPECT_EQ(modify(added, LDAP_MOD_DELETE, "description", "two"), CFG_SUCCESS);
    EXPECT_EQ(cfg_flush_s(handle_), CFG_SUCCESS);
    EXPECT_EQ(cfg_delete_s(handle_, added.c_str()), CFG_SUCCESS);
}

void own_session::look_at_options() const {
    char* name = nullptr;
    EXPECT_EQ(cfg_get_option(handle_, CFG_OPT_CONFIG_FILE, &name), CFG_SUCCESS);
    EXPECT_STREQ(name, cfg_get_file_name(handle_));
    cfg_memfree(name);
    int is_on = 0;
    for (const int option : {CFG_OPT_SHOW_SOURCE, CFG_OPT_SHOW_STACK, CFG_OPT_DELETE_NON_LEAVES}) {
        EXPECT_EQ(cfg_set_option(handle_, option, CFG_OPT_ON), CFG_SUCCESS);
        EXPECT_EQ(cfg_get_option(handle_, option, &is_on), CFG_SUCCESS);
        EXPECT_EQ(is_on, 1);
    }
}

/// Calls that are refused, each for another reason.
void own_session::fail() const {
    EXPECT_EQ(bind("wrong"), CFG_INVALID_CREDENTIALS);
    EXPECT_EQ(bind(password), CFG_SUCCESS);
    expect_failure(modify(configuration, LDAP_MOD_ADD, "oru-slapdPort", "70000"));
    EXPECT_EQ(cfg_get_maximum(handle_), 65535);
    EXPECT_STREQ(cfg_get_value(handle_), "70000");
    expect_failure(modify(configuration, LDAP_MOD_ADD, "oru-slapdDerefAliases", "perhaps"));
    EXPECT_NE(cfg_get_enum(handle_), nullptr);
    expect_failure(modify("cn=nobody", LDAP_MOD_ADD, "cn", "x"));
    expect_failure(modify("no name", LDAP_MOD_ADD, "cn", "x"));
    expect_failure(cfg_delete_s(handle_, "cn=nobody"));
    cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, folder_.file("").c_str());
    expect_failure(bind(password));
    name_the_files();
}

void own_session::expect_failure(int code) const {
    EXPECT_NE(code, CFG_SUCCESS);
    EXPECT_EQ(cfg_get_errno(handle_), code);
    EXPECT_NE(cfg_get_exterror(handle_), CFG_SUCCESS);
    EXPECT_STRNE(cfg_err2string(code), "");
    const char* report = cfg_dump_exception(handle_);
    EXPECT_TRUE(report && *report);
}

/// Runs the body in a process of its own, and fails if that fails.
template <class Body>
void in_new_process(Body body) {
    fflush(nullptr);
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        body();
        exit(testing::Test::HasFailure() ? EXIT_FAILURE : EXIT_SUCCESS);
    }
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
}

/// Calls body(session) in all threads at once, each with a session of its own. No test is in the
/// library but here, so that what is made once in a process is made anew by these threads.
template <class Body>
void in_all_threads(Body body) {
    in_new_process([&] {
        const shared_key key;
        std::vector<std::unique_ptr<own_session>> sessions;
        for (size_t i = 0; i < thread_count; ++i) {
            sessions.push_back(std::make_unique<own_session>(key));
        }
        std::barrier together(thread_count);
        std::vector<std::thread> threads;
        for (const auto& own : sessions) {
            threads.emplace_back([&] {
                together.arrive_and_wait();
                body(*own);
            });
        }
        for (std::thread& thread : threads) {
            thread.join();
        }
    });
}

/// An installation whose configuration is the one that handles without a file name have.
class default_installation {
  public:
    default_installation() {
        std::filesystem::create_directory(folder_.file("etc"));
        folder_.write("etc/oruslapd.conf", "dn: cn=Configuration\ncn: Configuration\n");
        setenv("NUV_INSTALL_PATH", folder_.file("").c_str(), 1);
    }
    default_installation(const default_installation&) = delete;
    default_installation& operator=(const default_installation&) = delete;
    ~default_installation() { unsetenv("NUV_INSTALL_PATH"); }

  private:
    const temporary_folder folder_;
};

}  // namespace

// A file that is named is checked, for which one thread looks up the type of such names while the
// others wait. So no file is named.
TEST(threads, MakeTheFirstLookUpTogether) {
    const default_installation installation;
    in_all_threads([](const own_session& own) {
        EXPECT_EQ(cfg_bind_s(own.handle(), nullptr, nullptr, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    });
}

TEST(threads, NameTheirFilesTogether) {
    in_all_threads([](const own_session& own) { own.name_the_files(); });
}

TEST(threads, MakeTheFirstBindTogether) {
    in_all_threads([](const own_session& own) {
        own.name_the_files();
        EXPECT_EQ(cfg_bind_s(own.handle(), "cn=root", password, CFG_AUTH_SIMPLE), CFG_SUCCESS);
    });
}

TEST(threads, MakeAllCallsTogether) {
    in_all_threads([](const own_session& own) {
        own.name_the_files();
        for (int i = 0; i < rounds && !testing::Test::HasFatalFailure(); ++i) {
            own.use();
        }
    });
}

TEST(threads, FailTogether) {
    in_all_threads([](const own_session& own) {
        own.name_the_files();
        for (int i = 0; i < rounds; ++i) {
            own.fail();
        }
    });
}
