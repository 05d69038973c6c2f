// One system call of an update fails, or does half of what it was asked for: whichever it is, the
// caller is told, and nothing is lost.

#include <gmock/gmock.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <iterator>
#include <set>
#include <vector>

#include "environment.h"
#include "faulty_calls.h"
#include "scenarios.h"

using namespace cfg32::tests;
using testing::Contains;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

const int errors[] = {EIO, ENOSPC, EINTR, EDQUOT, EACCES, EMFILE, EOPNOTSUPP};

/// The descriptors that are open in this process.
std::set<std::string> descriptors_of_this_process() {
    std::set<std::string> names;
    for (const auto& file : std::filesystem::directory_iterator("/proc/self/fd")) {
        std::error_code ignored;
        names.insert(file.path().filename().string() + " " +
                     std::filesystem::read_symlink(file.path(), ignored).string());
    }
    return names;
}

/// The calls that overwrite a file, and put its old content back.
bool overwrites(const seen_call& call) {
    static const std::set<std::string> names = {"pwrite", "ftruncate", "fdatasync"};
    return names.count(call.name) != 0;
}

size_t last_overwriting(const std::vector<seen_call>& calls) {
    const auto last = std::find_if(calls.rbegin(), calls.rend(), overwrites);
    return static_cast<size_t>(calls.rend() - last);
}

size_t last_reserving(const std::vector<seen_call>& calls) {
    const auto last = std::find_if(calls.rbegin(), calls.rend(),
                                   [](const seen_call& call) { return call.name == "fallocate"; });
    return static_cast<size_t>(calls.rend() - last);
}

size_t first_sync_after_reserving(const std::vector<seen_call>& calls) {
    size_t nth = last_reserving(calls) + 1;
    while (nth < calls.size() && calls[nth - 1].name != "fdatasync") {
        ++nth;
    }
    return nth;
}

std::string told(const char* what, int error, const stage& on) {
    return std::string(what) + ", " + strerror(error) + ", the file " +
           (on.folder().text() == on.setting().before ? "as before" : "changed") + ", after:\n" +
           listed(on.seen()) + on.report();
}

struct failing_calls : testing::TestWithParam<scenario> {
    static void SetUpTestSuite() { work_in_memory(); }

    const scenario& setting = GetParam();
    const std::vector<std::string> versions = versions_of(setting);
    const std::vector<seen_call> calls = calls_of(setting);
    const std::string& before = versions.front();
    const std::string& after = versions.back();

    /// What a call fails with: all of them. With a sanitizer, under which a run takes several times
    /// as long, one after the other.
    static std::vector<int> errors_of(size_t nth) {
        if (is_sanitized()) {
            return {errors[nth % std::size(errors)]};
        }
        return {std::begin(errors), std::end(errors)};
    }

    /// The error that the report tells. Many errors of a search for a name mean that there is none.
    int told_error(const fault& planned) const {
        static const std::set<int> true_errors = {EINTR, EIO, EMFILE};
        const std::string& name = calls[planned.nth - 1].name;
        const bool is_search = name == "getpwnam_r" || name == "getgrnam_r";
        return is_search && true_errors.count(planned.error) == 0 ? EINVAL : planned.error;
    }

    /// Without a reservation, or for a mark that is longer than the file.
    bool takes_room_by_writing() const {
        constexpr size_t length_of_the_mark = 82;
        return setting.has_backup ? before.size() < length_of_the_mark
                                  : !setting.circumstances.empty();
    }

    /// Success is the new content, anything else a documented code with a report.
    void expect_told(const stage& on, const fault& planned, int code,
                     const std::string& description) const {
        static const std::set<int> documented = {CFG_INSUFFICIENT_ACCESS, CFG_OTHER,
                                                 CFG_CONNECT_ERROR};
        if (code == CFG_SUCCESS) {
            EXPECT_EQ(on.folder().text(), after) << description;
            return;
        }
        EXPECT_NE(planned.what, effect::is_short) << description;
        EXPECT_THAT(documented, Contains(code)) << description;
        EXPECT_THAT(on.report(), HasSubstr("errno " + std::to_string(told_error(planned)) + ":"))
            << description;
        EXPECT_THAT(on.report(), Not(HasSubstr("could not be put back"))) << description;
    }

