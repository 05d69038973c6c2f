// Each kind of problem is found at its place, and a load does what its rule says.

#include <gmock/gmock.h>
#include <sys/mman.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "check/problem.h"
#include "disk.h"
#include "environment.h"
#include "unique_fd.h"

using namespace cfg32::tool;
using cfg32::tests::is_sanitized;
using testing::HasSubstr;

namespace {

const std::string head = "version: 1\ncharset: UTF-8\n\n";  // three lines
const std::string top = "dn: cn=Configuration\ncn: Configuration\n";
const std::string begun = head + top;  // five lines; what follows belongs to the top entry

using key_pointer = std::unique_ptr<aes_key_data, decltype(&aes_key_data_free)>;

key_pointer some_key(unsigned char byte) {
    const std::vector<unsigned char> bytes(32, byte);
    return {aes_key_data_from_bytes(bytes.data(), bytes.size()), aes_key_data_free};
}

std::string encoded(const std::string& clear, aes_key_data* key) {
    char out[256];
    EXPECT_EQ(1, format_password(CFG32_PASSWORD_SELECTOR, CFG32_PASSWORD_FLAG, key, clear.c_str(),
                                 static_cast<int>(clear.size()), out, sizeof out));
    return out;
}

/// "line:column rule" for each problem.
std::vector<std::string> places(const std::vector<problem>& problems) {
    std::vector<std::string> all;
    for (const problem& each : problems) {
        all.push_back(std::to_string(each.line) + ":" + std::to_string(each.column) + " " +
                      each.broken->id);
    }
    return all;
}

std::vector<std::string> found_in(const std::string& text, aes_key_data* key = nullptr) {
    return places(find_problems(text, key));
}

bool has(const std::vector<problem>& problems, consequence outcome) {
    return std::any_of(problems.begin(), problems.end(),
                       [&](const problem& each) { return each.outcome() == outcome; });
}

bool has(const std::vector<problem>& problems, const rule& wanted) {
    return std::any_of(problems.begin(), problems.end(),
                       [&](const problem& each) { return each.broken == &wanted; });
}

/// What the library makes of a text.
struct load {
    bool is_done = false;
    bool is_rewritten = false;
    std::string failure;
};

load load_of(const std::string& text, aes_key_data* key = nullptr) {
    const cfg32::unique_fd file(memfd_create("conf", MFD_CLOEXEC));
    EXPECT_TRUE(cfg32::replace_content(file.get(), text));
    load made;
    try {
        const LDIF_File store("/proc/self/fd/" + std::to_string(file.get()), "", key);
        made.is_done = true;
    } catch (const LDIF_Exception& e) {
        made.failure = e.dump();
    }
    std::string after;
    EXPECT_TRUE(cfg32::read_all(file.get(), text.size(), after));
    made.is_rewritten = after != text;
    return made;
}

/// A load does what is said of the text. Returns what is said.
std::vector<problem> expect_agreement(const std::string& text, aes_key_data* key = nullptr) {
    const std::vector<problem> problems = find_problems(text, key);
    const bool is_stopped = has(problems, consequence::stops_load);
    const load made = load_of(text, key);
    EXPECT_EQ(can_be_loaded(problems), !is_stopped);
    EXPECT_EQ(made.is_done, !is_stopped)
        << made.failure << testing::PrintToString(places(problems));
    if (made.is_done) {
        EXPECT_EQ(made.is_rewritten, has(problems, consequence::kept_aside));
        if (!has(problems, kind::unwritable_entry)) {
            EXPECT_EQ(loadable_part(text, problems), text) << "nothing is left out without need";
        }
    }
    const std::string part = loadable_part(text, problems);
    const load again = load_of(part, key);
    EXPECT_TRUE(again.is_done) << again.failure << part;
    const std::vector<problem> rest = find_problems(part, key);
    EXPECT_TRUE(std::all_of(rest.begin(), rest.end(),
                            [](const problem& each) { return each.first_left_out == 0; }))
        << part << testing::PrintToString(places(rest));
    return problems;
}

struct row {
    std::string text;
    std::vector<std::string> problems;
};

std::string orphan(const std::string& dn) { return "\ndn: " + dn + "\ncn: x\n"; }

// clang-format off
const row rows[] = {
    // Nothing to say.
    {begun, {}},
    {top, {}},
    {"# A comment\n\n" + begun + "# and one at the end", {}},
    {begun + "oru-slapdSetenv: A=1\noru-slapdSetenv: B=2\n", {}},
    {begun + "NUV-INSTANCEDESC: known in any case\n", {}},
    {"VERSION: 1\nCharSet: x\n" + top, {}},
    {begun + "\n   \n\t\n# comment\n", {}},
    // Values.
    {begun + "oru-slapdPort: 70000\n", {"6:16 invalid-value"}},
    {begun + "oru-slapdPort:   70000\n", {"6:18 invalid-value"}},
    {begun + "oru-slapdPort:\n 70000\n", {"7:2 invalid-value"}},
    {begun + "oru-slapdPort:\n  70000\n", {"7:3 invalid-value"}},
    {begun + "oru-slapdPort: \n  \n\t7 0\n", {"8:2 invalid-value"}},
    {begun + "oru-slapdSuffix: dc=a,\n b\n", {"7:3 invalid-value"}},
    {begun + "oru-slapdPort:\t\n", {"6:16 invalid-value"}},
    {begun + "oru-slapdReadOnly: maybe\noru-slapdPort: x\n", {"6:20 invalid-value", "7:16 invalid-value"}},
    {begun + "oru-slapdSuffix: dc=a, b\n", {"6:25 invalid-value"}},
    {begun + "oru-slapdSuffix: dc=a, =b\n", {"6:24 invalid-value"}},
    {begun + "oru-slapdSuffix: dc=\n", {"6:21 invalid-value"}},
    {begun + "oru-slapdAdminPW: " + std::string(2000, 'x') + "\n", {"6:19 invalid-value"}},
    {begun + "oru-slapdAdminPW: a\noru-slapdAdminPW: {SHA}x\n", {"7:19 invalid-value"}},
    {begun + "oru-slapdSslCipherSpecs: 1\n", {"6:26 invalid-value"}},
    // Lines.
    {begun + "oru-slapdPort 389\n", {"6:1 missing-separator"}},
    {begun + ": 389\n", {"6:1 missing-separator"}},
    {begun + "one\ntwo\n three\n", {"6:1 missing-separator", "7:1 missing-separator"}},
    {begun + "one\none\n", {"6:1 missing-separator", "7:1 missing-separator"}},
    {begun + "oru-slapdInvalidLine: oru-slapdPort 389\n", {"6:23 kept-line"}},
    {begun + "cn2: x\n", {"6:1 unknown-attribute"}},
    {begun + "oru-slapdSetenv:: QT0x\n", {"6:19 literal-base64"}},
    {begun + "oru-slapdSetenv:< file:///a\n", {"6:17 literal-base64"}},
    {begun + "nuv-instanceDesc:\n", {}},
    {begun + "nuv-instanceDesc::\n", {}},
    {"", {"1:1 missing-configuration"}},
    {"\n\n# nothing\n", {"3:1 missing-configuration"}},
    {begun + "nuv-instanceDesc: x", {"6:20 missing-final-newline"}},
    {begun + "nuv-instanceDesc: x\n y", {"7:3 missing-final-newline"}},
    {begun + "nuv-instanceDesc: x\n ", {"7:2 missing-final-newline"}},
    {begun + "nuv-instanceDesc:", {}},
    {begun + "oru-slapdPort: 1", {"6:17 missing-final-newline"}},
    {begun + "oru-slapdPort: x", {"6:16 invalid-value", "6:17 missing-final-newline"}},
    {begun + "oru-slapdSuffix: dc=a, b", {"6:25 invalid-value", "6:25 missing-final-newline"}},
    {begun + "cn: y", {"6:5 second-value", "6:6 missing-final-newline"}},
    {begun + "cn: configuration", {"6:18 missing-final-newline", "6:5 duplicate-value"}},
    {"version: 1", {"1:1 missing-configuration", "1:11 missing-final-newline"}},
    {"version: 2", {"1:1 attribute-outside-entry", "1:10 invalid-value", "1:1 missing-configuration", "1:11 missing-final-newline"}},
    {"dn: cn=Configuration", {"1:21 missing-final-newline"}},
    {begun + "\ndn: cn=a, b", {"7:12 invalid-dn", "7:12 missing-final-newline"}},
    {begun + "\ndn: cn=a, cn=b, cn=Configuration", {"7:33 missing-final-newline", "7:5 missing-ancestor"}},
    {begun + "\ndn: cn=, cn=Configuration", {"7:26 missing-final-newline", "7:5 unwritable-entry"}},
    {begun + "\ndn: cn=, cn=Configuration\n\ndn: cn=b, cn=Configuration\noru-slapdPort: 1", {"7:5 blocked-repair", "10:17 missing-final-newline"}},
    {begun + "\ndn: cn=a", {"7:9 missing-final-newline"}},
    {begun + "nuv-instanceDesc", {"6:1 missing-separator"}},
    {begun + "nuv-instanceDesc\n x", {"6:1 missing-separator", "7:3 missing-final-newline"}},
    {begun + std::string("nuv-instanceDesc: a\0b\n", 22), {"6:20 nul-byte"}},
    {begun + std::string("# a\0b\n", 6), {"6:4 nul-byte"}},
    {begun + std::string("oru-slapdPort: 389\0x\n\0\n", 23), {"6:19 nul-byte", "7:1 nul-byte"}},
    // Above the first entry, and between entries.
    {"cn: x\n" + begun, {"1:1 attribute-outside-entry"}},
    {"cn: x\ncn: y\n# c\n z: 1\n" + begun, {"1:1 attribute-outside-entry", "4:1 unknown-attribute"}},
    {"version: 2\n" + begun, {"1:1 attribute-outside-entry", "1:10 invalid-value"}},
    {"version: 1\ncn: x\ncharset: UTF-8\ncn: y\n" + top, {"2:1 attribute-outside-entry", "4:1 attribute-outside-entry"}},
    {"no colon\n" + begun, {"1:1 attribute-outside-entry", "1:1 missing-separator"}},
    {begun + "\noru-slapdPort: x\ncn: y\n", {"7:1 attribute-outside-entry", "7:16 invalid-value"}},
    {begun + "\ncn: x\n\ncn: y\n", {"7:1 attribute-outside-entry", "9:1 attribute-outside-entry"}},
    {"version: 1\nversion: 1\ncharset: x\n" + top, {"2:1 repeated-header"}},
    {"charset: x\nversion: 1\nCHARSET: y\n z\n" + top, {"3:1 repeated-header"}},
    {top + "\nversion: 1\n", {"4:1 repeated-header"}},
    {begun + "version: 1\n", {}},
    {begun + "oru-slapdInvalidLine: x\n\noru-slapdInvalidLine: x\n", {"6:23 kept-line", "8:1 attribute-outside-entry", "8:23 kept-line"}},
    // DN lines.
    {begun + "\ndn: cn=a, b\ncn: a\noru-slapdPort: x\n", {"7:12 invalid-dn", "9:16 invalid-value"}},
    {begun + "\ndn: cn=a,\n", {"7:10 invalid-dn"}},
    {begun + "\ndn: cn=a,\n cn=\\g\n", {"8:5 invalid-dn"}},
    {begun + "\ndn: \\\n", {"7:5 invalid-dn"}},
    {begun + "dn cn=a\ncn: a\n# c\n\n", {"6:1 invalid-dn"}},
    {begun + "dn=a\ncn: a\n", {"6:1 invalid-dn"}},
    {begun + "\ndn: dn=ab\\20\n\ndn=ab\ncn: a\n", {"9:1 missing-separator", "9:1 duplicate-entry"}},
    {begun + "dnsName\n", {"6:1 invalid-dn"}},
    {begun + "dnsName: x\n", {"6:1 unknown-attribute"}},
    {"dn: a\nversion: 1\n\nversion: 1\n\n" + top, {"1:6 invalid-dn"}},
    {begun + "\ndn:\n", {"7:4 empty-dn"}},
    {begun + "\ndn:\ncn: x\n", {"7:4 empty-dn"}},
    {begun + "\ndn:\ncn: x\n\ndn: cn=b, cn=Configuration\noru-slapdPort: x\n", {"7:4 blocked-repair", "7:4 empty-dn", "11:16 invalid-value"}},
    {begun + "\ndn:\n cn=a, cn=Configuration\ncn: a\n", {}},
    {begun + "\ndn:\n cn=a, b\ncn: a\n", {"8:9 invalid-dn"}},
    {begun + "\ndn:\n cn=, cn=Configuration\ncn: a\n", {"8:2 unwritable-entry"}},
    {begun + "\ndn: cn=\ncn: a\n\ndn: cn=\ncn: b\n", {"7:5 unwritable-entry", "10:5 duplicate-entry", "10:5 unwritable-entry", "11:5 second-value"}},
    {begun + "\ndn:\ncharset: x\n", {"7:4 empty-dn", "8:10 second-value"}},
    {begun + "\ndn: cn=a + ou=b, cn=Configuration\n", {"7:5 dn-changes"}},
    {begun + "\ndn: cn=ab , cn=Configuration\n", {"7:5 dn-changes"}},
    {begun + "\ndn: cn=ab\\20, cn=Configuration\n", {}},
    {begun + "\ndn: cn=\"a, b\" , cn=Configuration\n", {}},
    {begun + "oru-slapdSuffix: cn=a + ou=b\noru-slapdSuffix: o=c , o=d\n", {"6:18 dn-changes", "7:18 dn-changes"}},
    {begun + "\ndn: cn=, cn=Configuration\n", {"7:5 unwritable-entry"}},
    {begun + "\ndn: cn=a\\0Ab, cn=Configuration\n", {"7:5 unwritable-entry"}},
    {begun + "\ndn: cn=, cn=Configuration\nx\n", {"7:5 blocked-repair", "8:1 missing-separator"}},
    {begun + "oru-slapdSuffix: cn=a\\0Ab\n", {"4:5 unwritable-entry"}},
    {begun + "oru-slapdSuffix: cn=a\\0Db\nx\n", {"4:5 blocked-repair", "7:1 missing-separator"}},
    {begun + "# c\n x: 1\n", {"7:1 unknown-attribute"}},
    {begun + "# c\n x: 1\n# c\n x: 2\n", {"4:5 unwritable-entry", "7:1 unknown-attribute", "9:1 unknown-attribute"}},
    {begun + "# c\n x: 1\n# c\n x: 2\ny\n", {"4:5 blocked-repair", "7:1 unknown-attribute", "9:1 unknown-attribute", "10:1 missing-separator"}},
    {begun + "# c\n x: 1\ny\n", {"7:1 unknown-attribute", "8:1 missing-separator"}},
    // Duplicates.
    {begun + "cn: configuration\n", {"6:5 duplicate-value"}},
    {begun + "cn: other\n", {"6:5 second-value"}},
    {begun + "oru-slapdSuffix: dc=a,dc=b\noru-slapdSuffix: DC=A; dc=b\n", {"7:18 duplicate-value"}},
    {begun + "oru-slapdPort: 389\noru-slapdPort: 0389\noru-slapdPort: 390\n", {"7:16 duplicate-value", "8:16 second-value"}},
    {begun + "\ndn: CN=configuration\ncn: Configuration\n", {"7:5 duplicate-entry"}},
    {begun + "\ndn: cn=Configuration\ncn: x\n", {"7:5 duplicate-entry", "8:5 second-value"}},
    {begun + "oru-slapdAdminPW: a\n\ndn: cn=Configuration\noru-slapdAdminPW: a\n", {"8:5 duplicate-entry"}},
    {begun + "oru-slapdAdminPW: {SHA}a\n\ndn: cn=Configuration\ncn: c\noru-slapdAdminPW: {SHA}a\n", {"8:5 unmergeable-entry", "9:5 second-value"}},
    {begun + "oru-slapdAdminPW: {SHA}a\noru-slapdPort: x\n\ndn: cn=Configuration\ny\noru-slapdAdminPW: {SHA}a\n", {"7:16 invalid-value", "9:5 unmergeable-entry", "10:1 missing-separator"}},
    // The tree.
    {begun + orphan("cn=a, cn=b, cn=Configuration"), {"7:5 missing-ancestor"}},
    {begun + orphan("cn=a, cn=b, cn=c, cn=Configuration") + orphan("cn=c, cn=Configuration"), {"7:5 missing-ancestor"}},
    {begun + orphan("cn=a, cn=b, cn=Configuration") + orphan("cn=b, cn=Configuration"), {}},
    {begun + orphan("cn=a, dc=x") + orphan("cn=b, cn=a, dc=x"), {}},
    {begun + orphan("cn=a, cn=b, cn=Configuration") + orphan("cn=b, cn=Configuration, x"), {"7:5 missing-ancestor", "10:30 invalid-dn"}},
    {head + "dn: cn=a, cn=Configuration\n", {"4:1 missing-configuration"}},
    // Bytes.
    {begun + "nuv-instanceDesc: M\xfcnchen\n", {"6:20 invalid-bytes"}},
    {begun + "nuv-instanceDesc: M\xc3\xbcnchen \xff\xfe!\n", {"6:27 invalid-bytes"}},
    {begun + "nuv-instanceDesc: a\n b\xff\n c\n", {"7:3 invalid-bytes"}},
    {begun + "# M\xfcnchen\n", {"6:4 invalid-bytes"}},
    {begun + "# M\xfcnchen\n cn: not a continuation\n", {"6:4 invalid-bytes", "7:1 unknown-attribute"}},
    {begun + "# M\xfcnchen\n   \ncn: x\n", {"6:4 invalid-bytes", "8:1 attribute-outside-entry"}},
    {begun + "\ndn: cn=\xfc, cn=Configuration\ncn: x\noru-slapdPort: x\n\n", {"7:8 invalid-bytes", "9:16 invalid-value"}},
    {begun + std::string("nuv-instanceDesc: a\0\xff\n", 22), {"6:20 nul-byte"}},
    {begun + "nuv-instanceDesc \xff\n", {"6:1 missing-separator", "6:18 invalid-bytes"}},
    {begun + "n\xff: \xff\n", {"6:1 unknown-attribute", "6:2 invalid-bytes"}},
    {begun + "oru-slapdPort: 7\xff\n", {"6:16 invalid-value", "6:17 invalid-bytes"}},
    {begun + "oru-slapdSuffix: dc=\xff, b\n", {"6:21 invalid-bytes", "6:25 invalid-value"}},
    {begun + "nuv-instanceDesc:: \xff\n", {"6:20 invalid-bytes", "6:20 literal-base64"}},
    {begun + "nuv-instanceDesc: \xff", {"6:19 invalid-bytes", "6:20 missing-final-newline"}},
    {begun + "nuv-instanceDesc: x\n v\xff\n v\n v\xff\xff", {"7:3 invalid-bytes", "9:3 invalid-bytes", "9:5 missing-final-newline"}},
    {begun + "nuv-instanceDesc: J\xc3\xb6rg\noru-slapdPort: \xc3\xb6\n", {"7:16 invalid-value"}},
    {begun + "n\xc3\xb6: \xc3\xb6\nn\xc3\xb6:: \xc3\xb6\n", {"6:1 unknown-attribute", "7:1 unknown-attribute", "7:6 literal-base64", "7:6 duplicate-value"}},
    // The line before the last fails.
    {std::string(cfg32::unfinished_mark) + begun, {"1:1 unfinished-write"}},
    {std::string(cfg32::unfinished_mark) + std::string(cfg32::unfinished_mark) + begun, {"1:1 unfinished-write"}},
    {"cn: x\n" + std::string(cfg32::unfinished_mark) + begun, {"1:1 attribute-outside-entry"}},
    {std::string(cfg32::unfinished_mark), {"1:1 missing-configuration", "1:1 unfinished-write"}},
    {begun + std::string(cfg32::unfinished_mark), {}},
    // A byte order mark is part of what follows it.
    {"\xef\xbb\xbf" + begun, {"1:1 byte-order-mark"}},
    {"\xef\xbb\xbf" + top, {"1:1 byte-order-mark"}},
    {"\xef\xbb\xbf# a comment\n" + begun + "oru-slapdPort: x\n", {"1:1 byte-order-mark", "7:16 invalid-value"}},
    {"\xef\xbb\xbfversion: x\n" + top, {"1:1 byte-order-mark", "1:2 attribute-outside-entry", "1:11 invalid-value"}},
    {"\xef\xbb\xbf\xef\xbb\xbf" + top, {"1:1 byte-order-mark", "1:2 byte-order-mark"}},
    {"\xef\xbb\xbf\xef\xbb\xbf\xef\xbb\xbfversion: x\n" + top, {"1:1 byte-order-mark", "1:2 byte-order-mark", "1:3 byte-order-mark", "1:4 attribute-outside-entry", "1:13 invalid-value"}},
    {"\xef\xbb\xbf", {"1:1 byte-order-mark", "1:2 missing-configuration"}},
    // Nothing of a hidden password's length shows.
    {begun + "oru-slapdAdminPW: secret", {"6:19 missing-final-newline"}},
    {begun + "oru-slapdAdminPW:\n sec\n ret", {"8:2 missing-final-newline"}},
    {begun + std::string("oru-slapdAdminPW: sec\0ret\n", 26), {"6:19 nul-byte"}},
    {begun + "oru-slapdAdminPW: sec\xff\n", {"6:19 invalid-bytes"}},
    // Carriage returns are not seen.
    {begun + "oru-slapdPort: 1\n\r 2\n\rcn\n", {"8:1 missing-separator"}},
    {"version: 1\r\n\r\ndn: cn=Configuration\r\noru-slapdPort: 389\r\noru-slapdPort: 70000\r\n", {"5:16 invalid-value"}},
};
// clang-format on

std::vector<std::string> sorted_copy(std::vector<std::string> all) {
    std::sort(all.begin(), all.end());
    return all;
}

TEST(FindProblems, FindsEachAtItsPlace) {
    for (const row& each : rows) {
        EXPECT_EQ(sorted_copy(found_in(each.text)), sorted_copy(each.problems)) << each.text;
    }
}

TEST(FindProblems, SaysWhatALoadDoes) {
    const key_pointer key = some_key('k');
    for (const row& each : rows) {
        SCOPED_TRACE(each.text);
        expect_agreement(each.text);
        expect_agreement(each.text, key.get());
    }
}

TEST(FindProblems, SaysWhatALoadDoesWithAnyTwoTogether) {
    const size_t step = is_sanitized() ? 7 : 1;
    for (size_t first = 0; first < std::size(rows); ++first) {
        for (size_t second = first % step; second < std::size(rows); second += step) {
            const std::string text = rows[first].text + "\n" + rows[second].text;
            SCOPED_TRACE(text);
            expect_agreement(text);
        }
    }
}

struct mutation {
    std::mt19937 random{20240229};

