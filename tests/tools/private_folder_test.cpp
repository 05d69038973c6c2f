#include "private_folder.h"

#include <gmock/gmock.h>

#include <cstdlib>

#include "end_of.h"
#include "memory_file.h"

namespace cfg32::tool {

using tests::end_of;

TEST(private_folder, ThatCanNotBeMadeEndsTheCommand) {
    const char* const present = getenv("TMPDIR");
    const std::string before = present ? present : "/tmp";
    setenv("TMPDIR", "/proc", 1);
    EXPECT_THAT(end_of([] { private_folder(); }), testing::StartsWith("/proc/cfg32-"));
    setenv("TMPDIR", before.c_str(), 1);
}

TEST(private_folder, OverwritesNoFile) {
    const private_folder folder;
    const std::string path = folder.write("f", "a text");
    EXPECT_EQ(end_of([&] { folder.write("f", "another"); }), path + ": File exists");
    EXPECT_EQ(read_without_waiting(path), "a text");
}

}  // namespace cfg32::tool
