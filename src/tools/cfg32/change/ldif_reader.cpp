// Reading LDIF of changes: what the lines of a record mean.

#include "change/ldif_reader.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <map>
#include <optional>
#include <span>
#include <utility>

#include "change/ldif_lines.h"
#include "cisString.h"
#include "hidden_passwords.h"

namespace cfg32::tool {

namespace {

using line_span = std::span<const ldif_text_line>;

constexpr struct {
    const char* name;
    std::optional<change_record::operation> kind;  ///< none: not supported
} change_types[] = {
    {"add", change_record::add},       {"modify", change_record::modify},
    {"delete", change_record::remove}, {"modrdn", std::nullopt},
    {"moddn", std::nullopt},
};

constexpr struct {
    const char* name;
    modification::operation kind;
} block_types[] = {
    {"add", modification::add},
    {"delete", modification::remove},
    {"replace", modification::replace},
};

/// The row of a table that has the name; null when none has.
template <class Rows>
const auto* row_of(const Rows& rows, std::string_view name) {
    const auto row = std::find_if(std::begin(rows), std::end(rows),
                                  [&](const auto& each) { return is_same_name(each.name, name); });
    return row == std::end(rows) ? nullptr : row;
}

change_record::operation kind_of(const named_value& change_type) {
    const auto* type = row_of(change_types, change_type.value);
    if (!type) {
        throw ldif_error{
            change_type.line,
            fmt::format("\"{}\" is no changetype: add, modify and delete are",
                        change_type.value.substr(0, change_type.value.find_first_of(" :")))};
    }
    if (!type->kind) {
        throw ldif_error{change_type.line,
                         fmt::format("changetype {} is not supported", type->name)};
    }
    return *type->kind;
}

void add_value(modification& to, const named_value& line) {
    to.values.push_back(line.value);
    to.value_lines.push_back(line.line);
}

void require_no_dn(const named_value& line) {
    if (is_same_name(line.name, "dn")) {
        throw ldif_error{line.line, "a second \"dn:\": a blank line is missing above it"};
    }
}

/// The content of an added entry, one modification for each attribute.
void read_content(line_span lines, change_record& record) {
    std::map<cisString, size_t> places;
    for (const ldif_text_line& each : lines) {
        const named_value line = parse_line(each);
        require_no_dn(line);
        if (is_same_name(line.name, "changetype")) {
            throw ldif_error{line.line, "\"changetype:\" stands only right below \"dn:\""};
        }
        if (row_of(block_types, line.name)) {
            throw ldif_error{
                line.line,
                fmt::format("\"{}:\" needs \"changetype: modify\" below \"dn:\"", line.name)};
        }
        const auto [place, is_new] =
            places.try_emplace(cisString(line.name), record.modifications.size());
        if (is_new) {
            record.modifications.push_back({modification::add, line.name, {}, line.line});
        }
        add_value(record.modifications[place->second], line);
    }
}

/// One block, taken from the front of the lines.
modification take_block(line_span& lines, modification::operation kind) {
    const named_value head = parse_line(lines.front());
    require_name(head.value, head.line);
    modification block = {kind, head.value, {}, head.line};
    bool is_ended = false;
    for (lines = lines.subspan(1); !lines.empty(); lines = lines.subspan(1)) {
        if (lines.front().text == "-") {
            lines = lines.subspan(1);
            is_ended = true;
            break;
        }
        if (lines.front().text.starts_with('-')) {
            throw ldif_error{lines.front().number, "text after the \"-\" that ends a block"};
        }
        const named_value line = parse_line(lines.front());
        require_no_dn(line);
        if (!is_same_name(line.name, block.attribute)) {
            throw ldif_error{line.line,
                             fmt::format("\"{}\" in the block of {}, which a line \"-\" ends",
                                         shown_line(line.name), shown_line(block.attribute))};
        }
        add_value(block, line);
    }
    if (kind == modification::add && block.values.empty()) {
        throw ldif_error{head.line, "no values to add"};
    }
    if (block.values.empty() && !is_ended) {
        // A cut-off replacement would delete.
        throw ldif_error{head.line, "a block without values needs the line \"-\" that ends it"};
    }
    return block;
}

/// The blocks of a modification. is_said: the record has a changetype.
void read_blocks(line_span lines, bool is_said, change_record& record) {
    if (lines.empty()) {
        throw ldif_error{record.line, "a modification without changes"};
    }
    while (!lines.empty()) {
        const named_value head = parse_line(lines.front());
        require_no_dn(head);
        const auto* type = row_of(block_types, head.name);
        if (!type && is_said) {
            throw ldif_error{head.line,
                             "a value outside of a block: \"add:\", \"replace:\" or "
                             "\"delete:\" begins one"};
        }
        if (!type) {
            throw ldif_error{head.line,
                             "the content of an entry is for `cfg32 add`, or needs "
                             "\"changetype: add\" below \"dn:\""};
        }
        record.modifications.push_back(take_block(lines, type->kind));
    }
}

void require_nothing(line_span lines) {
    if (!lines.empty()) {
        throw ldif_error{lines.front().number, "nothing may follow in a record that deletes"};
    }
}

/// Reads "dn:" and "changetype:" from the front of the lines.
bool take_head(line_span& lines, change_record& record) {
    const named_value dn = parse_line(lines.front());
    if (!is_same_name(dn.name, "dn")) {
        throw ldif_error{dn.line, "a record begins with \"dn:\""};
    }
    record.dn = dn.value;
    record.line = dn.line;
    lines = lines.subspan(1);
    if (lines.empty()) {
        return false;
    }
    const std::string_view next = lines.front().text;
    const std::string_view name = next.substr(0, next.find(':'));
    if (is_same_name(name, "control")) {
        throw ldif_error{lines.front().number, "\"control:\" is not supported"};
    }
    const bool is_said = is_same_name(name, "changetype");
    if (is_said) {
        record.kind = kind_of(parse_line(lines.front()));
        lines = lines.subspan(1);
    }
    return is_said;
}

change_record read_record(line_span lines, change_record::operation default_kind) {
    change_record record;
    record.kind = default_kind;
    const bool is_said = take_head(lines, record);
    if (record.dn.empty() && record.kind != change_record::modify) {
        throw ldif_error{record.line,
                         "an empty DN, which stands for the lines above all entries: "
                         "they can only be modified"};
    }
    switch (record.kind) {
        case change_record::add:
            if (lines.empty() && !is_said) {
                throw ldif_error{record.line, "an entry without content needs \"changetype: add\""};
            }
            read_content(lines, record);
            break;
        case change_record::modify:
            read_blocks(lines, is_said, record);
            break;
        case change_record::remove:
            require_nothing(lines);
            break;
    }
    return record;
}

/// True when the line says the version of LDIF; throws for another one than the one there is.
bool is_version(const ldif_text_line& line) {
    if (!is_same_name(std::string_view(line.text).substr(0, line.text.find(':')), "version")) {
        return false;
    }
    if (parse_line(line).value != "1") {
        throw ldif_error{line.number, "only version 1 of LDIF is supported"};
    }
    return true;
}

/// A line that the end of the text ends may have been cut off in the middle.
std::optional<ldif_error> cut_off_line(std::string_view text) {
    const std::string_view last = text.substr(text.find_last_of('\n') + 1);
    if (last.empty() || last.front() == '#') {
        return {};
    }
    const auto line = std::count(text.begin(), text.end(), '\n') + 1;
    return ldif_error{static_cast<int>(line),
                      "the last line has no newline at its end, as if it were cut off"};
}

}  // namespace

std::vector<std::variant<change_record, ldif_error>> read_ldif(
    std::string_view text, change_record::operation default_kind) {
    std::vector<std::variant<change_record, ldif_error>> read;
    bool is_first = true;
    for (const ldif_lines& record : split_records(text)) {
        try {
            line_span lines = record;
            if (std::exchange(is_first, false) && is_version(lines.front())) {
                lines = lines.subspan(1);
            }
            if (!lines.empty()) {
                read.emplace_back(read_record(lines, default_kind));
            }
        } catch (const ldif_error& e) {
            read.emplace_back(e);
        }
    }
    const std::optional<ldif_error> cut_off = cut_off_line(text);
    if (cut_off && !read.empty()) {
        read.back() = *cut_off;
    }
    return read;
}

}  // namespace cfg32::tool
