// Hiding passwords in what is printed.

#include "hidden_passwords.h"

#include <algorithm>
#include <cctype>
#include <optional>
#include <vector>

#include "LDIF_AttrType.h"
#include "LDIF_Util.h"
#include "cfg32_platform.h"
#include "check/file_text.h"
#include "cisString.h"
#include "password.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

namespace {

constexpr int clear_text = 1;  // answer of check_format

const cisString kept_line_attribute = "oru-slapdInvalidLine";

/// What people put between a name and a value.
constexpr bool is_separator(char c) {
    return c == ':' || c == ';' || c == ',' || c == '=' || c == '<' || c == ' ' || c == '\t' ||
           c == '\v' || c == '\f';
}

/// What hides a password says how it is stored: an encrypted or hashed text hides itself.
std::string shown_password(const std::string& stored) {
    const cisString tag = stored.substr(0, sizeof iMASK_BRACED);
    const bool is_masked = tag == std::string(iMASK_BRACED, sizeof iMASK_BRACED);
    const bool hides_itself =
        stored.starts_with('{') && !is_masked &&
        check_format(stored.c_str(), static_cast<int>(stored.size())) != clear_text;
    return stored.empty() || hides_itself ? stored : std::string(hidden_text);
}

/// A line as it is meant.
struct meant_line {
    enum { other, kept, known_password, password } what = other;
    size_t value = 0;  // where it begins
};

bool is_password(const meant_line& line) {
    return line.what == meant_line::password || line.what == meant_line::known_password;
}

size_t behind_separators(std::string_view text, size_t begin) {
    const auto end =
        std::find_if_not(text.begin() + static_cast<ptrdiff_t>(begin), text.end(), is_separator);
    return static_cast<size_t>(end - text.begin());
}

/// What stands before the first separator.
std::string_view first_word(std::string_view line) {
    const auto end = std::find_if(line.begin(), line.end(), is_separator);
    return line.substr(0, static_cast<size_t>(end - line.begin()));
}

/// Where a name may end, each told from the line's front.
struct line_parts {
    explicit line_parts(std::string_view text)
        : begin(behind_separators(text, leading_space(text))),
          line(text.substr(begin)),
          word(first_word(line)),
          run(line.substr(0, line.find_first_not_of(keyChar))),
          has_colon(line.find(':') != std::string_view::npos),
          name(without_trailing_space(line.substr(0, line.find(':')))) {}

    size_t begin;           // of what follows, in the text
    std::string_view line;  // without blanks and separators at its front
    std::string_view word;  // its beginning, up to a blank or separator
    std::string_view run;   // its beginning, up to what no name has
    bool has_colon;
    std::string_view name;  // before the colon; the whole line without one
};

meant_line meant(std::string_view text) {
    const line_parts parts(text);
    const auto behind = [&](size_t length) {
        return behind_separators(text, parts.begin + length);
    };
    if (cisString(std::string(parts.word)) == kept_line_attribute) {
        return {meant_line::kept, behind(parts.word.size())};
    }
    if (is_password_attribute(parts.run)) {
        return {parts.word == parts.run ? meant_line::known_password : meant_line::password,
                behind(parts.run.size())};
    }
    const bool is_other = find_attribute(parts.word) != nullptr;
    if (!is_other && (is_password_name(parts.word) || is_password_name(parts.run))) {
        return {meant_line::password, behind(length_of_name(parts.word))};
    }
    const bool is_named = parts.has_colon ? is_password_name(parts.name)
                                          : !is_other && end_of_mark(lower(parts.line));
    return {is_named ? meant_line::password : meant_line::other, behind(parts.word.size())};
}

/// What follows the sign of a comment counts as a line; without a colon it is prose, in which no
/// more than the first word does.
meant_line meant_in_comment(std::string_view text) {
    const std::string_view line =
        text.substr(std::min(text.find_first_not_of("# \t"), text.size()));
    const line_parts parts(line);
    if (!parts.has_colon && !is_password_name(parts.word)) {
        return {};
    }
    meant_line found = meant(line);
    found.value += text.size() - line.size();
    return found;
}

meant_line meant_in_line(std::string_view text) {
    const bool is_comment = text.substr(leading_space(text)).starts_with('#');
    return is_comment ? meant_in_comment(text) : meant(text);
}

/// A line is kept once. What is kept in what was kept is not looked at for ever.
constexpr int most_kept = 3;

/// Where what is to be hidden begins.
std::optional<size_t> hidden_from(std::string_view text, int kept_in = 0);

/// The same of a line that was kept. A name that went on on the next line stands there with a colon
/// where the line ended.
std::optional<size_t> hidden_from_kept(std::string_view kept, int kept_in = 1) {
    if (const auto begin = hidden_from(kept, kept_in)) {
        return begin;
    }
    constexpr std::string_view inserted = ": ";
    const size_t end = kept.find(inserted);
    if (end == std::string_view::npos || find_attribute(kept.substr(0, end))) {
        return {};
    }
    const size_t next = end + inserted.size();
    const std::string joined = std::string(kept.substr(0, end)).append(kept.substr(next));
    return hidden_from(joined, kept_in) ? std::optional(next) : std::nullopt;
}

std::optional<size_t> hidden_from(std::string_view text, int kept_in) {
    const meant_line line = meant_in_line(text);
    if (line.what == meant_line::other || line.value == text.size()) {
        return {};
    }
    const std::string_view value = text.substr(line.value);
    if (line.what == meant_line::kept && kept_in < most_kept) {
        const auto begin = hidden_from_kept(value, kept_in + 1);
        return begin ? std::optional(line.value + *begin) : std::nullopt;
    }
    const bool is_visible =
        line.what == meant_line::known_password && shown_password(std::string(value)) == value;
    return is_visible ? std::nullopt : std::optional(line.value);
}

bool is_letter_or_digit(char c) { return is_ascii(c) && isalnum(static_cast<unsigned char>(c)); }

/// True when the last letters and digits of the text are those of the name, whatever else stands
/// between them.
bool ends_with_letters(std::string_view text, std::string_view small_name) {
    for (; !text.empty() && !small_name.empty(); text.remove_suffix(1)) {
        if (is_letter_or_digit(text.back())) {
            if (lower(text.back()) != small_name.back()) {
                return false;
            }
            small_name.remove_suffix(1);
        }
    }
    return small_name.empty();
}

/// Where a password begins whose name stands anywhere in a line: the line before was not ended, a
/// name was broken by what no name has. A colon or "=" follows the name.
std::optional<size_t> behind_any_name(std::string_view text) {
    for (size_t end = 0; end < text.size(); ++end) {
        if (text[end] != ':' && text[end] != '=') {
            continue;
        }
        std::string_view before = text.substr(0, end);
        before = before.substr(0, before.find_last_not_of(" \t\"'") + 1);
        const auto is_before = [&](const std::string& name) {
            return ends_with_letters(before, name);
        };
        if (!before.empty() && is_letter_or_digit(before.back()) &&
            std::any_of(known_passwords().begin(), known_passwords().end(), is_before)) {
            return behind_separators(text, end);
        }
    }
    return {};
}

/// A line of a text, without what stands behind any password's name.
std::string without_any_password(std::string line) {
    const auto begin = behind_any_name(line);
    if (begin && *begin < line.size()) {
        const std::string value = line.substr(*begin);
        line.replace(*begin, std::string::npos, shown_password(value));
    }
    return line;
}

/// A line without what makes no difference to a reader: carriage returns, NULs, bytes that are no
/// characters.
class judged_line {
  public:
    explicit judged_line(std::string_view line) : is_same_(is_clean(line)), text_(line) {
        if (is_same_) {
            return;
        }
        text_.clear();
        const char* const front = line.data();
        for (; !line.empty(); line.remove_prefix(first_character(line).bytes.size())) {
            const character next = first_character(line);
            if (next.is_valid && next.code != L'\r' && next.code != L'\0') {
                text_ += next.bytes;
                places_.resize(text_.size(), static_cast<size_t>(next.bytes.data() - front));
            }
        }
    }

