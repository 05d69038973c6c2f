#pragma once

// Carrying out changes: all that are asked for together, in one write, or none.

#include <string>
#include <vector>

#include "change/change_record.h"
#include "settings.h"

namespace cfg32::tool {

/// A record that was left out, and why.
struct skipped_record {
    int line;
    std::string dn;
    std::string reason;
};

struct update_options {
    std::string source;          ///< what messages call the records' text; empty for none
    bool goes_on = false;        ///< -c: records that fail are left out
    bool deletes_trees = false;  ///< an entry goes with everything below it
    bool merges = false;         ///< an added entry that is there takes over the attributes
    bool may_be_gone = false;    ///< an attribute to remove that is not there is no error
    const std::string* based_on = nullptr;  ///< the text that the records were made for; else any
};

struct update_result {
    bool is_changed = false;
    std::string before;     ///< the file's text
    std::string canonical;  ///< what a write without a change would make of it
    std::string after;      ///< what it becomes, or became
    std::vector<skipped_record> skipped;
};

/// Checks all records, carries them out on a private copy, and, unless this is a dry run or nothing
/// would change, puts that in the place of the file, under its lock, after a backup, in one write;
/// when somebody else was faster it begins again with what they left. Throws `ended` with the
/// failures of the records.
update_result update(const settings& options, const std::vector<change_record>& records,
                     const update_options& how);

/// Prints what an update did, or would do: as a diff, one word, or JSON. Returns the exit status.
int print_result(const settings& options, const update_result& result);

}  // namespace cfg32::tool
