// What the attribute table says, as JSON.

#include "schema/attribute_json.h"

#include <nlohmann/json.hpp>
#include <string>

#include "LDIF_AttrType.h"
#include "json_text.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

void add_bounds(json& object, const value_bounds& bounds) {
    if (bounds.what == bounded::number) {
        object["minimum"] = bounds.minimum;
        object["maximum"] = bounds.maximum;
    }
    if (bounds.what == bounded::length) {
        object["minimumLength"] = bounds.minimum;
        if (bounds.maximum != 0) {
            object["maximumLength"] = bounds.maximum;
        }
    }
}

json attribute_json(const _AttrType& row) {
    json object;
    object["name"] = row.name;
    object["syntax"] = syntax_name(row);
    object["description"] = syntax_in_words(row);
    object["accepted"] = accepted_values(row);
    add_bounds(object, bounds_of(row));
    const char* const words_name = enforces_words(row) ? "words" : "usualWords";
    for (const char* const* word = row.enumValues; word && *word; ++word) {
        object[words_name].push_back(*word);
    }
    if (row.bitmask != 0) {
        object["bitmask"] = row.bitmask;
    }
    object["singleValued"] = row.isSingle;
    object["example"] = example_value(row);
    return object;
}

}  // namespace

void print_attributes_json(const std::vector<const _AttrType*>& rows) {
    json list = json::array();
    for (const _AttrType* row : rows) {
        list.push_back(attribute_json(*row));
    }
    print_json({{"attributes", list}});
}

}  // namespace cfg32::tool
