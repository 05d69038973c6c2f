// What else may stand where the configuration file or its backup should, and what may become of a
// file while it is read or updated. No call hangs, each tells why it failed, and nothing is lost.

#include <gmock/gmock.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "faulty_calls.h"
#include "scenarios.h"
#include "unique_fd.h"

using namespace cfg32;
using namespace cfg32::tests;
using testing::AnyOf;
using testing::Contains;
using testing::HasSubstr;

namespace {

void make_socket(const std::string& path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    ASSERT_LT(path.size(), sizeof address.sun_path);
    strcpy(address.sun_path, path.c_str());
    const unique_fd end(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
    ASSERT_EQ(bind(end.get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
}

template <const char* Target>
void link_to(const std::string& path) {
    ASSERT_EQ(symlink(Target, path.c_str()), 0);
}

constexpr char null_device[] = "/dev/null";
constexpr char zero_device[] = "/dev/zero";
constexpr char full_device[] = "/dev/full";
constexpr char nothing[] = "nothing";
constexpr char below_a_file[] = "/dev/null/file";

/// Something that is no file, and the error that tells it.
struct obstacle {
    const char* name;
    void (*make)(const std::string& path);
    int error;
};

void PrintTo(const obstacle& one, std::ostream* out) { *out << one.name; }

const obstacle obstacles[] = {
    {"directory", [](const std::string& path) { ASSERT_EQ(mkdir(path.c_str(), 0700), 0); }, EISDIR},
    {"fifo", [](const std::string& path) { ASSERT_EQ(mkfifo(path.c_str(), 0600), 0); }, EINVAL},
    {"socket", make_socket, ENXIO},
    {"null_device", link_to<null_device>, EINVAL},
    {"zero_device", link_to<zero_device>, EINVAL},
    {"full_device", link_to<full_device>, EINVAL},
    {"link_to_nothing", link_to<nothing>, ENOENT},
    {"link_below_a_file", link_to<below_a_file>, ENOTDIR},
    {"link_to_itself",
     [](const std::string& path) { ASSERT_EQ(symlink(path.c_str(), path.c_str()), 0); }, ELOOP},
};

const attribute_change change = {LDAP_MOD_REPLACE, "cn=Configuration", "description", {"new"}};

struct in_place_of : testing::TestWithParam<obstacle> {
    static void SetUpTestSuite() { work_in_memory(); }

    const obstacle& other = GetParam();
    const std::string before = as_written(configuration_head);
    const std::string after = as_written_after(before, change);
    const configuration_folder folder{before};
    const std::string aside = folder.folder().file("aside");

    void expect_told(session& by, int code) const {
        EXPECT_EQ(code, CFG_CONNECT_ERROR);
        EXPECT_THAT(by.report(), HasSubstr("errno " + std::to_string(other.error) + ":"));
    }

    static std::filesystem::file_type type_of(const std::string& path) {
        return std::filesystem::symlink_status(path).type();
    }
};

}  // namespace

TEST_P(in_place_of, TheConfigurationIsToldByEveryCallAndLeftAlone) {
    session user(folder.config(), folder.backup());
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    ASSERT_EQ(rename(folder.config().c_str(), aside.c_str()), 0);
    other.make(folder.config());
    const auto type = type_of(folder.config());

    session another(folder.config(), folder.backup());
    std::set<std::string> values;
    expect_told(another, another.bind());
    EXPECT_EQ(user.search("cn=Configuration", "cn", values), CFG_CONNECT_ERROR);
    expect_told(user, user.modify(change));
    expect_told(user, user.flush());
    EXPECT_EQ(type_of(folder.config()), type);
    EXPECT_FALSE(folder.folder().has("nothing"));
    EXPECT_FALSE(folder.folder().has("oruslapd.bak"));

    std::filesystem::remove(folder.config());
    ASSERT_EQ(rename(aside.c_str(), folder.config().c_str()), 0);
    EXPECT_EQ(user.modify(change), CFG_SUCCESS) << user.report();
    EXPECT_EQ(folder.text(), after);
    EXPECT_EQ(folder.backup_text(), before);
}

TEST_P(in_place_of, TheBackupIsToldAndNothingIsWritten) {
    other.make(folder.backup());
    const auto type = type_of(folder.backup());
    session user(folder.config(), folder.backup());
    ASSERT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    const int code = user.modify(change);
    if (other.error == ENOENT) {  // a name that is free
        EXPECT_EQ(code, CFG_SUCCESS) << user.report();
        EXPECT_EQ(folder.backup_text(), before);
        return;
    }
    EXPECT_EQ(code, CFG_INSUFFICIENT_ACCESS);
    const int error = other.error == ENXIO ? EINVAL : other.error;  // it is not opened
    EXPECT_THAT(user.report(), HasSubstr("errno " + std::to_string(error) + ":"));
    EXPECT_EQ(folder.text(), before);
    EXPECT_EQ(type_of(folder.backup()), type);

    std::filesystem::remove(folder.backup());
    EXPECT_EQ(user.modify(change), CFG_SUCCESS) << user.report();
    EXPECT_EQ(folder.text(), after);
    EXPECT_EQ(folder.backup_text(), before);
}

INSTANTIATE_TEST_SUITE_P(a, in_place_of, testing::ValuesIn(obstacles),
                         [](const auto& info) { return std::string(info.param.name); });

namespace {

/// What becomes of the file, by somebody who does not ask for the lock.
struct event {
    const char* name;
    void (*happens)(const configuration_folder& folder);
};

void PrintTo(const event& one, std::ostream* out) { *out << one.name; }

std::string aside(const configuration_folder& folder) { return folder.folder().file("aside"); }

void vanish(const configuration_folder& folder) {
    EXPECT_EQ(rename(folder.config().c_str(), aside(folder).c_str()), 0);
}

const event moves[] = {
    {"vanishes", vanish},
    {"becomes_a_directory",
     [](const configuration_folder& folder) {
         vanish(folder);
         EXPECT_EQ(mkdir(folder.config().c_str(), 0700), 0);
     }},
    {"becomes_a_fifo",
     [](const configuration_folder& folder) {
         vanish(folder);
         EXPECT_EQ(mkfifo(folder.config().c_str(), 0600), 0);
     }},
};

const event writes[] = {
    {"shrinks",
     [](const configuration_folder& folder) {
         EXPECT_EQ(truncate(folder.config().c_str(), 100), 0);
     }},
    {"grows",
     [](const configuration_folder& folder) {
         folder.write(folder.text() + "\ndn: cn=Grown, cn=Configuration\ncn: Grown\n");
     }},
};

struct file_that : testing::TestWithParam<event> {
    static void SetUpTestSuite() { work_in_memory(); }

    const event& happening = GetParam();

    /// Puts the file back that is not where it was.
    static void put_back(const configuration_folder& folder) {
        if (is_moved(folder)) {
            std::filesystem::remove(folder.config());
            EXPECT_EQ(rename(aside(folder).c_str(), folder.config().c_str()), 0);
        }
    }

    std::vector<fault> at(size_t nth, const configuration_folder& folder) {
        return {{nth, effect::comes_before, 0, "", [this, &folder](const seen_call&) {
                     happening.happens(folder);
                     left = folder.folder().read(is_moved(folder) ? "aside" : "oruslapd.conf");
                 }}};
    }

    static bool is_moved(const configuration_folder& folder) {
        return folder.folder().has("aside");
    }

    std::string left;  ///< by what happened
};

struct moved_file_that : file_that {};

std::string name_of(const testing::TestParamInfo<event>& info) { return info.param.name; }

size_t calls_of_a_bind(const std::string& text) {
    const configuration_folder folder(text);
    session user(folder.config());
    const watched_calls watched;
    EXPECT_EQ(user.bind(), CFG_SUCCESS) << user.report();
    EXPECT_FALSE(watched.seen().empty());
    return watched.seen().size();
}

/// What searches for the entries that a file may have come to.
std::vector<std::pair<int, std::set<std::string>>> found_by(session& user) {
    std::vector<std::pair<int, std::set<std::string>>> found;
    for (const char* entry : {"cn=Configuration", "cn=Grown, cn=Configuration"}) {
        for (const char* attribute : {"cn", "description", "oru-slapdAdminDN"}) {
            std::set<std::string> values;
            const int code = user.search(entry, attribute, values);
            found.emplace_back(code, values);
        }
    }
    return found;
}

/// Of the updates that faults are tried on, those that differ in the calls that they make.
std::vector<scenario> updates() {
    std::vector<scenario> few;
    for (const scenario& one : scenarios()) {
        static const std::set<std::string> names = {"growing", "shrinking_without_backup",
                                                    "repairing"};
        if (names.count(one.name) != 0) {
            few.push_back(one);
        }
    }
    return few;
}

}  // namespace

// What a load made of it is forgotten by the next call: that sees the file, as any other reader.
TEST_P(file_that, WhileItIsReadIsLeftAloneAndSeenAsItIs) {
    const attribute_change entry = {LDAP_MOD_REPLACE, "cn=Configuration", "description", {"old"}};
    const std::string before = as_written_after(configuration_head, entry);
    const size_t calls = calls_of_a_bind(before);
    for (size_t nth = 1; nth <= calls && !HasFailure(); ++nth) {
        const configuration_folder folder(before);
        session user(folder.config());
        int code = 0;
        std::string seen;
        {
            const watched_calls watched(at(nth, folder));
            code = user.bind();
            seen = listed(watched.seen());
        }
        SCOPED_TRACE(std::to_string(nth) + " of:\n" + seen + user.report());
        EXPECT_THAT(code, AnyOf(CFG_SUCCESS, CFG_CONNECT_ERROR, CFG_NO_SUCH_OBJECT,
                                CFG_INVALID_CREDENTIALS));
        EXPECT_TRUE(is_moved(folder) || code != CFG_CONNECT_ERROR);
        put_back(folder);
        EXPECT_EQ(folder.text(), left);
        session another(folder.config());
        EXPECT_EQ(another.bind_as_anybody(), CFG_SUCCESS) << another.report();
        if (code != CFG_SUCCESS) {
            EXPECT_EQ(user.bind_as_anybody(), CFG_SUCCESS) << user.report();
        }
        EXPECT_EQ(found_by(user), found_by(another));
        EXPECT_EQ(folder.text(), left);

        folder.write(before);
        folder.folder().touch("oruslapd.conf", 5);
        std::set<std::string> values;
        EXPECT_EQ(user.search("cn=Configuration", "description", values), CFG_SUCCESS);
        EXPECT_THAT(values, testing::ElementsAre("old"));
        EXPECT_TRUE(folder.other_files().empty());
    }
}

// It is a complete version, wherever it is then. What else an editor does has tests of its own.
TEST_P(moved_file_that, WhileItIsUpdatedIsNotLost) {
    for (const scenario& setting : updates()) {
        const std::vector<std::string> versions = versions_of(setting);
        const size_t calls = calls_of(setting).size();
        for (size_t nth = 1; nth <= calls && !HasFailure(); ++nth) {
            stage on(setting);
            const int code = on.play(at(nth, on.folder()));
            SCOPED_TRACE(std::string(setting.name) + ", " + std::to_string(nth) + " of:\n" +
                         listed(on.seen()) + on.report());
            EXPECT_THAT(code, AnyOf(CFG_SUCCESS, CFG_INSUFFICIENT_ACCESS, CFG_BUSY, CFG_OTHER,
                                    CFG_CONNECT_ERROR, CFG_NO_SUCH_OBJECT));
            put_back(on.folder());
            EXPECT_THAT(versions, Contains(on.folder().text()));
            EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report();
            EXPECT_EQ(on.folder().text(), versions.back());
        }
    }
}

INSTANTIATE_TEST_SUITE_P(moves, file_that, testing::ValuesIn(moves), name_of);
INSTANTIATE_TEST_SUITE_P(writes, file_that, testing::ValuesIn(writes), name_of);
INSTANTIATE_TEST_SUITE_P(moves, moved_file_that, testing::ValuesIn(moves), name_of);
