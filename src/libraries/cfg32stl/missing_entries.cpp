#include "missing_entries.h"

#include <algorithm>

#include "LDIF_Entry.h"

namespace cfg32 {

void missing_entries::add_above(const LDIF_Entry& entry) {
    const size_t known = found_.size();
    const LDIF_DN& dn = below_.emplace_back(entry.dn());
    for (size_t size = dn.rdns().size(); size-- > entry.depth() + 1;) {
        // What is missing above one that is known was added with it.
        if (!found_.insert({&dn, size}).second) {
            break;
        }
    }
    if (found_.size() == known) {
        below_.pop_back();
    }
}

void missing_entries::for_each(const std::function<void(const std::string&)>& use) const {
    for (const ancestor& each : found_) {
        std::string text;
        for (size_t i = each.size; i-- > 0;) {
            each.of->rdns()[i].append_to(text);
            text += i > 0 ? ", " : "";
        }
        use(text);
    }
}

void missing_entries::copy_to(std::set<LDIF_DN>& dns) const {
    for (const ancestor& each : found_) {
        LDIF_DN dn;
        for (size_t i = 0; i < each.size; ++i) {
            dn += each.of->rdns()[i];
        }
        dns.insert(std::move(dn));
    }
}

bool missing_entries::ancestor::operator<(const ancestor& other) const {
    const size_t common = of == other.of ? 0 : std::min(size, other.size);
    for (size_t i = 0; i < common; ++i) {
        if (const int order = of->rdns()[i].compare(other.of->rdns()[i]); order != 0) {
            return order < 0;
        }
    }
    return size > other.size;  // an ancestor is greater than its descendants
}

}  // namespace cfg32
