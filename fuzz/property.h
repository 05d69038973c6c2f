#pragma once

// Properties of the library that hold for any text. The fuzzers look for one for which they don't.

#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

class LDIF_Exception;

namespace cfg32::fuzz {

/// A property does not hold for a text. Says which, and what was found instead.
struct broken_promise : std::logic_error {
    using std::logic_error::logic_error;
};

void require(bool holds, std::string_view promise);

/// True for the codes of what surprised the library itself.
bool is_surprise(int ldap, int extended);

/// A text is refused for what it is, and that is no surprise.
void require_refusal(const LDIF_Exception& e);

template <class Left, class Right>
void require_equal(const Left& left, const Right& right, std::string_view promise) {
    if (!(left == right)) {
        std::ostringstream text;
        text << promise << ":\n<" << left << ">\n<" << right << ">";
        throw broken_promise(text.str());
    }
}

/// The texts of an input that is several: a line "%" stands between two of them. What is beyond so
/// many belongs to the last.
std::vector<std::string> parts_of(std::string_view input, size_t most);

/// Throws broken_promise when the property does not hold for the input. Whatever else it throws is
/// a failure of the library.
using property = void(std::string_view input);

#define PROPERTY(name, promise) property name##_property;
#include "properties.def"
#undef PROPERTY

struct named_property {
    const char* name;
    const char* promise;
    property* check;
};

inline std::ostream& operator<<(std::ostream& out, const named_property& one) {
    return out << one.name;
}

inline constexpr named_property properties[] = {
#define PROPERTY(name, promise) {#name, promise, name##_property},
#include "properties.def"
#undef PROPERTY
};

}  // namespace cfg32::fuzz
