#pragma once

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace cfg32::tests {

/// A folder of the test's own, removed at its end.
class temporary_folder {
  public:
    temporary_folder() {
        std::string name = (std::filesystem::temp_directory_path() / "cfg32-test-XXXXXX").string();
        if (!mkdtemp(name.data())) {
            throw std::filesystem::filesystem_error("mkdtemp", {});
        }
        path_ = name;
    }
    temporary_folder(const temporary_folder&) = delete;
    temporary_folder& operator=(const temporary_folder&) = delete;
    ~temporary_folder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }

    std::string file(const std::string& name) const { return (path_ / name).string(); }

    /// Writes a file and returns its path.
    std::string write(const std::string& name, const std::string& text) const {
        std::ofstream(file(name), std::ios::binary) << text;
        return file(name);
    }

    /// The file's content; a file that is not there fails the test.
    std::string read(const std::string& name) const {
        std::ifstream in(file(name), std::ios::binary);
        EXPECT_TRUE(in.good()) << "no file " << name;
        return {std::istreambuf_iterator<char>(in), {}};
    }

    bool has(const std::string& name) const { return std::filesystem::exists(path_ / name); }

    /// Moves the file's modification time, so that it differs from every one of before.
    void touch(const std::string& name, int seconds_later) const {
        struct stat status {};
        EXPECT_EQ(stat(file(name).c_str(), &status), 0);
        const timespec times[2] = {status.st_atim,
                                   {status.st_mtim.tv_sec + seconds_later, status.st_mtim.tv_nsec}};
        EXPECT_EQ(utimensat(AT_FDCWD, file(name).c_str(), times, 0), 0);
    }

  private:
    std::filesystem::path path_;
};

}  // namespace cfg32::tests
