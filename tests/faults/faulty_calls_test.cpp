// No call by which the libraries reach a file goes past the tests of this folder.

#include "faulty_calls.h"

#include <dlfcn.h>
#include <gmock/gmock.h>

#include <set>

#include "cfg32.h"
#include "session.h"
#include "taken_names.h"

using namespace cfg32::tests;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

std::set<std::string> names_taken_by_the_libraries() {
    std::set<std::string> names = taken_names(CFG32_LIBRARY);
    names.merge(taken_names(CFG32_PLATFORM_LIBRARY));
    return names;
}

std::vector<std::string> names_of(const std::vector<seen_call>& calls) {
    std::vector<std::string> names;
    for (const seen_call& call : calls) {
        names.push_back(call.name);
    }
    return names;
}

}  // namespace

TEST(faulty_calls, EveryNameThatTheLibrariesTakeIsWrappedOrKnownToBeHarmless) {
#ifdef CFG32_COVERAGE
    GTEST_SKIP() << "what counts the lines that run takes names of its own";
#endif
    const std::set<std::string> wrapped(wrapped_names().begin(), wrapped_names().end());
    const std::set<std::string> taken = names_taken_by_the_libraries();
    ASSERT_EQ(taken.count("pwrite"), 1u) << "the names of the library could not be listed";
    ASSERT_EQ(taken.count("copy_file_range"), 1u) << "those of the other could not be listed";
    for (const std::string& name : taken) {
        EXPECT_TRUE(wrapped.count(name) != 0 || is_harmless(name)) << name;
    }
}

TEST(faulty_calls, EveryWrappedNameIsTakenByALibraryAndDefinedByThisProgram) {
    const std::set<std::string> taken = names_taken_by_the_libraries();
    const std::string program = home_of(reinterpret_cast<void*>(&wrapped_names));
    ASSERT_NE(program, "");
    for (const std::string& name : wrapped_names()) {
        // Which of the two names a call has depends on how large files are asked for.
        const bool is_one_of_two =
            taken.count(name + "64") != 0 ||
            (name.ends_with("64") && taken.count(name.substr(0, name.size() - 2)) != 0);
        EXPECT_TRUE(taken.count(name) != 0 || is_one_of_two) << name;
        if (taken.count(name) != 0) {
            EXPECT_EQ(home_of(dlsym(RTLD_DEFAULT, name.c_str())), program) << name;
        }
    }
}

TEST(faulty_calls, CallsAreSeenInTheirOrderAndOnlyWhileTheyAreWatched) {
    const configuration_folder folder(configuration_head);
    session user(folder.config());
    ASSERT_EQ(user.bind(), CFG_SUCCESS);
    const watched_calls calls;
    std::set<std::string> values;
    ASSERT_EQ(user.search("cn=Configuration", "cn", values), CFG_SUCCESS);
    EXPECT_THAT(names_of(calls.seen()), ElementsAre("stat"));
    EXPECT_EQ(listed(calls.seen()), "  1 stat(" + folder.config() + ")\n");
}

TEST(faulty_calls, APlannedFaultHitsOneCall) {
    const configuration_folder folder(configuration_head);
    session user(folder.config());
    ASSERT_EQ(user.bind(), CFG_SUCCESS);
    std::set<std::string> values;
    const watched_calls calls({{2, effect::fails, EIO}});
    EXPECT_EQ(user.search("cn=Configuration", "cn", values), CFG_SUCCESS);
    EXPECT_EQ(user.search("cn=Configuration", "cn", values), CFG_CONNECT_ERROR);
    EXPECT_EQ(user.search("cn=Configuration", "cn", values), CFG_SUCCESS);
    EXPECT_THAT(names_of(calls.seen()), ElementsAre("stat", "stat", "stat"));
}

TEST(faulty_calls, AnEventComesBeforeOrAfterACallAndIsNotSeen) {
    const configuration_folder folder(configuration_head);
    session user(folder.config());
    ASSERT_EQ(user.bind(), CFG_SUCCESS);
    const auto event = [&](const seen_call&) {
        folder.write(folder.text() + "\ndn: cn=a, cn=Configuration\n");
    };
    const struct {
        effect what;
        int code;  // of the first search
    } rows[] = {{effect::comes_before, CFG_SUCCESS}, {effect::comes_after, CFG_NO_SUCH_OBJECT}};
    for (const auto& row : rows) {
        folder.write(configuration_head);
        folder.folder().touch("oruslapd.conf", row.code + 5);
        std::set<std::string> values;
        ASSERT_EQ(user.search("cn=Configuration", "cn", values), CFG_SUCCESS);
        const watched_calls calls({{1, row.what, 0, "", event}});
        EXPECT_EQ(user.search("cn=a, cn=Configuration", "cn", values), row.code);
        EXPECT_EQ(calls.seen().size() == 1, row.code == CFG_NO_SUCH_OBJECT) << listed(calls.seen());
        EXPECT_EQ(user.search("cn=a, cn=Configuration", "cn", values), CFG_SUCCESS);
    }
}

TEST(faulty_calls, AnUpdateIsOnTheDiskAndItsBackupBeforeIt) {
    const configuration_folder folder(configuration_head);
    session user(folder.config(), folder.backup());
    ASSERT_EQ(user.bind(), CFG_SUCCESS);
    const watched_calls calls;
    ASSERT_EQ(user.modify({LDAP_MOD_ADD, "cn=Configuration", "description", {"longer now"}}),
              CFG_SUCCESS);
    std::vector<std::string> lasting;  // of all the calls, those that change or sync something
    for (const std::string& name : names_of(calls.seen())) {
        static const std::set<std::string> changing = {
            "copy_file_range", "fallocate", "fchmod", "fdatasync", "fsync",
            "ftruncate",       "openat64",  "pwrite", "renameat",  "write"};
        if (changing.count(name) != 0 && (lasting.empty() || lasting.back() != name)) {
            lasting.push_back(name);
        }
    }
    EXPECT_THAT(lasting, ElementsAre("openat64", "copy_file_range", "fchmod", "fsync", "renameat",
                                     "fsync", "fallocate", "pwrite", "fdatasync", "pwrite",
                                     "ftruncate", "fdatasync", "pwrite", "fdatasync"))
        << listed(calls.seen());
    EXPECT_THAT(folder.other_files(), IsEmpty());
}
