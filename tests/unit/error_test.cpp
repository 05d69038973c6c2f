// The error tables, and what a handle tells of its last failure.

#include "error.h"

#include <gmock/gmock.h>

#include <climits>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <stdexcept>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "cfg32.h"
#include "failing_new.h"
#include "handle.h"

namespace {

using testing::HasSubstr;
using testing::StartsWith;

struct text_row {
    int code;
    const char* text;
};

const std::vector<text_row> ldap_rows = {
#include "ldap_error_rows.inc"
};

const std::vector<text_row> cfg_rows = {
#include "cfg_error_rows.inc"
};

/// The codes below 1000 that have no row: from, to.
constexpr int ldap_gaps[][2] = {{15, 15},   {22, 31},   {37, 47},   {55, 63},   {72, 79},
                                {102, 111}, {121, 127}, {130, 132}, {138, 159}, {164, 175},
                                {179, 191}, {197, 207}, {209, 999}};

/// A handle without a file; what its members own is released as cfg_reset() does.
class error : public testing::Test {
  protected:
    ~error() override { cfg_reset(&handle); }

    /// Gives the handle an exception of its own, as a call that failed leaves it.
    LDIF_Exception& fail(int ldap, int ext, const char* msg = "why") {
        handle.exception = new LDIF_Exception("folder/file.cpp", 7, ldap, ext, msg);
        handle.err = ldap;
        return *handle.exception;
    }

