// Printing JSON.

#include "json_text.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "LDIF_Util.h"
#include "secret.h"

namespace cfg32::tool {

namespace {

constexpr unsigned long replacement_character = 0xfffd;

void append_utf8(std::string& text, unsigned long code) {
    const auto append = [&](unsigned long byte) { text += static_cast<char>(byte); };
    const auto append_rest = [&](int shift) { append(0x80 | ((code >> shift) & 0x3f)); };
    if (code < 0x80) {
        append(code);
    } else if (code < 0x800) {
        append(0xc0 | (code >> 6));
        append_rest(0);
    } else if (code < 0x10000) {
        append(0xe0 | (code >> 12));
        append_rest(6);
        append_rest(0);
    } else {
        append(0xf0 | (code >> 18));
        append_rest(12);
        append_rest(6);
        append_rest(0);
    }
}

}  // namespace

std::string utf8(std::string_view text) {
    if (is_plain(text)) {
        return std::string(text);
    }
    std::string converted;
    while (!text.empty()) {
        const character next = first_character(text);
        append_utf8(converted,
                    next.is_valid ? static_cast<unsigned long>(next.code) : replacement_character);
        text.remove_prefix(next.bytes.size());
    }
    return converted;
}

json json_of(const entry& printed) {
    json attributes = json::object();
    for (const attribute& each : printed.attributes) {
        json values = json::array();
        for (const std::string& value : each.values) {
            values.push_back(utf8(shown_value(each.name, value)));
        }
        attributes[utf8(each.name)] = std::move(values);
    }
    return {{"dn", utf8(printed.dn)}, {"attributes", std::move(attributes)}};
}

json json_of(const std::vector<problem>& left_out) {
    json list = json::array();
    for (const problem& found : left_out) {
        list.push_back({{"line", found.line}, {"text", utf8(found.text)}});
    }
    return list;
}

void print_json(const json& value) {
    const std::string text = value.dump(2) + "\n";
    fwrite(text.data(), 1, text.size(), stdout);
}

}  // namespace cfg32::tool