    const std::string& text() const { return text_; }
    /// Where a byte of the text stands in the line.
    size_t place(size_t at) const { return is_same_ ? at : places_[at]; }

  private:
    static bool is_clean(std::string_view line) {
        return is_plain(line) && line.find('\r') == std::string_view::npos;
    }

    bool is_same_;
    std::string text_;
    std::vector<size_t> places_;
};

std::string shown(std::string_view line, const judged_line& judged) {
    const auto begin = hidden_from(judged.text());
    return begin ? std::string(line.substr(0, judged.place(*begin))).append(hidden_text)
                 : without_any_password(std::string(line));
}

}  // namespace

std::string shown_value(std::string_view attribute, std::string_view value) {
    if (is_password_attribute(attribute)) {
        return shown_password(std::string(value));
    }
    if (cisString(std::string(attribute)) == kept_line_attribute) {
        const judged_line judged(value);
        const auto begin = hidden_from_kept(judged.text());
        return begin ? std::string(value.substr(0, judged.place(*begin))).append(hidden_text)
                     : without_any_password(std::string(value));
    }
    const bool is_hidden = !value.empty() && is_password_line(std::string(attribute) + ":");
    return is_hidden ? std::string(hidden_text) : without_any_password(std::string(value));
}

std::vector<std::string> shown_values(std::string_view attribute,
                                      const std::vector<std::string>& values) {
    std::vector<std::string> shown;
    std::string_view above;
    for (const std::string& value : values) {
        const std::string_view kept = std::string_view(value).substr(0, value.find(':'));
        const bool is_below = cisString(std::string(attribute)) == kept_line_attribute &&
                              is_password_below(above, kept);
        shown.push_back(is_below ? std::string(hidden_text) : shown_value(attribute, value));
        above = value;
    }
    return shown;
}

bool is_password_line(std::string_view line) {
    return is_password(meant_in_line(judged_line(line).text()));
}

bool hides_something(std::string_view line) {
    const judged_line judged(line);
    const meant_line meant = meant_in_line(judged.text());
    const bool is_other = meant.what == meant_line::other;
    return is_password(meant) ||
           (is_other ? without_any_password(std::string(line)) : shown(line, judged)) != line;
}

std::string shown_line(std::string_view line) { return shown(line, judged_line(line)); }

bool is_password_below(std::string_view above, std::string_view line) {
    const std::string_view ended = above.substr(0, above.find_last_not_of(" \t\r\n") + 1);
    return ended.ends_with(':') && is_password_line(ended) && !line.empty() &&
           line.find_first_of(":#") == std::string_view::npos;
}

std::string shown_text(std::string_view text) {
    std::string shown;
    for (;;) {
        const size_t end = text.find('\n');
        shown += without_any_password(std::string(text.substr(0, end)));
        if (end == std::string_view::npos) {
            return shown;
        }
        shown += '\n';
        text.remove_prefix(end + 1);
    }
}

}  // namespace cfg32::tool