    CfgHandle handle{};
};

using error_tables = error;

// No exception leaves a call.
static_assert(
    noexcept(cfg_init()) && noexcept(cfg_unbind(nullptr)) && noexcept(cfg_reset(nullptr)));
static_assert(noexcept(cfg_bind_s(nullptr, nullptr, nullptr, 0)));
static_assert(noexcept(cfg_search_s(nullptr, nullptr, 0, nullptr, nullptr, 0, nullptr)));

TEST_F(error_tables, LdapTableHasItsRowsInTheStoredOrder) {
    size_t row = 0;
    for (const text_row& expected : ldap_rows) {
        SCOPED_TRACE(expected.code);
        ASSERT_NE(ldap_errlist[row].code, -1) << "the table ends too early";
        EXPECT_EQ(ldap_errlist[row].code, expected.code);
        EXPECT_STREQ(ldap_errlist[row].text, expected.text);
        ++row;
    }
    EXPECT_EQ(ldap_errlist[row].code, -1);
    EXPECT_EQ(ldap_errlist[row].text, nullptr);
}

TEST_F(error_tables, CfgTableHasItsRowsInTheStoredOrder) {
    size_t row = 0;
    for (const text_row& expected : cfg_rows) {
        SCOPED_TRACE(expected.code);
        ASSERT_NE(cfg_errlist[row].code, 0) << "the table ends too early";
        EXPECT_EQ(cfg_errlist[row].code, expected.code);
        EXPECT_STREQ(cfg_errlist[row].text, expected.text);
        ++row;
    }
    EXPECT_EQ(cfg_errlist[row].code, 0);
    EXPECT_STREQ(cfg_errlist[row].text, "Unknown error");
}

TEST_F(error_tables, RowOf16StandsBetween9And10) {
    EXPECT_EQ(ldap_errlist[9].code, 9);
    EXPECT_EQ(ldap_errlist[10].code, 16);
    EXPECT_EQ(ldap_errlist[11].code, 10);
}

TEST_F(error_tables, ThirtiethCfgRowRepeatsTheCode1001) {
    EXPECT_EQ(cfg_errlist[29].code, 1001);
    EXPECT_STREQ(cfg_errlist[29].text, "Value is not a valid file name.");
}

TEST_F(error_tables, EveryLdapCodeHasTheTextOfItsRow) {
    for (const text_row& row : ldap_rows) {
        EXPECT_STREQ(cfg_err2string(row.code), row.text) << row.code;
    }
}

TEST_F(error_tables, EveryCfgCodeHasTheTextOfItsFirstRow) {
    for (const text_row& row : cfg_rows) {
        const char* expected = row.code == 1001 ? "Configuration filename is not valid." : row.text;
        EXPECT_STREQ(cfg_err2string(row.code), expected) << row.code;
    }
}

TEST_F(error_tables, CodeWithoutARowIsUnknown) {
    for (const auto& [from, to] : ldap_gaps) {
        for (int code = from; code <= to; ++code) {
            EXPECT_STREQ(cfg_err2string(code), "Unknown error") << code;
        }
    }
    for (const int code : {INT_MIN, -1000, -2, -1, 1029, 1036, 1037, 2000, 9999, INT_MAX}) {
        EXPECT_STREQ(cfg_err2string(code), "Unknown error") << code;
    }
}

TEST_F(error_tables, TextsOfTheLookUpAreStatic) {
    for (const int code : {-1, 0, 15, 16, 80, 999, 1000, 1029}) {
        EXPECT_EQ(cfg_err2string(code), cfg_err2string(code)) << code;
    }
    EXPECT_EQ(cfg_err2string(16), ldap_errlist[10].text);
    EXPECT_EQ(cfg_err2string(1029), cfg_errlist[36].text);
}

TEST_F(error_tables, TextOfTheRepeatedRowIsNeverFound) {
    for (int code = 1000; code < 1100; ++code) {
        EXPECT_STRNE(cfg_err2string(code), "Value is not a valid file name.") << code;
    }
}

TEST_F(error, NullHandleIsABadParameter) {
    EXPECT_EQ(cfg_get_errno(nullptr), 89);
    EXPECT_EQ(cfg_get_exterror(nullptr), 89);
    EXPECT_EQ(cfg_dump_exception(nullptr), nullptr);
    EXPECT_EQ(cfg_reset(nullptr), 89);
    EXPECT_STREQ(cfg_err2string(89), "Bad parameter to an ldap routine");
}

TEST_F(error, HandleWithoutAFailureTellsOfNone) {
    EXPECT_EQ(cfg_get_errno(&handle), 0);
    EXPECT_EQ(cfg_get_exterror(&handle), 0);
    EXPECT_EQ(cfg_dump_exception(&handle), nullptr);
    EXPECT_EQ(handle.dumpText, nullptr);
}

TEST_F(error, ErrnoIsTheHandlesNumberAndNotTheExceptions) {
    fail(50, 1004);
    handle.err = 49;
    EXPECT_EQ(cfg_get_errno(&handle), 49);
}

TEST_F(error, ExterrorIsTheExtendedCodeOfTheException) {
    fail(50, 1004);
    EXPECT_EQ(cfg_get_errno(&handle), 50);
    EXPECT_EQ(cfg_get_exterror(&handle), 1004);
}

TEST_F(error, NegativeExtendedCodeIsReturnedAsWell) {
    fail(50, -3);
    EXPECT_EQ(cfg_get_exterror(&handle), -3);
}

TEST_F(error, ExterrorOfAnExceptionWithoutAnExtendedCodeIsItsLdapCode) {
    fail(32, 0);
    EXPECT_EQ(cfg_get_exterror(&handle), 32);
}

TEST_F(error, ExterrorWithoutAnExceptionIsTheHandlesNumber) {
    handle.err = 49;
    EXPECT_EQ(cfg_get_exterror(&handle), 49);
    EXPECT_EQ(cfg_dump_exception(&handle), nullptr);
}

TEST_F(error, PerrorChangesAndPrintsNothing) {
    fail(50, 1004);
    const CfgHandle before = handle;
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    cfg_perror(&handle, "prefix");
    cfg_perror(&handle, nullptr);
    cfg_perror(nullptr, "prefix");
    cfg_perror(nullptr, nullptr);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
    EXPECT_EQ(handle.err, before.err);
    EXPECT_EQ(handle.exception, before.exception);
    EXPECT_EQ(handle.dumpText, nullptr);
    EXPECT_EQ(cfg_get_exterror(&handle), 1004);
}

TEST_F(error, DumpIsTheExceptionsReport) {
    const std::string expected = fail(50, 1004).dump();
    EXPECT_EQ(cfg_dump_exception(&handle), expected);
    EXPECT_THAT(expected, StartsWith("[folder/file.cpp:7]\nmsg     why\nldapErr 50: "));
}

TEST_F(error, DumpIsCachedUntilTheNextReset) {
    LDIF_Exception& e = fail(50, 1004);
    const char* first = cfg_dump_exception(&handle);
    EXPECT_EQ(first, handle.dumpText);
    e.msg = "something else";
    EXPECT_EQ(cfg_dump_exception(&handle), first);
    EXPECT_THAT(first, HasSubstr("msg     why\n"));

    EXPECT_EQ(cfg_reset(&handle), 0);
    EXPECT_EQ(handle.dumpText, nullptr);
    EXPECT_EQ(handle.exception, nullptr);
    EXPECT_EQ(cfg_dump_exception(&handle), nullptr);
}

TEST_F(error, CachedDumpIsReturnedEvenWithoutAnException) {
    handle.dumpText = strdup("kept");
    EXPECT_STREQ(cfg_dump_exception(&handle), "kept");
}

TEST_F(error, ReadingTheFailureDoesNotResetIt) {
    fail(50, 1004);
    handle.treeText = strdup("tree");
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(cfg_get_errno(&handle), 50);
        EXPECT_EQ(cfg_get_exterror(&handle), 1004);
        EXPECT_NE(cfg_dump_exception(&handle), nullptr);
    }
    EXPECT_STREQ(handle.treeText, "tree");
}

