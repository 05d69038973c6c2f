// Somebody who does not ask for the lock, such as an editor, saves the file while it is updated: at
// whichever system call, what was saved is not lost, and the caller is told.
//
// There are limits. What is saved in place just when the file is written over may be written over
// as well. What is saved in place while the backup is made may be in it in part. And a save in
// place that leaves the very time that the update leaves can't be told from it: the clock of file
// systems ticks every few milliseconds. Here it never does that: the time of the file is one in the
// future, and so is every time that an update gives it.

#include <gmock/gmock.h>

#include <algorithm>
#include <cstdio>
#include <functional>

#include "faulty_calls.h"
#include "scenarios.h"

using namespace cfg32::tests;
using testing::AnyOf;
using testing::Contains;

namespace {

constexpr int changed_meanwhile = 51;

const std::string entry = "cn=Editor, cn=Configuration";

using save = std::function<void(const configuration_folder&, const std::string&)>;

void save_by_rename(const configuration_folder& folder, const std::string& text) {
    const std::string name = folder.folder().write("saved", text);
    EXPECT_EQ(rename(name.c_str(), folder.config().c_str()), 0);
}

void save_in_place(const configuration_folder& folder, const std::string& text) {
    folder.write(text);
}

/// The first half of a save in place.
void truncate(const configuration_folder& folder, const std::string&) { folder.write(""); }

enum class moment { before, after };

struct editor : testing::TestWithParam<scenario> {
    static void SetUpTestSuite() { work_in_memory(); }

    const scenario& setting = GetParam();
    const std::vector<std::string> versions = versions_of(setting);
    const std::vector<seen_call> calls = calls_of(setting);
    const std::string saved =
        as_written(setting.before + "\ndn: " + entry + "\ncn: Editor\nobjectclass: top\n");
    const std::string changed = as_written_after(saved, setting.what);

    /// The number, from 1, of the next call of one of these names.
    size_t next_call(size_t from, const std::set<std::string>& names) const {
        while (from <= calls.size() && names.count(calls[from - 1].name) == 0) {
            ++from;
        }
        return from;
    }

    /// The same, of the last one before.
    size_t last_call(size_t from, const std::set<std::string>& names) const {
        while (from > 0 && names.count(calls[from - 1].name) == 0) {
            --from;
        }
        return from;
    }

    /// True from after a file's last look at the one call until before another's, with a call of
    /// the name in between.
    static bool is_between(size_t nth, moment when, size_t first, size_t last) {
        return (nth > first || (nth == first && when == moment::after)) &&
               (nth < last || (nth == last && when == moment::before));
    }

    /// From the look at what was opened to be written over, before it is read to be put back if
    /// need be, until the first look at what was written.
    bool is_written_over(size_t nth, moment when) const {
        return is_in_a_write(nth, when, [&](size_t room) {
            return last_call(next_call(room, {"close"}), {"fstat", "fstat64"});
        });
    }

    /// The first part of it, when nothing has been done to the file.
    bool is_read_before(size_t nth, moment when) const {
        return is_in_a_write(nth, when,
                             [&](size_t room) { return last_call(room, {"pread"}) + 1; });
    }

    /// Each write begins with a look, and takes its room, which the limit of the process is asked
    /// for.
    template <class End>
    bool is_in_a_write(size_t nth, moment when, End end_of) const {
        for (size_t room = next_call(1, {"getrlimit"}); room <= calls.size();
             room = next_call(room + 1, {"getrlimit"})) {
            const size_t opened = last_call(room, {"open", "open64"});
            if (is_between(nth, when, next_call(opened, {"fstat", "fstat64"}), end_of(room))) {
                return true;
            }
        }
        return false;
    }

    /// From the last look at what becomes the backup until all of it is copied, by when the list of
    /// those who may read it is asked for.
    bool is_backed_up(size_t nth, moment when) const {
        for (size_t owner = next_call(1, {"getpwuid_r"}); owner <= calls.size();
             owner = next_call(owner + 1, {"getpwuid_r"})) {
            // The mark is looked for just after the status.
            const size_t look = last_call(last_call(owner, {"pread"}), {"stat", "stat64"});
            if (is_between(nth, when, look, next_call(owner, {"fgetxattr"}))) {
                return true;
            }
        }
        return false;
    }

    /// Has something happen at every call, before and after it, and checks what became of the file.
    template <class Selected, class Check>
    void for_each_moment(const save& saves, Selected is_selected, Check check) {
        int moments = 0;
        for (size_t nth = 1; nth <= calls.size() && !HasFailure(); ++nth) {
            for (const moment when : {moment::before, moment::after}) {
                if (!is_selected(nth, when)) {
                    continue;
                }
                ++moments;
                stage on(setting);
                const bool is_before = when == moment::before;
                const effect comes = is_before ? effect::comes_before : effect::comes_after;
                const auto event = [&](const seen_call&) { saves(on.folder(), saved); };
                const int code = on.play({{nth, comes, 0, "", event}});
                SCOPED_TRACE(std::string("saved ") + (is_before ? "before " : "after ") +
                             std::to_string(nth) + " of:\n" + listed(on.seen()) + on.report());
                check(on, nth, when, code);
            }
        }
        EXPECT_GT(moments, 0) << listed(calls);
    }

    static bool always(size_t, moment) { return true; }

