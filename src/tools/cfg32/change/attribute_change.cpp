// Changing one attribute of an entry.

#include "change/attribute_change.h"

#include <utility>

#include "LDIF_AttrType.h"
#include "cfg32_platform.h"
#include "change/update.h"
#include "hidden_passwords.h"
#include "outcome.h"
#include "schema/attribute_words.h"

namespace cfg32::tool {

std::string spelled_name(const std::string& attribute) {
    const _AttrType* type = find_attribute(attribute);
    return type ? type->name : attribute;
}

void require_no_secrets(const std::string& attribute, const std::vector<std::string>& values) {
    if (!is_password_line(attribute)) {
        return;
    }
    for (const std::string& value : values) {
        if (check_format(value.c_str(), static_cast<int>(value.size())) != 0) {
            throw ended(usage_error,
                        attribute +
                            " takes no password in clear on the command line, where others "
                            "see it: use `cfg32 passwd`");
        }
    }
}

int change_attribute(const settings& options, const std::string& dn, modification change) {
    change_record record = {change_record::modify, dn, {}};
    record.modifications.push_back(std::move(change));
    update_options how;
    how.may_be_gone = true;
    return print_result(options, update(options, {std::move(record)}, how));
}

}  // namespace cfg32::tool
