#include <algorithm>
#include <memory>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "LDIF_Search.h"
#include "LDIF_Util.h"
#include "exempt_dn.h"
#include "memory_file.h"
#include "property.h"

namespace cfg32::fuzz {

namespace {

/// What a filter says of an entry: "yes", "no", or why it can't tell.
template <class Matches>
std::string answer(Matches matches) {
    try {
        return matches() ? "yes" : "no";
    } catch (const LDIF_Exception& e) {
        return std::to_string(e.ldapErr) + "/" + std::to_string(e.extErr);
    }
}

/// The rule, value by value.
bool is_match(const LDIF_Filter& filter, const LDIF_Entry& entry) {
    const LDIF_Attributes& attributes = entry.attributes();
    const auto attribute = attributes.find(filter.attribute());
    if (attribute == attributes.end()) {
        return false;
    }
    const LDIF_Values& values = attribute->values();
    if (filter.any_value() || values.empty()) {
        return filter.any_value();
    }
    const LDIF_Value wanted(values.type(), filter.value().c_str(), nullptr);
    return std::any_of(values.begin(), values.end(),
                       [&](const LDIF_Value& value) { return value.compare(wanted) == 0; });
}

std::vector<std::string> answers(const LDIF_Filter& filter, const LDIF_File& file) {
    std::vector<std::string> all;
    for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) {
        all.push_back(answer([&] { return filter.match(entry); }));
    });
    return all;
}

/// A filter for exactly that value.
std::string filter_of(const LDIF_Attribute& attribute, const LDIF_Value& value) {
    std::string text = attribute.name().text() + "=";
    for (const char byte : value.str()) {
        byte2hex(static_cast<unsigned char>(byte), text += '\\');
    }
    return text;
}

void require_finds(const LDIF_Entry& entry) {
    for (const LDIF_Attribute& attribute : entry.attributes()) {
        for (const LDIF_Value& value : attribute.values()) {
            const LDIF_Filter filter(filter_of(attribute, value));
            const bool can_be_said =
                filter.attribute().text() == attribute.name().text() && !is_exempt(value);
            if (!can_be_said) {
                continue;
            }
            require_equal(answer([&] { return filter.match(entry); }), "yes",
                          "an entry is found by each of its values");
        }
    }
}

void require_answers(const LDIF_Filter& filter, const LDIF_File& file) {
    const std::vector<std::string> unread = answers(filter, file);
    std::vector<std::string> expected;
    for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) {
        expected.push_back(answer([&] { return is_match(filter, entry); }));
    });
    // Looking at the attributes has read them.
    require(unread == expected, "lines are found as their rule says");
    require(answers(filter, file) == expected, "attributes are found as their rule says");
}

/// What is made, or null where the text is none.
template <class Made, class... Arguments>
std::unique_ptr<Made> made_of(const Arguments&... arguments) {
    try {
        return std::make_unique<Made>(arguments...);
    } catch (const LDIF_Exception& e) {
        require_refusal(e);
        return nullptr;
    }
}

}  // namespace

void filter_property(std::string_view input) {
    const std::vector<std::string> parts = parts_of(input, 2);
    const tool::memory_file text(parts.size() > 1 ? parts[1] : "");
    const auto filter = made_of<LDIF_Filter>(parts[0]);
    const auto file = made_of<LDIF_File>(text.name(), "", nullptr);
    if (filter && file) {
        require_answers(*filter, *file);
        for_each_in_preorder(file->root(), require_finds);
    }
}

}  // namespace cfg32::fuzz
