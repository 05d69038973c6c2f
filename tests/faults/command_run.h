#pragma once

#include <functional>
#include <map>
#include <ostream>
#include <string>
#include <vector>

#include "faulty_calls.h"
#include "recorded_disk.h"

// Runs of the administrator's command, each in a process of its own, with faults.

namespace cfg32::tests {

/// What the files of a folder hold, by their names.
using folder_image = recorded_disk::image;

/// One that writes.
struct command_row {
    const char* name;
    std::vector<std::string> words;  ///< what is typed after "cfg32 -f oruslapd.conf"
    folder_image before;             ///< what the folder holds, in which it is typed
    std::string input{};             ///< what its standard input has
};

inline void PrintTo(const command_row& one, std::ostream* out) { *out << one.name; }

/// Every command that writes, some of them in more than one situation.
const std::vector<command_row>& command_rows();

const command_row& command_row_of(const std::string& name);

inline const std::string unfinished_head =
    "# This file is being written. If it stays so, its backup is the complete version.\n";

struct command_run {
    int status = 0;  ///< the exit status; -1 when a signal ended it
    int signal = 0;
    std::string output;            ///< what it printed
    std::string told;              ///< what it said on standard error
    folder_image after;            ///< what the folder holds now, see comparable()
    folder_image temporary;        ///< and the one for temporary files
    std::vector<seen_call> calls;  ///< unless a signal ended it

    std::string described() const;
};

command_run run_command(const command_row& row, const std::vector<fault>& faults);

/// Its standard output can't be written.
command_run run_without_output(const command_row& row);

/// Has what happens to the disk recorded, and then judged, in the process of the command. The exit
/// status of a run that was judged badly is bad_run, and the reason is in what it printed.
command_run run_recorded(const command_row& row,
                         const std::function<bool(const recorded_disk&)>& is_good);

inline constexpr int bad_run = 99;

/// The image without what differs from run to run: encodings of passwords, and the bytes of keys.
folder_image comparable(folder_image image);

}  // namespace cfg32::tests
