#pragma once

#include <string>
#include <string_view>

#include "file_lock.h"
#include "unique_fd.h"

namespace cfg32::tool {

/// A private copy of a file's text, in memory, that is opened by its name like a file. What is
/// tried on it touches no disk, and nobody else sees it.
class memory_file {
  public:
    explicit memory_file(std::string_view text);

    const std::string& name() const { return name_; }
    /// What it holds now.
    std::string text() const;

  private:
    unique_fd file_;
    std::string name_;
};

/// Opens the configuration file while no program is writing it, and keeps it so. Ends the command
/// when that can't be done.
locked_file locked_configuration(const std::string& name);

/// The text of a file of that name. Ends the command when it can't be read.
std::string text_of(const locked_file& file, const std::string& name);

/// The text of the configuration file, read while no program is writing it. Ends the command when
/// it can't be read.
std::string read_configuration(const std::string& name);

/// The same without asking for the lock, which somebody may hold for long.
std::string read_without_waiting(const std::string& name);

}  // namespace cfg32::tool
