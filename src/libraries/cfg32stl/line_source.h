#pragma once

#include <string>
#include <string_view>

#include "LDIF_Util.h"
#include "kept_text.h"

namespace cfg32 {

/// The physical lines of a text in memory. It keeps the states that std::getline and seekg leave
/// in a stream, because the rules for the last lines of a file are made of them.
class line_source {
  public:
    /// The text is not copied and must outlive the source; if it lasts, also what is made of its
    /// lines.
    explicit line_source(const given_text& text);

    bool lasts() const { return text_.lasts(); }
    /// True when every line can be taken as it stands: the text is ASCII without NULs and carriage
    /// returns.
    bool is_clean() const { return is_clean_; }

    bool good() const { return !end_ && !failed_; }
    /// True once a line was ended by the end of the text and not by a newline.
    bool at_end() const { return end_; }

    /// Takes the next line, without its newline.
    std::string_view take();

    /// False when it is known at once that the next line is valid and no continuation line.
    bool may_be_continued() const;

    /// What is not taken yet.
    std::string_view rest() const { return text_.view().substr(position_); }

    size_t position() const { return position_; }
    /// Goes back to a position of before; clears the end, but not a failure to read anything.
    void go_back(size_t position);

  private:
    given_text text_;
    bool is_clean_;
    size_t position_ = 0;
    bool end_ = false;
    bool failed_ = false;
};

inline line_source::line_source(const given_text& text)
    : text_(text), is_clean_(is_plain(text) && text.view().find('\r') == std::string_view::npos) {}

inline std::string_view line_source::take() {
    if (position_ == text_.size()) {
        end_ = failed_ = true;
        return {};
    }
    const std::string_view text = text_;
    const size_t newline = text.find('\n', position_);
    end_ = newline == std::string_view::npos;
    const size_t end = end_ ? text.size() : newline;
    const std::string_view line = text.substr(position_, end - position_);
    position_ = end_ ? end : newline + 1;
    return line;
}

inline bool line_source::may_be_continued() const {
    const std::string_view text = text_;
    return !is_clean_ || position_ == text.size() ||
           (text[position_] != '\n' && is_ascii_space(text[position_]));
}

inline void line_source::go_back(size_t position) {
    end_ = false;
    if (!failed_) {
        position_ = position;
    }
}

}  // namespace cfg32
