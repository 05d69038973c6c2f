// No call by which the command reaches a file goes past its tests either.

#include <cxxabi.h>
#include <dlfcn.h>
#include <gmock/gmock.h>

#include <algorithm>
#include <cstdlib>
#include <memory>
#include <set>

#include "command_run.h"
#include "faulty_calls.h"
#include "session.h"
#include "taken_names.h"

using namespace cfg32::tests;
using testing::Contains;
using testing::StartsWith;

namespace {

/// What only the command takes from elsewhere and what can't lose a file, by the reason.
const std::set<std::string> harmless = {
    // the compiler's and the linker's
    "__assert_fail",
    "__libc_single_threaded",
    "__libc_start_main",
    "__popcountdi2",
    "__udivti3",
    // numbers and text
    "abs",
    "ceil",
    "isalnum",
    "iscntrl",
    "isspace",
    "isxdigit",
    "localeconv",
    "nl_langinfo",
    "strtold",
    "strtoll",
    "tolower",
    "wcwidth",
    // the process
    "getenv",
    "prctl",
    "pthread_cond_clockwait",
    "pthread_sigmask",
    "raise",
    "setenv",
    "sigaction",
    "sigfillset",
    "signal",
    // the standard streams, as nothing here opens another; there are tests with a full device
    "ferror",
    "fflush",
    "fileno",
    "fputc",
    "fwrite",
    "isatty",
    "stderr",
    "stdout",
    // memory, and random numbers and passwords that are asked for: the calls of the libraries below
    // lead through here
    "randombytes_buf",
    "readpassphrase",
    "sodium_base642bin",
    "sodium_bin2base64",
    "sodium_init",
    "sodium_memzero",
};

/// The same of what C++ names: how the name begins.
const char* const harmless_beginnings[] = {
    // names of files
    "std::filesystem::__cxx11::path::",
    // their calls lead through here
    "std::filesystem::read_symlink(",
    "std::filesystem::remove_all(",
    "std::filesystem::status(",
    "std::filesystem::temp_directory_path[",
    // `check` looks for what was left beside the file; that it can't is no failure
    "std::filesystem::__cxx11::directory_iterator::",
    "std::filesystem::canonical(",
    "std::filesystem::equivalent(",
    // an answer that can't be read is none
    "std::cin",
    // the standard streams
    "std::cerr",
    "std::cout",
    "fmt::v9::vprint(",
};

/// The name as C++ has it.
std::string readable(const std::string& name) {
    int status = 0;
    const std::unique_ptr<char, void (*)(void*)> text(
        abi::__cxa_demangle(name.c_str(), nullptr, nullptr, &status), free);
    return text ? text.get() : name;
}

/// The parser can read options from a file, which the command does not let it; nothing else has
/// such streams.
bool is_of_file_streams(const std::string& name) {
    return name.find("ifstream") != std::string::npos ||
           name.find("basic_filebuf") != std::string::npos;
}

bool is_harmless_in_the_command(const std::string& name) {
    const std::string text = readable(name);
    return is_harmless(name) || harmless.count(name) != 0 || is_of_file_streams(name) ||
           std::any_of(std::begin(harmless_beginnings), std::end(harmless_beginnings),
                       [&](const char* beginning) { return text.starts_with(beginning); });
}

std::set<std::string> all_wrapped_names() {
    std::set<std::string> names(wrapped_names().begin(), wrapped_names().end());
    names.insert(names_wrapped_for_the_command().begin(), names_wrapped_for_the_command().end());
    return names;
}

/// The calls of a run, as "read(0)": without sizes.
std::set<std::string> calls_of(const std::string& name) {
    std::set<std::string> calls;
    for (const seen_call& call : run_command(command_row_of(name), {}).calls) {
        calls.insert(call.name + "(" + call.about.substr(0, call.about.find(',')) + ")");
    }
    return calls;
}

}  // namespace

TEST(faulty_command_calls, EveryNameThatTheCommandTakesIsWrappedOrKnownToBeHarmless) {
#ifdef CFG32_COVERAGE
    GTEST_SKIP() << "what counts the lines that run takes names of its own";
#endif
    const std::set<std::string> wrapped = all_wrapped_names();
    const std::set<std::string> taken = taken_names(CFG32_COMMAND);
    ASSERT_EQ(taken.count("memfd_create"), 1u) << "the names could not be listed";
    for (const std::string& name : taken) {
        EXPECT_TRUE(wrapped.count(name) != 0 || is_harmless_in_the_command(name)) << readable(name);
    }
}

TEST(faulty_command_calls, OnlyTheParserHasStreamsOfFiles) {
    const std::set<std::string> taken = taken_names(CFG32_OBJECTS_WITHOUT_PARSER, "");
    ASSERT_EQ(taken.count("memfd_create"), 1u) << "the names could not be listed";
    for (const std::string& name : taken) {
        EXPECT_FALSE(is_of_file_streams(name)) << readable(name);
    }
}

TEST(faulty_command_calls, EveryWrappedNameIsDefinedByThisProgram) {
    const std::string program = home_of(reinterpret_cast<void*>(&names_wrapped_for_the_command));
    ASSERT_NE(program, "");
    for (const std::string& name : all_wrapped_names()) {
        EXPECT_EQ(home_of(dlsym(RTLD_DEFAULT, name.c_str())), program) << name;
    }
}

TEST(faulty_command_calls, ThatOtherLibrariesMakeForTheCommandAreSeen) {
    const struct {
        const char* command;
        const char* call;
    } rows[] = {
        {"passwd", "read(0)"},
        {"keygen", "getrandom()"},
        {"restore_of_a_missing_file", "lstat(oruslapd.conf)"},
        {"edit", "fdopendir("},
        {"edit", "unlinkat(oruslapd.conf)"},
    };
    for (const auto& row : rows) {
        EXPECT_THAT(calls_of(row.command), Contains(StartsWith(row.call))) << row.command;
    }
}

TEST(faulty_command_calls, ThatReadWhatIsGivenAreSeen) {
    const struct {
        const char* command;
        const char* call;
    } rows[] = {
        {"add", "open(new.ldif)"},
        {"modify_from_standard_input", "read(0)"},
        {"set_by_the_administrator", "open(typed)"},
    };
    for (const auto& row : rows) {
        EXPECT_THAT(calls_of(row.command), Contains(StartsWith(row.call))) << row.command;
    }
}
