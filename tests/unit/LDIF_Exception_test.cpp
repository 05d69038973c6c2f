#include "LDIF_Exception.h"

#include <gmock/gmock.h>

#include <cerrno>
#include <climits>
#include <cstring>
#include <memory>
#include <sstream>
#include <string>
#include <type_traits>
#include <utility>

#include "LDIF_AttrType.h"
#include "failures.h"
#include "small_stack.h"

namespace {

using testing::HasSubstr;
using testing::Not;

// Read before any test or call can change them.
const bool first_show_stack = LDIF_Exception::showStack;
const bool first_show_source = LDIF_Exception::showSource;

/// Sets the process-wide flags, and puts them back at the end.
class report_flags {
  public:
    report_flags() { set(true, false); }
    report_flags(const report_flags&) = delete;
    report_flags& operator=(const report_flags&) = delete;
    ~report_flags() { set(stack_, source_); }

    void set(bool stack, bool source) {
        LDIF_Exception::showStack = stack;
        LDIF_Exception::showSource = source;
    }

  private:
    const bool stack_ = LDIF_Exception::showStack;
    const bool source_ = LDIF_Exception::showSource;
};

/// "file.cpp:7" with the message "why" and no context.
LDIF_Exception plain(int ldap = 50, int ext = 50, const char* msg = "why") {
    return LDIF_Exception("folder/file.cpp", 7, ldap, ext, msg);
}

/// An exception with every member set, and causes two levels deep.
LDIF_Exception complete() {
    static const _AttrType type{};
    LDIF_Exception e("a/b.cpp", 12, 21, 1016, "outer");
    e.sysErrno = ENOENT;
    e.sysErrnoKind = 3;
    e.configFile = "/etc/x.conf";
    e.configLine = 44;
    e.entryDn = "cn=a";
    e.attribute = "cn";
    e.value = "v";
    e.attrType = &type;
    e.cause = std::make_unique<LDIF_Exception>("c.cpp", 13, 22, 1017, "middle");
    e.cause->value = "w";
    e.cause->cause = std::make_unique<LDIF_Exception>("d.cpp", 14, 23, 1018, "inner");
    return e;
}

/// Every member but the position in the source and the cause.
void expect_same_context(const LDIF_Exception& actual, const LDIF_Exception& expected) {
    EXPECT_EQ(actual.msg, expected.msg);
    EXPECT_EQ(actual.ldapErr, expected.ldapErr);
    EXPECT_EQ(actual.extErr, expected.extErr);
    EXPECT_EQ(actual.sysErrno, expected.sysErrno);
    EXPECT_EQ(actual.sysErrnoKind, expected.sysErrnoKind);
    EXPECT_EQ(actual.configFile, expected.configFile);
    EXPECT_EQ(actual.configLine, expected.configLine);
    EXPECT_EQ(actual.entryDn, expected.entryDn);
    EXPECT_EQ(actual.attribute, expected.attribute);
    EXPECT_EQ(actual.value, expected.value);
    EXPECT_EQ(actual.attrType, expected.attrType);
}

/// Every member, and the whole chain; no two causes are the same object.
void expect_copy(const LDIF_Exception& actual, const LDIF_Exception& expected) {
    expect_same_context(actual, expected);
    EXPECT_EQ(actual.srcFile, expected.srcFile);
    EXPECT_EQ(actual.srcLine, expected.srcLine);
    ASSERT_EQ(actual.cause == nullptr, expected.cause == nullptr);
    if (expected.cause) {
        EXPECT_NE(actual.cause, expected.cause);
        expect_copy(*actual.cause, *expected.cause);
    }
}

TEST(LDIF_Exception, IsAStandardExceptionWithTheStandardText) {
    const LDIF_Exception e = plain();
    const std::exception& base = e;
    EXPECT_STREQ(base.what(), std::exception().what());
    EXPECT_TRUE((std::is_convertible_v<LDIF_Exception*, std::exception*>));
    EXPECT_TRUE(std::has_virtual_destructor_v<LDIF_Exception>);
}

TEST(LDIF_Exception, StackIsShownAndSourceHiddenAtFirst) {
    EXPECT_TRUE(first_show_stack);
    EXPECT_FALSE(first_show_source);
}

TEST(LDIF_Exception, NewExceptionHasItsArgumentsAndNothingElse) {
    const LDIF_Exception e("/full/path/file.cpp", 17, 34, 1011, "message");
    EXPECT_EQ(e.srcFile, "/full/path/file.cpp");
    EXPECT_EQ(e.srcLine, 17);
    EXPECT_EQ(e.ldapErr, 34);
    EXPECT_EQ(e.extErr, 1011);
    EXPECT_EQ(e.msg, "message");
    EXPECT_EQ(e.sysErrno, 0);
    EXPECT_EQ(e.sysErrnoKind, 0);
    EXPECT_EQ(e.configFile, "");
    EXPECT_EQ(e.configLine, 0);
    EXPECT_EQ(e.entryDn, "");
    EXPECT_EQ(e.attribute, "");
    EXPECT_EQ(e.value, "");
    EXPECT_EQ(e.attrType, nullptr);
    EXPECT_EQ(e.cause, nullptr);
}

TEST(LDIF_Exception, CopyHasEveryMemberAndCausesOfItsOwn) {
    const LDIF_Exception e = complete();
    const LDIF_Exception copy(e);
    expect_copy(copy, e);
    ASSERT_TRUE(copy.cause && copy.cause->cause);
}

TEST(LDIF_Exception, CopyOutlivesTheOriginal) {
    auto e = std::make_unique<LDIF_Exception>(complete());
    const LDIF_Exception copy(*e);
    e->cause->msg = "changed";
    e.reset();
    expect_copy(copy, complete());
}

TEST(LDIF_Exception, ChainKeepsTheContextUnderANewPositionWithACopyAsItsCause) {
    const LDIF_Exception caught = complete();
    const LDIF_Exception e("layer.cpp", 99, caught);
    EXPECT_EQ(e.srcFile, "layer.cpp");
    EXPECT_EQ(e.srcLine, 99);
    expect_same_context(e, caught);
    ASSERT_NE(e.cause, nullptr);
    EXPECT_NE(e.cause.get(), &caught);
    expect_copy(*e.cause, caught);
    expect_copy(caught, complete());
}

TEST(LDIF_Exception, ChainThatTakesTheCaughtOverIsTheSame) {
    const LDIF_Exception copying("layer.cpp", 99, complete());
    LDIF_Exception caught = complete();
    const LDIF_Exception moving("layer.cpp", 99, std::move(caught));
    expect_copy(moving, copying);
    expect_copy(*moving.cause, complete());
}

TEST(LDIF_Exception, ChainOfAnExceptionWithoutCauseHasOneCause) {
    const LDIF_Exception e("layer.cpp", 99, plain());
    ASSERT_NE(e.cause, nullptr);
    EXPECT_EQ(e.cause->cause, nullptr);
    EXPECT_EQ(e.cause->srcFile, "folder/file.cpp");
}

TEST(LDIF_Exception, FileStrIsTheFileWithoutItsFoldersAndTheLine) {
    const struct {
        const char* file;
        int line;
        const char* expected;
    } rows[] = {
        {"", 0, "file?"},
        {"", 5, "file?"},
        {"f.cpp", 5, "f.cpp:5"},
        {"/a/b/f.cpp", 5, "f.cpp:5"},
        {"a\\b\\f.cpp", 5, "f.cpp:5"},
        {"a/b\\f.cpp", 5, "f.cpp:5"},
        {"a\\b/f.cpp", 5, "f.cpp:5"},
        {"/", 1, ":1"},
        {"a/", 1, ":1"},
        {"f", 0, "f:0"},
        {"f", -3, "f:-3"},
        {"f", INT_MAX, "f:2147483647"},
        {"f", INT_MIN, "f:-2147483648"},
        {"src/libraries/cfg32stl/LDIF_DN", 1047, "LDIF_DN:1047"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(LDIF_Exception(row.file, row.line, 1, 1, "m").fileStr(), row.expected);
    }
}

TEST(LDIF_Exception, ErrStrIsTheErrorNumber) {
    LDIF_Exception e = plain();
    EXPECT_EQ(e.errStr(), "0");
    e.sysErrno = 13;
    EXPECT_EQ(e.errStr(), "13");
    e.sysErrno = -13;
    EXPECT_EQ(e.errStr(), "-13");
    e.sysErrno = INT_MIN;
    EXPECT_EQ(e.errStr(), "-2147483648");
}

TEST(LDIF_Exception, MsgStrIsTheMessage) {
    EXPECT_EQ(plain().msgStr(), "why");
    EXPECT_EQ(plain(1, 1, "").msgStr(), "");
}

TEST(LDIF_Exception, StrHasSourceThenErrnoThenMessage) {
    report_flags flags;
    const struct {
        bool show_source;
        int sys_errno;
        int kind;
        const char* msg;
        const char* expected;
    } rows[] = {
        {false, 0, 0, "why", "why\n"},
        {false, 0, 0, "", ""},
        {false, 2, 0, "why", "2: why\n"},
        {false, 2, 7, "why", "2: why\n"},
        {false, 2, 0, "", "2: "},
        {true, 0, 0, "why", "[file.cpp:7] why\n"},
        {true, 2, 0, "why", "[file.cpp:7] 2: why\n"},
        {true, 0, 0, "", "[file.cpp:7] "},
        {true, -5, 0, "", "[file.cpp:7] -5: "},
    };
    for (const auto& row : rows) {
        flags.set(true, row.show_source);
        LDIF_Exception e = plain(50, 1004, row.msg);
        e.sysErrno = row.sys_errno;
        e.sysErrnoKind = row.kind;
        EXPECT_EQ(e.str(), row.expected);
    }
}

TEST(LDIF_Exception, StrShowsTheWholeChainInnermostLast) {
    report_flags flags;
    EXPECT_EQ(complete().str(), "2: outer\nmiddle\ninner\n");
    flags.set(true, true);
    EXPECT_EQ(complete().str(), "[b.cpp:12] 2: outer\n[c.cpp:13] middle\n[d.cpp:14] inner\n");
}

TEST(LDIF_Exception, StrWithoutTheStackShowsNoCause) {
    report_flags flags;
    flags.set(false, false);
    EXPECT_EQ(complete().str(), "2: outer\n");
    flags.set(false, true);
    EXPECT_EQ(complete().str(), "[b.cpp:12] 2: outer\n");
}

TEST(LDIF_Exception, StreamingWritesStrAndReturnsTheStream) {
    std::ostringstream out;
    EXPECT_EQ(&(out << complete()), &out);
    EXPECT_EQ(out.str(), complete().str());
}

/// Says who is asked.
struct talking_exception : LDIF_Exception {
    talking_exception() : LDIF_Exception("f", 1, 1, 1, "m") { sysErrno = 1; }
    std::string dump() const override { return "own dump\n"; }
    std::string fileStr() const override { return "own file"; }
    std::string errStr() const override { return "own errno"; }
    std::string msgStr() const override { return "own msg"; }
};

struct laconic_exception : talking_exception {
    std::string str() const override { return "own str"; }
};

TEST(LDIF_Exception, ReportsAskTheVirtualFunctions) {
    report_flags flags;
    flags.set(true, true);
    EXPECT_EQ(talking_exception().str(), "[own file] own errno: own msg\n");

    LDIF_Exception outer = plain();
    outer.cause = std::make_unique<laconic_exception>();
    EXPECT_EQ(outer.str(), "[file.cpp:7] why\nown str");
    EXPECT_THAT(outer.dump(), testing::EndsWith("\n\nown dump\n"));

    std::ostringstream out;
    const LDIF_Exception& base = *outer.cause;
    out << base;
    EXPECT_EQ(out.str(), "own str");
}

TEST(LDIF_Exception, CauseIsDeletedThroughItsVirtualDestructor) {
    struct counted : LDIF_Exception {
        explicit counted(int& deleted) : LDIF_Exception("f", 1, 1, 1, "m"), deleted(deleted) {}
        ~counted() override { ++deleted; }
        int& deleted;
    };
    int deleted = 0;
    {
        LDIF_Exception outer = plain();
        outer.cause = std::make_unique<counted>(deleted);
    }
    EXPECT_EQ(deleted, 1);
}

TEST(LDIF_Exception, DumpOfABareExceptionHasItsMessageAndItsCode) {
    EXPECT_EQ(plain().dump(),
              "[folder/file.cpp:7]\n"
              "msg     why\n"
              "ldapErr 50: Insufficient access\n");
}

// The bracket that opens a report without a message is not closed.
TEST(LDIF_Exception, DumpWithoutAMessageLeavesTheBracketOpen) {
    EXPECT_EQ(plain(50, 50, "").dump(),
              "[folder/file.cpp:7\n"
              "ldapErr 50: Insufficient access\n");
}

TEST(LDIF_Exception, DumpShowsAnErrorNumberOfTheCLibraryWithItsText) {
    LDIF_Exception e = plain();
    e.sysErrno = ENOENT;
    EXPECT_EQ(e.dump(), "[folder/file.cpp:7]\nmsg     why\nerrno 2: " +
                            std::string(strerror(ENOENT)) + "\nldapErr 50: Insufficient access\n");
    e.sysErrnoKind = 1;
    EXPECT_EQ(e.dump(), plain().dump()) << "a number of another kind is not shown";
}

TEST(LDIF_Exception, DumpShowsTheExtendedCodeOnlyWhenItIsPositiveAndAnother) {
    const struct {
        int ldap;
        int ext;
        const char* expected;
    } rows[] = {
        {90, 90, "ldapErr 90: Out of memory\n"},
        {32, 0, "ldapErr 32: No such object\n"},
        {32, -1, "ldapErr 32: No such object\n"},
        {32, 16, "ldapErr 32: No such object\nextErr 16: No such attribute\n"},
        {91, 1001,
         "ldapErr 91: Connection error\nextErr 1001: Configuration filename is not valid.\n"},
        {21, 1029, "ldapErr 21: Invalid syntax\nextErr 1029: Unknown error\n"},
        {-1, 1000, "ldapErr -1: Unknown error\nextErr 1000: Unexpected error in cfg32 API\n"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(plain(row.ldap, row.ext).dump(),
                  std::string("[folder/file.cpp:7]\nmsg     why\n") + row.expected);
    }
}

TEST(LDIF_Exception, DumpNamesTheConfigurationFileWithOrWithoutALine) {
    const std::string before = plain().dump();
    LDIF_Exception e = plain();
    e.configLine = 12;
    EXPECT_EQ(e.dump(), before) << "a line without a file";
    e.configFile = "/etc/x.conf";
    EXPECT_EQ(e.dump(), before + "Line 12 of /etc/x.conf\n");
    e.configLine = -1;
    EXPECT_EQ(e.dump(), before + "Line -1 of /etc/x.conf\n");
    e.configLine = 0;
    EXPECT_EQ(e.dump(), before + "Config file: /etc/x.conf\n");
}

TEST(LDIF_Exception, DumpNamesEntryAttributeAndValueWhereKnown) {
    const std::string before = plain().dump();
    LDIF_Exception e = plain();
    e.value = "v";
    EXPECT_EQ(e.dump(), before + "value: v\n");
    e.attribute = "a";
    EXPECT_EQ(e.dump(), before + "attribute: a\nvalue: v\n");
    e.entryDn = "cn=x";
    EXPECT_EQ(e.dump(), before + "entry dn: cn=x\nattribute: a\nvalue: v\n");
}

constexpr const char* two_words[] = {"TRUE", "FALSE", nullptr};
constexpr const char* one_word[] = {"only", nullptr};
constexpr const char* no_words[] = {nullptr};
constexpr const char* empty_word_first[] = {"", "b", nullptr};

_AttrType type_row(const char* name, bool is_single, int64_t minimum, int64_t maximum,
                   int64_t bitmask, const char* const* words) {
    _AttrType type{};
    type.name = name;
    type.isSingle = is_single;
    type.minimum = minimum;
    type.maximum = maximum;
    type.bitmask = bitmask;
    type.enumValues = words;
    return type;
}

/// What dump() says about the constraints of a type.
std::string constraints_of(const _AttrType& type) {
    LDIF_Exception e = plain();
    const std::string without = e.dump();
    e.attrType = &type;
    const std::string with = e.dump();
    EXPECT_EQ(with.substr(0, without.size()), without);
    return with.substr(without.size());
}

TEST(LDIF_Exception, DumpShowsTheConstraintsOfTheType) {
    const struct {
        _AttrType type;
        const char* expected;
    } rows[] = {
        {type_row("cn", true, 0, 0, 0, nullptr), "Constraints for cn\n  Single-valued\n"},
        {type_row("cn", false, 0, 0, 0, nullptr), "Constraints for cn\n  Multi-valued\n"},
        {type_row(nullptr, false, 0, 0, 0, nullptr),
         "Constraints for UNKNOWN ATTRIBUTE TYPE\n  Multi-valued\n"},
        {type_row("", false, 0, 0, 0, nullptr), "Constraints for \n  Multi-valued\n"},
        {type_row("n", true, 1, 9, 0, nullptr),
         "Constraints for n\n  Single-valued\n  min: 1\n  max: 9\n"},
        {type_row("n", true, 0, 9, 0, nullptr),
         "Constraints for n\n  Single-valued\n  min: 0\n  max: 9\n"},
        {type_row("n", true, -4, 0, 0, nullptr),
         "Constraints for n\n  Single-valued\n  min: -4\n  max: 0\n"},
        {type_row("n", true, 0, 4294967296, 0, nullptr),
         "Constraints for n\n  Single-valued\n  min: 0\n  max: 4294967296\n"},
        {type_row("e", true, 0, 0, 0, two_words),
         "Constraints for e\n  Single-valued\n  enumeration: { TRUE, FALSE }\n"},
        {type_row("e", true, 0, 0, 0, one_word),
         "Constraints for e\n  Single-valued\n  enumeration: { only }\n"},
        {type_row("e", true, 0, 0, 0, no_words),
         "Constraints for e\n  Single-valued\n  enumeration: {  }\n"},
        {type_row("all", false, 1, 2, 255, two_words),
         "Constraints for all\n  Multi-valued\n  min: 1\n  max: 2\n  bit mask: 0x\n"
         "  enumeration: { TRUE, FALSE }\n"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(constraints_of(row.type), row.expected);
    }
}

// The digits of the mask have never been part of the report.
TEST(LDIF_Exception, DumpShowsABitMaskWithoutItsDigits) {
    for (const int64_t mask : {int64_t{1}, int64_t{0x7fffffff}, int64_t{-1}}) {
        EXPECT_EQ(constraints_of(type_row("m", true, 0, 0, mask, nullptr)),
                  "Constraints for m\n  Single-valued\n  bit mask: 0x\n");
    }
}

TEST(LDIF_Exception, DumpJoinsEnumerationWordsEvenWhenTheFirstIsEmpty) {
    EXPECT_EQ(constraints_of(type_row("e", true, 0, 0, 0, empty_word_first)),
              "Constraints for e\n  Single-valued\n  enumeration: { , b }\n");
}

// Numbers pass through a buffer of 16 bytes, so a longer one loses its last digits.
TEST(LDIF_Exception, DumpShowsFifteenCharactersOfANumber) {
    EXPECT_EQ(constraints_of(type_row("n", true, INT64_MIN, INT64_MAX, 0, nullptr)),
              "Constraints for n\n  Single-valued\n  min: -92233720368547\n"
              "  max: 922337203685477\n");
    EXPECT_EQ(constraints_of(type_row("n", true, -12345678901234, 123456789012345, 0, nullptr)),
              "Constraints for n\n  Single-valued\n  min: -12345678901234\n"
              "  max: 123456789012345\n");
}

TEST(LDIF_Exception, DumpHasItsPartsInOrder) {
    const std::string error_text = strerror(EACCES);
    const _AttrType type = type_row("n", true, 1, 9, 0, nullptr);
    LDIF_Exception e("a/b.cpp", 12, 21, 1015, "outer");
    e.sysErrno = EACCES;
    e.configFile = "/etc/x.conf";
    e.configLine = 44;
    e.entryDn = "cn=a";
    e.attribute = "n";
    e.value = "10";
    e.attrType = &type;
    EXPECT_EQ(e.dump(), "[a/b.cpp:12]\nmsg     outer\nerrno 13: " + error_text +
                            "\n"
                            "ldapErr 21: Invalid syntax\n"
                            "extErr 1015: Integer value is not within allowable range.\n"
                            "Line 44 of /etc/x.conf\n"
                            "entry dn: cn=a\n"
                            "attribute: n\n"
                            "value: 10\n"
                            "Constraints for n\n"
                            "  Single-valued\n"
                            "  min: 1\n"
                            "  max: 9\n");
}

TEST(LDIF_Exception, DumpShowsTheWholeChainInnermostLastAfterBlankLines) {
    report_flags flags;
    const LDIF_Exception inner("c.cpp", 3, 32, 32, "inner");
    LDIF_Exception middle("b.cpp", 2, inner);
    middle.msg = "";
    LDIF_Exception outer("a.cpp", 1, middle);
    outer.msg = "outer";
    const std::string first = "[a.cpp:1]\nmsg     outer\nldapErr 32: No such object\n";
    EXPECT_EQ(outer.dump(), first +
                                "\n[b.cpp:2\nldapErr 32: No such object\n"
                                "\n[c.cpp:3]\nmsg     inner\nldapErr 32: No such object\n");
    flags.set(false, false);
    EXPECT_EQ(outer.dump(), first);
}

TEST(LDIF_Exception, DumpDoesNotDependOnShowSource) {
    report_flags flags;
    const std::string hidden = complete().dump();
    flags.set(true, true);
    EXPECT_EQ(complete().dump(), hidden);
    EXPECT_THAT(hidden, Not(HasSubstr("errno 2"))) << "its kind is not 0";
}

}  // namespace

TEST(LDIF_Exception, AChainThatIsDeeperThanTheStackIsReportedCopiedAndDeleted) {
    cfg32::tests::on_a_small_stack([] {
        constexpr int depth = 10000;
        auto last = std::make_unique<LDIF_Exception>(plain());
        for (int i = 0; i < depth; ++i) {
            last = std::make_unique<LDIF_Exception>("file.cpp", i, std::move(*last));
        }
        const LDIF_Exception copy(*last);
        EXPECT_EQ(copy.dump(), last->dump());
        EXPECT_EQ(copy.str(), last->str());
        EXPECT_THAT(copy.dump(), testing::HasSubstr("[file.cpp:7]"));
    });
}
