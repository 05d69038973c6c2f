#pragma once

#include <nlohmann/json_fwd.hpp>
#include <vector>

#include "entry.h"
#include "utf8.h"

namespace cfg32::tool {

class configuration;

/// JSON objects keep the order in which their members were given.
using json = nlohmann::ordered_json;

void print_json(const json& value);

/// Prints what was found of a file's entries, an object each, and what was left out of it.
void print_objects(json entries, const configuration& file);

/// Prints entries so, with their passwords only as far as they may be seen.
void print_entries(const std::vector<entry>& entries, const configuration& file);

}  // namespace cfg32::tool
