#include "LDIF_Line.h"

#include <strings.h>

#include <algorithm>
#include <array>
#include <string_view>

#include "LDIF_Util.h"
#include "line_source.h"

using namespace cfg32;

namespace {

/// A stream as a source of physical lines: literally getline, tellg and seekg.
class stream_source {
  public:
    explicit stream_source(std::ifstream& in) : in_(in) {}

    bool good() const { return in_.good(); }
    bool at_end() const { return in_.eof(); }

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
class physical_line {
  public:
    explicit physical_line(std::string_view raw) : text_(raw), is_plain_(is_plain(raw)) {
        if (!is_plain_) {
            std::wstring wide = multibyte2wide(std::string(raw));
            w_stripCarriageReturn(wide);
            text_ = converted_ = wide2multibyte(wide);
        } else if (raw.find('\r') != std::string_view::npos) {
            converted_ = raw;
            std::erase(converted_, '\r');
            text_ = converted_;
        }
    }
    physical_line(const physical_line&) = delete;
    physical_line& operator=(const physical_line&) = delete;

    std::string_view text() const { return text_; }
    bool is_blank() const { return without_space_before(text_).empty(); }
    bool is_continuation() const {
        return !text_.empty() && without_space_before(text_).size() < text_.size();
    }
    bool is_in_ascii() const { return is_plain_; }
    /// A part of the text without the whitespace at its front, or at its end.
    std::string_view without_space_before(std::string_view part) const {
        return is_plain_ ? without_leading_ascii_space(part) : without_leading_space(part);
    }
    std::string_view without_space_behind(std::string_view part) const {
        return is_plain_ ? without_trailing_ascii_space(part) : without_trailing_space(part);
    }
    /// The text that a continuation line adds: all but its first character, which is whitespace.
    std::string_view continuation() const;

  private:
    std::string_view text_;
    const bool is_plain_;
    std::string converted_;
};

std::string_view physical_line::continuation() const {
    if (is_plain_) {
        return text_.substr(1);
    }
    const std::wstring first(1, multibyte2wide(std::string(text_)).front());
    return text_.substr(wide2multibyte(first).size());
}

bool is_dn_name(std::string_view name) {
    return name.size() == 2 && !strncasecmp(name.data(), "dn", 2);
}

/// Splits the first physical line; returns where its value begins.
std::string_view split(LDIF_Line& line, const physical_line& first) {
    const std::string_view text = first.text();
    const size_t colon = text.find(':');
    if (colon == 0 || colon == std::string_view::npos) {
        // A line that merely begins with "dn" counts as a DN line, so that what follows it is not
        // taken for attributes of the entry before.
        line.type = is_dn_name(text.substr(0, 2)) ? LDIF_Line::dn : LDIF_Line::attr;
        line.attribute = text;
        line.hasSeparator = 0;
        return {};
    }
    line.attribute = first.without_space_behind(text.substr(0, colon));
    line.type = is_dn_name(line.attribute) ? LDIF_Line::dn : LDIF_Line::attr;
    const size_t value = text.find_first_not_of(':', colon);
    return value == std::string_view::npos ? std::string_view()
                                           : first.without_space_before(text.substr(value));
}

/// Reads a logical line: see LDIF_Line::next.
template <class Source>
int read(LDIF_Line& line, Source& in, int last) {
    std::string value = std::move(line.value);  // its memory serves; after a failure it has none
    line.value.clear();
    line.attribute.clear();
    line.type = LDIF_Line::endOfFile;
    line.lineNumber = last + 1;
    line.hasSeparator = 1;
    if (!in.good()) {
        return last;
    }
    bool is_ascii_only = false;
    {
        const physical_line first(in.take());
        ++last;
        if (first.is_blank()) {
            line.type = LDIF_Line::blankLine;
            return last;
        }
        if (first.text().front() == '#') {
            line.type = LDIF_Line::comment;
            line.value = first.text();
            return last;
        }
        value = split(line, first);
        is_ascii_only = first.is_in_ascii();
    }
    while (!in.at_end()) {
        const auto before = in.position();
        const physical_line next(in.take());
        if (!next.is_continuation()) {
            in.go_back(before);
            value.resize((is_ascii_only ? without_trailing_ascii_space(value)
                                        : without_trailing_space(value))
                             .size());
            line.value = std::move(value);
            return last;
        }
        value += next.continuation();
        is_ascii_only = is_ascii_only && next.is_in_ascii();
        ++last;
    }
    // KEPT: a line that is ended by the end of the file and not by a newline loses its value; it
    // may have been cut off in the middle.
    return last;
}

constexpr std::array type_names = {"endOfFile", "blankLine", "comment", "dn", "attribute"};

}  // namespace

int LDIF_Line::next(std::ifstream& in, int lastLineNumber) {
    stream_source source(in);
    return read(*this, source, lastLineNumber);
}

int LDIF_Line::next(line_source& in, int lastLineNumber) { return read(*this, in, lastLineNumber); }

std::string LDIF_Line::str() const {
    return type == dn || type == attr ? attribute + ": " + value : value;
}

void LDIF_Line::changeToInvalidAttr() {
    value = attribute + ": " + value;
    attribute = "oru-slapdInvalidLine";
}

const char* cfg32::line_type_name(int type) {
    const bool known = type >= 0 && static_cast<size_t>(type) < type_names.size();
    return known ? type_names[static_cast<size_t>(type)] : "UNKNOWN";
}
