// Keeping others away from the configuration file while it is changed, and noticing those who don't
// ask.

#include <cerrno>

#include "LDIF_File.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure busy{51, 51, "Configuration file is in use by another process"};
constexpr failure changed{51, 51, "Configuration file was changed meanwhile"};
constexpr failure unfinished{80, 1002,
                             "Configuration file was not written to its end; "
                             "its backup is the complete version"};

}  // namespace

/// The file, locked; nothing, with the reason in errno, when it can't be opened.
locked_file LDIF_File::locked(int flags, int operation) const {
    locked_file file(file_name_.c_str(), flags, operation);
    if (!file && errno == EWOULDBLOCK) {
        raise_with(busy, {}, name_file_and_errno(0));
    }
    return file;
}

LDIF_File::update::update(LDIF_File& file) : file_(file), is_outermost_(!file.is_updated_) {
    if (!is_outermost_) {
        return;
    }
    file_.lock_ = file_.locked(O_RDWR, LOCK_EX);
    if (!file_.lock_) {
        // What may not be written can still be read, and backed up, while nobody else writes it.
        file_.lock_ = file_.locked(O_RDONLY, LOCK_EX);
    }
    file_.lock_error_ = file_.lock_ ? 0 : errno;
    file_.is_updated_ = true;
}

LDIF_File::update::~update() {
    if (is_outermost_) {
        file_.lock_ = locked_file();
        file_.is_updated_ = false;
    }
}

/// The next refresh reads what the file has become.
void LDIF_File::raise_changed() {
    is_loaded_ = false;
    raise_with(changed, {}, name_file_and_errno(0));
}

/// Throws when a writer did not come to the end of the text.
void LDIF_File::require_finished(std::string_view text) {
    if (text.starts_with(unfinished_mark)) {
        is_loaded_ = false;
        raise_with(unfinished, {}, name_file_and_errno(0));
    }
}
