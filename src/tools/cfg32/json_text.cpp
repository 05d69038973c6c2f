// Printing JSON.

#include "json_text.h"

#include <iomanip>
#include <iostream>
#include <nlohmann/json.hpp>
#include <unordered_map>

#include "configuration.h"
#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

json json_of(const entry& printed) {
    json attributes = json::object();
    // Members are appended to the list that they are: to insert one looks through all.
    auto& members = attributes.get_ref<json::object_t&>();
    std::unordered_map<std::string, size_t> places;
    for (const attribute& each : printed.attributes) {
        // Names of which a part is hidden may look the same.
        const auto [place, is_new] =
            places.try_emplace(utf8(shown_line(each.name)), members.size());
        if (is_new) {
            members.emplace_back(place->first, json::array());
        }
        json& values = members.data()[place->second].second;
        for (const std::string& value : shown_values(each.name, each.values)) {
            values.push_back(utf8(value));
        }
    }
    return {{"dn", utf8(shown_text(printed.dn))}, {"attributes", std::move(attributes)}};
}

json json_of(const std::vector<problem>& left_out) {
    json list = json::array();
    for (const problem& found : left_out) {
        list.push_back({{"line", found.line}, {"text", utf8(found.text)}});
    }
    return list;
}

}  // namespace

void print_json(const json& value) { std::cout << std::setw(2) << value << "\n"; }

void print_objects(json entries, const configuration& file) {
    print_json({{"file", utf8(file.name())},
                {"entries", std::move(entries)},
                {"leftOut", json_of(file.left_out())}});
}

void print_entries(const std::vector<entry>& entries, const configuration& file) {
    json list = json::array();
    for (const entry& each : entries) {
        list.push_back(json_of(each));
    }
    print_objects(std::move(list), file);
}

}  // namespace cfg32::tool
