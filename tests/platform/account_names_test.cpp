#include "account_names.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <utility>

#include "call_faults.h"

namespace cfg32::platform {
namespace {

constexpr const char* unknown_name = "no-such-name-here";

TEST(AccountNames, RootHasTheNumberZero) {
    uid_t owner = 1;
    gid_t group = 1;
    EXPECT_TRUE(find_owner("root", owner));
    EXPECT_TRUE(find_group("root", group));
    EXPECT_EQ(owner, 0u);
    EXPECT_EQ(group, 0u);
}

TEST(AccountNames, ANullNameMeansUnchanged) {
    uid_t owner = 1;
    gid_t group = 1;
    EXPECT_TRUE(find_owner(nullptr, owner));
    EXPECT_TRUE(find_group(nullptr, group));
    EXPECT_EQ(owner, unchanged_owner);
    EXPECT_EQ(group, unchanged_group);
}

TEST(AccountNames, AnUnknownNameIsInvalid) {
    uid_t owner;
    gid_t group;
    for (const char* name : {unknown_name, "", "0"}) {
        errno = 0;
        EXPECT_FALSE(find_owner(name, owner)) << name;
        EXPECT_EQ(errno, EINVAL) << name;
        errno = 0;
        EXPECT_FALSE(find_group(name, group)) << name;
        EXPECT_EQ(errno, EINVAL) << name;
    }
}

TEST(AccountNames, ExhaustedMemoryIsAFailure) {
    uid_t owner;
    const call_fault fault(watched_call::allocate, 1, 0);
    EXPECT_FALSE(find_owner("root", owner));
    EXPECT_EQ(errno, ENOMEM);
}

TEST(AccountNames, ARecordThatDoesNotFitIsAskedForAgainWithMoreRoom) {
    uid_t owner = 1;
    const call_fault fault(watched_call::look_up, 1, ERANGE);
    EXPECT_TRUE(find_owner("root", owner));
    EXPECT_EQ(owner, 0u);
    EXPECT_EQ(fault.calls(), 2);
}

TEST(AccountNames, ARecordThatNeverFitsIsAFailure) {
    uid_t owner;
    const call_fault fault(watched_call::look_up, every_call, ERANGE);
    EXPECT_FALSE(find_owner("root", owner));
    EXPECT_EQ(errno, ERANGE);
}

TEST(AccountNames, AFailureToLookUpIsToldFromANameThatThereIsNot) {
    const std::pair<int, int> rows[] = {{EINTR, EINTR},   {EIO, EIO},       {EMFILE, EMFILE},
                                        {ENFILE, ENFILE}, {ENOMEM, ENOMEM}, {ENOENT, EINVAL},
                                        {ESRCH, EINVAL},  {EPERM, EINVAL}};
    for (const auto& [error, told] : rows) {
        uid_t owner;
        const call_fault fault(watched_call::look_up, 1, error);
        EXPECT_FALSE(find_owner("root", owner));
        EXPECT_EQ(errno, told) << error;
    }
}

}  // namespace
}  // namespace cfg32::platform
