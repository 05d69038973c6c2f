#include "problem.h"
namespace cfg32::tool {
const std::vector<const rule*> rules;
std::vector<problem> find_problems(std::string_view, aes_key_data*) { return {}; }
std::string loadable_part(std::string_view text, const std::vector<problem>&) {
    return std::string(text);
}
}  // namespace cfg32::tool
