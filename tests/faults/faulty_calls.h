#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

// The calls by which the two libraries reach the system lead through the test program, which
// defines them itself and passes them on to the C library. It can count them, let one fail, end the
// process at one, as a crash would, and do at one what somebody else might do at that moment.

namespace cfg32::tests {

enum class effect {
    fails,          ///< nothing is done (a close is), the call reports the error
    is_short,       ///< half of what could be transferred is; other calls than transfers succeed
    is_slow,        ///< the same, and it takes a while
    kills_before,   ///< SIGKILL instead of the call
    kills_halfway,  ///< SIGKILL after half of what could be transferred
    kills_after,    ///< SIGKILL when the call is done
    comes_before,   ///< nothing but the event, and then the call
    comes_after,    ///< the call, and then the event
};

struct seen_call {
    std::string name;
    std::string about;  ///< its path or descriptor, and its size
    bool is_transfer;   ///< it can be short
    bool has_fault;
};

struct fault {
    size_t nth;          ///< which call of all that are seen, from 1; 0 for every one
    effect what;         ///< what happens to it
    int error = 0;       ///< the errno of one that fails
    std::string name{};  ///< if not empty, only calls of this name
    /// What happens at the call, after it for comes_after and else before it. Its own calls are not
    /// seen.
    std::function<void(const seen_call&)> event{};
};

/// Watches the calls of this thread for as long as it lives. There is one at a time.
class watched_calls {
  public:
    explicit watched_calls(std::vector<fault> faults = {});
    watched_calls(const watched_calls&) = delete;
    watched_calls& operator=(const watched_calls&) = delete;
    ~watched_calls();

    const std::vector<seen_call>& seen() const { return seen_; }

    /// Adds a call, and tells what shall happen to it: a fault, or null. A test whose calls never
    /// end is ended.
    const fault* note(const char* name, const std::string& about, bool is_transfer);

  private:
    std::vector<fault> faults_;
    std::vector<seen_call> seen_;
};

/// The calls as a numbered list, those with a fault marked.
std::string listed(const std::vector<seen_call>& calls);

/// The names by which the libraries take them.
const std::vector<std::string>& wrapped_names();

/// The others by which the command does, in the tests that it is part of.
const std::vector<std::string>& names_wrapped_for_the_command();

}  // namespace cfg32::tests
