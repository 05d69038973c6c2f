#pragma once

// What the commands share that change one attribute of an entry.

#include <string>
#include <string_view>
#include <vector>

#include "change/change_record.h"
#include "settings.h"

namespace cfg32::tool {

/// The attribute's name as the table spells it; as it was given when the table has none such.
std::string spelled_name(const std::string& attribute);

/// Ends the command for a password in clear, which others saw on the command line.
void require_no_secrets(const std::string& attribute, const std::vector<std::string>& values);

/// Makes one modification of one entry and prints the result. Returns the exit status.
int change_attribute(const settings& options, const std::string& dn, modification change);

}  // namespace cfg32::tool
