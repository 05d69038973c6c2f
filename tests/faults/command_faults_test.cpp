// A system call of the administrator's command fails, the command is killed at it, or the power
// goes: whichever it is, the file or its backup is complete, and who typed it is told.

#include <gmock/gmock.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <iostream>
#include <random>

#include "command_run.h"
#include "session.h"

using namespace cfg32::tests;
using testing::AnyOf;
using testing::Contains;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Pair;
using testing::StartsWith;

namespace {

const std::string config = "oruslapd.conf";

/// What a failure is about, if not a file.
const char* const other_subjects[] = {"a private copy in memory",
                                      "no password was given",
                                      "the editor failed",
                                      "oru-slapdDbUserPW: ",
                                      "/tmp/cfg32-",
                                      "TMPDIR",
                                      "standard input"};

std::string text_in(const folder_image& image, const std::string& name) {
    const auto found = image.find(name);
    return found == image.end() ? "" : found->second;
}

std::vector<std::string> temporary_files(const folder_image& image) {
    std::vector<std::string> names;
    for (const auto& [name, text] : image) {
        if (name.starts_with(".")) {
            names.push_back(name);
        }
    }
    return names;
}

struct command_faults : testing::TestWithParam<command_row> {
    static void SetUpTestSuite() { work_in_memory(); }

    const command_row& row = GetParam();
    const command_run good = run_command(row, {});
    const folder_image before = comparable(row.before);
    const unsigned long seed = number_from_environment("CFG32_FAULTS_SEED", 20);
    std::mt19937_64 random{seed};
    size_t torn = 0;

    void SetUp() override {
        ASSERT_EQ(good.status, 0) << good.told;
        ASSERT_NE(good.after, before);
        ASSERT_GT(good.calls.size(), 5u);
    }

    /// What is certain, and of the others as many by chance as an ordinary run has time for. With
    /// the sanitizers chance chooses of all: each run takes several times as long.
    std::vector<fault> chosen(std::vector<fault> certain, std::vector<fault> others) {
        if (is_sanitized()) {
            others.insert(others.end(), certain.begin(), certain.end());
            certain.clear();
        }
        const unsigned long most =
            number_from_environment("CFG32_FAULTS_COMMAND", is_sanitized() ? 10 : 20);
        std::shuffle(others.begin(), others.end(), random);
        others.resize(std::min<size_t>(others.size(), most));
        certain.insert(certain.end(), others.begin(), others.end());
        return certain;
    }

    /// Every call fails, and every transfer is short; which error comes for certain is drawn. After
    /// EINTR most calls are made again.
    std::vector<fault> failures() {
        constexpr int errors[] = {EIO, ENOSPC, EACCES, EMFILE};
        std::vector<fault> certain;
        std::vector<fault> others;
        for (size_t nth = 1; nth <= good.calls.size(); ++nth) {
            const int drawn = errors[random() % std::size(errors)];
            for (const int error : errors) {
                (error == drawn ? certain : others).push_back({nth, effect::fails, error});
            }
            others.push_back({nth, effect::fails, EINTR});
            if (good.calls[nth - 1].is_transfer) {
                certain.push_back({nth, effect::is_short});
            }
        }
        return chosen(certain, others);
    }

    /// At every call. After one is much the same as before the next.
    std::vector<fault> deaths() {
        std::vector<fault> certain;
        std::vector<fault> others;
        for (size_t nth = 1; nth <= good.calls.size(); ++nth) {
            certain.push_back({nth, effect::kills_before});
            others.push_back({nth, effect::kills_after});
            if (good.calls[nth - 1].is_transfer) {
                certain.push_back({nth, effect::kills_halfway});
            }
        }
        return chosen(certain, others);
    }

    /// Every file is what it was or what it becomes, and the configuration becomes something else
    /// only when its backup is there.
    void expect_complete(folder_image after) const {
        std::erase_if(after, [](const auto& file) { return file.first.starts_with("."); });
        for (const auto& [name, text] : after) {
            EXPECT_TRUE((before.count(name) != 0 && text == before.at(name)) ||
                        text == text_in(good.after, name))
                << name << " holds\n"
                << text;
        }
        for (const auto& [name, text] : before) {
            EXPECT_EQ(after.count(name), 1u) << name;
        }
        if (text_in(after, config) != text_in(before, config)) {
            folder_image others = after;
            folder_image wanted = good.after;
            others.erase(config);
            wanted.erase(config);
            EXPECT_EQ(others, wanted);
        }
    }

    /// The same of what was not ended: it may be refused as unfinished, if its complete version is
    /// beside it. A key file that nothing was written to is no key.
    void expect_nothing_lost(folder_image after) {
        if (text_in(after, config).starts_with(unfinished_head)) {
            ++torn;
            EXPECT_THAT(
                after, Contains(Pair(StartsWith(config + "."),
                                     AnyOf(text_in(before, config), text_in(good.after, config)))));
            after[config] = text_in(good.after, config);
        }
        std::erase_if(after, [](const auto& file) {
            return file.first.ends_with(".key") && file.second.empty();
        });
        EXPECT_LE(temporary_files(after).size(), 1u);
        expect_complete(after);
    }

