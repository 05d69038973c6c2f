#pragma once

#include <cstddef>
#include <ostream>
#include <string>
#include <vector>

// Configurations that are as large as anybody could make them, each in another way.

namespace cfg32::tests {

struct large_file {
    const char* name;
    size_t usual;                                       ///< how many there are in an ordinary run
    size_t real;                                        ///< and at full size
    void (*write_to)(std::ostream& out, size_t count);  ///< what follows the head
    std::string (*subject)(size_t count);               ///< DN of the entry that is changed
    size_t (*entries)(size_t count);                    ///< how many a search finds
    size_t (*problems)(size_t count);                   ///< how many a check tells
    size_t memory;  ///< a session takes less than so many times the file's size
};

inline void PrintTo(const large_file& one, std::ostream* out) { *out << one.name; }

const std::vector<large_file>& large_files();

/// How many there are in this run: a part of the full size in percent, CFG32_HOSTILE_SCALE, and at
/// least as many as usual.
size_t count_of(const large_file& one);

/// The file, head included.
void write_large_file(const large_file& one, size_t count, std::ostream& out);

}  // namespace cfg32::tests
