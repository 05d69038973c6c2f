// Finding problems: the way through a file, its bytes, entries and end.

#include "check/problem_finder.h"

#include <utility>

#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "check/dn_findings.h"
#include "check/shown_lines.h"
#include "hidden_passwords.h"
#include "line_source.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

bool begins_with_blank(const LDIF_Line& line) {
    return without_leading_space(line.attribute).size() < line.attribute.size();
}

}  // namespace

std::vector<problem> problem_finder::run() {
    if (file_.text().starts_with(unfinished_mark)) {
        problem& found = found_.add(kind::unfinished_write, {1, 1, file_.name_place(1).width},
                                    "file was not written to its end: restore the backup, which is "
                                    "the complete version");
        found.first_left_out = found.last_left_out = 1;
    }
    check_bytes();
    line_source source(file_.readable());
    do {
        last_ = line_.next(source, last_);
        follow();
    } while (line_.type != LDIF_Line::endOfFile);
    entries_.finish();
    shown_lines lines(file_);
    for (problem& found : found_.all()) {
        lines.hide_length(found);
    }
    return found_.sorted();
}

void problem_finder::check_bytes() {
    for (const place& where : file_.invalid_bytes()) {
        problem& found = found_.add(kind::invalid_bytes, where,
                                    "bytes that are no character in this locale; a file with other "
                                    "than ASCII text needs the locale it was written in");
        found.first_left_out = found.last_left_out = where.line;
        unreadable_[where.line] = &found;
    }
    const std::string_view text = file_.text();
    if (text.find('\0') == std::string_view::npos) {
        return;
    }
    for (int number = 1; number <= file_.line_count(); ++number) {
        const std::string_view line = file_.line(number);
        const size_t nul = line.find('\0');
        if (nul != std::string_view::npos) {
            found_.add(kind::nul_byte, {number, count_characters(line.substr(0, nul)) + 1, 1},
                       "NUL: the rest of the line is not seen");
        }
    }
}

void problem_finder::follow() {
    switch (line_.type) {
        case LDIF_Line::comment:
            return comment();
        case LDIF_Line::dn:
            return dn_line();
        case LDIF_Line::attr:
            return attribute_line();
        default:
            return end_of_entry();
    }
}

/// True for a line that has to be left out because it can't be read, or because it would continue
/// another after a comment that can't.
bool problem_finder::is_unreadable() {
    problem* const comment = std::exchange(unreadable_comment_, nullptr);
    if (comment && begins_with_blank(line_)) {
        comment->last_left_out = last_;
        return true;
    }
    const auto first = unreadable_.lower_bound(line_.lineNumber);
    const auto last = unreadable_.upper_bound(last_);
    for (auto line = first; line != last; ++line) {
        line->second->first_left_out = line_.lineNumber;
        line->second->last_left_out = last_;
        line->second->entry = open_ ? open_->written : shared_text();
    }
    return first != last;
}

void problem_finder::comment() {
    const auto unreadable = unreadable_.find(line_.lineNumber);
    unreadable_comment_ = unreadable == unreadable_.end() ? nullptr : unreadable->second;
}

/// A blank line ends an entry, and so does the end of the file.
void problem_finder::end_of_entry() {
    unreadable_comment_ = nullptr;
    end_run();
    if (open_) {
        entries_.close(std::move(*open_));
        open_.reset();
    }
}

void problem_finder::dn_line() {
    end_of_entry();
    has_dn_line_ = true;
    const bool is_readable = !is_unreadable();
    open_.emplace();
    open_->written = shared_text(line_.value);
    open_->where = value_place();
    open_->first = line_.lineNumber;
    open_->last = last_;
    check_literal();
    if (is_readable) {
        parse_dn(*open_);
    }
    const auto end = unreadable_.upper_bound(last_);
    for (auto line = unreadable_.lower_bound(line_.lineNumber); line != end; ++line) {
        open_->stopping.push_back(line->second);
    }
    open_->is_left_out = !open_->stopping.empty();
    if (!open_->is_left_out) {
        require_headers();
    }
}

void problem_finder::parse_dn(entry_section& section) {
    if (!line_.hasSeparator) {
        return dn_without_colon(section);
    }
    try {
        section.dn = LDIF_DN(cisString(line_.value));
    } catch (const LDIF_Exception& e) {
        const place where = file_.value_place(line_.lineNumber, parsed_length(line_.value));
        problem& found = add(kind::invalid_dn, where, message_of(e));
        found.accepted = "a distinguished name, such as cn=Name, cn=Configuration";
        take_codes(found, e);
        section.stopping.push_back(&found);
        return;
    }
    if (section.dn.empty()) {
        add(kind::empty_dn, section.where,
            "DN line without a DN: its attributes go where version and charset are");
    }
    const std::string change = change_of(section.dn, line_.value);
    if (!change.empty()) {
        add(kind::dn_changes, section.where, change);
    }
}

/// A load takes the whole line for the DN of an entry that can't be written, and so stops; but
/// where there is an entry of that DN it merges the two, and only the line is lost.
void problem_finder::dn_without_colon(entry_section& section) {
    const place where = section.where = name_place();
    line_.changeToInvalidAttr();
    const std::optional<LDIF_DN> dn = parsed_dn(line_.value);
    if (dn && entries_.has(*dn)) {
        add(kind::missing_separator, where, "no colon in a line that begins with \"dn\"");
        section.dn = *dn;
        section.has_kept_line = true;
        return;
    }
    problem& found = add(kind::invalid_dn, where,
                         "line begins with \"dn\" and has no colon, so it counts as a DN line");
    section.stopping.push_back(&found);
}

/// The first entry gives a file without these lines their defaults.
void problem_finder::require_headers() {
    for (const auto& [name, value] :
         {std::pair("charset", "ISO-8859-1"), std::pair("version", "1")}) {
        if (header_lines_.emplace(name, 0).second) {
            entries_.add_header(LDIF_Attribute(key_, name, value), 0);
        }
    }
}

problem& problem_finder::add(const rule& broken, const place& where, std::string text) {
    problem& found = found_.add(broken, where, std::move(text));
    found.entry = open_ ? open_->written : shared_text();
    const bool has_name = line_.type == LDIF_Line::attr && line_.hasSeparator;
    found.attribute = has_name ? shown_line(line_.attribute) : "";
    return found;
}

}  // namespace cfg32::tool
