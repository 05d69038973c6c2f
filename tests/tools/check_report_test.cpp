// Problems as they are printed.

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>

#include "check/check_report.h"
#include "check/source_excerpt.h"
#include "terminal.h"
#include "utf8.h"

using namespace cfg32::tool;
using testing::HasSubstr;

namespace {

problem problem_at(int line, int column, int width, const rule& broken = kind::invalid_value,
                   const std::string& text = "Wrong") {
    problem made{};
    made.broken = &broken;
    made.text = text;
    made.line = line;
    made.column = column;
    made.width = width;
    return made;
}

struct excerpt_row {
    std::string line;
    int column;
    int width;
    std::string shown;
    std::string marker;  // with its indent
};

const std::string sixty(60, 'x');

const excerpt_row excerpts[] = {
    {"oru-slapdPort: 70000", 16, 5, "oru-slapdPort: 70000", "               ^~~~~"},
    {"cn:", 4, 1, "cn:", "   ^"},
    {"cn: x", 99, 1, "cn: x", "     ^"},
    {"cn:\tx", 5, 1, "cn:     x", "        ^"},
    {"cn: \t\tx", 5, 3, "cn:             x", "    ^~~~~~~~~~~~~"},
    {"cn: 漢字x", 7, 1, "cn: 漢字x", "        ^"},
    {"cn: 漢字", 5, 2, "cn: 漢字", "    ^~~~"},
    {"cn: e\u0301x", 7, 1, "cn: e\u0301x", "     ^"},
    {"cn: a\xff\xfe!", 6, 2, "cn: a?\?!", "     ^~"},
    {std::string("cn: a\x1b[2J\0!", 11), 6, 1, "cn: a?[2J?!", "     ^"},
    {"\xff\xfe", 1, 2, "?\?", "^~"},
    {" \xff\xfe", 2, 1, " ?\?", " ^"},
    {"cn: a\u202e!", 6, 1, "cn: a?!", "     ^"},
    // Passwords: the marker is below what is shown.
    {"oru-slapdAdminPW: secret", 19, 6, "oru-slapdAdminPW: ********", "                  ^~~~~~~~"},
    {"oru-slapdAdminPW: secret", 25, 1, "oru-slapdAdminPW: ********", "                  ^~~~~~~~"},
    {"oru-slapdAdminPW: secret", 1, 16, "oru-slapdAdminPW: ********", "^~~~~~~~~~~~~~~~"},
    {"oru-slapdAdminPW secret", 1, 23, "oru-slapdAdminPW ********", "^~~~~~~~~~~~~~~~~~~~~~~~~"},
    {"oru-slapdPort: 70000\r", 16, 5, "oru-slapdPort: 70000", "               ^~~~~"},
    {"\ufeffcn: x", 1, 1, "?cn: x", "^"},
    {"oru-slapdAdminPW=secret", 1, 1, "oru-slapdAdminPW=********", "^"},
    {"oru-slapdAdminPW:: secret", 20, 6, "oru-slapdAdminPW:: ********",
     "                   ^~~~~~~~"},
    {"ORU-slapdInvalidLine: oru-slapdPeerPW secret", 1, 1,
     "ORU-slapdInvalidLine: oru-slapdPeerPW ********", "^"},
    {"oru-slapdAdminPW: {SSHA}abc", 19, 3, "oru-slapdAdminPW: {SSHA}abc", "                  ^~~"},
    // Long lines are cut around the place.
    {"cn: " + sixty + sixty, 5, 120, "cn: " + sixty + sixty.substr(24) + "...",
     "    ^" + std::string(95, '~')},
    {sixty + sixty + "!", 121, 1, "..." + sixty.substr(20) + "!", std::string(43, ' ') + "^"},
    {sixty + sixty + "!" + sixty + sixty, 121, 1,
     "..." + sixty.substr(20) + "!" + sixty.substr(1) + "...", std::string(43, ' ') + "^"},
};

TEST(SourceExcerpt, PutsTheMarkerBelowThePlace) {
    for (const excerpt_row& row : excerpts) {
        const file_text file(row.line);
        const source_excerpt shown = source_excerpts(file).of(problem_at(1, row.column, row.width));
        EXPECT_EQ(shown.line, row.shown);
        EXPECT_EQ(shown.indent + shown.marker, row.marker) << row.shown;
    }
}

TEST(SourceExcerpt, ShowsPlacesOfOneLineInAnyOrder) {
    const std::string text = sixty + "\t" + sixty + "\n" + "cn: x\n";
    const file_text file(text);
    source_excerpts excerpts(file);
    for (const int column : {1, 61, 62, 121, 62, 30, 130}) {
        const source_excerpt shown = excerpts.of(problem_at(1, column, 2));
        const source_excerpt alone = source_excerpts(file).of(problem_at(1, column, 2));
        EXPECT_EQ(shown.line, alone.line) << column;
        EXPECT_EQ(shown.indent, alone.indent) << column;
        EXPECT_EQ(shown.marker, alone.marker) << column;
    }
    EXPECT_EQ(excerpts.of(problem_at(2, 1, 2)).line, "cn: x");
}

TEST(SourceExcerpt, HidesAPasswordThatGoesOnOnTheNextLine) {
    const file_text file("cn: a\n b\noru-slapdAdminPW: sec\n r\n et");
    source_excerpts excerpts(file);
    EXPECT_EQ(excerpts.of(problem_at(2, 2, 1)).line, " b");
    EXPECT_EQ(excerpts.of(problem_at(3, 19, 3)).line, "oru-slapdAdminPW: ********");
    EXPECT_EQ(excerpts.of(problem_at(4, 1, 1)).line, " ********");
    EXPECT_EQ(excerpts.of(problem_at(5, 4, 1)).line, " ********");
    EXPECT_EQ(excerpts.of(problem_at(2, 2, 1)).line, " b");
    EXPECT_EQ(source_excerpts(file).of(problem_at(5, 4, 1)).line, " ********");
}

TEST(SourceExcerpt, HidesWhatFollowsANameThatGoesOnOnTheNextLine) {
    const file_text file(
        "oru-slapdAdm\n\r inPW: secret\n\roru-slapdPeerPW: secret\n# c\n cn: a\n"
        " oru-slapdPeerPW secret\n   \n oru-slapdPeerPW secret\n");
    source_excerpts excerpts(file);
    EXPECT_EQ(excerpts.of(problem_at(1, 1, 1)).line, "oru-slapdAdm");
    EXPECT_EQ(excerpts.of(problem_at(2, 3, 1)).line, " ********");
    EXPECT_EQ(excerpts.of(problem_at(3, 1, 1)).line, "?oru-slapdPeerPW: ********");
    EXPECT_EQ(excerpts.of(problem_at(5, 1, 1)).line, " cn: a") << "comments are not continued";
    EXPECT_EQ(excerpts.of(problem_at(6, 1, 1)).line, " oru-slapdPeerPW secret")
        << "the value of cn";
}

/// A file with two problems.
checked_file two_problems() {
    checked_file file{"a b/100%:ö,.conf", "cn: a\noru-slapdPort: 70000\n", {}};
    file.problems.push_back(
        problem_at(1, 5, 1, kind::duplicate_value, "stands\ntwice: 100%, \x01"));
    file.problems.push_back(problem_at(2, 16, 5));
    file.problems.back().accepted = "an integer";
    file.problems.back().entry = shared_text("cn=M\xfcnchen");
    file.problems.back().attribute = "oru-slapdPort";
    file.problems.back().result = 21;
    file.problems.back().extended = 1015;
    return file;
}

TEST(TextReport, PrintsAsCompilersDo) {
    choose_color(color_choice::never);
    EXPECT_EQ(text_report({two_problems()}),
              "a b/100%:ö,.conf:1:5: warning: stands?twice: 100%, ? [duplicate-value]\n"
              "    1 | cn: a\n"
              "      |     ^\n"
              "a b/100%:ö,.conf:2:16: error: Wrong [invalid-value]\n"
              "    2 | oru-slapdPort: 70000\n"
              "      |                ^~~~~\n"
              "      = accepted: an integer\n"
              "1 error, 1 warning\n");
}

TEST(TextReport, SaysNothingOfFilesWithoutProblems) {
    EXPECT_EQ(text_report({}), "");
    EXPECT_EQ(text_report({{"a", "cn: x\n", {}}, {"b", "", {}}}), "");
}

TEST(TextReport, CountsOverAllFiles) {
    choose_color(color_choice::never);
    EXPECT_TRUE(text_report({two_problems(), {"b", "", {}}, two_problems()})
                    .ends_with("\n2 errors, 2 warnings\n"));
}

TEST(TextReport, ShowsNoLineWhereThereIsNone) {
    choose_color(color_choice::never);
    EXPECT_EQ(text_report({{"a", "", {problem_at(1, 1, 1)}}}),
              "a:1:1: error: Wrong [invalid-value]\n1 error\n");
}

TEST(TextReport, IsColouredWhenAsked) {
    choose_color(color_choice::always);
    const std::string report = text_report({two_problems()});
    choose_color(color_choice::never);
    EXPECT_THAT(report, HasSubstr("\x1b[1m\x1b[31merror:\x1b[0m"));
    EXPECT_THAT(report, HasSubstr("\x1b[1m\x1b[35mwarning:\x1b[0m"));
    EXPECT_THAT(report, HasSubstr("^~~~~\x1b[0m"));
}

std::string json_of(const std::vector<checked_file>& files) {
    std::string all;
    json_report(files, [&](std::string_view piece) { all += piece; });
    return all;
}

TEST(JsonReport, HoldsWhatIsKnown) {
    const auto report = nlohmann::json::parse(json_of({two_problems(), {"b", "", {}}}));
    ASSERT_EQ(report["files"].size(), 2U);
    EXPECT_EQ(report["files"][0]["file"], "a b/100%:ö,.conf");
    EXPECT_EQ(report["files"][1]["problems"], nlohmann::json::array());
    EXPECT_EQ(report["files"][0]["problems"][1], nlohmann::json::parse(R"({
        "rule": "invalid-value", "severity": "error", "consequence": "kept-aside",
        "text": "Wrong", "line": 2, "column": 16, "width": 5,
        "entry": "cn=M\ufffdnchen", "attribute": "oru-slapdPort", "accepted": "an integer",
        "result": 21, "extended": 1015})"));
    EXPECT_EQ(nlohmann::json::parse(json_of({})), nlohmann::json::parse(R"({"files": []})"));
}

TEST(JsonReport, ComesInPiecesOfOneProblemAndIsLaidOutAsAWhole) {
    checked_file file = two_problems();
    file.problems[1].accepted = std::string(1000, 'a') + "\n\"";
    for (const auto& files : std::vector<std::vector<checked_file>>{
             {}, {{"b", "", {}}}, {file, file, {"b", "", {}}, file}}) {
        const std::string whole = json_of(files);
        EXPECT_EQ(whole, nlohmann::ordered_json::parse(whole).dump(2) + "\n");
        json_report(files, [](std::string_view piece) { EXPECT_LT(piece.size(), 1500U); });
    }
}

TEST(SarifReport, HasWhatTheFormatRequires) {
    const auto report = nlohmann::json::parse(sarif_report({two_problems()}));
    EXPECT_EQ(report["version"], "2.1.0");
    EXPECT_THAT(report["$schema"].get<std::string>(), HasSubstr("sarif-schema-2.1.0.json"));
    const auto& run = report["runs"][0];
    EXPECT_EQ(run["columnKind"], "unicodeCodePoints");
    const auto& driver = run["tool"]["driver"];
    EXPECT_EQ(driver["name"], "cfg32");
    EXPECT_EQ(driver["version"], CFG32_VERSION);
    ASSERT_EQ(driver["rules"].size(), rules.size());
    ASSERT_EQ(run["results"].size(), 2U);
    for (const auto& result : run["results"]) {
        EXPECT_EQ(driver["rules"][result["ruleIndex"].get<size_t>()]["id"], result["ruleId"]);
    }
    EXPECT_EQ(run["results"][1]["level"], "error");
    EXPECT_EQ(run["results"][1]["message"]["text"], "Wrong (accepted: an integer)");
    EXPECT_EQ(run["results"][1]["locations"][0]["physicalLocation"], nlohmann::json::parse(R"({
        "artifactLocation": {"uri": "a%20b/100%25%3A%C3%B6%2C.conf"},
        "region": {"startLine": 2, "startColumn": 16, "endColumn": 21}})"));
}

TEST(SarifReport, NamesAFileByItsAbsolutePath) {
    const auto report =
        nlohmann::json::parse(sarif_report({{"/etc/a", "", {problem_at(1, 1, 1)}}}));
    EXPECT_EQ(report["runs"][0]["results"][0]["locations"][0]["physicalLocation"]
                    ["artifactLocation"]["uri"],
              "file:///etc/a");
}

TEST(GithubReport, EscapesWhatEndsACommand) {
    EXPECT_EQ(github_report({two_problems()}),
              "::warning file=a b/100%25%3Aö%2C.conf,line=1,col=5,title=duplicate-value"
              "::stands%0Atwice: 100%25, \x01\n"
              "::error file=a b/100%25%3Aö%2C.conf,line=2,col=16,title=invalid-value"
              "::Wrong (accepted: an integer)\n");
}

TEST(Utf8, ReplacesWhatIsNoCharacter) {
    EXPECT_EQ(utf8("a\xffö漢\U0001f600\xc3"), "a\ufffdö漢\U0001f600\ufffd");
    EXPECT_EQ(utf8(""), "");
}

TEST(Rules, HaveNamesOfTheirOwn) {
    for (const rule* each : rules) {
        EXPECT_EQ(std::string(each->id).find_first_not_of("abcdefghijklmnopqrstuvwxyz0123456789-"),
                  std::string::npos)
            << each->id;
        for (const rule* other : rules) {
            EXPECT_TRUE(each == other || std::string_view(each->id) != other->id) << each->id;
        }
    }
}

}  // namespace
