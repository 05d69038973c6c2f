#pragma once

#include <cstddef>
#include <string>

/// What the parts are measured with.
namespace cfg32::bench {

/// Below cn=Configuration, or ten below each entry.
enum class shape { flat, nested };

/// The DN of an entry.
std::string dn_of(size_t number, shape how);

/// The text of a configuration file with that many entries: comments, continued lines, several
/// values, every common syntax.
std::string configuration_text(size_t entries, shape how);

}  // namespace cfg32::bench
