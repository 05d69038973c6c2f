#pragma once

#include <sys/stat.h>

#include <set>
#include <string>
#include <string_view>

#include "LDIF_Comment.h"
#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "LDIF_Search.h"
#include "file_lock.h"

struct aes_key_data;
struct ldapmod;

/// The configuration file in memory. Loaded by the constructor, read again by refresh() when the
/// file was changed, written by flush().
///
/// Who changes the file holds an update from before the refresh until after the flush:
///
///     const LDIF_File::update lock(file);
///     file.refresh();
///     file.modify(dn, mods);
///     file.flush();
class LDIF_File {
  public:
    /// Keeps every other user of the library away from the file. Throws 51/51 when one of them
    /// does so for longer than longest_wait. A file that can't be opened is left to refresh() to
    /// report.
    class update {
      public:
        explicit update(LDIF_File& file);
        update(const update&) = delete;
        update& operator=(const update&) = delete;
        ~update();

      private:
        LDIF_File& file_;
        const bool is_outermost_;
    };

    /// Loads the file. An empty backupFileName makes no backups. The key stays the caller's.
    /// Throws LDIF_Exception 91/1001 for an empty fileName and what refresh() throws.
    LDIF_File(const std::string& fileName, const std::string& backupFileName, aes_key_data* key);
    LDIF_File(const LDIF_File&) = delete;
    LDIF_File& operator=(const LDIF_File&) = delete;
    ~LDIF_File() = default;

    /// Reads the file if its modification time is not the remembered one; returns 1 if it did and
    /// else 0. Lines that can't be used become oru-slapdInvalidLine attributes, and the file is
    /// rewritten at once. After a failure the store holds what was read before it, and the next
    /// call reads again.
    int refresh();

    /// Copies the file to the backup name, if there is one, and writes the store over it. When it
    /// returns, both are on the disk. A failure before the writing leaves the file untouched; after
    /// one in the middle the old content is put back, if that is possible. Within an update the
    /// file must be the one that was refreshed (51/51 otherwise). A store whose text can't be
    /// made, or would not read back (21/1005), is forgotten: the next refresh() reads the file.
    void flush();

    /// Puts a text in the place of the file's, whatever that is, in the way of flush(): under the
    /// lock, after a backup, in place. expected is what the file holds; if it holds something else,
    /// or changes meanwhile, that is 51/51 and nothing is written. A file that was not written to
    /// its end is not backed up, because its backup is the complete version.
    static void replace(const std::string& fileName, const std::string& backupFileName,
                        const std::string& content, const std::string& expected);

    /// Changes an entry's attributes. Modifications before one that is refused stay applied.
    /// Throws 32/32 when there is no such entry, 16/16 when there is no attribute to delete,
    /// 19/1006 for a second value of a single-valued attribute, 89/1010 for an unknown operation,
    /// 21/1005 for an attribute that would not read back as it is written, and what the values'
    /// syntax throws.
    void modify(const LDIF_DN& dn, ldapmod** mods);
    /// Adds an entry, or merges its attributes into the entry that has the DN already.
    void add(const LDIF_DN& dn, ldapmod** mods);
    /// Removes an entry; one with children (66/66) only when deleteNonLeaves allows it. Throws
    /// 32/32 when there is no such entry.
    void erase(const LDIF_DN& dn, bool deleteNonLeaves);

    /// A drawing of the tree, in plain characters or in those of code page 437 (oem).
    std::string treeView(bool oem) const;

    /// Copies of the entries at or below base that the filter matches. Throws 32/32 when there is
    /// no base entry.
    LDIF_Search_Results search(const LDIF_DN& base, const LDIF_Search_Results::Scope& scope,
                               const LDIF_Filter& filter, const LDIF_AttrFilter& attributes,
                               bool attributesOnly) const;

    /// The entries themselves, which stay this file's until it is changed or refreshed; the list
    /// does until the next one. Throws the same.
    const cfg32::found_entries& matches(const cfg32::dn_path& base,
                                        const LDIF_Search_Results::Scope& scope,
                                        const LDIF_Filter& filter) const;

    enum Authentication { not_authenticated, anonymous, administrator };

