// The command's own readings of large configurations: what is wrong with one, and what differs from
// another.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>
#include <sstream>

#include "LDIF_File.h"
#include "check/check_report.h"
#include "check/problem.h"
#include "command_line.h"
#include "diff/difference.h"
#include "diff/unified_diff.h"
#include "environment.h"
#include "failing_new.h"
#include "large_file.h"
#include "small_stack.h"
#include "temporary_folder.h"
#include "unique_fd.h"

using namespace cfg32;
using namespace cfg32::tests;

namespace {

struct large_text : testing::TestWithParam<large_file> {
    const large_file& file = GetParam();
    const size_t count = count_of(file);
    const temporary_folder folder;

    std::string text_of(size_t count) const {
        std::ostringstream out;
        write_large_file(file, count, out);
        return out.str();
    }
};

/// What body asks for, by the byte of a text.
template <class Body>
double share_of(const std::string& text, Body body) {
    const size_t before = failing_allocation::bytes();
    body();
    return static_cast<double>(failing_allocation::bytes() - before) /
           static_cast<double>(text.size());
}

/// What is printed while this is there goes nowhere.
class unseen_output {
  public:
    unseen_output() {
        fflush(nullptr);
        const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
        dup2(nowhere, STDOUT_FILENO);
        dup2(nowhere, STDERR_FILENO);
        close(nowhere);
    }
    unseen_output(const unseen_output&) = delete;
    unseen_output& operator=(const unseen_output&) = delete;
    ~unseen_output() {
        fflush(nullptr);
        dup2(out_.get(), STDOUT_FILENO);
        dup2(err_.get(), STDERR_FILENO);
    }

  private:
    const unique_fd out_{dup(STDOUT_FILENO)};
    const unique_fd err_{dup(STDERR_FILENO)};
};

int run_unseen(std::vector<std::string> words) {
    std::vector<char*> arguments;
    for (std::string& word : words) {
        arguments.push_back(word.data());
    }
    const unseen_output nowhere;
    return tool::run_command_line(static_cast<int>(arguments.size()), arguments.data());
}

const std::vector<std::vector<std::string>> readings = {
    {"search"}, {"search", "--json"}, {"search", "cn=*"}, {"tree"}, {"tree", "--json"},
    {"check"},  {"check", "--json"}};

const std::string head = "charset: UTF-8\nversion: 1\n\ndn: cn=Configuration\ncn: Configuration\n";

}  // namespace

TEST(Check, TellsEveryByteOrderMarkOnASmallStack) {
    on_a_small_stack([] {
        constexpr size_t count = 20'000;
        std::string text;
        for (size_t i = 0; i < count; ++i) {
            text += tool::byte_order_mark;
        }
        const std::vector<tool::problem> problems = tool::find_problems(text + head, nullptr);
        ASSERT_EQ(problems.size(), count);
        EXPECT_EQ(problems.back().column, static_cast<int>(count));
        EXPECT_EQ(tool::loadable_part(text + head, problems), head);
    });
}

TEST(Check, ShowsAPartOfALongLineInAFewTimesItsMemory) {
    for (const std::string front : {"", "note: "}) {
        const std::string text = head + front + std::string(1'000'000, 'l') + "\n";
        const std::vector<tool::checked_file> files = {
            {"conf", text, tool::find_problems(text, nullptr)}};
        EXPECT_LT(share_of(text, [&] { EXPECT_LT(tool::text_report(files).size(), 500U); }), 16);
    }
}

