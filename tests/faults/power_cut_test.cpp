// The power goes in the middle of an update: whatever of it is on the disk by then, the file or its
// backup is a complete version, and nobody takes a mixture for a configuration.

#include <gmock/gmock.h>

#include <iostream>
#include <set>

#include "faulty_calls.h"
#include "recorded_disk.h"
#include "scenarios.h"

using namespace cfg32::tests;
using testing::Contains;
using testing::HasSubstr;

namespace {

const std::string mark = "# This file is being written.";

std::vector<scenario> scenarios_with_backup() {
    std::vector<scenario> all = scenarios();
    std::erase_if(all, [](const scenario& one) { return !one.has_backup; });
    return all;
}

/// A text that is shorter than the mark gets blank lines before it. Their size may be on the disk
/// sooner than they are, and then there are zero bytes, which a load passes over as it does those.
std::string without_blank_end(std::string text) {
    text.erase(text.find_last_not_of('\0') + 1);
    while (text.ends_with("\n\n\n")) {
        text.pop_back();
    }
    return text;
}

struct power_cut : testing::TestWithParam<scenario> {
    static void SetUpTestSuite() { work_in_memory(); }

    const scenario& setting = GetParam();
    const std::vector<std::string> versions = versions_of(setting);
    const unsigned long seed = number_from_environment("CFG32_FAULTS_SEED", 20);
    std::mt19937_64 random{seed};
    std::set<recorded_disk::image> known;
    size_t images = 0;
    size_t torn = 0;

    /// Plays with the fault, and looks at everything that a power cut may leave of it. Returns the
    /// result of the call.
    int cut_while(const std::vector<fault>& faults) {
        stage on(setting);
        recorded_disk disk(std::filesystem::path(on.folder().config()).parent_path());
        std::vector<fault> all = faults;
        for (const fault& event : disk.recording()) {
            all.push_back(event);
        }
        const int code = on.play(all);
        SCOPED_TRACE(disk.listed() + "of:\n" + listed(on.seen()));
        disk.for_each_image(cuts_by_chance(), random, [&](const recorded_disk::image& left) {
            ++images;
            recorded_disk::image both = left;
            std::erase_if(both, [](const auto& file) { return file.first.front() == '.'; });
            if (!HasFailure() && known.insert(both).second) {
                expect_complete(both);
            }
        });
        return code;
    }

    void expect_complete(const recorded_disk::image& left) {
        const std::string& text = left.at("oruslapd.conf");
        const bool has_backup = left.count("oruslapd.bak") != 0;
        if (has_backup) {
            EXPECT_THAT(versions, Contains(left.at("oruslapd.bak")));
        }
        const bool is_torn = text.starts_with(mark);
        torn += is_torn ? 1 : 0;
        EXPECT_TRUE(is_torn ? has_backup
                            : testing::Value(versions, Contains(without_blank_end(text))))
            << text;
        // Of a torn file the mark decides, whatever comes after it.
        if (!is_torn || torn <= 50) {
            expect_nothing_is_lost(left, is_torn);
        }
    }

    /// The next program refuses a torn file, and loads any other.
    void expect_nothing_is_lost(const recorded_disk::image& left, bool is_torn) const {
        const configuration_folder after(left.at("oruslapd.conf"));
        const auto backup = left.find("oruslapd.bak");
        if (backup != left.end()) {
            after.folder().write("oruslapd.bak", backup->second);
        }
        session next(after.config(), after.backup());
        if (!is_torn) {
            EXPECT_EQ(next.bind_as_anybody(), CFG_SUCCESS) << next.report();
            EXPECT_THAT(versions, Contains(as_written(after.text())));
            return;
        }
        EXPECT_EQ(next.bind_as_anybody(), CFG_OTHER);
        EXPECT_THAT(next.report(), HasSubstr("Configuration file was not written to its end"));
        EXPECT_EQ(after.text(), left.at("oruslapd.conf"));
        EXPECT_EQ(after.backup_text(), left.at("oruslapd.bak"));
    }

    void tell() const {
        std::cout << images << " images of the disk (seed " << seed << "), " << known.size()
                  << " different pairs of file and backup, " << torn << " torn and marked\n";
    }
};

}  // namespace

TEST_P(power_cut, LeavesACompleteVersionAndNoMixtureThatIsTakenForOne) {
    EXPECT_EQ(cut_while({}), CFG_SUCCESS);
    tell();
    EXPECT_GT(torn, 0u);
}

TEST_P(power_cut, WhileTheOldContentIsPutBackLeavesTheSame) {
    const std::vector<seen_call> calls = calls_of(setting);
    static const std::set<std::string> overwriting = {"pwrite", "ftruncate", "fdatasync"};
    int failures = 0;
    for (size_t nth = 1; nth <= calls.size() && !HasFailure(); ++nth) {
        if (overwriting.count(calls[nth - 1].name) != 0) {
            failures += cut_while({{nth, effect::fails, EIO}}) == CFG_SUCCESS ? 0 : 1;
        }
    }
    tell();
    EXPECT_GE(failures, 5);
}

INSTANTIATE_TEST_SUITE_P(of, power_cut, testing::ValuesIn(scenarios_with_backup()),
                         [](const auto& info) { return std::string(info.param.name); });
