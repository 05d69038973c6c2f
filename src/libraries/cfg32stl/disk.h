#pragma once

// Reading and writing whole open files. Failures are false, with the reason in errno.

#include <cstddef>
#include <ctime>
#include <string>
#include <string_view>

namespace cfg32 {

/// Reads the whole file. expected is a hint of how much there is.
bool read_all(int file, size_t expected, std::string& text);

/// Takes the room that a text of `wanted` bytes needs beyond the end of the file, which is
/// `present` bytes long. After a failure the file is what it was.
bool reserve(int file, size_t present, size_t wanted);

/// Makes the text the file's whole content, on the disk. Until it is complete the file begins with
/// the mark, if there is one; a text that is shorter than the mark does without.
bool overwrite(int file, std::string_view text, std::string_view mark = {});

/// Makes the file's modification time a later one than `before`, if it isn't.
bool make_later(int file, const timespec& before);

}  // namespace cfg32
