#pragma once

// What can be wrong with a configuration file.

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "check/shared_text.h"

struct aes_key_data;

namespace cfg32::tool {

enum class severity { error, warning };

/// What a load makes of a problem.
enum class consequence {
    none,        ///< nothing
    loses_text,  ///< part of the line is not seen
    kept_aside,  ///< the line becomes an oru-slapdInvalidLine attribute, and the file is rewritten
    stops_load   ///< no load until it is mended
};

/// A kind of problem.
struct rule {
    const char* id;  ///< as it is printed in brackets: lower case, words joined by "-"
    severity grade;
    consequence outcome;
    int result;           ///< LDAP result code that a load or a change usually gives, 0 for none
    int extended;         ///< extended code, 0 for none
    const char* summary;  ///< what is wrong, for lists of rules
};

/// A place of a file where it breaks a rule. Texts hold no password.
struct problem {
    const rule* broken;
    std::string text;       ///< the message
    int line;               ///< counted from 1
    int column;             ///< of the first character concerned, counted from 1
    int width;              ///< how many characters are concerned, at least 1
    shared_text entry;      ///< DN as it is written, or empty
    std::string attribute;  ///< name, or empty
    std::string accepted;   ///< what would be accepted instead, in words, or empty
    int result = 0;         ///< LDAP result code that a load or a change would give, 0 for none
    int extended = 0;       ///< extended code, 0 for none
    int other_line = 0;     ///< the line that the text tells of, 0 if none
    std::optional<consequence> own_outcome = {};  ///< where it is not that of the rule
    // The lines that have to be left out for a load, and then a write, to succeed (both included),
    // 0 if none.
    int first_left_out = 0;
    int last_left_out = 0;

    /// What a load makes of it.
    consequence outcome() const { return own_outcome.value_or(broken->outcome); }
};

/// The rules by name.
namespace kind {
#define RULE(name, id, grade, outcome, result, extended, summary)                \
    inline constexpr rule name = {id,     severity::grade, consequence::outcome, \
                                  result, extended,        summary};
#include "check/problem_rules.def"
#undef RULE
}  // namespace kind

/// All rules, in the order in which lists show them.
extern const std::vector<const rule*> rules;

/// The rule's place in that order.
size_t index_of(const rule& wanted);

/// Every problem of a configuration file's text, sorted by line and column. With a key, stored
/// passwords are tried as well.
std::vector<problem> find_problems(std::string_view text, aes_key_data* key);

/// True when a load of the file succeeds.
bool can_be_loaded(const std::vector<problem>& problems);

/// The byte order mark of UTF-8, with which some editors begin a file.
inline constexpr std::string_view byte_order_mark = "\xef\xbb\xbf";

/// The text without the lines that a load would stop at and without entries that can't be printed,
/// so that it can be read.
std::string loadable_part(std::string_view text, const std::vector<problem>& problems);

}  // namespace cfg32::tool
