// A place for a text that another program is to work on.

#include "private_folder.h"

#include <fcntl.h>

#include <cerrno>
#include <cstdlib>
#include <new>
#include <system_error>

#include "disk.h"
#include "outcome.h"
#include "terminal.h"
#include "unique_fd.h"

namespace cfg32::tool {

private_folder::private_folder() {
    std::error_code error;
    const std::filesystem::path place = std::filesystem::temp_directory_path(error);
    if (error) {
        fail_for_system("the folder for temporary files (TMPDIR)", error.value());
    }
    std::string name = (place / "cfg32-XXXXXX").string();
    if (!mkdtemp(name.data())) {
        fail_for_system(name, errno);
    }
    path_ = name;
}

private_folder::~private_folder() {
    if (is_kept_) {
        return;
    }
    try {
        std::error_code error;
        std::filesystem::remove_all(path_, error);
        if (error) {
            complain(path_.string() + " can't be removed: " + error.message());
        }
    } catch (const std::bad_alloc&) {
        for (const char* part : {"cfg32: no memory to remove ", path_.c_str(), "\n"}) {
            tell(part);
        }
    }
}

std::string private_folder::write(const std::string& name, std::string_view text) const {
    std::string path = (path_ / name).string();
    unique_fd file(open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, of_owner_only));
    if (!file || !replace_content(file.get(), text) || !file.close()) {
        fail_for_system(path, errno);
    }
    return path;
}

}  // namespace cfg32::tool
