#pragma once

#include <sys/stat.h>

#include <string>

#include "LDIF_Comment.h"
#include "LDIF_Entry.h"
#include "LDIF_Exception.h"
#include "LDIF_Search.h"

struct aes_key_data;

/// The configuration file in memory. Loaded by the constructor, read again by refresh() when the
/// file was changed, written by flush().
class LDIF_File {
  public:
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

    /// Copies the file to the backup name, if there is one, and writes the store over it. A failure
    /// before the writing leaves the file untouched.
    void flush();

    /// Copies of the entries at or below base that the filter matches. Throws 32/32 when there is
    /// no base entry.
    LDIF_Search_Results search(const LDIF_DN& base, const LDIF_Search_Results::Scope& scope,
                               const LDIF_Filter& filter, const LDIF_AttrFilter& attributes,
                               bool attributesOnly) const;

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
    bool is_current(const struct stat& status) const;
    int authenticate(const char* dn, const char* password, int method) const;
    std::string text() const;
    void back_up() const;
    void write(const std::string& content);

    // What is filled in of a failure.
    void name_file(LDIF_Exception& e) const { e.configFile = file_name_; }
    auto name_file_and_errno(int error) const {
        return [this, error](LDIF_Exception& e) {
            name_file(e);
            e.sysErrno = error;
        };
    }

    std::string file_name_;
    std::string backup_file_name_;
    struct stat status_ {};  // of the last load or write
    LDIF_Comment trailing_comment_;
    LDIF_Entry root_;
    int authentication_ = not_authenticated;
    aes_key_data* key_;
    bool is_loaded_ = false;  // the tree is what status_ tells
};
