#pragma once

#include "LDIF_AttrType.h"

namespace cfg32::tests {

/// A row of the table, changed while this lives.
class changed_row {
  public:
    explicit changed_row(const char* attribute)
        : row_(const_cast<_AttrType*>(getAttrType(attribute))), before_(*row_) {}
    changed_row(const changed_row&) = delete;
    changed_row& operator=(const changed_row&) = delete;
    ~changed_row() { *row_ = before_; }

    _AttrType* operator->() { return row_; }

  private:
    _AttrType* row_;
    _AttrType before_;
};

}  // namespace cfg32::tests
