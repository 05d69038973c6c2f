#pragma once

#include <array>

#include "unique_fd.h"

namespace cfg32::platform {

// A new, empty file under a random name in an open directory, accessible to the calling user only.
// It is removed when it goes, errno kept, unless it was given its final name before.
class temporary_file {
  public:
    // Does not own the directory's descriptor, which has to live longer.
    explicit temporary_file(int directory);
    temporary_file(const temporary_file&) = delete;
    temporary_file& operator=(const temporary_file&) = delete;
    ~temporary_file();

    // False if no file could be created, with errno saying why.
    explicit operator bool() const { return static_cast<bool>(fd_); }
    int fd() const { return fd_.get(); }

    // Closes the file and moves it to a name in the same directory, replacing what bears it.
    bool move_to(const char* name);

  private:
    int create();
    bool choose_name();

    // ".cfg32-", 16 hexadecimal digits, ".tmp"
    std::array<char, 28> name_{};
    int directory_;
    unique_fd fd_;
    bool named_;
};

}  // namespace cfg32::platform
