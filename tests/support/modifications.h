#pragma once

#include <deque>
#include <string>
#include <vector>

#include "cfg32.h"

namespace cfg32::tests {

namespace operations {

inline constexpr int add = LDAP_MOD_ADD;
inline constexpr int del = LDAP_MOD_DELETE;
inline constexpr int replace = LDAP_MOD_REPLACE;
inline constexpr int binary = LDAP_MOD_BVALUES;

}  // namespace operations

/// A modification as a row of a table says it. The values are counted ones when the operation says
/// so.
struct change {
    int operation;
    std::string name;
    std::vector<std::string> values;
};

/// Modification records in the form that callers give them to the library.
class modifications {
  public:
    modifications(const std::vector<change>& changes) {
        for (const change& change : changes) {
            add(change);
        }
    }
    modifications(const modifications&) = delete;
    modifications& operator=(const modifications&) = delete;

    ldapmod** records() { return records_.data(); }
    /// For what a row can't say.
    ldapmod& record(size_t number) { return *records_[number]; }

  private:
    struct owned_record {
        change given;
        std::vector<berval> counted;
        std::vector<berval*> counted_values;
        std::vector<char*> values;
        ldapmod record;
    };

    void add(const change& change);

    std::deque<owned_record> owned_;
    std::vector<ldapmod*> records_ = {nullptr};
};

inline void modifications::add(const change& change) {
    owned_record& owned = owned_.emplace_back();
    owned.given = change;
    owned.counted.reserve(change.values.size());
    for (std::string& value : owned.given.values) {
        owned.values.push_back(value.data());
        owned.counted.push_back({value.size(), value.data()});
        owned.counted_values.push_back(&owned.counted.back());
    }
    owned.values.push_back(nullptr);
    owned.counted_values.push_back(nullptr);
    owned.record.mod_op = change.operation;
    owned.record.mod_type = owned.given.name.data();
    if ((change.operation & LDAP_MOD_BVALUES) != 0) {
        owned.record.mod_bvalues = owned.counted_values.data();
    } else {
        owned.record.mod_values = owned.values.data();
    }
    records_.back() = &owned.record;
    records_.push_back(nullptr);
}

}  // namespace cfg32::tests
