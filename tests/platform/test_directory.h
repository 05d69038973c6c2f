#pragma once

#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>
#include <string_view>

// A fresh directory that disappears with its content.
class test_directory {
  public:
    explicit test_directory(const char* parent = nullptr) {
        const char* chosen = std::getenv("TMPDIR");
        std::string name = parent != nullptr ? parent : chosen != nullptr ? chosen : "/tmp";
        name += "/cfg32-test-XXXXXX";
        if (::mkdtemp(name.data()) == nullptr)
            ADD_FAILURE() << "no directory " << name;
        path_ = name;
    }
    test_directory(const test_directory&) = delete;
    test_directory& operator=(const test_directory&) = delete;
    ~test_directory() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }

    const std::string& path() const { return path_; }
    std::string file(std::string_view name) const { return path_ + "/" + std::string(name); }

    std::string write(std::string_view name, std::string_view content, mode_t mode = 0600) const {
        const std::string path = file(name);
        std::ofstream(path, std::ios::binary) << content;
        EXPECT_EQ(::chmod(path.c_str(), mode), 0);
        return path;
    }

    std::set<std::string> names() const {
        std::set<std::string> found;
        for (const auto& entry : std::filesystem::directory_iterator(path_))
            found.insert(entry.path().filename());
        return found;
    }

  private:
    std::string path_;
};

inline std::string content_of(const std::string& path) {
    std::ifstream stream(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

inline struct stat status_of(const std::string& path) {
    struct stat status {};
    EXPECT_EQ(::lstat(path.c_str(), &status), 0) << path;
    return status;
}

inline mode_t mode_of(const std::string& path) { return status_of(path).st_mode & 07777; }
