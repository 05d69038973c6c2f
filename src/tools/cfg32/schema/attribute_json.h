#pragma once

// What the attribute table says, as JSON.

#include <nlohmann/json_fwd.hpp>
#include <vector>

struct _AttrType;

namespace cfg32::tool {

/// {"attributes": [...]} with an object for each row; members that say nothing are left out.
nlohmann::ordered_json attributes_json(const std::vector<const _AttrType*>& rows);

}  // namespace cfg32::tool
