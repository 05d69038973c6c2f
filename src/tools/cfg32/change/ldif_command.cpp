// Changes that come as LDIF.

#include "change/ldif_command.h"

#include <algorithm>
#include <memory>

#include "arguments.h"
#include "change/ldif_reader.h"
#include "input.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

/// The records of a text, and what is wrong with those that are not well-formed.
struct ldif_records {
    std::vector<change_record> good;
    std::vector<skipped_record> bad;

    void add(change_record&& record, change_record::operation allowed, bool only_allowed,
             const std::string& source) {
        if (only_allowed && record.kind != allowed) {
            return add({record.line, "a record that does not delete"}, source, record.dn);
        }
        good.push_back(std::move(record));
    }

    void add(const ldif_error& error, const std::string& source, const std::string& dn = {}) {
        bad.push_back(
            {error.line, dn, source + ":" + std::to_string(error.line) + ": " + error.text});
    }
};

ldif_records records_of(std::string_view text, const std::string& source,
                        change_record::operation default_kind, bool only_default) {
    ldif_records records;
    for (auto& each : read_ldif(text, default_kind)) {
        if (const auto* error = std::get_if<ldif_error>(&each)) {
            records.add(*error, source);
        } else {
            records.add(std::move(std::get<change_record>(each)), default_kind, only_default,
                        source);
        }
    }
    return records;
}

void require_none(const std::vector<skipped_record>& bad) {
    std::string failures;
    for (const skipped_record& each : bad) {
        failures += (failures.empty() ? "" : "\n") + each.reason;
    }
    if (!failures.empty()) {
        throw ended(failed, failures);
    }
}

}  // namespace

std::shared_ptr<ldif_options> add_ldif_options(CLI::App& parser) {
    auto given = std::make_shared<ldif_options>();
    add_argument(parser, "-l,--ldif", "FILE",
                 "read the changes from this file; else from standard input", given->file);
    add_flag(parser, "-c,--continue", "leave out records that fail, and say which",
             given->how.goes_on);
    return given;
}

int update_from_ldif(const settings& options, const ldif_options& given,
                     change_record::operation default_kind, bool only_default) {
    update_options how = given.how;
    how.source = given.file.empty() ? standard_input : given.file;
    const std::string text = given.file.empty() ? input_text() : input_text(given.file);
    ldif_records records = records_of(text, how.source, default_kind, only_default);
    if (!how.goes_on) {
        require_none(records.bad);
    }
    update_result result = update(options, records.good, how);
    result.skipped.insert(result.skipped.end(), records.bad.begin(), records.bad.end());
    std::sort(result.skipped.begin(), result.skipped.end(),
              [](const skipped_record& l, const skipped_record& r) { return l.line < r.line; });
    return print_result(options, result);
}

}  // namespace cfg32::tool
