#pragma once

// Reading and writing whole open files. Failures are false, with the reason in errno.

#include <sys/stat.h>

#include <cstddef>
#include <ctime>
#include <string>
#include <string_view>

namespace cfg32 {

/// Reads the whole file. expected is a hint of how much there is.
bool read_all(int file, size_t expected, std::string& text);

/// Reads what the file begins with: so many bytes, or fewer where there are no more.
bool read_first(int file, size_t count, std::string& bytes);

/// Takes the room that a text of `wanted` bytes needs in the place of the file's present content.
/// After a failure the file is what it was. Where the file system can't reserve, room is taken by
/// blank lines at the end; but what will be marked grows only to the mark's size, and the rest when
/// it is written: no power cut shall leave half of such lines without the mark.
bool reserve(int file, size_t present, size_t wanted, std::string_view mark = {});

/// Marks are not longer than this.
inline constexpr size_t longest_mark = 128;

/// Makes the text the file's whole content. Until it is complete the file begins with the mark, if
/// there is one, on the disk as well. The last step is not synced.
bool replace_content(int file, std::string_view text, std::string_view mark = {});

/// The same with what another file holds.
bool replace_content(int file, int other, std::string_view mark);

/// Tells whether the text is the file's whole content.
bool is_content(int file, std::string_view text, bool& is_so);

/// Makes the file's modification time a later one than `before`, if it isn't; of a file of somebody
/// else, another one. Takes the status.
bool make_later(int file, const timespec& before, struct stat& status);

/// Waits until the content is on the disk.
bool sync_content(int file);

}  // namespace cfg32
