// cfg32 apply: makes the configuration the same as another file's.

#include <memory>

#include "arguments.h"
#include "change/update.h"
#include "command.h"
#include "configuration.h"
#include "diff/difference.h"

namespace cfg32::tool {

namespace {

/// What was left out of the other file would be deleted from this one.
void require_whole(const configuration& wanted) {
    if (!wanted.left_out().empty()) {
        throw ended(failed, wanted.name() + " can't be used whole: mend it first");
    }
}

/// Such a change would be carried out on something else.
void require_speakable(const configuration& present, const configuration& wanted) {
    const std::string name = unspeakable_name(differences(present.root(), wanted.root()));
    if (!name.empty()) {
        throw ended(failed, wanted.name() + " can't be applied: \"" + name +
                                "\" would be taken for another name, or not at all");
    }
}

int apply_all(const settings& options, const std::string& wanted_name) {
    const configuration wanted(options, wanted_name);
    require_whole(wanted);
    const configuration present(options, options.file_name());  // the update binds
    require_speakable(present, wanted);
    update_options how;
    how.source = wanted_name;
    how.based_on = &present.text();
    const std::vector<change_record> changes = changes_between(present.root(), wanted.root());
    return print_result(options, update(options, changes, how));
}

}  // namespace

action define_apply(CLI::App& parser, settings& options) {
    const auto wanted = std::make_shared<std::string>();
    add_argument(parser, "wanted", "FILE", "the file that has the wanted content", *wanted,
                 presence::required);
    return [wanted, &options] { return apply_all(options, *wanted); };
}

}  // namespace cfg32::tool
