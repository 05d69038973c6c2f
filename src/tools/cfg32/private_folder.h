#pragma once

#include <sys/stat.h>

#include <filesystem>
#include <string>
#include <string_view>

namespace cfg32::tool {

inline constexpr mode_t of_owner_only = 0600;

/// A folder that only its owner can look into, removed with the object unless it is kept.
class private_folder {
  public:
    private_folder();
    private_folder(const private_folder&) = delete;
    private_folder& operator=(const private_folder&) = delete;
    ~private_folder();

    /// Writes a file into it that only its owner can read; returns its path.
    std::string write(const std::string& name, std::string_view text) const;

    void keep() { is_kept_ = true; }

  private:
    std::filesystem::path path_;
    bool is_kept_ = false;
};

}  // namespace cfg32::tool