    void expect_told(const command_run& run) const {
        EXPECT_THAT(run.told, HasSubstr("cfg32: "));
        const bool is_about =
            run.told.find(config) != std::string::npos ||
            std::any_of(
                good.after.begin(), good.after.end(),
                [&](const auto& file) { return run.told.find(file.first) != std::string::npos; }) ||
            std::any_of(
                std::begin(other_subjects), std::end(other_subjects),
                [&](const char* subject) { return run.told.find(subject) != std::string::npos; });
        EXPECT_TRUE(is_about) << run.told;
    }

    /// libsodium ends a process that gets no random numbers.
    bool may_abort(const fault& planned) const {
        return good.calls[planned.nth - 1].name == "getrandom" && planned.what == effect::fails;
    }
};

}  // namespace

TEST_P(command_faults, OfOneCallAreToldAndLeaveCompleteFilesAndNothingElse) {
    size_t refused = 0;
    const std::vector<fault> faults = failures();
    for (const fault& planned : faults) {
        const command_run run = run_command(row, {planned});
        SCOPED_TRACE(
            (planned.what == effect::is_short ? "half" : std::string(strerror(planned.error))) +
            " at " + std::to_string(planned.nth) + " of:\n" + listed(good.calls) + run.described());
        expect_complete(run.after);
        EXPECT_THAT(temporary_files(run.after), IsEmpty());
        if (run.status == 0) {
            EXPECT_EQ(run.after, good.after);
        } else if (run.status > 0) {
            ++refused;
            expect_told(run);
        } else {
            EXPECT_TRUE(may_abort(planned) && run.signal == SIGABRT);
        }
        if (!run.temporary.empty()) {  // what was edited, or what can't be removed
            EXPECT_THAT(run.told, HasSubstr("/tmp/cfg32-"));
        }
        if (HasFailure()) {
            break;  // the first that goes wrong says enough
        }
    }
    std::cout << faults.size() << " faults (seed " << seed << ") at " << good.calls.size()
              << " calls, " << refused << " of them told\n";
    EXPECT_GT(refused, 0u);
}

TEST_P(command_faults, OfStandardOutputAreToldAndLeaveCompleteFilesAndNothingElse) {
    const command_run run = run_without_output(row);
    expect_complete(run.after);
    EXPECT_THAT(temporary_files(run.after), IsEmpty());
    if (good.output.empty()) {
        EXPECT_EQ(run.status, 0) << run.told;
        EXPECT_EQ(run.after, good.after);
    } else {
        EXPECT_GT(run.status, 0);
        EXPECT_THAT(run.told, AnyOf(HasSubstr("standard output can't be written"),
                                    HasSubstr("can't be shown")));
    }
}

TEST_P(command_faults, ThatKillItLeaveACompleteVersion) {
    const std::vector<fault> faults = deaths();
    for (const fault& planned : faults) {
        const command_run run = run_command(row, {planned});
        SCOPED_TRACE("killed at " + std::to_string(planned.nth) + " of:\n" + listed(good.calls));
        EXPECT_EQ(run.signal, SIGKILL);
        expect_nothing_lost(run.after);
        if (HasFailure()) {
            break;
        }
    }
    std::cout << faults.size() << " deaths (seed " << seed << ") at " << good.calls.size()
              << " calls, " << torn << " left the file torn and marked\n";
}

TEST_P(command_faults, OfThePowerLeaveACompleteVersionAndWhatIsDoneLasts) {
    const command_run run = run_recorded(row, [&](const recorded_disk& disk) {
        SCOPED_TRACE(disk.listed());
        size_t images = 0;
        disk.for_each_image(cuts_by_chance(), random, [&](const folder_image& left) {
            ++images;
            if (!HasFailure()) {
                expect_nothing_lost(comparable(left));
            }
        });
        EXPECT_EQ(comparable(disk.lasting()), good.after);
        EXPECT_GT(images, 2u);
        std::cout << images << " images of the disk (seed " << seed << "), " << torn
                  << " with the file torn and marked" << std::endl;
        return !HasFailure();
    });
    std::cout << run.output.substr(run.output.rfind('\n', run.output.size() - 2) + 1);
    EXPECT_EQ(run.status, 0) << run.output << run.told;
}

// Else the file would take the place of a link that there may be.
TEST(restore_of_a_missing_file, EndsWhenItCanNotBeToldWhetherItsNameIsALink) {
    const command_row& row = command_row_of("restore_of_a_missing_file");
    const command_run run = run_command(row, {{0, effect::fails, EIO, "lstat"}});
    EXPECT_GT(run.status, 0);
    EXPECT_THAT(run.told, HasSubstr("oruslapd.conf: Input/output error"));
    EXPECT_EQ(run.after, comparable(row.before));
}

INSTANTIATE_TEST_SUITE_P(of, command_faults, testing::ValuesIn(command_rows()),
                         [](const auto& info) { return std::string(info.param.name); });
