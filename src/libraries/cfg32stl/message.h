#pragma once

#include "cfg32.h"

/// A node of a search result, allocated with calloc; it owns its text, child and next.
struct CfgMessage {
    int kind;           ///< see the constants below
    int is_secret;      ///< the text is a password in clear
    char* text;         ///< an entry's DN, an attribute's name, a value
    CfgMessage* child;  ///< an entry's first attribute, an attribute's first value
    CfgMessage* next;   ///< the next one of the same kind and parent
};
static_assert(sizeof(CfgMessage) == 32);

/// Allocated with calloc.
struct CfgCursor {
    CfgMessage* attribute;
};

namespace cfg32 {

enum message_kind { entry_message, attribute_message, value_message };

}  // namespace cfg32