    /// Checks the credentials against the administrator's in the file; returns and keeps the
    /// outcome, an Authentication. method is 0 (none) or 0x80 (simple); another authenticates
    /// nobody. After an exception the outcome of before stands.
    int setAuthentication(const char* dn, const char* password, int method);
    int getAuthentication() const { return authentication_; }

    const char* getFileName() const { return file_name_.c_str(); }
    const char* getBackupFileName() const { return backup_file_name_.c_str(); }
    time_t getModTime() const { return status_.st_mtime; }

    const LDIF_Entry& root() const { return root_; }
    const LDIF_Comment& trailing_comment() const { return trailing_comment_; }

  private:
    struct not_loaded {};
    LDIF_File(const std::string& fileName, const std::string& backupFileName, not_loaded)
        : file_name_(fileName), backup_file_name_(backupFileName), key_(nullptr) {}

    const LDIF_Entry& base_entry(const cfg32::dn_path& dn) const;
    bool is_current(const struct stat& status) const;
    bool load_if_changed();
    cfg32::locked_file locked(int flags, int operation) const;
    cfg32::locked_file locked_for_reading();
    [[noreturn]] void raise_changed();
    void require_finished(std::string_view text);
    int authenticate(const char* dn, const char* password, int method) const;
    std::string text() const;
    /// An open backup.
    struct backup {
        cfg32::unique_fd file;
        struct stat of {};  ///< the version of the configuration file that it is a copy of

        bool is_of(const struct stat& status) const {
            return file && cfg32::is_same_version(of, status);
        }
    };

    backup back_up(bool is_refreshed);
    [[noreturn]] void raise_no_backup(int error);
    void write(const std::string& content, const backup& copy, bool is_refreshed);
    void replace_content_of(const std::string& expected, const std::string& content);
    std::string locked_content();
    cfg32::unique_fd open_for_writing(struct stat& status);
    void create();
    void overwrite(cfg32::unique_fd file, struct stat& status, const std::string& content,
                   const backup& copy);
    [[noreturn]] void raise_not_written(int error, bool is_put_back);
    std::string content_of(int file, const struct stat& status);
    void require_own(const struct stat& status, bool is_refreshed);

    // What is filled in of a failure.
    void name_file(LDIF_Exception& e) const { e.configFile = file_name_; }
    template <class Body>
    void change(const char* operation, const LDIF_DN& dn, Body body);
    auto name_file_and_errno(int error) const {
        return [this, error](LDIF_Exception& e) {
            name_file(e);
            e.sysErrno = error;
        };
    }

    std::string file_name_;
    std::string backup_file_name_;
    struct stat status_ {};  // of the last load or write
    std::string text_;       // of the last load, in which the store stands
    LDIF_Comment trailing_comment_;
    LDIF_Entry root_;
    int authentication_ = not_authenticated;
    aes_key_data* key_;
    bool is_whole_ = false;           // the tree is all of a file
    bool is_loaded_ = false;          // the tree is what status_ tells
    bool has_invalid_lines_ = false;  // that the file has not yet as attributes

    // Kept, because to make room for many anew upsets the heap for the results.
    mutable cfg32::found_entries found_;

    bool is_updated_ = false;  // while there is an update
    cfg32::locked_file lock_;
    int lock_error_ = 0;  // why there is no lock, an errno
};

namespace cfg32 {

/// The only attributes above the first entry, with one value each: version and charset.
bool is_of_root(const LDIF_Attribute& attribute);

/// What a file with a backup begins with while it is written.
inline constexpr std::string_view unfinished_mark =
    "# This file is being written. If it stays so, its backup is the complete version.\n";

}  // namespace cfg32

/// The tree at an entry in plain characters. prefix is what precedes it on its line; undefined
/// takes the DNs that are missing between an entry and the one it is drawn below.
std::string IA5_TreeView(const LDIF_Entry& entry, std::set<LDIF_DN>& undefined,
                         const std::string& prefix);

/// The same in the single bytes of code page 437. last: the entry is its parent's last child.
std::string OEM_TreeView(const LDIF_Entry& entry, bool last, std::set<LDIF_DN>& undefined,
                         const std::string& prefix);
