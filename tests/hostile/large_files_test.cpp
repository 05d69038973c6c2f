// Large configurations are loaded, searched, drawn, changed and written: on a small stack, with
// memory that grows with the file and no faster, at its most and of all that is asked for together.
// CFG32_HOSTILE_SCALE=100 makes them as large as in large_file.cpp, and tells what each took.

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "cfg32.h"
#include "environment.h"
#include "failing_new.h"
#include "large_file.h"
#include "small_stack.h"
#include "temporary_folder.h"

using namespace cfg32::tests;

namespace {

bool is_full_size() { return number_from_environment("CFG32_HOSTILE_SCALE", 0) > 0; }

/// A file and its backup.
class large_folder {
  public:
    large_folder(const large_file& one, size_t count) {
        std::ofstream out(config(), std::ios::binary);
        write_large_file(one, count, out);
    }

    std::string config() const { return folder_.file("oruslapd.conf"); }
    std::string backup() const { return folder_.file("oruslapd.bak"); }
    size_t size() const { return std::filesystem::file_size(config()); }

  private:
    temporary_folder folder_;
};

bool is_same_file(const std::string& left, const std::string& right) {
    std::ifstream one(left, std::ios::binary);
    std::ifstream other(right, std::ios::binary);
    std::vector<char> of_one(1 << 16);
    std::vector<char> of_other(of_one.size());
    do {
        one.read(of_one.data(), static_cast<std::streamsize>(of_one.size()));
        other.read(of_other.data(), static_cast<std::streamsize>(of_other.size()));
        if (one.gcount() != other.gcount() ||
            !std::equal(of_one.data(), of_one.data() + one.gcount(), of_other.data())) {
            return false;
        }
    } while (one && other);
    return one.eof() && other.eof();
}

/// Everything that a program does with a file.
class large_session {
  public:
    large_session(const large_folder& folder, std::string subject)
        : handle_(cfg_init()), subject_(std::move(subject)) {
        cfg_set_option(handle_, CFG_OPT_CONFIG_FILE, folder.config().c_str());
        cfg_set_option(handle_, CFG_OPT_BACKUP_FILE, folder.backup().c_str());
    }
    large_session(const large_session&) = delete;
    large_session& operator=(const large_session&) = delete;
    ~large_session() { cfg_unbind(handle_); }

    void bind() { expect_success(cfg_bind_s(handle_, nullptr, nullptr, CFG_AUTH_SIMPLE)); }

    void flush() { expect_success(cfg_flush_s(handle_)); }

    void find(size_t entries) {
        CfgMessage* found = nullptr;
        expect_success(cfg_search_s(handle_, "cn=Configuration", CFG_SCOPE_SUBTREE, "(cn=*)",
                                    nullptr, 0, &found));
        EXPECT_EQ(static_cast<size_t>(cfg_count_entries(handle_, found)), entries);
        cfg_msgfree(found);
    }

    void read_subject() {
        CfgMessage* found = nullptr;
        expect_success(
            cfg_search_s(handle_, subject_.c_str(), CFG_SCOPE_BASE, "", nullptr, 0, &found));
        CfgCursor* cursor = nullptr;
        int names = 0;
        for (char* name = cfg_first_attribute(handle_, found, &cursor); name;
             name = cfg_next_attribute(handle_, found, cursor)) {
            cfg_memfree(name);
            ++names;
        }
        EXPECT_EQ(names, cfg_count_attributes(handle_, found));
        cfg_ber_free(cursor);
        cfg_msgfree(found);
    }

    void draw() {
        EXPECT_NE(cfg_tree_view(handle_, CFG_TREE_ASCII), nullptr);
        cfg_reset(handle_);
    }

    /// Changes, after which the file is what it was.
    void change_and_change_back() {
        const std::string added = "cn=Added, " + subject_;
        expect_success(cfg_add_s(handle_, added.c_str(), nullptr));
        expect_success(modify(LDAP_MOD_ADD, "added"));
        expect_success(modify(LDAP_MOD_DELETE, "added"));
        expect_success(cfg_delete_s(handle_, added.c_str()));
    }

  private:
    int modify(int operation, const char* value) {
        std::string name = "list";
        std::string text = value;
        char* values[] = {text.data(), nullptr};
        LDAPMod record{};
        record.mod_op = operation;
        record.mod_type = name.data();
        record.mod_values = values;
        LDAPMod* records[] = {&record, nullptr};
        return cfg_modify_s(handle_, subject_.c_str(), records);
    }