    std::string became(const std::string& text) const {
        return text == saved             ? "what was saved"
               : text == changed         ? "what was saved and changed"
               : text == versions.back() ? "changed, what was saved is lost"
                                         : "a mixture";
    }

    /// The handle that made the update sees what was saved, and can change it.
    void expect_seen_and_changed(stage& on, int code) const {
        std::set<std::string> names;
        EXPECT_EQ(on.user().search(entry, "cn", names), CFG_SUCCESS) << on.report();
        EXPECT_THAT(names, Contains("Editor"));
        if (code == changed_meanwhile) {
            EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report();
            EXPECT_EQ(on.folder().text(), changed);
        }
    }

    /// True when the update is on the disk already.
    bool is_done(size_t nth, moment when) const {
        return is_between(nth, when, last_call(calls.size(), {"fdatasync"}), calls.size() + 1);
    }

    void expect_kept(stage& on, size_t nth, moment when, int code) const {
        const std::string end = became(on.folder().text());
        if (code == CFG_SUCCESS) {
            EXPECT_EQ(end, is_done(nth, when) ? "what was saved" : "what was saved and changed");
        } else {
            EXPECT_EQ(code, changed_meanwhile);
            EXPECT_EQ(end, "what was saved");
        }
        expect_seen_and_changed(on, code);
    }

    void expect_complete_backup(const stage& on) const {
        std::vector<std::string> complete = versions;
        complete.push_back(saved);
        EXPECT_TRUE(!on.folder().folder().has("oruslapd.bak") ||
                    testing::Value(complete, Contains(on.folder().backup_text())))
            << "the backup is not complete";
    }
};

}  // namespace

TEST_P(editor, ThatSavesByRenameLosesNothing) {
    std::set<int> codes;
    for_each_moment(save_by_rename, always, [&](stage& on, size_t nth, moment when, int code) {
        codes.insert(code);
        expect_complete_backup(on);
        expect_kept(on, nth, when, code);
    });
    EXPECT_EQ(codes, (std::set<int>{CFG_SUCCESS, changed_meanwhile}));
}

TEST_P(editor, ThatSavesInPlaceLosesNothing) {
    std::set<int> codes;
    const auto is_selected = [&](size_t nth, moment when) { return !is_written_over(nth, when); };
    for_each_moment(save_in_place, is_selected, [&](stage& on, size_t nth, moment when, int code) {
        codes.insert(code);
        if (!is_backed_up(nth, when)) {
            expect_complete_backup(on);
        }
        expect_kept(on, nth, when, code);
    });
    EXPECT_EQ(codes, (std::set<int>{CFG_SUCCESS, changed_meanwhile}));
}

TEST_P(editor, ThatSavesInPlaceWhileTheOldContentIsReadIsNoticed) {
    if (setting.has_backup) {
        GTEST_SKIP() << "the backup is what would be put back, and nothing is read";
    }
    const auto is_selected = [&](size_t nth, moment when) { return is_read_before(nth, when); };
    for_each_moment(save_in_place, is_selected, [&](stage& on, size_t, moment, int code) {
        EXPECT_EQ(code, changed_meanwhile);
        EXPECT_EQ(became(on.folder().text()), "what was saved");
        expect_seen_and_changed(on, code);
    });
}

// What was saved may be lost then, but a mixture of the two is not what a call has done.
TEST_P(editor, ThatSavesInPlaceWhileTheFileIsWrittenOverIsNotMixedInUnnoticed) {
    const auto is_selected = [&](size_t nth, moment when) { return is_written_over(nth, when); };
    for_each_moment(save_in_place, is_selected, [&](stage& on, size_t, moment, int code) {
        const std::string end = became(on.folder().text());
        if (code != CFG_SUCCESS) {
            EXPECT_EQ(code, changed_meanwhile);
        } else if (end == "what was saved") {
            expect_seen_and_changed(on, code);
        } else {
            EXPECT_EQ(end, "changed, what was saved is lost");
        }
    });
}

// The limit is the time from the last look at the file until it is copied.
TEST_P(editor, ThatHasTruncatedTheFileAndWillWriteItCostsNoBackup) {
    if (!setting.has_backup) {
        GTEST_SKIP() << "there is no backup to lose";
    }
    const auto begin = [](const configuration_folder& folder, const std::string& text) {
        truncate(folder, text);
    };
    const auto is_selected = [&](size_t nth, moment when) {
        return !is_written_over(nth, when) && !is_backed_up(nth, when);
    };
    int noticed = 0;
    for_each_moment(begin, is_selected, [&](stage& on, size_t, moment, int code) {
        // An empty file is one that has no entry to change.
        EXPECT_THAT(code, AnyOf(CFG_SUCCESS, changed_meanwhile, CFG_NO_SUCH_OBJECT));
        noticed += code == changed_meanwhile ? 1 : 0;
        EXPECT_EQ(on.folder().text(), "");
        expect_complete_backup(on);
        save_in_place(on.folder(), saved);
        on.folder().folder().touch("oruslapd.conf", 10);
        expect_seen_and_changed(on, code);
    });
    EXPECT_GT(noticed, 0) << listed(calls);
}

INSTANTIATE_TEST_SUITE_P(of, editor, testing::ValuesIn(scenarios()),
                         [](const auto& info) { return std::string(info.param.name); });
