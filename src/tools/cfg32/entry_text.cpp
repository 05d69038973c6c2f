// Finding an entry in a configuration's text.

#include "entry_text.h"

#include <algorithm>
#include <optional>

#include "LDIF_Exception.h"
#include "LDIF_Line.h"
#include "cfg32.h"
#include "line_source.h"
#include "outcome.h"

namespace cfg32::tool {

namespace {

/// Follows the lines of a text and keeps the place of the entries of one DN.
class entry_finder {
  public:
    entry_finder(std::string_view text, const LDIF_DN& wanted) : text_(text), wanted_(wanted) {}

    /// The places: of the first such entry, and how many there are.
    std::optional<entry_text> first() const { return found_; }
    int count() const { return count_; }

    void run();

  private:
    void take(const LDIF_Line& line, size_t begin, size_t end);
    bool is_wanted(const LDIF_Line& line) const;

    std::string_view text_;
    const LDIF_DN& wanted_;
    std::optional<entry_text> block_;  // what an entry's text may begin with
    bool is_open_ = false;             // in the wanted entry
    std::optional<entry_text> found_;
    int count_ = 0;
};

/// A DN line that can't be used names no entry.
bool entry_finder::is_wanted(const LDIF_Line& line) const {
    try {
        return line.hasSeparator && LDIF_DN(cisString(line.value)) == wanted_;
    } catch (const LDIF_Exception&) {
        return false;
    }
}

void entry_finder::take(const LDIF_Line& line, size_t begin, size_t end) {
    if (line.type == LDIF_Line::blankLine) {
        is_open_ = false;
        block_.reset();
        return;
    }
    if (line.type == LDIF_Line::dn) {
        is_open_ = is_wanted(line);
        count_ += is_open_ ? 1 : 0;
        const entry_text place = block_.value_or(entry_text{begin, end, line.lineNumber});
        if (is_open_ && count_ == 1) {
            found_ = place;
        }
        block_.reset();
    } else if (line.type == LDIF_Line::comment && !block_) {
        block_ = {begin, end, line.lineNumber};
    } else if (line.type == LDIF_Line::attr) {
        block_.reset();
    }
    // A comment belongs to what follows it: to the entry only together with an attribute.
    if (is_open_ && count_ == 1 && line.type != LDIF_Line::comment) {
        found_->end = end;
    }
}

void entry_finder::run() {
    line_source source(text_);
    LDIF_Line line;
    int number = 0;
    while (source.good()) {
        const size_t begin = source.position();
        bool is_usable = true;
        try {
            line.next(source, number);
        } catch (const LDIF_Exception&) {
            is_usable = false;  // it is not of the locale's character set
        }
        const size_t end = source.position();
        if (is_usable) {
            take(line, begin, end);
        }
        number += static_cast<int>(std::count(text_.begin() + begin, text_.begin() + end, '\n'));
    }
}

}  // namespace

entry_text find_entry_text(std::string_view text, const std::string& dn) {
    const LDIF_DN wanted{cisString(dn)};
    entry_finder finder(text, wanted);
    finder.run();
    if (finder.count() == 0) {
        throw ended(answer_is_no, with_result("no entry " + dn, CFG_NO_SUCH_OBJECT));
    }
    if (finder.count() > 1) {
        throw ended(answer_is_no, dn + " stands in the file several times: edit the whole file");
    }
    return *finder.first();
}

}  // namespace cfg32::tool
