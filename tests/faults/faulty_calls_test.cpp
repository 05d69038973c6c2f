// No call by which the libraries reach a file goes past the tests of this folder.

#include "faulty_calls.h"

#include <dlfcn.h>
#include <gmock/gmock.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <set>
#include <sstream>

#include "cfg32.h"
#include "session.h"

using namespace cfg32::tests;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

/// What the libraries take from elsewhere and what can't lose a file, by the reason.
const std::set<std::string> harmless = {
    // the compiler's and the linker's
    "_ITM_deregisterTMCloneTable",
    "_ITM_registerTMCloneTable",
    "__ctype_get_mb_cur_max",
    "__cxa_atexit",
    "__cxa_finalize",
    "__errno_location",
    "__gmon_start__",
    "__gxx_personality_v0",
    "__stack_chk_fail",
    "__tls_get_addr",
    "_Unwind_Resume",
    // memory
    "calloc",
    "explicit_bzero",
    "free",
    "malloc",
    "memchr",
    "memcmp",
    "memcpy",
    "memmove",
    "memset",
    "wmemchr",
    "wmemcpy",
    "wmemmove",
    "wmemset",
    // text
    "__ctype_tolower_loc",
    "iswspace",
    "mbrtowc",
    "mbstowcs",
    "snprintf",
    "strcasecmp",
    "strcmp",
    "strcspn",
    "strdup",
    "strerror",
    "strlen",
    "strncasecmp",
    "strnlen",
    "strrchr",
    "strtol",
    "vsnprintf",
    "wcslen",
    "wcstombs",
    // the process: cfg_init() reads the C library's own files of the locale, nothing else
    "pthread_mutex_lock",
    "pthread_mutex_unlock",
    "secure_getenv",
    "setlocale",
};

/// Families of such names: exceptions, the sanitizers, ciphers and compression in memory.
const char* const harmless_families[] = {"__cxa_",  "__asan_",      "__ubsan_",
                                         "__tsan_", "__sanitizer_", "__sancov_",
                                         "nettle_", "deflate",      "inflate"};

/// The standard library is harmless save for what opens files; the description of a type does not.
const char* const parts_with_files[] = {"fstream", "filebuf", "filesystem", "random_device"};

bool is_harmless(const std::string& name) {
    if (name.starts_with("_ZTI")) {
        return true;
    }
    if (name.starts_with("_Z")) {
        return std::none_of(std::begin(parts_with_files), std::end(parts_with_files),
                            [&](const char* part) { return name.find(part) != std::string::npos; });
    }
    // A function that looks at the size of what it writes to has a name made of its own.
    const std::string_view checked = "_chk";
    if (name.starts_with("__") && name.ends_with(checked)) {
        return is_harmless(name.substr(2, name.size() - 2 - checked.size()));
    }
    return harmless.count(name) != 0 ||
           std::any_of(std::begin(harmless_families), std::end(harmless_families),
                       [&](const char* family) { return name.starts_with(family); });
}

/// The undefined names of a library, save those that one of the two gives the other.
std::set<std::string> taken_names(const std::string& library) {
    const std::string command = NM " -D --undefined-only '" + library + "'";
    const std::unique_ptr<FILE, int (*)(FILE*)> output(popen(command.c_str(), "r"), pclose);
    std::set<std::string> names;
    char line[4096];
    while (output && fgets(line, sizeof line, output.get())) {
        std::istringstream words(line);
        std::string type;
        std::string name;
        words >> type >> name;
        if (name.find("@CFG32") == std::string::npos) {
            names.insert(name.substr(0, name.find('@')));
        }
    }
    return names;
}

std::set<std::string> taken_names() {
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

/// The program or library that something is defined in.
std::string home_of(void* definition) {
    Dl_info info{};
    return definition && dladdr(definition, &info) != 0 ? info.dli_fname : "";
}

}  // namespace

TEST(faulty_calls, EveryNameThatTheLibrariesTakeIsWrappedOrKnownToBeHarmless) {
#ifdef CFG32_COVERAGE
    GTEST_SKIP() << "what counts the lines that run takes names of its own";
#endif
    const std::set<std::string> wrapped(wrapped_names().begin(), wrapped_names().end());
    const std::set<std::string> taken = taken_names();
    ASSERT_EQ(taken.count("pwrite"), 1u) << "the names of the library could not be listed";
    ASSERT_EQ(taken.count("copy_file_range"), 1u) << "those of the other could not be listed";
    for (const std::string& name : taken) {
        EXPECT_TRUE(wrapped.count(name) != 0 || is_harmless(name)) << name;
    }
}

TEST(faulty_calls, EveryWrappedNameIsTakenByALibraryAndDefinedByThisProgram) {
    const std::set<std::string> taken = taken_names();
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