    void expect_complete(const stage& on, const fault& planned, int code,
                         const std::string& description) const {
        const std::string text = on.folder().text();
        EXPECT_THAT(versions, Contains(text)) << description;
        // A failure while the file is written puts back what was there.
        if (code != CFG_SUCCESS && planned.nth <= last_overwriting(calls)) {
            EXPECT_NE(text, after) << description;
        }
        const std::string backup = on.folder().backup_text();
        if (setting.has_backup && code == CFG_SUCCESS) {
            EXPECT_EQ(backup, versions[versions.size() - 2]) << description;
        } else if (!backup.empty()) {
            EXPECT_THAT(versions, Contains(backup)) << description;
        }
    }

    /// The next call refuses a torn file, rather than to make it the backup.
    void expect_backup_is_safe(stage& on, const std::string& description) const {
        if (!setting.has_backup) {
            return;
        }
        if (on.repeat() == CFG_SUCCESS) {
            EXPECT_EQ(on.folder().text(), after) << description;
        } else {
            EXPECT_THAT(on.report(), HasSubstr("Configuration file was not written to its end"))
                << description;
        }
        // Where room was taken with blank lines, they may be there still.
        EXPECT_THAT(versions, Contains(as_written(on.folder().backup_text()))) << description;
    }

    /// Tries every call with every error, and with half a transfer.
    template <class Check>
    void for_each_fault(Check check) {
        ASSERT_GT(calls.size(), setting.has_backup ? 30u : 10u) << listed(calls);
        for (size_t nth = 1; nth <= calls.size(); ++nth) {
            for (const int error : errors_of(nth)) {
                check(fault{nth, effect::fails, error});
            }
            if (calls[nth - 1].is_transfer) {
                check(fault{nth, effect::is_short});
            }
            if (HasFailure()) {
                return;  // the first call that goes wrong says enough
            }
        }
    }
};

}  // namespace

TEST_P(failing_calls, AreToldAndLeaveACompleteVersionAndNothingElse) {
    for_each_fault([&](const fault& planned) {
        stage on(setting);
        const auto descriptors = descriptors_of_this_process();
        const int code = on.play({planned});
        const std::string description = told("one fault", planned.error, on);
        expect_told(on, planned, code, description);
        expect_complete(on, planned, code, description);
        EXPECT_EQ(descriptors_of_this_process(), descriptors) << description;
        EXPECT_THAT(on.folder().other_files(), IsEmpty()) << description;
    });
}

TEST_P(failing_calls, AreMadeGoodByTheNextCall) {
    for_each_fault([&](const fault& planned) {
        stage on(setting);
        on.play({planned});
        const std::string description = told("one fault", planned.error, on);
        EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report() << description;
        EXPECT_EQ(on.folder().text(), after) << description;
        if (setting.has_backup) {
            EXPECT_THAT(versions, Contains(on.folder().backup_text())) << description;
        }
        // Nothing that is locked or remembered keeps others from the file.
        session other(on.folder().config());
        EXPECT_EQ(other.bind_as_anybody(), CFG_SUCCESS) << other.report() << description;
        EXPECT_EQ(on.folder().text(), after) << description;
    });
}

