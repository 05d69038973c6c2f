#pragma once

#include <string>
#include <vector>

namespace cfg32::tool {

/// One block of a change: what is to be done with an attribute.
struct modification {
    enum operation { add, remove, replace };

    operation kind = add;
    std::string attribute;
    std::vector<std::string> values;    ///< without line feeds and NULs
    int line = 0;                       ///< where the LDIF text has it, 0 for a change without one
    std::vector<int> value_lines = {};  ///< the same for each value; may be empty
};

/// One record of a change (RFC 2849): what is to be done with an entry.
struct change_record {
    enum operation { add, modify, remove };

    operation kind = modify;
    std::string dn;  ///< empty for the lines above all entries
    std::vector<modification>
        modifications;  ///< of an added entry: of kind add; of a removed: none
    int line = 0;
};

}  // namespace cfg32::tool
