// Finding problems: the lines that are to be attributes.

#include <fmt/format.h>

#include <algorithm>
#include <cerrno>

#include "LDIF_File.h"
#include "check/dn_findings.h"
#include "check/problem_finder.h"
#include "check/stored_password.h"
#include "hidden_passwords.h"
#include "outcome.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

const cisString kept_line_name = "oru-slapdInvalidLine";

}  // namespace

void problem_finder::attribute_line() {
    if (open_) {
        open_->last = last_;
    }
    const bool is_readable = !is_unreadable();
    check_spelling();
    if (!is_readable) {
        return check_unreadable_value();
    }
    if (!line_.hasSeparator) {
        return keep_aside();
    }
    try {
        take();
    } catch (const LDIF_Exception& e) {
        if (e.sysErrno != 0) {
            throw;  // that says nothing about the line
        }
        report_refused(e);
        keep_aside();
    }
}

/// What can be said of a line without its value.
void problem_finder::check_spelling() {
    if (!line_.hasSeparator) {
        add(kind::missing_separator, name_place(), "no colon after the attribute's name").accepted =
            "name: value";
        return;
    }
    check_literal();
    if (kept_line_name == line_.attribute) {
        add(kind::kept_line, value_place(),
            "a line that could not be used was kept here: mend it or delete it");
    } else if (!find_attribute(line_.attribute)) {
        check_unknown_name();
    }
}

/// Whatever the bytes are that can't be read: as many others of no meaning are no better in their
/// place. A load does not come so far.
void problem_finder::check_unreadable_value() {
    if (!line_.hasSeparator) {
        return;
    }
    try {
        LDIF_Attribute(key_, line_, {});
    } catch (const LDIF_Exception& e) {
        if (e.sysErrno != 0) {
            throw;
        }
        report_refused(e);
    }
}

/// Other readers of LDIF would decode the value, or fetch it.
void problem_finder::check_literal() {
    const std::string_view line = file_.line(line_.lineNumber);
    const size_t colon = line.find(':');
    const bool is_marked = line_.hasSeparator && !line_.value.empty() && colon + 1 < line.size() &&
                           (line[colon + 1] == ':' || line[colon + 1] == '<');
    if (!is_marked) {
        return;
    }
    std::string text =
        "\":<\" is not understood: the value is taken as it stands, not as a reference";
    if (line[colon + 1] == ':') {
        const size_t end = std::min(line.find_first_not_of(':', colon), line.size());
        const std::string_view colons = line.substr(colon, end - colon);
        text = fmt::format("\"{}\" is not understood: the value {}, not {}base64", colons,
                           colons.size() == 2 ? "is taken as it stands" : "is what follows them",
                           colons.size() == 2 ? "as " : "");
    }
    add(kind::literal_base64, value_place(), text).accepted = "name: value";
}

void problem_finder::check_unknown_name() {
    const auto [known, is_new] = nearest_.try_emplace(line_.attribute);
    if (is_new) {
        known->second = nearest_attribute(line_.attribute).value_or("");
    }
    problem& found = add(kind::unknown_attribute, name_place(),
                         fmt::format("\"{}\" is not an attribute that the server knows",
                                     shown_line(line_.attribute)));
    if (!known->second.empty()) {
        found.text += fmt::format("; did you mean {}?", known->second);
        found.accepted = known->second;
    }
}

/// Uses the line as a load does; throws where a load keeps it aside.
void problem_finder::take() {
    LDIF_Attribute attribute(key_, line_, {});
    check_value(*attribute.values().begin());
    if (open_) {
        entries_.add(*open_, std::move(attribute), line_.lineNumber, true);
    } else {
        add_outside(std::move(attribute));
    }
}

void problem_finder::report_refused(const LDIF_Exception& e) {
    const _AttrType* type = find_attribute(line_.attribute);
    place where = value_place();
    if (type && e.ldapErr == 34 && !line_.value.empty()) {
        where = file_.value_place(line_.lineNumber, parsed_length(line_.value));
    }
    std::string text = message_of(e);
    if (e.ldapErr == 84) {
        text = "a second password, which can't be compared with the first one";
        text += key_ ? "" : " without the key";
    }
    problem& found = add(kind::invalid_value, where, text);
    found.accepted = type ? accepted_values(*type) : "";
    take_codes(found, e);
}

void problem_finder::keep_aside() {
    line_.changeToInvalidAttr();
    if (!open_) {
        return add_to_run();
    }
    entries_.add(*open_, LDIF_Attribute(key_, line_, {}), line_.lineNumber, false);
    open_->has_kept_line = true;
}

/// Only one version and one charset line stand outside of entries, above the first one.
void problem_finder::add_outside(LDIF_Attribute&& attribute) {
    if (!is_of_root(attribute)) {
        return add_to_run();
    }
    end_run();
    if (header_lines_.contains(attribute.name())) {
        return repeated_header(attribute);
    }
    header_lines_[attribute.name()] = line_.lineNumber;
    entries_.add_header(std::move(attribute), line_.lineNumber);
}

void problem_finder::repeated_header(const LDIF_Attribute& attribute) {
    const int first = header_lines_[attribute.name()];
    problem& found =
        add(kind::repeated_header, name_place(),
            first > 0 ? fmt::format("another {} line; the first one is line {}",
                                    attribute.name().text(), first)
                      : fmt::format("a {} line stands above the first entry or not at all",
                                    attribute.name().text()));
    found.first_left_out = line_.lineNumber;
    found.last_left_out = last_;
}

void problem_finder::add_to_run() {
    if (!run_) {
        run_ = &add(kind::attribute_outside, name_place(), "");
        run_->attribute.clear();
        run_->first_left_out = line_.lineNumber;
    }
    ++run_lines_;
    run_->last_left_out = last_;
}

void problem_finder::end_run() {
    if (run_) {
        run_->text = fmt::format(
            "{} {}", run_lines_ == 1 ? "an attribute" : "attributes",
            has_dn_line_ ? "below the blank line that ended the entry" : "above the first entry");
        run_->accepted =
            has_dn_line_ ? "no blank line inside an entry" : "one version and one charset line";
    }
    run_ = nullptr;
    run_lines_ = 0;
}

/// What can be said of a value that its syntax accepts.
void problem_finder::check_value(const LDIF_Value& value) {
    const bool is_dn = value.attrType->fromStr == dnFromStr;
    const std::string change = is_dn ? change_of(LDIF_DN(cisString(line_.value)), line_.value) : "";
    if (!change.empty()) {
        add(kind::dn_changes, value_place(), change);
    }
    if (key_ && is_password_attribute(line_.attribute) && !is_decodable(line_.value, key_)) {
        add(kind::undecodable_password, value_place(),
            "stored password can't be decoded with this key");
    }
}

}  // namespace cfg32::tool
