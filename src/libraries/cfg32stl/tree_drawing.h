#pragma once

#include <string>

#include "missing_entries.h"

namespace cfg32 {

enum class drawing_characters { ascii, code_page_437 };

/// The tree at an entry as text. prefix is what precedes it on its line; is_last: it is its
/// parent's last child. What is missing between an entry and the one it is drawn below is added to
/// missing.
std::string tree_drawing(drawing_characters characters, const LDIF_Entry& top, bool is_last,
                         missing_entries& missing, const std::string& prefix);

}  // namespace cfg32