TEST_P(failing_calls, ThatKeepTheOldContentFromBeingPutBackAreToldAndTheBackupIsComplete) {
    int rows = 0;
    for (size_t nth = 1; nth <= calls.size(); ++nth) {
        stage once(setting);
        if (!overwrites(calls[nth - 1]) || once.play({{nth, effect::fails, EIO}}) == CFG_SUCCESS) {
            continue;
        }
        const std::vector<seen_call> with_put_back = once.seen();
        // Blank lines that take room are written and synced first, beyond the end of the file,
        // where there is nothing to put back.
        const bool is_tail = takes_room_by_writing() && nth <= first_sync_after_reserving(calls);
        for (size_t later = nth + 1; !is_tail && later <= with_put_back.size(); ++later) {
            if (!overwrites(with_put_back[later - 1])) {
                continue;
            }
            ++rows;
            stage on(setting);
            const int code = on.play({{nth, effect::fails, EIO}, {later, effect::fails, ENOSPC}});
            const std::string description = told("two faults", ENOSPC, on);
            EXPECT_EQ(code, CFG_OTHER) << description;
            EXPECT_THAT(on.report(), HasSubstr("The old content could not be put back"))
                << description;
            EXPECT_THAT(on.report(), HasSubstr("errno " + std::to_string(EIO) + ":"));
            EXPECT_THAT(on.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
            if (setting.has_backup) {
                EXPECT_THAT(std::vector(versions.begin(), versions.end() - 1),
                            Contains(on.folder().backup_text()))
                    << description;
            }
            EXPECT_THAT(on.folder().other_files(), IsEmpty()) << description;
            expect_backup_is_safe(on, description);
        }
    }
    EXPECT_GE(rows, 6) << listed(calls);
}

// Without them no password can be encoded, which is not the password's fault: neither is it kept as
// a line that can't be used, nor does the one before it go.
TEST(failing_random_numbers, TakeNoPasswordAway) {
    const auto with = [](const std::string& password) {
        return configuration_head +
               "\ndn: cn=a, cn=Configuration\ncn: a\noru-slapdMasterPW: " + password + "\n\n";
    };
    const attribute_change harmless = {LDAP_MOD_REPLACE, "cn=a, cn=Configuration", "cn", {"a"}};
    constexpr int encoding_error = 83;
    attribute_change new_password = harmless;
    new_password.attribute = "oru-slapdMasterPW";
    new_password.values = {"new"};
    for (const scenario& one : {scenario{"read", false, with("secret"), harmless, {}},
                                scenario{"changed", false, with("{SHA}x"), new_password, {}}}) {
        for (const int error : {EIO, ENOSYS, EPERM}) {
            stage on(one);
            EXPECT_EQ(on.play({{0, effect::fails, error, "getrandom"}}), encoding_error);
            EXPECT_EQ(on.folder().text(), one.before);
            EXPECT_EQ(on.user().modify(harmless), CFG_SUCCESS) << on.report();
            EXPECT_THAT(on.folder().text(), HasSubstr("\noru-slapdMasterPW: {"));
        }
    }
}

// There is no room for the mark of an unfinished file: nothing of the file was touched.
TEST(a_file_that_is_shorter_than_the_mark, IsAsItWasWhenItCanNotGrow) {
    const scenario one{"short",
                       true,
                       "dn: cn=Configuration\ncn: Configuration\n",
                       {LDAP_MOD_REPLACE, "cn=Configuration", "description", {"d"}},
                       {{0, effect::fails, EOPNOTSUPP, "fallocate"}}};
    stage on(one);
    EXPECT_EQ(on.play({{0, effect::fails, ENOSPC, "pwrite"}}), CFG_OTHER) << listed(on.seen());
    EXPECT_THAT(on.report(), HasSubstr("errno " + std::to_string(ENOSPC) + ":"));
    EXPECT_THAT(on.report(), Not(HasSubstr("could not be put back")));
    EXPECT_EQ(on.folder().text(), one.before);
    EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report();
}

// Somebody else shortens the backup when it is made: the old content is put back without it.
TEST_P(failing_calls, NeedNoBackupToPutTheOldContentBack) {
    if (!setting.has_backup) {
        GTEST_SKIP() << "there is none";
    }
    const auto of_backup = [](const seen_call& call) {
        return call.name.starts_with("open") &&
               call.about.find("oruslapd.bak") != std::string::npos;
    };
    const auto last = std::find_if(calls.rbegin(), calls.rend(), of_backup);
    ASSERT_NE(last, calls.rend()) << listed(calls);
    const size_t opening = static_cast<size_t>(calls.rend() - last);
    size_t writing = 0;
    for (const bool fails : {false, true}) {
        stage on(setting);
        std::vector<fault> faults = {{opening, effect::comes_before, 0, "", [&](const seen_call&) {
                                          EXPECT_EQ(truncate(on.folder().backup().c_str(), 1), 0);
                                      }}};
        if (fails) {
            faults.push_back({writing, effect::fails, EIO});
        }
        const int code = on.play(faults);
        EXPECT_EQ(code, fails ? CFG_OTHER : CFG_SUCCESS) << listed(on.seen()) << on.report();
        EXPECT_EQ(on.folder().text(), fails ? versions[versions.size() - 2] : after);
        writing = last_overwriting(on.seen());
    }
}

// For the lock it is opened twice, the second time for reading only. To read it then works again.
TEST_P(failing_calls, ThatKeepTheFileFromBeingLockedKeepItFromBeingRead) {
    const auto is_open = [](const seen_call& call) { return call.name.starts_with("open"); };
    const auto first = std::find_if(calls.begin(), calls.end(), is_open);
    const size_t nth = static_cast<size_t>(first - calls.begin()) + 1;
    stage on(setting);
    const int code = on.play({{nth, effect::fails, EMFILE}, {nth + 1, effect::fails, EMFILE}});
    const std::string description = told("two faults", EMFILE, on);
    EXPECT_EQ(code, CFG_CONNECT_ERROR) << description;
    EXPECT_THAT(on.report(), HasSubstr("errno " + std::to_string(EMFILE) + ":"));
    EXPECT_EQ(on.folder().text(), before) << description;
    EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report();
    EXPECT_EQ(on.folder().text(), after) << description;
}

TEST_P(failing_calls, OfWhatFileSystemsNeedNotHaveAreNoFailures) {
    const struct {
        const char* name;
        std::vector<int> errors;
    } rows[] = {
        {"fallocate", {EOPNOTSUPP, ENOSYS}},
        {"flock", {ENOLCK, EOPNOTSUPP, ENOSYS, EINVAL, EBADF}},
        {"fremovexattr", {ENODATA, ENOTSUP, ENOSYS}},
        {"copy_file_range", {EXDEV, EINVAL, ENOSYS, EOPNOTSUPP}},
        {"getrlimit", {EINVAL}},
        {"getpwuid_r", {ENOENT, EIO, ERANGE}},
        {"getgrgid_r", {ENOENT, EIO, ERANGE}},
    };
    for (const auto& row : rows) {
        for (const int error : row.errors) {
            stage on(setting);
            EXPECT_EQ(on.play({{0, effect::fails, error, row.name}}), CFG_SUCCESS)
                << row.name << told("every one", error, on);
            EXPECT_EQ(on.folder().text(), after) << row.name;
            EXPECT_EQ(on.folder().backup_text(),
                      setting.has_backup ? versions[versions.size() - 2] : "")
                << row.name;
        }
    }
}

TEST_P(failing_calls, ThatAreInterruptedAreRepeated) {
    for (size_t nth = 1; nth <= calls.size(); ++nth) {
        static const std::set<std::string> interruptible = {
            "close",     "fallocate", "fdatasync", "flock", "fsync",
            "ftruncate", "getrandom", "nanosleep", "open",  "open64",
            "openat64",  "pread",     "pwrite",    "read",  "write"};
        if (interruptible.count(calls[nth - 1].name) == 0) {
            continue;
        }
        stage on(setting);
        EXPECT_EQ(on.play({{nth, effect::fails, EINTR}}), CFG_SUCCESS) << told("one", EINTR, on);
    }
}

TEST_P(failing_calls, ThatTransferLittleAtATimeAreContinued) {
    for (const char* name : {"pread", "pwrite", "read", "write", "copy_file_range"}) {
        stage on(setting);
        EXPECT_EQ(on.play({{0, effect::is_short, 0, name}}), CFG_SUCCESS) << on.report();
        EXPECT_EQ(on.folder().text(), after) << listed(on.seen());
    }
}

INSTANTIATE_TEST_SUITE_P(of, failing_calls, testing::ValuesIn(scenarios()),
                         [](const auto& info) { return std::string(info.param.name); });
