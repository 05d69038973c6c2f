#pragma once

#include <ostream>
#include <string>
#include <vector>

#include "faulty_calls.h"
#include "session.h"

// The updates that faults are tried on.

namespace cfg32::tests {

struct scenario {
    const char* name;
    bool has_backup;
    std::string before;                ///< what the file holds before the call
    attribute_change what;             ///< the call, which can be repeated
    std::vector<fault> circumstances;  ///< faults that are there in any case
};

inline void PrintTo(const scenario& one, std::ostream* out) { *out << one.name; }

/// All of them. Files grow, shrink and stay as long as they are; with a backup and without; lines
/// that can't be used have to be repaired; room can't be reserved; a text is shorter than the mark
/// of an unfinished file.
const std::vector<scenario>& scenarios();

/// A scenario's versions of the file: as it was, repaired if it has to be, and changed.
std::vector<std::string> versions_of(const scenario& one);

/// A scenario made ready: the handle is bound to a file, which then gets the text of before.
class stage {
  public:
    explicit stage(const scenario& one);

    /// The call, with the scenario's circumstances and these faults.
    int play(const std::vector<fault>& faults = {});
    /// The same, without any fault.
    int repeat() { return user_.modify(scenario_.what); }

    const scenario& setting() const { return scenario_; }
    const configuration_folder& folder() const { return folder_; }
    std::string report() const { return user_.report(); }
    session& user() { return user_; }
    /// What play() did.
    const std::vector<seen_call>& seen() const { return seen_; }

  private:
    const scenario& scenario_;
    configuration_folder folder_;
    session user_;
    std::vector<seen_call> seen_;
};

/// The calls of a scenario that goes well.
std::vector<seen_call> calls_of(const scenario& one);

}  // namespace cfg32::tests
