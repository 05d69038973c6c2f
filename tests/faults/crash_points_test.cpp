// A process dies at one of the system calls of an update: whichever it is, the file or its backup
// is a complete version.

#include <gmock/gmock.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>

#include "faulty_calls.h"
#include "scenarios.h"

using namespace cfg32::tests;
using testing::Contains;
using testing::HasSubstr;

namespace {

/// Plays the scenario in a process of its own; returns the signal that ended it, 0 for none.
int play_and_die(stage& on, const fault& death) {
    const pid_t child = fork();
    if (child == 0) {
        on.play({death});
        _exit(0);
    }
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    return WIFSIGNALED(status) ? WTERMSIG(status) : 0;
}

struct crash_points : testing::TestWithParam<scenario> {
    static void SetUpTestSuite() { work_in_memory(); }

    const scenario& setting = GetParam();
    const std::vector<std::string> versions = versions_of(setting);
    const std::vector<seen_call> calls = calls_of(setting);
    const std::vector<std::string> versions_before{versions.begin(), versions.end() - 1};

    /// Lets a process die at every call, in every way, and checks what it left behind. After a call
    /// is before the next one. With a sanitizer, under which a run takes several times as long and
    /// leaves the same, every third of the deaths between two calls.
    template <class Check>
    void for_each_death(Check check) {
        for (size_t nth = 1; nth <= calls.size() && !HasFailure(); ++nth) {
            for (const effect what :
                 {effect::kills_before, effect::kills_halfway, effect::kills_after}) {
                if ((what == effect::kills_halfway && !calls[nth - 1].is_transfer) ||
                    (what == effect::kills_after && nth < calls.size()) ||
                    (what == effect::kills_before && is_sanitized() && nth % 3 != 0)) {
                    continue;
                }
                stage on(setting);
                SCOPED_TRACE("died " +
                             std::string(what == effect::kills_before  ? "before "
                                         : what == effect::kills_after ? "after "
                                                                       : "within ") +
                             std::to_string(nth) + " of:\n" + listed(calls));
                ASSERT_EQ(play_and_die(on, {nth, what}), SIGKILL);
                check(on);
            }
        }
    }

    bool is_complete(const std::string& text) const {
        return testing::Value(versions, Contains(text));
    }
};

}  // namespace

TEST_P(crash_points, LeaveTheVersionBeforeOrTheOneInFlightAndNoTornBackup) {
    int torn = 0;
    for_each_death([&](const stage& on) {
        const bool is_torn = !is_complete(on.folder().text());
        torn += is_torn ? 1 : 0;
        const bool has_backup = on.folder().folder().has("oruslapd.bak");
        if (setting.has_backup && (is_torn || has_backup)) {
            EXPECT_THAT(versions_before, Contains(on.folder().backup_text()));
        }
    });
    // Otherwise nothing that matters has been tried.
    EXPECT_GT(torn, 0) << listed(calls);
}

// What it made of a torn file would become the backup of the next update.
TEST_P(crash_points, LeaveNoTornFileThatIsTakenForAConfiguration) {
    if (!setting.has_backup) {
        GTEST_SKIP() << "without a backup there is no complete version to point to";
    }
    int refused = 0;
    for_each_death([&](const stage& on) {
        const std::string text = on.folder().text();
        const std::string backup = on.folder().backup_text();
        session next(on.folder().config(), on.folder().backup());
        if (next.bind_as_anybody() == CFG_SUCCESS) {
            EXPECT_THAT(versions, Contains(as_written(text)));
            return;
        }
        ++refused;
        EXPECT_THAT(next.report(), HasSubstr("Configuration file was not written to its end"));
        EXPECT_EQ(on.folder().text(), text);
        EXPECT_EQ(on.folder().backup_text(), backup);
    });
    EXPECT_GT(refused, 0);
}

// It tells its reader to copy the backup over the file.
TEST_P(crash_points, WithoutABackupLeaveNoMarkForThereIsNothingToPointTo) {
    int marked = 0;
    for_each_death([&](const stage& on) {
        marked += on.folder().text().find("This file is being written") != std::string::npos;
    });
    EXPECT_EQ(marked > 0, setting.has_backup) << listed(calls);
}

TEST_P(crash_points, KeepNobodyFromTheNextUpdate) {
    for_each_death([&](const stage& on) {
        if (!is_complete(on.folder().text())) {
            if (!setting.has_backup) {
                return;
            }
            on.folder().restore();
        }
        EXPECT_LE(on.folder().other_files().size(), 1u);  // the backup that was being made
        session next(on.folder().config(), on.folder().backup());
        EXPECT_EQ(next.bind_as_anybody(), CFG_SUCCESS) << next.report();
        EXPECT_EQ(next.modify(setting.what), CFG_SUCCESS) << next.report();
        EXPECT_EQ(on.folder().text(), versions.back());
    });
}

INSTANTIATE_TEST_SUITE_P(of, crash_points, testing::ValuesIn(scenarios()),
                         [](const auto& info) { return std::string(info.param.name); });
