#pragma once

#include <optional>
#include <set>
#include <vector>

#include "LDIF_Attribute.h"
#include "change/change_record.h"

namespace cfg32::tool {

/// What modifications do to the attributes of an entry, so that it can be undone for no more than
/// they cost themselves. A list may be long: of one to which values are added there is no copy,
/// because they come last, and one from which some are removed is not copied either.
class former_attributes {
  public:
    explicit former_attributes(LDIF_Attributes& present) : present_(present) {}

    /// Comes before each modification. is_last: none follows that could fail.
    void keep(const modification& change, bool is_last);
    /// Returns false when not all can be put back; then nothing is.
    bool put_back();

  private:
    struct former {
        cisString name;
        bool is_there;
        size_t count;                        // of its values
        std::optional<LDIF_Attribute> copy;  // none where values are only added
    };

    LDIF_Attributes& present_;
    bool is_complete_ = true;
    std::vector<former> former_;
    // What is kept already: for additions, for everything.
    std::set<cisString> counted_;
    std::set<cisString> copied_;
};

}  // namespace cfg32::tool
