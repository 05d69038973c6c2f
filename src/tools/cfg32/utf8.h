#pragma once

#include <string>
#include <string_view>

namespace cfg32::tool {

/// Text of the locale's character set in UTF-8; a byte that is no character becomes U+FFFD.
std::string utf8(std::string_view text);

}  // namespace cfg32::tool
