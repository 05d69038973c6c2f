#pragma once

#include <string>
#include <string_view>

namespace cfg32 {

/// The physical lines of a text in memory. It keeps the states that std::getline and seekg leave
/// in a stream, because the rules for the last lines of a file are made of them.
class line_source {
  public:
    /// The text is not copied and must outlive the source.
    explicit line_source(std::string_view text) : text_(text) {}

    bool good() const { return !end_ && !failed_; }
    /// True once a line was ended by the end of the text and not by a newline.
    bool at_end() const { return end_; }

    /// Takes the next line, without its newline.
    std::string_view take();

    size_t position() const { return position_; }
    /// Goes back to a position of before; clears the end, but not a failure to read anything.
    void go_back(size_t position);

  private:
    std::string_view text_;
    size_t position_ = 0;
    bool end_ = false;
    bool failed_ = false;
};

inline std::string_view line_source::take() {
    if (position_ == text_.size()) {
        end_ = failed_ = true;
        return {};
    }
    const size_t newline = text_.find('\n', position_);
    end_ = newline == std::string_view::npos;
    const size_t end = end_ ? text_.size() : newline;
    const std::string_view line = text_.substr(position_, end - position_);
    position_ = end_ ? end : newline + 1;
    return line;
}

inline void line_source::go_back(size_t position) {
    end_ = false;
    if (!failed_) {
        position_ = position;
    }
}

}  // namespace cfg32
