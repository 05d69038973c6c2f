#pragma once

#include <nlohmann/json_fwd.hpp>
#include <vector>

#include "check/problem.h"
#include "entry.h"
#include "utf8.h"

namespace cfg32::tool {

/// JSON objects keep the order in which their members were given.
using json = nlohmann::ordered_json;

/// An entry, with its passwords only as far as they may be seen.
json json_of(const entry& printed);

/// What was left out when a file was read.
json json_of(const std::vector<problem>& left_out);

void print_json(const json& value);

}  // namespace cfg32::tool
