#pragma once

// Finding every problem of a file: it is followed as by a load, and on where a load would stop.

#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_Line.h"
#include "check/checked_entries.h"
#include "check/file_text.h"
#include "check/findings.h"
#include "check/problem.h"
#include "cisString.h"

namespace cfg32::tool {

/// One pass over a file's text, judged as a load reads it.
class problem_finder {
  public:
    problem_finder(std::string_view text, aes_key_data* key)
        : file_(text), key_(key), entries_(found_, file_) {}

    std::vector<problem> run();

  private:
    void check_bytes();
    void follow();

    bool is_unreadable();
    void comment();
    void end_of_entry();
    void dn_line();
    void parse_dn(entry_section& section);
    void dn_without_colon(entry_section& section);
    void require_headers();

    void attribute_line();
    void check_spelling();
    void check_unreadable_value();
    void take();
    void keep_aside();
    void add_outside(LDIF_Attribute&& attribute);
    void add_to_run();
    void repeated_header(const LDIF_Attribute& attribute);
    void end_run();

    void report_refused(const LDIF_Exception& e);
    void check_value(const LDIF_Value& value);
    void check_literal();
    void check_unknown_name();

    problem& add(const rule& broken, const place& where, std::string text);
    place name_place() const { return file_.name_place(line_.lineNumber); }
    place value_place() const { return file_.value_place(line_.lineNumber); }

    const file_text file_;
    aes_key_data* key_;
    findings found_;
    checked_entries entries_;

    LDIF_Line line_;                         // the logical line, from its lineNumber
    int last_ = 0;                           // to here
    std::map<int, problem*> unreadable_;     // lines that have invalid bytes
    problem* unreadable_comment_ = nullptr;  // directly before the line
    std::optional<entry_section> open_;
    problem* run_ = nullptr;  // of lines outside of entries
    int run_lines_ = 0;
    bool has_dn_line_ = false;
    std::map<cisString, int> header_lines_;                 // 0 for one that a load adds by itself
    std::unordered_map<std::string, std::string> nearest_;  // names that are not in the table
};

}  // namespace cfg32::tool
