// The disk fails while a file is written over, and there is no memory left: the old content is put
// back all the same.

#include <gmock/gmock.h>

#include <cerrno>
#include <optional>

#include "failing_new.h"
#include "faulty_calls.h"
#include "scenarios.h"

using namespace cfg32::tests;
using testing::AnyOf;
using testing::Contains;
using testing::IsEmpty;

namespace {

struct exhausted_memory : testing::TestWithParam<scenario> {
    static void SetUpTestSuite() { work_in_memory(); }

    const scenario& setting = GetParam();
    const std::vector<std::string> versions = versions_of(setting);
    const std::vector<std::string> versions_before{versions.begin(), versions.end() - 1};
    const std::vector<seen_call> calls = calls_of(setting);

    /// Plays with an I/O error at a call, and with memory that is short from then on. Returns
    /// whether an allocation failed.
    bool expect_put_back(size_t nth, long which, failing_allocation::extent how_long) const {
        stage on(setting);
        std::optional<failing_allocation> shortage;
        const auto begin = [&](const seen_call&) { shortage.emplace(which, how_long); };
        const int code = on.play({{nth, effect::fails, EIO, "", begin}});
        const bool has_failed = shortage && shortage->happened();
        shortage.reset();
        SCOPED_TRACE("allocation " + std::to_string(which) +
                     (how_long == failing_allocation::once ? "" : " and all that follow") +
                     ", after:\n" + listed(on.seen()) + on.report());
        EXPECT_THAT(code, AnyOf(CFG_OTHER, CFG_NO_MEMORY));
        EXPECT_TRUE(testing::Value(versions_before, Contains(on.folder().text())))
            << "the file is not what it was";
        EXPECT_THAT(on.folder().other_files(), IsEmpty());
        EXPECT_EQ(on.repeat(), CFG_SUCCESS) << on.report();
        EXPECT_EQ(on.folder().text(), versions.back());
        return has_failed;
    }
};

}  // namespace

TEST_P(exhausted_memory, KeepsNoContentFromBeingPutBack) {
    int rows = 0;
    for (size_t nth = 1; nth <= calls.size(); ++nth) {
        const std::string& name = calls[nth - 1].name;
        if (name != "pwrite" && name != "ftruncate" && name != "fdatasync") {
            continue;
        }
        rows += expect_put_back(nth, 0, failing_allocation::from_then_on) ? 1 : 0;
        for (long which = 0; !HasFailure(); ++which) {
            if (!expect_put_back(nth, which, failing_allocation::once)) {
                break;
            }
        }
        if (HasFailure()) {
            return;  // the first call that goes wrong says enough
        }
    }
    EXPECT_GT(rows, 0) << listed(calls);
}

INSTANTIATE_TEST_SUITE_P(of, exhausted_memory, testing::ValuesIn(scenarios()),
                         [](const auto& info) { return std::string(info.param.name); });