TEST(Check, HoldsALongNameOnceForAllProblemsOfItsEntry) {
    double share[2] = {};
    for (const size_t factor : {1, 4}) {
        std::string text =
            head + "\ndn: cn=" + std::string(20'000 * factor, 'n') + ", cn=Configuration\n";
        for (size_t i = 0; i < 250 * factor; ++i) {
            text += "name" + std::to_string(i) + ": n\nline" + std::string(1, '\0') + "\n";
        }
        share[factor / 4] = share_of(
            text, [&] { EXPECT_GE(tool::find_problems(text, nullptr).size(), 500 * factor); });
    }
    EXPECT_LT(share[1], share[0] * 2);
}

TEST_P(large_text, IsCheckedOnASmallStack) {
    static const large_text* that;
    that = this;
    on_a_small_stack([] {
        EXPECT_EQ(tool::find_problems(that->text_of(that->count), nullptr).size(),
                  that->file.problems(that->count));
    });
}

TEST_P(large_text, IsComparedOnASmallStack) {
    static const large_text* that;
    that = this;
    on_a_small_stack([] {
        const LDIF_File from(that->folder.write("from", that->text_of(that->count)), "", nullptr);
        const LDIF_File to(that->folder.write("to", that->text_of(1)), "", nullptr);
        EXPECT_TRUE(tool::changes_between(from.root(), from.root()).empty());
        EXPECT_EQ(tool::changes_between(from.root(), to.root()).empty(),
                  tool::differences(from.root(), to.root()).empty());
    });
}

TEST_P(large_text, FourTimesAsLongAsksForNoMoreThanItsShareOfMemory) {
    double checked[2] = {};
    double compared[2] = {};
    for (const size_t factor : {1, 4}) {
        const std::string text = text_of(file.usual * factor / 4);
        checked[factor / 4] = share_of(text, [&] { tool::find_problems(text, nullptr); });
        const LDIF_File loaded(folder.write("from", text), "", nullptr);
        const LDIF_File other(folder.write("to", text), "", nullptr);
        compared[factor / 4] =
            share_of(text, [&] { tool::changes_between(loaded.root(), other.root()); });
    }
    EXPECT_LT(checked[1], checked[0] * 2);
    EXPECT_LT(compared[1], compared[0] * 2 + 1);
}

TEST_P(large_text, FourTimesAsLongIsPrintedForNoMoreThanItsShareOfMemory) {
    if (is_sanitized()) {
        GTEST_SKIP() << "the same is asked for, but it takes long";
    }
    for (const std::vector<std::string>& reading : readings) {
        double share[2] = {};
        for (const size_t factor : {1, 4}) {
            const std::string text = text_of(file.usual * factor / 4);
            std::vector<std::string> words = {"cfg32", "-f", folder.write("conf", text)};
            words.insert(words.end(), reading.begin(), reading.end());
            share[factor / 4] = share_of(text, [&] { EXPECT_LE(run_unseen(words), 1); });
        }
        EXPECT_LT(share[1], share[0] * 2) << testing::PrintToString(reading);
    }
}

TEST(LongContinuedLine, FourTimesAsLongIsDiffedForNoMoreThanItsShareOfMemory) {
    const auto continued = [](size_t count, const char* line) {
        std::string text = "note: " + std::string(count, 'n') + "\n";
        for (size_t i = 0; i < count; ++i) {
            text += line;
        }
        return text;
    };
    const auto share_of_diff = [&](size_t count) {
        const std::string before = continued(count, " v\n");
        const std::string after = continued(count, " w\n");
        return share_of(before, [&] { tool::unified_diff(before, after, "conf"); });
    };
    EXPECT_LT(share_of_diff(4000), share_of_diff(1000) * 2);
}

namespace {

const std::string modified = "dn: cn=Configuration\nchangetype: modify\n";

/// What records ask for that are carried out as far as they can be, by the byte of them.
double share_of_records(const std::string& text, const std::string& records, int status) {
    const temporary_folder folder;
    const std::string conf = folder.write("conf", text);
    const std::string ldif = folder.write("ldif", records);
    return share_of(records, [&] {
        EXPECT_EQ(run_unseen({"cfg32", "-f", conf, "modify", "-c", "-l", ldif}), status);
    });
}

double share_of_failing_records(size_t count) {
    std::string records;
    for (size_t i = 0; i < count; ++i) {
        const std::string number = std::to_string(i);
        records += modified + "add: list\nlist: " + number + "\n-\n\n";
        records += modified + "add: list\nlist: no " + number + "\n-\ndelete: none\n-\n\n";
    }
    return share_of_records("dn: cn=Configuration\ncn: Configuration\n\n", records, 3);
}

double share_of_replacing_records(size_t count) {
    std::string text = "dn: cn=Configuration\ncn: Configuration\n";
    std::string records;
    for (size_t i = 0; i < count; ++i) {
        const std::string value = "list: " + std::to_string(i);
        text += value + "\n";
        records += modified + "delete: list\n" + value + "\n-\nadd: list\n" + value + "0\n-\n\n";
    }
    return share_of_records(text + "\n", records, 0);
}

}  // namespace

TEST(ManyRecords, ThatFailInTheMiddleAskForNoMoreThanTheirShareOfMemory) {
    EXPECT_LT(share_of_failing_records(400), share_of_failing_records(100) * 2);
}

TEST(ManyRecords, ThatReplaceValuesOfALongListAskForNoMoreThanTheirShareOfMemory) {
    EXPECT_LT(share_of_replacing_records(2000), share_of_replacing_records(500) * 2);
}

// Together their DNs are hundreds of times as long as the file.
TEST(MissingAncestors, AreToldOneByOne) {
    const temporary_folder folder;
    std::string text = "dn: ";
    for (int i = 0; i < 1000; ++i) {
        text += "cn=" + std::to_string(i) + ", ";
    }
    text += "cn=Configuration\ncn: 0\n\ndn: cn=Configuration\ncn: Configuration\n\n";
    const std::string conf = folder.write("conf", text);
    for (const char* option : {"--style=unicode", "--style=ascii", "--json"}) {
        failing_allocation::take_largest();
        EXPECT_EQ(run_unseen({"cfg32", "-f", conf, "tree", option}), 0);
        EXPECT_LT(failing_allocation::take_largest(), 20 * text.size()) << option;
    }
}

INSTANTIATE_TEST_SUITE_P(of, large_text, testing::ValuesIn(large_files()),
                         [](const auto& info) { return std::string(info.param.name); });
