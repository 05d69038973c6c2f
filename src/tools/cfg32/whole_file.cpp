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

bool is_there(const std::string& name) {
    struct stat status;
    return stat(name.c_str(), &status) == 0;
}

bool is_same(const std::string& left, const std::string& right) {
    struct stat left_status;
    struct stat right_status;
    return stat(left.c_str(), &left_status) == 0 && stat(right.c_str(), &right_status) == 0 &&
           is_same_file(left_status, right_status);
}

bool is_newer(const std::string& one, const std::string& other) {
    struct stat status;
    struct stat other_status;
    if (stat(one.c_str(), &status) != 0) {
        return false;
    }
    return stat(other.c_str(), &other_status) != 0 ||
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
