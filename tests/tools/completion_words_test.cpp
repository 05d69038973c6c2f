// What may stand at the end of a command line.

#include "completion/completion_words.h"

#include <gmock/gmock.h>

#include <CLI/CLI.hpp>
#include <algorithm>

#include "file_lock.h"

using namespace cfg32::tool;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::IsSupersetOf;
using testing::Not;

namespace {

constexpr const char* example = CFG32_EXAMPLES "/oruslapd.conf";

/// A program with commands such as the real one has.
class CompletionWords : public testing::Test {
  protected:
    CompletionWords() {
        program.add_option("-f,--file", text)->type_name("FILE");
        program.add_option("--color", text)->type_name("auto|never");
        program.add_option("-D,--bind-dn", text)->type_name("DN");
        CLI::App* set = program.add_subcommand("set", "give an attribute these values");
        set->add_option("dn", text)->type_name("DN");
        set->add_option("attribute", text)->type_name("ATTR");
        set->add_option("values", texts)->type_name("VALUE");
        set->add_flag("-n,--dry-run");
        set->add_flag("--hidden")->group("");
        CLI::App* search = program.add_subcommand("search", "print entries");
        search->add_option("-b,--base", text)->type_name("DN");
        search->add_option("-s", text)->type_name("base|one|sub");
        search->add_option("filter", text)->type_name("FILTER");
        search->add_option("attributes", texts)->type_name("ATTR");
    }

    std::vector<std::string> words_of(std::vector<std::string> line) {
        line.insert(line.begin(), "cfg32");
        const completion_words found = complete(program, line);
        EXPECT_FALSE(found.are_files);
        std::vector<std::string> words;
        for (const candidate& each : found.words) {
            words.push_back(each.text);
        }
        return words;
    }

    bool are_files(std::vector<std::string> line) {
        line.insert(line.begin(), "cfg32");
        return complete(program, line).are_files;
    }

    CLI::App program;
    std::string text;
    std::vector<std::string> texts;
};

TEST_F(CompletionWords, AreTheCommandsFirst) {
    EXPECT_THAT(words_of({""}), ElementsAre("set", "search"));
    EXPECT_THAT(words_of({"--color", "never", "-f", "a", "-fb", "--file=c", ""}),
                ElementsAre("set", "search"));
}

TEST_F(CompletionWords, ComeWithTheirDescriptions) {
    EXPECT_EQ(complete(program, {"cfg32", ""}).words.front().description,
              "give an attribute these values");
}

TEST_F(CompletionWords, AreTheOptionsOfTheCommandAndTheSharedOnesAfterADash) {
    EXPECT_THAT(words_of({"set", "-"}), ElementsAre("--help", "-h", "--dry-run", "-n", "--file",
                                                    "-f", "--color", "--bind-dn", "-D"));
    EXPECT_THAT(words_of({"--"}),
                ElementsAre("--help", "-h", "--file", "-f", "--color", "--bind-dn", "-D"));
}

TEST_F(CompletionWords, AreFilesWhereAFileIsExpected) {
    EXPECT_TRUE(are_files({"-f", ""}));
    EXPECT_TRUE(are_files({"set", "--file", "a"}));
    EXPECT_TRUE(are_files({"set", "--file="}));
}

TEST_F(CompletionWords, AreTheWordsThatAnOptionTakes) {
    EXPECT_THAT(words_of({"--color", ""}), ElementsAre("auto", "never"));
    EXPECT_THAT(words_of({"--color=n"}), ElementsAre("--color=auto", "--color=never"));
    EXPECT_THAT(words_of({"search", "-s", ""}), ElementsAre("base", "one", "sub"));
    EXPECT_THAT(words_of({"set", "-n", "-s", ""}), Not(Contains("sub")));
}

TEST_F(CompletionWords, AreTheNamesOfTheFilesEntriesWhereADnIsExpected) {
    const std::vector<std::string> names = words_of({"-f", example, "set", ""});
    EXPECT_THAT(names, IsSupersetOf({"cn=Configuration",
                                     "cn=Client Listener, cn=Network, cn=Configuration"}));
    EXPECT_EQ(words_of({"search", std::string("--file=") + example, "-b", ""}), names);
    EXPECT_EQ(words_of({"search", std::string("-f") + example, "--base", ""}), names);
}

TEST_F(CompletionWords, AreTheAdministratorsWhereTheOneWhoBindsIsExpected) {
    const std::vector<std::string> names = words_of({"-f", example, "-D", ""});
    EXPECT_THAT(names, IsSupersetOf({"cn=root", "cn=jvoss, ou=staff, dc=example, dc=com"}));
    EXPECT_THAT(names, Not(Contains("cn=Configuration")));
    EXPECT_EQ(words_of({"-f", example, "set", "--bind-dn", ""}), names);
}

TEST_F(CompletionWords, AreThereWhileAnotherProgramHasLockedTheFile) {
    const cfg32::locked_file locked(example, O_RDONLY, LOCK_EX);
    ASSERT_TRUE(locked);
    EXPECT_THAT(words_of({"-f", example, "set", ""}), Contains("cn=Configuration"));
}

TEST_F(CompletionWords, AreNoneForAFileThatIsNotThere) {
    EXPECT_THAT(words_of({"-f", "/nowhere/at/all", "set", ""}), IsEmpty());
}

TEST_F(CompletionWords, AreTheAttributesWhereOneIsExpected) {
    EXPECT_EQ(words_of({"set", "cn=Configuration", ""}).size(), 196U);
    EXPECT_THAT(words_of({"set", "cn=Configuration", "-n", ""}), Contains("oru-slapdPort"));
    EXPECT_THAT(words_of({"search", "(cn=*)", "cn", "oru-slapdPort", ""}),
                Contains("oru-slapdPort"));
}

TEST_F(CompletionWords, AreTheWordsOfTheAttributeWhereItsValueIsExpected) {
    EXPECT_THAT(words_of({"set", "cn=x", "oru-slapdReadOnly", ""}), ElementsAre("true", "false"));
    EXPECT_THAT(words_of({"set", "cn=x", "oru-slapdPort", ""}), IsEmpty());
}

TEST_F(CompletionWords, AreArgumentsAfterTwoDashes) {
    EXPECT_THAT(words_of({"set", "--", "cn=x", "oru-slapdReadOnly", "-"}),
                ElementsAre("true", "false"));
}

TEST_F(CompletionWords, AreNoneAfterAnUnknownCommandOrATextOfItsOwn) {
    EXPECT_THAT(words_of({"search", ""}), IsEmpty());
    EXPECT_THAT(words_of({"set", "--unknown="}), Not(Contains("--hidden")));
    EXPECT_THAT(complete(program, {"cfg32"}).words, IsEmpty());
    EXPECT_THAT(complete(program, {}).words, IsEmpty());
}

}  // namespace
