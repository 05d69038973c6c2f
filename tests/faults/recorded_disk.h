#pragma once

#include <sys/types.h>

#include <functional>
#include <map>
#include <optional>
#include <random>
#include <string>
#include <vector>

#include "faulty_calls.h"

// What a power cut leaves of a folder. What was done to it is recorded call by call; what was
// synced by then is on the disk, and of everything else any part, in any order: all of them when
// there are up to eight operations, and a sample when there are more.
//
// A size may be on the disk before what was written up to it: there are zero bytes then, as on file
// systems that keep a journal of sizes only. What was in the blocks before is never seen.
//
// A sync that fails is recorded like none: nothing that it was to bring to the disk is known to be
// there, and a later one that succeeds brings it. (A system may also give up what it could not
// write, and let the later one succeed without it; that is not modelled.)

namespace cfg32::tests {

/// Of what is written, this much is on the disk together or not at all.
inline constexpr size_t sector = 512;

class recorded_disk {
  public:
    /// What each name holds.
    using image = std::map<std::string, std::string>;

    /// What the folder holds now is on the disk.
    explicit recorded_disk(const std::string& folder);
    recorded_disk(const recorded_disk&) = delete;
    recorded_disk& operator=(const recorded_disk&) = delete;

    /// The events by which watched calls are recorded. This object has to outlive them.
    std::vector<fault> recording();

    /// Calls look with what a cut may leave: before each sync, and at the end, every part of what
    /// is not synced when there are few, and else every beginning of it, all but one, only one, and
    /// so many parts by chance. (A cut at an earlier moment leaves a part as well.)
    void for_each_image(size_t by_chance, std::mt19937_64& random,
                        const std::function<void(const image&)>& look) const;

    /// What any cut leaves that comes after all of it.
    image lasting() const;

    /// The operations, for the description of a failure.
    std::string listed() const;

  private:
    using file_number = size_t;

    struct content {
        std::string bytes;  // also of what lies behind the end
        size_t size = 0;
    };

    /// What is there, by the numbers of files.
    struct state {
        std::map<std::string, file_number> names;
        std::map<file_number, content> files;
    };

    /// What is on the disk whole or not at all.
    struct operation {
        enum { write, cut, grow, name, sync } kind;
        std::optional<file_number> file;  // nothing for the folder
        size_t place = 0;                 // of a write; the size otherwise
        std::string bytes{};
        std::map<std::string, std::optional<file_number>> names{};
    };

    void record(const seen_call& call);
    void record_names(const std::map<std::string, ino_t>& names);
    void record_content(file_number file, const std::string& now);
    void record_sync(int descriptor);
    static void sync(const operation& one, state& durable, std::vector<operation>& open);
    static void apply(const operation& one, state& to);
    static image image_of(const state& what);
    static image image_of(state durable, const std::vector<operation>& open,
                          const std::vector<bool>& is_done);

    const std::string folder_;
    std::map<std::string, ino_t> names_;       // as they were seen last
    std::map<ino_t, file_number> numbers_;     // a number of the system's is used again
    std::map<file_number, std::string> seen_;  // what was in the files
    file_number next_number_ = 0;
    state first_;
    std::vector<operation> operations_;
};

/// How many parts of what is not synced are taken by chance: CFG32_FAULTS_POWER_CUTS, else fewer
/// where they take longer. What a cut leaves is the same with a sanitizer.
size_t cuts_by_chance();

}  // namespace cfg32::tests
