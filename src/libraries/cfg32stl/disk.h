#pragma once

// Reading and writing whole files with POSIX calls. Failures are false, with the reason in errno.

#include <fcntl.h>
#include <unistd.h>

#include <string>
#include <string_view>
#include <utility>

namespace cfg32 {

/// Owns an open file.
class file_descriptor {
  public:
    explicit file_descriptor(int number = -1) : number_(number) {}
    file_descriptor(file_descriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
    file_descriptor& operator=(file_descriptor&&) = delete;
    ~file_descriptor() { close(); }

    bool is_open() const { return number_ >= 0; }
    int number() const { return number_; }

    /// Closes the file now; tells whether the system reported a late error.
    bool close() { return !is_open() || ::close(std::exchange(number_, -1)) == 0; }

  private:
    int number_;
};

/// Opens a regular file; anything else in its place (a directory, a FIFO, a device) is refused, and
/// opening it never blocks. mode is for O_CREAT.
file_descriptor open_regular_file(const char* path, int flags, mode_t mode = 0);

/// Reads the file to its end. expected is a hint of how much there is.
bool read_all(const file_descriptor& file, size_t expected, std::string& text);

/// Makes the text the file's whole content, on the disk: room for it is reserved before the old
/// content is touched.
bool overwrite(const file_descriptor& file, std::string_view text);

}  // namespace cfg32
