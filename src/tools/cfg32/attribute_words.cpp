#include "attribute_words.h"
#include "LDIF_AttrType.h"
namespace cfg32::tool {
const _AttrType* find_attribute(std::string_view name) {
    const _AttrType* t = getAttrType(std::string(name).c_str());
    return t->name ? t : nullptr;
}
std::string_view syntax_name(const _AttrType&) { return ""; }
std::string_view syntax_in_words(const _AttrType&) { return ""; }
std::string accepted_values(const _AttrType&) { return ""; }
std::string example_value(const _AttrType&) { return ""; }
std::optional<std::string> nearest_attribute(std::string_view) { return {}; }
}  // namespace cfg32::tool
