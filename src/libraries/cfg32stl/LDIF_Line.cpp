#include "LDIF_Line.h"

#include <array>

#include "line_source.h"
#include "logical_line.h"

using namespace cfg32;

namespace {

/// Reads a line. After a failure there is what was read of it before.
template <class Source>
int read(LDIF_Line& line, Source& in, int last) {
    logical_line parts;
    const auto take_over = [&] {
        line.value = parts.value.view();
        line.attribute = parts.attribute.view();
        line.type = parts.type;
        line.lineNumber = parts.line_number;
        line.hasSeparator = parts.has_separator ? 1 : 0;
    };
    try {
        const int now = parts.next(in, last);
        take_over();
        return now;
    } catch (...) {
        take_over();
        throw;
    }
}

constexpr std::array type_names = {"endOfFile", "blankLine", "comment", "dn", "attribute"};

}  // namespace

int LDIF_Line::next(std::ifstream& in, int lastLineNumber) {
    return read(*this, in, lastLineNumber);
}

int LDIF_Line::next(line_source& in, int lastLineNumber) { return read(*this, in, lastLineNumber); }

std::string LDIF_Line::str() const {
    return type == dn || type == attr ? attribute + ": " + value : value;
}

void LDIF_Line::changeToInvalidAttr() {
    value = attribute + ": " + value;
    attribute = invalid_line_name;
}

const char* cfg32::line_type_name(int type) {
    const bool known = type >= 0 && static_cast<size_t>(type) < type_names.size();
    return known ? type_names[static_cast<size_t>(type)] : "UNKNOWN";
}
