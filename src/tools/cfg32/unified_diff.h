#pragma once
#include <string>
namespace cfg32::tool {
std::string unified_diff(const std::string& before, const std::string& after,
                         const std::string& name);
}
