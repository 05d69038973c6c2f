#pragma once

// An entry's place as its rules say it literally: children are a list that is walked in order, and
// names are compared part by part.

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <string>
#include <utility>
#include <vector>

#include "LDIF_Entry.h"

namespace cfg32::tests {

using steps = std::vector<std::string>;  // a DN's RDNs, root first, in lower case

inline steps steps_of(const LDIF_DN& dn) {
    steps all;
    for (const LDIF_RDN& rdn : dn.rdns()) {
        std::string text = rdn.str();
        for (char& c : text) {
            c = static_cast<char>(tolower(static_cast<unsigned char>(c)));
        }
        all.push_back(text);
    }
    return all;
}

inline steps intersection(const steps& a, const steps& b) {
    return {a.begin(), std::mismatch(a.begin(), a.end(), b.begin(), b.end()).first};
}

struct model_entry {
    steps relative;
    std::string dn;  // as it is printed; "" for the root
    std::string comment;
    std::string values;  // of "sn"
    std::vector<model_entry> children;

    const model_entry& add(model_entry child) {
        if (child.relative == relative) {
            comment += child.comment;
            values += child.values;
            for (const model_entry& grandchild : child.children) {
                place(grandchild);
            }
            return *this;
        }
        const steps common = intersection(relative, child.relative);
        EXPECT_EQ(common, relative);
        child.relative.erase(child.relative.begin(),
                             child.relative.begin() + static_cast<ptrdiff_t>(common.size()));
        return place(std::move(child));
    }

    /// child's name is relative to this entry already.
    const model_entry& place(model_entry child) {
        for (size_t i = 0; i < children.size();) {
            model_entry& c = children[i];
            const steps common = intersection(c.relative, child.relative);
            if (c.relative == child.relative || c.relative == common) {
                return c.add(std::move(child));
            }
            if (child.relative == common) {
                child.add(c);
                children.erase(children.begin() + static_cast<ptrdiff_t>(i));
            } else {
                ++i;
            }
        }
        children.push_back(std::move(child));
        return *this;
    }

    const model_entry* find(const steps& dn_steps) const {
        if (relative == dn_steps) {
            return this;
        }
        const steps common = intersection(relative, dn_steps);
        if (common != relative) {
            return nullptr;
        }
        const steps rest(dn_steps.begin() + static_cast<ptrdiff_t>(common.size()), dn_steps.end());
        for (const model_entry& c : children) {
            if (const model_entry* found = c.find(rest)) {
                return found;
            }
        }
        return nullptr;
    }

    std::string str() const {
        std::string text = comment;
        if (!dn.empty()) {
            text += "dn: " + dn + "\n";
        }
        for (const char value : values) {
            text += std::string("sn: ") + value + "\n";
        }
        return text + (dn.empty() && children.empty() ? "" : "\n");
    }
};

/// The relative names and the nesting of a tree, one line for an entry.
inline void print_shape(const model_entry& entry, size_t depth, std::string& out) {
    out.append(depth, ' ');
    for (const std::string& step : entry.relative) {
        out += "/" + step;
    }
    out += "\n";
    for (const model_entry& child : entry.children) {
        print_shape(child, depth + 1, out);
    }
}

inline void print_shape(const LDIF_Entry& entry, size_t depth, std::string& out) {
    out.append(depth, ' ');
    for (const std::string& step : steps_of(entry.relative_dn())) {
        out += "/" + step;
    }
    out += "\n";
    for (const LDIF_Entry& child : entry.children()) {
        print_shape(child, depth + 1, out);
    }
}

template <class Entry>
std::string shape(const Entry& entry) {
    std::string text;
    print_shape(entry, 0, text);
    return text;
}

}  // namespace cfg32::tests