    size_t below(size_t end) { return std::uniform_int_distribution<size_t>(0, end - 1)(random); }
    size_t line_begin(const std::string& text) {
        const size_t newline = text.rfind('\n', below(text.size()));
        return newline == std::string::npos ? 0 : newline + 1;
    }
    std::string line_at(const std::string& text, size_t begin) {
        return text.substr(begin, text.find('\n', begin) - begin) + "\n";
    }
    void apply(std::string& text) {
        static const std::string bytes("\n\n\n  ::\\,=+;\"#xX09\r\t\0\xff\xc3", 23);
        const size_t at = below(text.size());
        const size_t line = line_begin(text);
        switch (below(8)) {
            case 0:
                text[at] = bytes[below(bytes.size())];
                break;
            case 1:
                text.insert(at, 1, bytes[below(bytes.size())]);
                break;
            case 2:
                text.erase(at, 1 + below(20));
                break;
            case 3:
                text.erase(line, line_at(text, line).size());
                break;
            case 4:
                text.insert(line, line_at(text, line_begin(text)));
                break;
            case 5:
                text.insert(line, rows[below(std::size(rows))].text);
                break;
            case 6:
                text.insert(line, 1, bytes[below(bytes.size())]);
                break;
            default:
                text.resize(below(20) == 0 ? at + 1 : text.size());
        }
    }
};

TEST(FindProblems, SaysWhatALoadDoesWithADamagedFile) {
    std::ifstream in(CFG32_EXAMPLES "/oruslapd.conf", std::ios::binary);
    const std::string example{std::istreambuf_iterator<char>(in), {}};
    ASSERT_FALSE(example.empty());
    const key_pointer key = some_key('k');
    mutation mutate;
    int loaded = 0;
    int rewritten = 0;
    constexpr int rounds = is_sanitized() ? 100 : 700;
    for (int i = 0; i < rounds && !testing::Test::HasFailure(); ++i) {
        std::string text = example;
        for (size_t count = 1 + mutate.below(4); count > 0 && !text.empty(); --count) {
            mutate.apply(text);
        }
        SCOPED_TRACE("round " + std::to_string(i));
        aes_key_data* const used = i % 2 == 0 ? nullptr : key.get();
        const std::vector<problem> problems = expect_agreement(text, used);
        const bool is_loaded = !has(problems, consequence::stops_load);
        loaded += is_loaded;
        rewritten += is_loaded && has(problems, consequence::kept_aside);
    }
    // All three outcomes came up often.
    EXPECT_GT(loaded, rounds / 10);
    EXPECT_GT(rounds - loaded, rounds / 10);
    EXPECT_GT(rewritten, rounds / 20);
}

problem only(const std::string& text, const rule& wanted, aes_key_data* key = nullptr) {
    for (const problem& each : find_problems(text, key)) {
        if (each.broken == &wanted) {
            return each;
        }
    }
    ADD_FAILURE() << "no " << wanted.id;
    return {};
}

TEST(FindProblems, TellsTheCodesOfAValue) {
    const problem found = only(begun + "oru-slapdPort: 70000\n", kind::invalid_value);
    EXPECT_EQ(found.text, "Integer value out of range");
    EXPECT_EQ(found.result, 21);
    EXPECT_EQ(found.extended, 1015);
    EXPECT_EQ(found.width, 5);
    EXPECT_EQ(found.entry.str(), "cn=Configuration");
    EXPECT_EQ(found.attribute, "oru-slapdPort");
}

TEST(FindProblems, TellsTheLineOfTheFirst) {
    EXPECT_THAT(only(begun + "cn: configuration\n", kind::duplicate_value).text,
                HasSubstr("the first one on line 5"));
    // Such a name reads back as another.
    EXPECT_THAT(only(begun + "oru-slapdSuffix: o=x\noru-slapdSuffix: cn=a b+ou=z\n"
                             "oru-slapdSuffix: cn=a b+ou=z\n",
                     kind::duplicate_value)
                    .text,
                HasSubstr("the first one on line 7"));
    EXPECT_THAT(only(begun + "\ndn: cn=Configuration\ncn: x\n", kind::second_value).text,
                HasSubstr("on line 5"));
    EXPECT_THAT(only(begun + "\ndn: cn=Configuration\n", kind::duplicate_entry).text,
                HasSubstr("on line 4"));
    EXPECT_THAT(only("charset: a\ncharset: b\n" + top, kind::repeated_header).text,
                HasSubstr("line 1"));
}

TEST(FindProblems, NamesEveryMissingAncestor) {
    const std::string text = begun + orphan("cn=a, cn=b, cn=c, cn=Configuration");
    EXPECT_EQ(only(text, kind::missing_ancestor).text,
              "no entry \"cn=b, cn=c, cn=Configuration\" and \"cn=c, cn=Configuration\" above this "
              "one");
}

TEST(FindProblems, NamesNoMoreThanThreeMissingAncestors) {
    std::string dn = "cn=e0";
    for (int i = 1; i < 4000; ++i) {
        dn += ", cn=e" + std::to_string(i);
    }
    const std::string text =
        only(begun + orphan(dn + ", cn=Configuration"), kind::missing_ancestor).text;
    EXPECT_THAT(text, testing::EndsWith("cn=Configuration\" and 3996 more above this one"));
    EXPECT_LT(text.size(), 4 * dn.size());
}

struct judged_row {
    std::string line;
    consequence outcome;
};

TEST(FindProblems, TellsWhatTheMissingNewlineDoes) {
    const judged_row judged[] = {{"nuv-instanceDesc: x", consequence::loses_text},
                                 {"oru-slapdPort: 1", consequence::kept_aside},
                                 {"oru-slapdSuffix: dc=a, b", consequence::loses_text}};
    for (const judged_row& each : judged) {
        EXPECT_EQ(only(begun + each.line, kind::missing_final_newline).outcome(), each.outcome)
            << each.line;
    }
    EXPECT_EQ(only("version: 1", kind::missing_final_newline).outcome(), consequence::stops_load);
    const problem unseen = only(begun + "oru-slapdSuffix: dc=a, b", kind::invalid_value);
    EXPECT_EQ(unseen.outcome(), consequence::none);
    EXPECT_EQ(unseen.result, 0);
}

TEST(FindProblems, TellsNothingOfAPasswordsLength) {
    const auto width_in = [](const std::string& line, const rule& wanted) {
        return only(begun + line, wanted).width;
    };
    EXPECT_EQ(width_in("oru-slapdAdminPW:: secret\n", kind::literal_base64), 1);
    EXPECT_EQ(width_in("oru-slapdAdminPW: a\noru-slapdAdminPW: {SHA}secret\n", kind::invalid_value),
              11)
        << "a hashed one is seen";
    EXPECT_EQ(width_in("oru-slapdAdminPW open sesame\n", kind::missing_separator), 18);
    EXPECT_EQ(width_in("oru-slapdInvalidLine: oru-slapdAdminPW: open sesame\n", kind::kept_line),
              19);
}

TEST(FindProblems, SaysOfThreeColonsThatAllAreDropped) {
    EXPECT_THAT(only(begun + "cn2:: 1\n", kind::literal_base64).text,
                HasSubstr("taken as it stands"));
    EXPECT_EQ(only(begun + "cn2:::1\n", kind::literal_base64).text,
              "\":::\" is not understood: the value is what follows them, not base64");
}

TEST(FindProblems, TellsARunsPlaceAndLines) {
    const problem above = only("cn: a\ncn: b\n" + begun, kind::attribute_outside);
    EXPECT_EQ(above.text, "attributes above the first entry");
    EXPECT_EQ(above.first_left_out, 1);
    EXPECT_EQ(above.last_left_out, 2);
    const problem below = only(begun + "\ncn: a\n b\n", kind::attribute_outside);
    EXPECT_EQ(below.text, "an attribute below the blank line that ended the entry");
    EXPECT_EQ(below.first_left_out, 7);
    EXPECT_EQ(below.last_left_out, 8);
}

TEST(FindProblems, TriesPasswordsWithTheKey) {
    const key_pointer right = some_key('r');
    const key_pointer wrong = some_key('w');
    const std::string sealed = encoded("secret", right.get());
    const std::string masked = encoded("secret", nullptr);
    const std::string text = begun + "oru-slapdAdminPW: " + sealed +
                             "\noru-slapdPeerPW: " + masked +
                             "\noru-slapdMasterPW: {SSHA}abc\noru-slapdProxyPw: clear\n";
    EXPECT_THAT(found_in(text), testing::IsEmpty()) << "nothing is tried without a key";
    EXPECT_THAT(found_in(text, right.get()), testing::IsEmpty());
    EXPECT_THAT(found_in(text, wrong.get()), testing::ElementsAre("6:19 undecodable-password"));
}

TEST(FindProblems, PutsNoPasswordIntoATextOfAProblem) {
    const std::string long_secret = "secret" + std::string(2000, 's');
    const std::string text = begun + "oru-slapdAdminPW: " + long_secret +
                             "\noru-slapdAdminPW secret\noru-slapdAdminPW secret: x\n"
                             "oru-slapdAdminPW=secret\noru-slapdAdminPW=secret: x\n"
                             "oru-slapdInvalidLine: oru-slapdAdminPW: secret\n"
                             "oru-slapdPeerPW: secret1\noru-slapdPeerPW: secret2\n"
                             "oru-slapdPeerPW: secret2\noru-slapdMasterPW:: c2secretA=\n"
                             "oru-slapdProxyPw: secret";
    const std::vector<problem> problems = find_problems(text, nullptr);
    EXPECT_GE(problems.size(), 8U);
    for (const problem& each : problems) {
        for (const std::string& part :
             {each.text, each.entry.str(), each.attribute, each.accepted}) {
            EXPECT_THAT(part, testing::Not(HasSubstr("secret"))) << each.broken->id;
        }
    }
}

TEST(FindProblems, IsSortedByPlace) {
    for (const row& each : rows) {
        const std::vector<problem> problems = find_problems(each.text, nullptr);
        EXPECT_TRUE(std::is_sorted(
            problems.begin(), problems.end(), [](const problem& left, const problem& right) {
                return std::pair(left.line, left.column) < std::pair(right.line, right.column);
            }));
    }
}

TEST(FindProblems, FindsSomethingOfEachRuleButTheOneOfFolders) {
    std::vector<std::string> missing;
    for (const rule* each : rules) {
        const bool is_found = std::any_of(std::begin(rows), std::end(rows), [&](const row& line) {
            return std::any_of(line.problems.begin(), line.problems.end(), [&](const auto& text) {
                return text.ends_with(std::string(" ") + each->id);
            });
        });
        if (!is_found) {
            missing.push_back(each->id);
        }
    }
    // The first has a test with a key.
    EXPECT_THAT(missing, testing::ElementsAre("undecodable-password", "leftover-copy"));
}

}  // namespace