    void expect_success(int code) {
        const char* report = code == CFG_SUCCESS ? "" : cfg_dump_exception(handle_);
        EXPECT_EQ(code, CFG_SUCCESS) << std::string(report ? report : "").substr(0, 2000);
    }

    CfgHandle* handle_;
    std::string subject_;
};

/// A whole session. What is written at its end is, byte for byte, what was written at its
/// beginning.
void use(const large_folder& folder, const large_file& one, size_t count) {
    const std::string canonical = folder.config() + ".canonical";
    large_session session(folder, one.subject(count));
    session.bind();
    session.flush();
    std::filesystem::copy_file(folder.config(), canonical);
    session.find(one.entries(count));
    session.read_subject();
    session.draw();
    session.change_and_change_back();
    EXPECT_TRUE(is_same_file(folder.config(), canonical));
    session.flush();
    EXPECT_TRUE(is_same_file(folder.config(), canonical));
    EXPECT_TRUE(is_same_file(folder.backup(), canonical));
    std::filesystem::remove(canonical);

    large_session again(folder, one.subject(count));
    again.bind();
    again.find(one.entries(count));
}

struct measured {
    size_t memory;
    double seconds;
};

/// In a process of its own, whose memory is only what the session takes.
measured used_in_a_child(const large_folder& folder, const large_file& one, size_t count) {
    const auto begin = std::chrono::steady_clock::now();
    const pid_t child = fork();
    if (child == 0) {
        static const large_folder* the_folder;
        static const large_file* the_file;
        static size_t the_count;
        the_folder = &folder;
        the_file = &one;
        the_count = count;
        on_a_small_stack([] { use(*the_folder, *the_file, the_count); });
        fflush(nullptr);
        _exit(testing::Test::HasFailure() ? 1 : 0);
    }
    int status = 0;
    rusage usage{};
    EXPECT_EQ(wait4(child, &status, 0, &usage), child);
    EXPECT_EQ(status, 0);
    return {static_cast<size_t>(usage.ru_maxrss) * 1024,
            std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count()};
}

struct large : testing::TestWithParam<large_file> {
    static void SetUpTestSuite() {
        if (!is_full_size() && access("/dev/shm", W_OK | X_OK) == 0) {
            setenv("TMPDIR", "/dev/shm", 0);
        }
    }

    const large_file& file = GetParam();
};

}  // namespace

TEST_P(large, FileIsUsedOnASmallStackInMemoryThatGrowsWithIt) {
    constexpr size_t noise = 4 << 20;
    const size_t count = count_of(file);
    const large_folder folder(file, count);
    const size_t size = folder.size();
    const measured used = used_in_a_child(folder, file, count);
    const large_folder smallest(file, 1);
    const size_t program = used_in_a_child(smallest, file, 1).memory;
    if (!is_sanitized()) {
        EXPECT_LT(used.memory, program + size * file.memory + noise);
    }
    if (is_full_size()) {
        printf("%-20s %10zu of them, %12zu bytes, %6.2f times as much memory, %7.1f s\n", file.name,
               count, size, static_cast<double>(used.memory - program) / static_cast<double>(size),
               used.seconds);
        fflush(stdout);
    }
}

// Memory that is asked for is memory that is filled: what is made anew for each of many lines shows
// in it. (What only looks at them again and again does not.) A vector that grows by doubling takes
// up to twice as much at one size as at another.
TEST_P(large, FileFourTimesAsLargeAsksForNoMoreThanItsShareOfMemory) {
    double share[2] = {};
    for (const size_t factor : {1, 4}) {
        const size_t count = file.usual * factor / 4;
        const large_folder folder(file, count);
        const size_t size = folder.size();
        const size_t before = failing_allocation::bytes();
        use(folder, file, count);
        share[factor / 4] =
            static_cast<double>(failing_allocation::bytes() - before) / static_cast<double>(size);
    }
    EXPECT_GT(share[0], 1);
    EXPECT_LT(share[1], share[0] * 2);
}

INSTANTIATE_TEST_SUITE_P(of, large, testing::ValuesIn(large_files()),
                         [](const auto& info) { return std::string(info.param.name); });
