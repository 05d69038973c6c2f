// Writing the configuration file.

#include <grp.h>
#include <pwd.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>

#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "disk.h"
#include "failure.h"
#include "open_regular.h"

using namespace cfg32;

namespace {

// KEPT: the message names the backup although the status is that of the configuration file.
constexpr failure no_status_for_backup{91, 1003, "_stat on backup file failed."};
constexpr failure no_backup{50, 1004, ""};
constexpr failure not_opened{50, 1004, ""};
constexpr failure not_written{80, 1000, "System error writing file"};
constexpr failure no_status{91, 1003, "_stat()"};
constexpr failure not_readable{21, 1005, "Entry would not read back as it is written"};
constexpr failure not_whole{80, 1000, "Configuration file was not read to its end"};
constexpr failure not_put_back{80, 1000, "The old content could not be put back"};

constexpr size_t name_buffer_size = 2048;

static_assert(unfinished_mark.size() <= longest_mark);

/// By so much a file usually grows, at most, when it is written.
constexpr size_t usual_growth = 65536;

std::string formatted(const char* format, const std::string& file_name) {
    char message[1024];
    nuv_snprintf(message, sizeof message, format, file_name.c_str());
    return message;
}

/// The name of a file's owner, or null when it is not known.
const char* owner_name(uid_t owner, char (&buffer)[name_buffer_size]) {
    passwd record;
    passwd* found = nullptr;
    const bool is_known = getpwuid_r(owner, &record, buffer, sizeof buffer, &found) == 0 && found;
    return is_known ? record.pw_name : nullptr;
}

const char* group_name(gid_t owner, char (&buffer)[name_buffer_size]) {
    group record;
    group* found = nullptr;
    const bool is_known = getgrgid_r(owner, &record, buffer, sizeof buffer, &found) == 0 && found;
    return is_known ? record.gr_name : nullptr;
}

/// True when an entry's text is so many lines that each reads back as one.
bool reads_back(std::string_view text, size_t lines) {
    if (text.find('\0') != std::string_view::npos || text.find('\r') != std::string_view::npos) {
        return false;
    }
    bool may_be_continued = false;  // comment and blank lines take no continuation
    for (; !text.empty(); --lines) {
        const std::string_view line = text.substr(0, text.find('\n'));
        if (lines == 0 || (may_be_continued && without_leading_space(line).size() < line.size())) {
            return false;
        }
        may_be_continued = !line.empty() && line.front() != '#';
        text.remove_prefix(std::min(line.size() + 1, text.size()));
    }
    return lines == 0;
}

/// The same of an entry that was printed so. Lines that were not read since they were loaded need
/// not be looked at again.
bool reads_back(const LDIF_Entry& entry, std::string_view printed) {
    if (const unread_attributes* lines = entry.printed_lines()) {
        constexpr size_t blank_line = 1;
        printed.remove_suffix(lines->text().size() + blank_line);
    }
    return reads_back(printed, entry.line_count());
}

/// True when the entry is one that a load takes: the root has two attributes at most, and another's
/// first line is its DN.
bool can_be_loaded(const LDIF_Entry& entry) {
    if (!entry.is_root()) {
        return entry.name() == "dn";
    }
    const LDIF_Attributes& attributes = entry.attributes();
    return std::all_of(attributes.begin(), attributes.end(), [](const LDIF_Attribute& attribute) {
        return is_of_root(attribute) && attribute.values().size() <= 1;
    });
}

}  // namespace

void LDIF_File::flush() {
    // What can't be written shall not stand in the way of the next change.
    const auto forgetting = [&](LDIF_Exception& e) {
        name_file(e);
        is_loaded_ = false;
    };
    const auto body = [&] {
        // Whatever can fail in memory fails before a file is touched.
        const std::string content = with_context([&] { return text(); }, forgetting);
        const bool is_refreshed = is_updated_;
        const update lock(*this);
        write(content, back_up(is_refreshed), is_refreshed);
    };
    with_system_error([] { return "writing file"; }, body, forgetting);
}

/// The whole file as text.
std::string LDIF_File::text() const {
    if (!is_whole_) {
        raise(not_whole);
    }
    std::string out;
    out.reserve(static_cast<size_t>(status_.st_size) + usual_growth);
    const auto append = [&](const LDIF_Entry& entry) {
        const size_t begin = out.size();
        entry.append_to(out);
        if (!can_be_loaded(entry) || !reads_back(entry, std::string_view(out).substr(begin))) {
            raise(not_readable);
        }
    };
    for_each_in_preorder(root_, [&](const LDIF_Entry& entry) {
        with_context([&] { append(entry); },
                     [&](LDIF_Exception& e) { e.entryDn = shown(entry.dn()); });
    });
    trailing_comment_.append_to(out);
    return out;
}

