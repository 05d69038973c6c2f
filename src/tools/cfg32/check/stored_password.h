#pragma once

#include <string>

struct aes_key_data;

namespace cfg32::tool {

/// False for a stored password in a form that can be decoded, but not with this key. True for all
/// others, clear and hashed ones among them.
bool is_decodable(const std::string& stored, aes_key_data* key);

}  // namespace cfg32::tool
