// Whole files by their names.

#include "whole_file.h"

#include <fmt/format.h>
#include <sys/stat.h>

#include <cerrno>
#include <filesystem>
#include <utility>

#include "LDIF_File.h"
#include "cfg32_platform.h"
#include "file_lock.h"
#include "held_back_signals.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

/// Takes the status of a file; false when there is no such file, as none is of too long a name.
/// What can't be told is no such answer: a file that is taken for missing would be overwritten.
bool has_status(const std::string& name, struct stat& status) {
    if (stat(name.c_str(), &status) == 0) {
        return true;
    }
    if (errno != ENOENT && errno != ENOTDIR && errno != ENAMETOOLONG) {
        fail_for_system(name, errno);
    }
    return false;
}

}  // namespace

bool is_there(const std::string& name) {
    struct stat status;
    return has_status(name, status);
}

bool is_same(const std::string& left, const std::string& right) {
    struct stat left_status;
    struct stat right_status;
    return has_status(left, left_status) && has_status(right, right_status) &&
           is_same_file(left_status, right_status);
}

bool is_newer(const std::string& one, const std::string& other) {
    struct stat status;
    struct stat other_status;
    if (!has_status(one, status)) {
        return false;
    }
    return !has_status(other, other_status) ||
           std::pair(status.st_ctim.tv_sec, status.st_ctim.tv_nsec) >
               std::pair(other_status.st_ctim.tv_sec, other_status.st_ctim.tv_nsec);
}

std::string target_of(const std::string& name) {
    std::filesystem::path path = name;
    std::error_code no_link;
    for (auto target = read_symlink(path, no_link); !no_link;
         target = read_symlink(path, no_link)) {
        path = path.parent_path() / target;
    }
    // Not to know is no answer here either: a file would take the place of the link.
    if (no_link != std::errc::invalid_argument && no_link != std::errc::no_such_file_or_directory) {
        fail_for_system(path.string(), no_link.value());
    }
    return path;
}

void copy_file(const std::string& from, const std::string& to) {
    const held_back_signals until_done;
    struct stat status;
    if (stat(from.c_str(), &status) != 0 ||
        !copyFile(from.c_str(), to.c_str(), nullptr, nullptr, status.st_mode)) {
        fail_for_system(fmt::format("{} can't be copied to {}", from, to), errno);
    }
}

void replace_file(const std::string& name, const std::string& backup_name,
                  const std::string& content, const std::string& expected) {
    const held_back_signals until_done;
    try {
        LDIF_File::replace(name, backup_name, content, expected);
    } catch (const LDIF_Exception& e) {
        if (message_of(e).starts_with("Unable to backup")) {  // the library does not tell where to
            throw ended(failed, report(e, name) + "\n  backup: " + backup_name);
        }
        throw;
    }
}

}  // namespace cfg32::tool