/// The backup, if there is to be one, is replaced by nothing but a complete version of the file
/// that is to be changed.
LDIF_File::backup LDIF_File::back_up(bool is_refreshed) {
    if (backup_file_name_.empty()) {
        return {};
    }
    // Not the remembered status: what was changed meanwhile is still to be noticed.
    struct stat status;
    const char* name = file_name_.c_str();
    if (stat(name, &status) != 0) {
        raise_with(no_status_for_backup, {}, name_file_and_errno(errno));
    }
    if (lock_) {
        std::string begin;
        if (!read_first(lock_.get(), unfinished_mark.size(), begin)) {
            raise_no_backup(errno);
        }
        require_finished(begin);
        require_own(status, is_refreshed);
    }
    char owner_buffer[name_buffer_size];
    char group_buffer[name_buffer_size];
    const char* owner = owner_name(status.st_uid, owner_buffer);
    const char* group = group_name(status.st_gid, group_buffer);
    errno = lock_error_;
    if (lock_ && copyFile(name, backup_file_name_.c_str(), owner, group, status.st_mode)) {
        struct stat of_copy;
        unique_fd copy = open_regular(backup_file_name_.c_str(), of_copy);
        return {copy && of_copy.st_size == status.st_size ? std::move(copy) : unique_fd(), status};
    }
    const int error = errno;
    if (lock_ && stat(name, &status) == 0) {
        require_own(status, is_refreshed);  // a copy of what is being written is none
    }
    raise_no_backup(error);
}

void LDIF_File::raise_no_backup(int error) {
    raise_with(no_backup, formatted("Unable to backup the configuration file: \"%s\" ", file_name_),
               name_file_and_errno(error));
}

/// Makes content the file's, in place: links to it, its owner and its mode stay.
void LDIF_File::write(const std::string& content, const backup& copy, bool is_refreshed) {
    struct stat status;
    unique_fd file = open_for_writing(status);
    require_own(status, is_refreshed);
    overwrite(std::move(file), status, content, copy);
    struct stat named;
    if (stat(file_name_.c_str(), &named) != 0) {
        raise_with(no_status, {}, name_file_and_errno(errno));
    }
    if (!is_same_version(named, status)) {  // somebody did not ask for the lock
        raise_changed();
    }
    status_ = status;
    is_loaded_ = true;
    has_invalid_lines_ = false;
}

/// What is written over is the file that is locked and, in an update, what was refreshed.
void LDIF_File::require_own(const struct stat& status, bool is_refreshed) {
    if (!is_same_file(status, lock_.status()) || (is_refreshed && !is_current(status))) {
        raise_changed();
    }
}

unique_fd LDIF_File::open_for_writing(struct stat& status) {
    if (!lock_ && lock_error_ == ENOENT) {
        create();
    }
    errno = lock_error_;
    unique_fd file;
    if (lock_) {
        file = open_regular(file_name_.c_str(), status, O_RDWR);
    }
    if (!file) {
        const int error = errno;
        raise_with(not_opened, formatted("Unable to open: \"%s\"", file_name_),
                   name_file_and_errno(error));
    }
    return file;
}

/// Makes an empty file in the place of one that was removed.
void LDIF_File::create() {
    const mode_t mode = is_loaded_ ? status_.st_mode & 07777 : S_IRUSR | S_IWUSR;
    struct stat status;
    if (open_regular(file_name_.c_str(), status, O_WRONLY | O_CREAT, mode)) {
        lock_ = locked(O_RDWR, LOCK_EX);
    }
    lock_error_ = lock_ ? 0 : errno;
}

/// Makes content the open file's, or puts back what was there. Takes the new status.
void LDIF_File::overwrite(unique_fd file, struct stat& status, const std::string& content,
                          const backup& copy) {
    // A process that is killed in the middle leaves a file that no load takes for a complete one:
    // it would repair what can't be read, and let the backup be overwritten by it.
    const std::string_view mark = backup_file_name_.empty() ? "" : unfinished_mark;
    // The backup need not be read, nor held in memory, to be there when it is wanted.
    const bool has_copy = copy.is_of(status);
    const std::string before = has_copy ? "" : content_of(file.get(), status);
    const size_t size_before = has_copy ? static_cast<size_t>(status.st_size) : before.size();
    if (!reserve(file.get(), size_before, content.size(), mark)) {
        raise_with(not_written, {}, name_file_and_errno(errno));
    }
    is_loaded_ = false;  // until it is known what the file has become
    bool is_ours = false;
    const timespec time = status.st_mtim;
    if (replace_content(file.get(), content, mark) && make_later(file.get(), time, status) &&
        is_content(file.get(), content, is_ours)) {
        if (!is_ours) {
            raise_changed();
        }
        if (sync_content(file.get()) && file.close()) {
            return;
        }
    }
    const int error = errno;
    const int damaged = file ? file.get() : lock_.get();
    const bool is_put_back = (has_copy ? replace_content(damaged, copy.file.get(), mark)
                                       : replace_content(damaged, before, mark)) &&
                             sync_content(damaged);
    raise_not_written(error, is_put_back);
}

/// errno tells why the old content was not put back.
void LDIF_File::raise_not_written(int error, bool is_put_back) {
    const int second_error = errno;
    LDIF_Exception e = make_exception(not_written);
    name_file_and_errno(error)(e);
    if (!is_put_back) {
        e.cause = std::make_unique<LDIF_Exception>(make_exception(not_put_back));
        name_file_and_errno(second_error)(*e.cause);
    }
    throw e;
}

/// What the open file holds, which has that status.
std::string LDIF_File::content_of(int file, const struct stat& status) {
    std::string content;
    struct stat now;
    if (!read_all(file, static_cast<size_t>(status.st_size), content) || fstat(file, &now) != 0) {
        raise_with(not_written, {}, name_file_and_errno(errno));
    }
    if (!is_same_version(now, status)) {
        raise_changed();
    }
    return content;
}
