#pragma once

#include <fstream>
#include <string>

namespace cfg32 {
class line_source;
}

/// One logical line of the configuration file: a physical line and the continuation lines that
/// follow it (RFC 2849, note 2), classified and split into attribute name and value.
class LDIF_Line {
  public:
    enum Type { endOfFile, blankLine, comment, dn, attr };

    std::string value;      ///< for a comment line the whole line
    std::string attribute;  ///< for a line without a separator the whole line
    int type = endOfFile;   ///< a Type
    int lineNumber = 0;     ///< of the first physical line; the file's first is 1
    int hasSeparator = 0;   ///< 0 when the line should have had a name and a ":" but has not

    LDIF_Line() = default;
    LDIF_Line(const LDIF_Line&) = default;
    LDIF_Line(LDIF_Line&&) noexcept = default;
    LDIF_Line& operator=(const LDIF_Line&) = default;
    LDIF_Line& operator=(LDIF_Line&&) noexcept = default;
    virtual ~LDIF_Line() = default;

    /// Reads the next logical line. lastLineNumber is the number of physical lines read so far,
    /// 0 at first; returns the new number. Throws LDIF_Exception 162/162 for text that is not of
    /// the locale's character set.
    int next(std::ifstream& in, int lastLineNumber);
    /// The same from a text in memory, without seeking.
    int next(cfg32::line_source& in, int lastLineNumber);

    /// The line in file form, without its end.
    virtual std::string str() const;

    /// Makes of a line that can't be used an attribute oru-slapdInvalidLine that keeps its text.
    void changeToInvalidAttr();
};

namespace cfg32 {

/// The attribute that keeps the text of a line that can't be used.
inline constexpr const char* invalid_line_name = "oru-slapdInvalidLine";

/// The name that messages print for a line type.
const char* line_type_name(int type);

}  // namespace cfg32
