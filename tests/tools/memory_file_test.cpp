#include "memory_file.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/file.h>
#include <sys/resource.h>

#include "end_of.h"
#include "temporary_folder.h"

namespace cfg32::tool {

namespace {

using tests::end_of;
using tests::temporary_folder;

/// While it lives, this process can open no file.
class no_descriptors {
  public:
    no_descriptors() {
        getrlimit(RLIMIT_NOFILE, &before_);
        const rlimit none = {0, before_.rlim_max};
        setrlimit(RLIMIT_NOFILE, &none);
    }
    ~no_descriptors() { setrlimit(RLIMIT_NOFILE, &before_); }

  private:
    rlimit before_{};
};

}  // namespace

TEST(memory_file, IsAFileThatHoldsTheText) {
    const memory_file file("a text");
    EXPECT_EQ(file.text(), "a text");
    EXPECT_EQ(read_configuration(file.name()), "a text");
}

TEST(memory_file, ThatCanNotBeMadeEndsTheCommand) {
    EXPECT_EQ(end_of([] {
                  const no_descriptors more;
                  memory_file("a text");
              }),
              "a private copy in memory: Too many open files [Unknown error (80)]");
}

TEST(read_configuration, EndsTheCommandWhenTheFileCanNotBeRead) {
    const temporary_folder folder;
    const std::string name = folder.write("f", "a text");
    const locked_file file(name.c_str(), O_WRONLY, LOCK_SH);
    ASSERT_TRUE(file);
    EXPECT_EQ(end_of([&] { text_of(file, "f"); }), "f: Bad file descriptor [Unknown error (80)]");
}

TEST(read_configuration, EndsTheCommandWhenAnotherProgramKeepsTheFile) {
    const temporary_folder folder;
    const std::string name = folder.write("f", "a text");
    const locked_file other(name.c_str(), O_RDWR, LOCK_EX);
    ASSERT_TRUE(other);
    EXPECT_THAT(end_of([&] { read_configuration(name); }),
                testing::StartsWith(name + ": in use by another process"));
    EXPECT_EQ(read_without_waiting(name), "a text");
}

}  // namespace cfg32::tool
