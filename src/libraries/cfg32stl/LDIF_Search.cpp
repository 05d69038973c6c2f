#include "LDIF_Search.h"

#include <ostream>

#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr failure no_base{32, 32, "Base entry not found"};

/// The text without its parentheses. A closing one counts only where it is the first and the last.
std::string without_parentheses(std::string text) {
    if (text.starts_with('(')) {
        text.erase(0, 1);
        if (!text.empty() && text.find(')') == text.size() - 1) {
            text.pop_back();
        }
    }
    return text;
}

/// The value with its escapes resolved; a broken escape ends it silently.
std::string unescaped(const std::string& text) {
    std::string value;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            value += text[i];
            continue;
        }
        std::string digits = text.substr(i + 1, 2);
        char byte = '\0';
        if (!is_plain(digits) || !hex2byte(digits, byte)) {
            break;
        }
        value += byte;
        i += 2;
    }
    return value;
}

}  // namespace

LDIF_Filter& LDIF_Filter::operator=(const std::string& text) {
    *this = LDIF_Filter();
    std::string term = text;
    term = without_parentheses(stripLeading(term));
    const size_t equals = term.find('=');
    if (equals == 0) {
        return *this;
    }
    std::string name = term.substr(0, equals);
    if (!stripTrailing(name).empty() || equals != std::string::npos) {
        attribute_ = name;
    }
    if (equals == std::string::npos) {
        return *this;
    }
    std::string value = term.substr(equals + 1);
    stripLeading(stripTrailing(value));
    if (!value.empty() && value != "*") {
        any_value_ = false;
        value_ = unescaped(value);
    }
    return *this;
}

bool LDIF_Filter::match(const LDIF_Entry& entry) const {
    const LDIF_Attributes& attributes = entry.attributes();
    const auto attribute = attributes.find(attribute_);
    if (attribute == attributes.end()) {
        return false;
    }
    const LDIF_Values& values = attribute->values();
    return any_value_ || values.find(value_) != values.end();
}

LDIF_Search_Results::LDIF_Search_Results(const Scope& scope, const LDIF_Filter& filter,
                                         const LDIF_AttrFilter& attributes, bool attributesOnly)
    : scope_(scope), filter_(filter), attributes_(attributes), attributes_only_(attributesOnly) {}

LDIF_Search_Results& LDIF_Search_Results::addEntry(const LDIF_Entry& entry, const bool& isBase) {
    const auto body = [&] {
        if (filter_.match(entry) && !(isBase && scope_ == OneLevel)) {
            add_match(entry);
        }
        if (scope_ != Base && (isBase || scope_ == Subtree)) {
            for (const LDIF_Entry& child : entry.children()) {
                addEntry(child, false);
            }
        }
    };
    // KEPT: the entry is told by its whole text, not by its DN.
    with_boundary(in("LDIF_Search_Results::addEntry()"), body,
                  [&](LDIF_Exception& e) { e.entryDn = shown(entry); });
    return *this;
}

void LDIF_Search_Results::add_match(const LDIF_Entry& entry) {
    LDIF_Entry found = entry.header();
    for (const LDIF_Attribute& attribute : entry.attributes()) {
        if (attributes_.empty() || attributes_.contains(attribute.name())) {
            found += attribute;
        }
    }
    entries_.push_back(std::move(found));
}

std::ostream& operator<<(std::ostream& out, const LDIF_Search_Results& results) {
    const size_t count = results.entries().size();
    out << count << " entr" << (count == 1 ? "y" : "ies") << " found.\n";
    for (const LDIF_Entry& entry : results.entries()) {
        out << "\n" << entry.name().text() << ": " << entry.dn() << "\n";
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            const std::string& name = attribute.name().text();
            if (results.attributes_only()) {
                out << name << "\n";
                continue;
            }
            for (const LDIF_Value& value : attribute.values()) {
                out << name << ": " << value << "\n";
            }
        }
    }
    return out;
}

LDIF_Search_Results LDIF_File::search(const LDIF_DN& base, const LDIF_Search_Results::Scope& scope,
                                      const LDIF_Filter& filter, const LDIF_AttrFilter& attributes,
                                      bool attributesOnly) const {
    const auto body = [&] {
        LDIF_Search_Results results(scope, filter, attributes, attributesOnly);
        const LDIF_Entry* entry = root_.find(base);
        if (!entry) {
            raise(no_base);
        }
        results += *entry;
        return results;
    };
    return with_system_error(in("LDIF_File::search()"), body, no_details);
}
