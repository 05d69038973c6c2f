#include "update.h"
namespace cfg32::tool {
update_result update(const settings&, const std::vector<change_record>&, const update_options&) {
    return {};
}
int print_result(const settings&, const update_result&) { return 3; }
}  // namespace cfg32::tool
