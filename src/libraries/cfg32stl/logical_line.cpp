#include "logical_line.h"

#include <string_view>

#include "LDIF_Line.h"
#include "LDIF_Util.h"
#include "line_source.h"

namespace cfg32 {

namespace {

/// A stream as a source of physical lines: literally getline, tellg and seekg.
class stream_source {
  public:
    explicit stream_source(std::ifstream& in) : in_(in) {}

    bool good() const { return in_.good(); }
    bool at_end() const { return in_.eof(); }
    bool is_clean() const { return false; }
    bool lasts() const { return false; }
    bool may_be_continued() const { return true; }

    std::string_view take() {
        std::getline(in_, line_, '\n');
        return line_;
    }

    std::streampos position() { return in_.tellg(); }
    void go_back(std::streampos position) { in_.seekg(position); }

  private:
    std::ifstream& in_;
    std::string line_;
};

/// A physical line as the rules see it: valid in the locale, without carriage returns.
struct physical_line {
    std::string_view text;
    bool is_plain = true;
    bool lasts = false;

    bool is_blank() const { return without_space_before(text).empty(); }
    bool is_continuation() const {
        return !text.empty() && without_space_before(text).size() < text.size();
    }
    /// A part of the text without the whitespace at its front, or at its end.
    std::string_view without_space_before(std::string_view part) const {
        return is_plain ? without_leading_ascii_space(part) : without_leading_space(part);
    }
    std::string_view without_space_behind(std::string_view part) const {
        return is_plain ? without_trailing_ascii_space(part) : without_trailing_space(part);
    }
    /// The text that a continuation line adds: all but its first character, which is whitespace.
    std::string_view continuation() const;
};

std::string_view physical_line::continuation() const {
    if (is_plain) {
        return text.substr(1);
    }
    const std::wstring first(1, multibyte2wide(std::string(text)).front());
    return text.substr(wide2multibyte(first).size());
}

/// What a line is that may not be taken as it stands; memory takes what must be changed in it.
physical_line converted(std::string_view raw, bool lasts, std::string& memory) {
    if (!is_plain(raw)) {
        std::wstring wide = multibyte2wide(std::string(raw));
        w_stripCarriageReturn(wide);
        memory = wide2multibyte(wide);
        return {memory, false, false};
    }
    if (raw.find('\r') == raw.npos) {
        return {raw, true, lasts};
    }
    memory = raw;
    std::erase(memory, '\r');
    return {memory, true, false};
}

template <class Source>
[[gnu::always_inline]] inline physical_line take(Source& in, std::string& memory) {
    const std::string_view raw = in.take();
    return in.is_clean() ? physical_line{raw, true, in.lasts()}
                         : converted(raw, in.lasts(), memory);
}

bool is_dn_name(std::string_view name) {
    return name.size() == 2 && (name[0] | 0x20) == 'd' && (name[1] | 0x20) == 'n';
}

/// A part of the line. One that does not last is put into memory that does until the next line.
given_text stored(const physical_line& line, std::string_view part, std::string& memory) {
    return line.lasts ? given_text::lasting(part) : given_text(memory.assign(part));
}

}  // namespace

int logical_line::next(line_source& in, int last) { return read(in, last); }

int logical_line::next(std::ifstream& in, int last) {
    stream_source source(in);
    return read(source, last);
}

template <class Source>
int logical_line::read(Source& in, int last) {
    attribute = value = {};
    type = LDIF_Line::endOfFile;
    line_number = last + 1;
    has_separator = true;
    if (!in.good()) {
        return last;
    }
    const physical_line first = take(in, line_memory_);
    const std::string_view text = first.text;
    is_in_ascii_ = first.is_plain;
    if (first.is_blank()) {
        type = LDIF_Line::blankLine;
        keep_line({}, text.empty() && first.lasts && !in.at_end() ? text.data() : "\n");
        return last + 1;
    }
    if (text.front() == '#') {
        type = LDIF_Line::comment;
        keep_line(text, first.lasts && !in.at_end() ? text.data() : nullptr);
        return last + 1;
    }
    const size_t colon = text.find(':');
    has_separator = colon != text.npos && colon > 0;
    // A line that merely begins with "dn" counts as a DN line, so that what follows it is not taken
    // for attributes of the entry before.
    const std::string_view name =
        has_separator ? first.without_space_behind(text.substr(0, colon)) : text;
    type = is_dn_name(has_separator ? name : name.substr(0, 2)) ? LDIF_Line::dn : LDIF_Line::attr;
    attribute = stored(first, name, attribute_memory_);
    size_t begin = has_separator ? colon : text.size();
    while (begin < text.size() && text[begin] == ':') {
        ++begin;
    }
    return read_value(in, last + 1, first, first.without_space_before(text.substr(begin)));
}

/// Keeps the text of a comment or blank line: with its newline, where it stands so for good.
void logical_line::keep_line(std::string_view line, const char* lasting) {
    with_newline_ = lasting ? given_text::lasting({lasting, line.size() + 1})
                            : given_text(value_memory_.assign(line).append("\n"));
    value = with_newline_.part(with_newline_.view().substr(0, line.size()));
}

/// The value, of which the first line has the begin.
template <class Source, class Line>
int logical_line::read_value(Source& in, int last, const Line& first, std::string_view begin) {
    // KEPT: a line that is ended by the end of the file and not by a newline loses its value; it
    // may have been cut off in the middle.
    if (in.at_end()) {
        return last;
    }
    if (!in.may_be_continued()) {
        value = stored(first, first.without_space_behind(begin), value_memory_);
        return last;
    }
    const int now = read_continuations(in, last, begin);
    if (now == last && first.lasts && !in.at_end()) {  // it was not continued
        value = given_text::lasting(first.without_space_behind(begin));
    }
    return now;
}

/// Adds to the begin of the value what continuation lines have of it.
template <class Source>
[[gnu::noinline]] int logical_line::read_continuations(Source& in, int last,
                                                       std::string_view begin) {
    value_memory_ = begin;
    while (!in.at_end()) {
        const auto before = in.position();
        const physical_line next = take(in, line_memory_);
        if (!next.is_continuation()) {
            in.go_back(before);
            const std::string_view text = value_memory_;
            value =
                is_in_ascii_ ? without_trailing_ascii_space(text) : without_trailing_space(text);
            return last;
        }
        value_memory_ += next.continuation();
        is_in_ascii_ = is_in_ascii_ && next.is_plain;
        ++last;
    }
    return last;
}

bool logical_line::is_canonical() const {
    if (!attribute.lasts() || !value.lasts() || value.empty()) {
        return false;
    }
    const char* const separator = attribute.view().data() + attribute.size();
    const char* const begin = value.view().data();
    return begin == separator + 2 && separator[0] == ':' && separator[1] == ' ' &&
           begin[value.size()] == '\n';
}

void logical_line::change_to_invalid_attribute() {
    std::string text = attribute.str() + ": " + value.str();
    value = value_memory_ = std::move(text);
    attribute = given_text::lasting(invalid_line_name);
}

}  // namespace cfg32