/// An exception whose report finds no memory, and that counts how many of it there are.
struct heavy_exception : LDIF_Exception {
    explicit heavy_exception(int& alive) : LDIF_Exception("f", 1, 90, 90, "m"), alive(alive) {
        ++alive;
    }
    ~heavy_exception() override { --alive; }
    std::string dump() const override { throw std::bad_alloc(); }
    int& alive;
};

TEST_F(error, DumpWithoutMemoryIsNullAndLeavesTheHandleAlone) {
    int alive = 0;
    handle.exception = new heavy_exception(alive);
    handle.err = 90;
    EXPECT_EQ(cfg_dump_exception(&handle), nullptr);
    EXPECT_EQ(handle.dumpText, nullptr);
    EXPECT_EQ(cfg_get_errno(&handle), 90);
    cfg_reset(&handle);  // while what the exception counts with is there
}

TEST_F(error, ResetDeletesTheWholeChainThroughItsDestructors) {
    int alive = 0;
    LDIF_Exception& outer = fail(50, 1004);
    outer.cause = std::make_unique<LDIF_Exception>("f", 2, 50, 1004, "middle");
    outer.cause->cause = std::make_unique<heavy_exception>(alive);
    EXPECT_EQ(alive, 1);
    cfg_reset(&handle);
    EXPECT_EQ(alive, 0);
    EXPECT_EQ(handle.exception, nullptr);
}

TEST_F(error, ResetForgetsTheNumberAndTheCachedTexts) {
    fail(50, 1004);
    cfg_dump_exception(&handle);
    handle.treeText = strdup("tree");
    EXPECT_EQ(cfg_reset(&handle), 0);
    EXPECT_EQ(cfg_get_errno(&handle), 0);
    EXPECT_EQ(cfg_get_exterror(&handle), 0);
    EXPECT_EQ(handle.dumpText, nullptr);
    EXPECT_EQ(handle.treeText, nullptr);
}

/// What a call leaves in the handle, whatever its operation throws.
using error_capture = error;

TEST_F(error_capture, ExceptionIsKeptAsACopyAndItsLdapCodeReturned) {
    LDIF_Exception thrown("folder/file.cpp", 7, 21, 1016, "not a number");
    thrown.entryDn = "cn=a";
    thrown.cause = std::make_unique<LDIF_Exception>("f", 2, 21, 1016, "inner");
    const int result = cfg32::handle_call(&handle, "cfg_x()", [&]() -> int { throw thrown; });
    EXPECT_EQ(result, 21);
    EXPECT_EQ(cfg_get_errno(&handle), 21);
    EXPECT_EQ(cfg_get_exterror(&handle), 1016);
    ASSERT_NE(handle.exception, nullptr);
    EXPECT_NE(handle.exception, &thrown);
    EXPECT_EQ(handle.exception->dump(), thrown.dump());
    EXPECT_NE(handle.exception->cause, thrown.cause);
}

