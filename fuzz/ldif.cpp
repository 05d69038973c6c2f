#include <algorithm>
#include <variant>

#include "change/ldif_reader.h"
#include "ldif_writer.h"
#include "property.h"

namespace cfg32::fuzz {

namespace {

using namespace cfg32::tool;

bool is_equal(const modification& left, const modification& right) {
    return left.kind == right.kind && left.attribute == right.attribute &&
           left.values == right.values;
}

bool is_equal(const change_record& left, const change_record& right) {
    return left.kind == right.kind && left.dn == right.dn &&
           std::equal(left.modifications.begin(), left.modifications.end(),
                      right.modifications.begin(), right.modifications.end(),
                      [](const auto& l, const auto& r) { return is_equal(l, r); });
}

void require_print(const change_record& record) {
    for (const bool is_folded : {false, true}) {
        const std::string text = ldif(record, is_folded);
        const auto again = read_ldif(text, change_record::modify);
        require_equal(again.size(), 1U, "a record is printed as one");
        const auto* read = std::get_if<change_record>(&again.front());
        require(read, "a record reads back as it is printed");
        require(is_equal(*read, record), "a record reads back as the same");
    }
}

}  // namespace

void ldif_property(std::string_view input) {
    const auto lines = std::count(input.begin(), input.end(), '\n') + 1;
    for (const auto kind : {change_record::add, change_record::modify, change_record::remove}) {
        int last = 0;
        for (const auto& read : read_ldif(input, kind)) {
            const auto* error = std::get_if<ldif_error>(&read);
            const int line = error ? error->line : std::get<change_record>(read).line;
            require(line > last && line <= lines, "every record has its line, in order");
            last = line;
            if (!error) {
                require_print(std::get<change_record>(read));
            }
        }
    }
}

}  // namespace cfg32::fuzz
