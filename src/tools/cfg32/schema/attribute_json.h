#pragma once

// What the attribute table says, as JSON.

#include <vector>

struct _AttrType;

namespace cfg32::tool {

/// Prints {"attributes": [...]} with an object for each row; members that say nothing are left out.
void print_attributes_json(const std::vector<const _AttrType*>& rows);

}  // namespace cfg32::tool
