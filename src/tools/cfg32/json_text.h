#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>
#include <vector>

#include "entry.h"
#include "problem.h"

namespace cfg32::tool {

/// JSON objects keep the order in which their members were given.
using json = nlohmann::ordered_json;

/// Text of the locale's character set in UTF-8, which JSON is written in (RFC 8259, 8.1). A byte
/// that is not of that set becomes U+FFFD.
std::string utf8(std::string_view text);

/// An entry, with its passwords only as far as they may be seen.
json json_of(const entry& printed);

/// What was left out when a file was read.
json json_of(const std::vector<problem>& left_out);

void print_json(const json& value);

}  // namespace cfg32::tool
