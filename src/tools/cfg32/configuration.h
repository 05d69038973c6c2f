#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LDIF_Entry.h"
#include "check/problem.h"
#include "entry.h"
#include "key.h"
#include "memory_file.h"
#include "settings.h"

struct CfgHandle;

namespace cfg32::tool {

/// A configuration file that is read. It is loaded from a private copy of its text, so that it is
/// never rewritten, and what would stop a load is left out of the copy, so that a broken file can
/// be read as far as it goes. Both are told on standard error.
class configuration {
  public:
    /// Any file, bound to anonymously. Ends the command when it can't be read.
    configuration(const settings& options, const std::string& file_name);
    /// The file that the options name, bound to with their credentials.
    explicit configuration(const settings& options);
    /// Binds as the options say. Ends the command when that fails.
    void bind(const settings& options);
    /// A text that was read already, of the file of that name.
    configuration(const settings& options, std::string file_name, std::string text);

    const std::string& name() const { return name_; }
    const std::string& text() const { return text_; }

    /// What a load would not have taken, or not as it stands.
    const std::vector<problem>& left_out() const { return left_out_; }

    /// The entries that a filter (RFC 4515, simple) matches. Ends the command when the base is not
    /// there, or the filter can't be used.
    std::vector<entry> search(const std::string& base, int scope, const std::string& filter) const;

    /// The tree itself, also of entries that no filter finds.
    const LDIF_Entry& root() const;
    /// The entry of that DN; ends the command with "not found" (1) when it is not there.
    const LDIF_Entry& entry_at(const std::string& dn) const;

  private:
    bool is_loaded(std::string_view text);
    void load(std::string_view text);
    void note_left_out();

    std::string name_;
    std::string text_;
    key key_;
    memory_file copy_;
    std::unique_ptr<CfgHandle, int (*)(CfgHandle*)> handle_;
    std::vector<problem> left_out_;
};

/// True when a load may not see all of a text, although it takes it as it is.
bool loses_text(std::string_view text);

/// The lines of a text that a load does not use, or not as they stand.
std::vector<problem> unused_lines(std::string_view text, aes_key_data* key);

/// Tells of them on standard error.
void tell_unused(const std::string& name, std::string_view what,
                 const std::vector<problem>& unused);

/// Ends the command when the options name somebody who can't bind to the file.
void require_bind(const settings& options, const std::string& file_name);

/// An entry's printable form.
entry entry_of(const LDIF_Entry& node);

/// The entries at and below one, as the scope has them.
std::vector<entry> entries_below(const LDIF_Entry& base, int scope);

}  // namespace cfg32::tool