TEST_F(error_capture, AnyOtherExceptionBecomesTheCallsSystemError) {
    const auto expect_system_error = [this](int result) {
        EXPECT_EQ(result, 80);
        EXPECT_EQ(cfg_get_errno(&handle), 80);
        EXPECT_EQ(cfg_get_exterror(&handle), 1000);
        ASSERT_NE(handle.exception, nullptr);
        EXPECT_EQ(handle.exception->ldapErr, 80);
        EXPECT_EQ(handle.exception->msg, "System error in cfg_add_s()");
        EXPECT_EQ(handle.exception->cause, nullptr);
        EXPECT_EQ(handle.exception->srcFile, "src/libraries/cfg32stl/error_test");
        EXPECT_GT(handle.exception->srcLine, 0);
    };
    const auto call = [this](auto operation) {
        return cfg32::handle_call(&handle, "cfg_add_s()", operation);
    };
    expect_system_error(call([]() -> int { throw std::runtime_error("boom"); }));
    expect_system_error(call([]() -> int { throw std::bad_alloc(); }));
    expect_system_error(call([]() -> int { throw 3; }));
}

/// False when a sanitizer's operators new stand before those that can be told to fail.
bool allocations_can_fail() {
    const cfg32::tests::failing_allocation first(0);
    try {
        const auto memory = std::make_unique<std::string>(100, 'x');
    } catch (const std::bad_alloc&) {
        return true;
    }
    return false;
}

TEST_F(error_capture, WithoutMemoryForTheExceptionTheResultIs90) {
    if (!allocations_can_fail()) {
        GTEST_SKIP() << "the allocations are not the test program's";
    }
    const LDIF_Exception thrown("folder/file.cpp", 7, 21, 1016, "not a number");
    int result = 0;
    {
        const cfg32::tests::failing_allocation first(0);
        result = cfg32::record(handle, thrown);
    }
    EXPECT_EQ(result, 90);
    EXPECT_EQ(cfg_get_errno(&handle), 90);
    EXPECT_EQ(handle.exception, nullptr);
    {
        const cfg32::tests::failing_allocation first(0);
        result = cfg32::record_system_error(handle, "cfg_x()", {});
    }
    EXPECT_EQ(result, 90);
    EXPECT_EQ(cfg_get_exterror(&handle), 90);
    EXPECT_EQ(handle.exception, nullptr);
}

TEST_F(error_capture, NextCallForgetsTheFailureOfTheLast) {
    fail(50, 1004);
    cfg_dump_exception(&handle);
    const int result = cfg32::handle_call(&handle, "cfg_x()", [this] {
        EXPECT_EQ(handle.exception, nullptr);
        EXPECT_EQ(handle.dumpText, nullptr);
        return 0;
    });
    EXPECT_EQ(result, 0);
    EXPECT_EQ(cfg_get_exterror(&handle), 0);
    EXPECT_EQ(cfg_dump_exception(&handle), nullptr);
}

TEST_F(error_capture, FailureWithoutAnExceptionKeepsOnlyItsNumber) {
    EXPECT_EQ(cfg32::handle_call(&handle, "cfg_x()", [] { return 49; }), 49);
    EXPECT_EQ(cfg_get_errno(&handle), 49);
    EXPECT_EQ(cfg_get_exterror(&handle), 49);
    EXPECT_EQ(handle.exception, nullptr);
}

TEST_F(error_capture, NullAndUnboundHandlesAreRefusedBeforeTheOperation) {
    const auto never = [](auto&&...) -> int {
        ADD_FAILURE() << "the operation ran";
        return 0;
    };
    EXPECT_EQ(cfg32::handle_call(nullptr, "cfg_x()", never), 89);
    EXPECT_EQ(cfg32::bound_call(nullptr, "cfg_x()", never), 89);
    EXPECT_EQ(cfg32::bound_call(&handle, "cfg_x()", never), 89);
    EXPECT_EQ(cfg_get_errno(&handle), 89);
    EXPECT_EQ(handle.exception, nullptr);
}

}  // namespace
