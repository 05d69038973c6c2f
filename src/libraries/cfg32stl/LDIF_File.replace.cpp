// Putting another text in the place of the configuration file's.

#include <cerrno>

#include "LDIF_File.h"
#include "disk.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure not_read{91, 1004, "Unable to read the configuration file"};

}  // namespace

void LDIF_File::replace(const std::string& fileName, const std::string& backupFileName,
                        const std::string& content, const std::string& expected) {
    LDIF_File file(fileName, backupFileName, not_loaded());
    const update lock(file);
    with_system_error([] { return "writing file"; },
                      [&] { file.replace_content_of(expected, content); },
                      [&](LDIF_Exception& e) { file.name_file(e); });
}

void LDIF_File::replace_content_of(const std::string& expected, const std::string& content) {
    const std::string present = locked_content();
    if (present != expected) {
        raise_changed();
    }
    const bool is_finished = !present.starts_with(unfinished_mark);
    write(content, is_finished ? back_up(true) : backup(), true);
}

/// What the locked file holds. From here on it counts as refreshed: it must stay what it is.
std::string LDIF_File::locked_content() {
    std::string text;
    errno = lock_error_;
    if (!lock_ || !read_all(lock_.get(), static_cast<size_t>(lock_.status().st_size), text)) {
        raise_with(not_read, {}, name_file_and_errno(errno));
    }
    status_ = lock_.status();
    is_loaded_ = true;
    return text;
}
