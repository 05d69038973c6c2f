#pragma once

#include <sys/types.h>

#include <ostream>
#include <string>
#include <vector>

#include "temporary_folder.h"

// File systems of a test's own, which can be filled.

namespace cfg32::tests {

struct file_system {
    const char* name;
    const char* make;  ///< the command that makes it in a file; null for one in memory
    off_t size = 1 << 20;
};

inline void PrintTo(const file_system& one, std::ostream* out) { *out << one.name; }

/// A mounted file system for a configuration file and its backup. Nobody else sees the mount: the
/// process has left the others' namespace, so a test with one has a process of its own.
class small_disk {
  public:
    explicit small_disk(const file_system& kind);
    small_disk(const small_disk&) = delete;
    small_disk& operator=(const small_disk&) = delete;
    ~small_disk();

    /// Why there is none, "" if there is.
    const std::string& obstacle() const { return obstacle_; }

    std::string config() const { return place() + "/oruslapd.conf"; }
    std::string backup() const { return place() + "/oruslapd.bak"; }
    /// "" when there is no such file.
    static std::string text_of(const std::string& path);

    /// Takes all the room that is left, but for so many bytes.
    void fill(size_t left = 0) const;
    void make_room() const;

    /// The names in the folder, save those that are to be there.
    std::vector<std::string> other_files() const;

  private:
    std::string place() const { return outside_.file("disk"); }
    std::string filler() const { return place() + "/filler"; }
    std::string mounted(const file_system& kind) const;

    const temporary_folder outside_;
    std::string obstacle_;
};

}  // namespace cfg32::tests
