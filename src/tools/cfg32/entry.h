#pragma once

#include <string>
#include <vector>

namespace cfg32::tool {

/// An attribute as it is read or printed.
struct attribute {
    std::string name;
    std::vector<std::string> values;  ///< as stored: passwords encoded
};

/// An entry as it is read or printed.
struct entry {
    std::string dn;  ///< empty for the lines above all entries
    std::vector<attribute> attributes;
};

}  // namespace cfg32::tool
