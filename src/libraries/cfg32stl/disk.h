#pragma once

// Reading and writing whole open files. Failures are false, with the reason in errno.

#include <cstddef>
#include <string>
#include <string_view>

namespace cfg32 {

/// Reads the file to its end. expected is a hint of how much there is.
bool read_all(int file, size_t expected, std::string& text);

/// Makes the text the file's whole content, on the disk: room for it is reserved before the old
/// content is touched.
bool overwrite(int file, std::string_view text);

}  // namespace cfg32
