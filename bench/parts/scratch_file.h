#pragma once

#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <string>

namespace cfg32::bench {

/// A file in a folder of its own, removed at the end.
class scratch_file {
  public:
    explicit scratch_file(const std::string& text) {
        std::string folder = std::filesystem::temp_directory_path() / "cfg32-bench-XXXXXX";
        if (!mkdtemp(folder.data())) {
            throw std::filesystem::filesystem_error("mkdtemp", {});
        }
        folder_ = folder;
        std::ofstream(name(), std::ios::binary) << text;
    }
    scratch_file(const scratch_file&) = delete;
    scratch_file& operator=(const scratch_file&) = delete;
    ~scratch_file() { std::filesystem::remove_all(folder_); }

    std::string folder() const { return folder_; }
    std::string name() const { return folder_ / "conf"; }

  private:
    std::filesystem::path folder_;
};

}  // namespace cfg32::bench
