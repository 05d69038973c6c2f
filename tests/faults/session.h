#pragma once

#include <set>
#include <string>
#include <vector>

#include "cfg32.h"
#include "environment.h"
#include "temporary_folder.h"

namespace cfg32::tests {

/// The administrator's entry, with which every configuration of these tests begins, in the form in
/// which it is written.
extern const std::string configuration_head;

/// A modification of one attribute.
struct attribute_change {
    int operation;
    std::string dn;
    std::string attribute;
    std::vector<std::string> values;
};

/// A handle for a configuration file. An empty backup makes none.
class session {
  public:
    explicit session(const std::string& config, const std::string& backup = "");
    session(const session&) = delete;
    session& operator=(const session&) = delete;
    ~session();

    // Each returns what the library's call returned.
    int bind();
    int bind_as_anybody();  ///< also to a file without an administrator
    int modify(const attribute_change& what);
    int search(const std::string& base, const std::string& attribute,
               std::set<std::string>& values);
    int flush();

    /// The report of the last failure, "" for none.
    std::string report() const;

  private:
    CfgHandle* handle_;
};

/// A folder with a configuration file in it, and perhaps its backup.
class configuration_folder {
  public:
    explicit configuration_folder(const std::string& text) { write(text); }

    std::string config() const { return folder_.file("oruslapd.conf"); }
    std::string backup() const { return folder_.file("oruslapd.bak"); }
    void write(const std::string& text) const { folder_.write("oruslapd.conf", text); }
    std::string text() const { return folder_.read("oruslapd.conf"); }
    /// "" when there is none.
    std::string backup_text() const;
    /// Puts the backup in the place of the file's content, as an administrator would.
    void restore() const { write(backup_text()); }
    /// The names of the files beside these two.
    std::vector<std::string> other_files() const;
    const temporary_folder& folder() const { return folder_; }

  private:
    temporary_folder folder_;
};

/// The text in the form in which the library writes it.
std::string as_written(const std::string& text);

/// The text as the library writes it after a change.
std::string as_written_after(const std::string& text, const attribute_change& what);

/// Has the folders of this process made in memory, where there is such a place. What a process has
/// written when it ends does not depend on the disk, and thousands of updates wait for none.
void work_in_memory();

}  // namespace cfg32::tests
