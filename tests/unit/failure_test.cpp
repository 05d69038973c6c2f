// How the library throws: the source position, the context that layers add, the system errors.

#include "failure.h"

#include <gmock/gmock.h>

#include <cstring>
#include <new>
#include <stdexcept>
#include <string>

#include "LDIF_Exception.h"
#include "failures.h"

namespace {

using cfg32::failure;
using cfg32::throw_site;
using cfg32::tests::failure_of;
using cfg32::tests::summary;

constexpr failure not_found{32, 32, "not found: "};
constexpr const char* this_source = "src/libraries/cfg32stl/failure_test";

void expect_thrown_here(const LDIF_Exception& e, int line) {
    EXPECT_EQ(e.srcFile, this_source);
    EXPECT_EQ(e.srcLine, line);
}

TEST(failure, SourceIsTheLibrarysFolderAndTheFilesBaseName) {
    const struct {
        const char* path;
        const char* expected;
    } rows[] = {
        {"LDIF_DN.cpp", "src/libraries/cfg32stl/LDIF_DN"},
        {"/somewhere/else/LDIF_DN.cpp", "src/libraries/cfg32stl/LDIF_DN"},
        {"src/libraries/cfg32stl/LDIF_DN.parser.h", "src/libraries/cfg32stl/LDIF_DN"},
        {"a.b/c.d/LDIF_AttrType.text.cpp", "src/libraries/cfg32stl/LDIF_AttrType"},
        {"../x/LDIF_Util", "src/libraries/cfg32stl/LDIF_Util"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(throw_site(row.path, 1).source(), row.expected);
    }
}

TEST(failure, MadeExceptionHasCodesTextDetailAndPlace) {
    const int line = __LINE__ + 1;
    const LDIF_Exception e = cfg32::make_exception({50, 1004, "Unable to open: "}, "x.conf");
    EXPECT_EQ(summary(e), "50/1004 Unable to open: x.conf");
    expect_thrown_here(e, line);
    EXPECT_EQ(e.sysErrno, 0);
    EXPECT_EQ(e.cause, nullptr);
}

TEST(failure, RaiseThrowsFromTheCallersPlace) {
    int line = 0;
    const LDIF_Exception e = failure_of([&] {
        line = __LINE__ + 1;
        cfg32::raise(not_found);
    });
    EXPECT_EQ(summary(e), "32/32 not found: ");
    expect_thrown_here(e, line);
}

TEST(failure, RaiseWithFillsTheDetailsIn) {
    int line = 0;
    const LDIF_Exception e = failure_of([&] {
        line = __LINE__ + 1;
        cfg32::raise_with(not_found, "cn=a", [](LDIF_Exception& e) { e.entryDn = "cn=a"; });
    });
    EXPECT_EQ(summary(e), "32/32 not found: cn=a");
    EXPECT_EQ(e.entryDn, "cn=a");
    expect_thrown_here(e, line);
}

TEST(failure, ContextReturnsWhatTheBodyReturns) {
    int number = 3;
    EXPECT_EQ(&cfg32::with_context([&]() -> int& { return number; }, cfg32::no_details), &number);
    EXPECT_EQ(cfg32::with_boundary(
                  cfg32::in("f()"), [] { return 4; }, cfg32::no_details),
              4);
}

TEST(failure, ContextChainsAPassingExceptionWithItsOwnPlaceInFront) {
    int line = 0;
    const LDIF_Exception e = failure_of([&] {
        line = __LINE__ + 1;
        cfg32::with_context([] { throw LDIF_Exception("inner.cpp", 5, 21, 1016, "why"); },
                            [](LDIF_Exception& e) { e.value = "v"; });
    });
    EXPECT_EQ(summary(e), "21/1016 why");
    EXPECT_EQ(e.srcFile, this_source);
    EXPECT_GE(e.srcLine, line);
    EXPECT_EQ(e.value, "v");
    ASSERT_NE(e.cause, nullptr);
    EXPECT_EQ(summary(*e.cause), "21/1016 why");
    EXPECT_EQ(e.cause->srcFile, "inner.cpp");
    EXPECT_EQ(e.cause->srcLine, 5);
    EXPECT_EQ(e.cause->value, "") << "the context is the layer's, not the thrower's";
    EXPECT_EQ(e.cause->cause, nullptr);
}

TEST(failure, LayersAddUpInnermostLast) {
    const LDIF_Exception e = failure_of([] {
        cfg32::with_context(
            [] {
                cfg32::with_context([] { cfg32::raise(not_found, "x"); },
                                    [](LDIF_Exception& e) { e.attribute = "a"; });
            },
            [](LDIF_Exception& e) { e.entryDn = "cn=a"; });
    });
    EXPECT_EQ(e.entryDn, "cn=a");
    EXPECT_EQ(e.attribute, "a");
    ASSERT_TRUE(e.cause && e.cause->cause);
    EXPECT_EQ(e.cause->entryDn, "");
    EXPECT_EQ(e.cause->attribute, "a");
    EXPECT_EQ(e.cause->cause->attribute, "");
    EXPECT_EQ(e.cause->cause->cause, nullptr);
}

TEST(failure, ContextLetsOtherExceptionsPass) {
    const auto never = [](LDIF_Exception&) { ADD_FAILURE(); };
    EXPECT_THROW(cfg32::with_context([] { throw std::runtime_error("x"); }, never),
                 std::runtime_error);
    EXPECT_THROW(cfg32::with_context([] { throw 3; }, never), int);
}

TEST(failure, BoundaryTurnsAnyOtherExceptionIntoItsSystemError) {
    const auto thrown_by = [](auto body) {
        return failure_of([&] {
            cfg32::with_boundary(cfg32::in("LDIF_File::setAuthentication()"), body,
                                 [](LDIF_Exception& e) { e.configFile = "x.conf"; });
        });
    };
    const LDIF_Exception errors[] = {
        thrown_by([] { throw std::runtime_error("x"); }),
        thrown_by([] { throw std::bad_alloc(); }),
        thrown_by([] { throw 3; }),
    };
    for (const LDIF_Exception& e : errors) {
        EXPECT_EQ(summary(e), "80/1000 System error in LDIF_File::setAuthentication()");
        EXPECT_EQ(e.srcFile, this_source);
        EXPECT_GT(e.srcLine, 0);
        EXPECT_EQ(e.configFile, "x.conf");
        EXPECT_EQ(e.cause, nullptr);
    }
}

TEST(failure, BoundaryChainsAnLdifException) {
    const LDIF_Exception e = failure_of([] {
        cfg32::with_boundary(
            cfg32::in("f()"), [] { cfg32::raise(not_found, "x"); },
            [](LDIF_Exception& e) { e.configFile = "x.conf"; });
    });
    EXPECT_EQ(summary(e), "32/32 not found: x");
    EXPECT_EQ(e.configFile, "x.conf");
    ASSERT_NE(e.cause, nullptr);
    EXPECT_EQ(e.cause->configFile, "");
    EXPECT_EQ(e.cause->cause, nullptr);
}

TEST(failure, SystemErrorLetsAnLdifExceptionPassAsItIs) {
    const LDIF_Exception e = failure_of([] {
        cfg32::with_system_error(
            cfg32::in("f()"), [] { throw LDIF_Exception("inner.cpp", 5, 32, 32, "x"); },
            [](LDIF_Exception&) { ADD_FAILURE(); });
    });
    EXPECT_EQ(e.srcFile, "inner.cpp");
    EXPECT_EQ(e.cause, nullptr);
}

// The text of a system error is made only when there is one.
TEST(failure, BoundaryAsksForItsTextOnlyWhenItFails) {
    const auto never = [] {
        ADD_FAILURE();
        return std::string();
    };
    EXPECT_EQ(cfg32::with_boundary(
                  never, [] { return 1; }, cfg32::no_details),
              1);
    failure_of([&] {
        cfg32::with_boundary(
            never, [] { cfg32::raise(not_found); }, cfg32::no_details);
    });
}

}  // namespace
