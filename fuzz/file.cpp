#include <algorithm>
#include <optional>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "LDIF_Util.h"
#include "exempt_dn.h"
#include "memory_file.h"
#include "printed_text.h"
#include "property.h"
#include "tree_description.h"

namespace cfg32::fuzz {

namespace {

bool has_blank_around(const kept_text& text) {
    std::string stripped(std::string_view{text});
    return stripLeading(stripTrailing(stripped)).size() < text.size();
}

/// KEPT: a line of blanks, a colon and a value is an attribute without a name, which is printed as
/// a line that is kept aside by the next load. Whitespace that only a continuation line brought to
/// the front of a value is not read again where the value is printed, and neither is what a kept
/// line without a colon got at its end.
bool is_settled(const LDIF_File& file) {
    bool is_so = true;
    for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) {
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            const std::span<const kept_text> values = attribute.values().texts();
            is_so &= !attribute.name().empty() &&
                     std::none_of(values.begin(), values.end(), has_blank_around);
        }
    });
    return is_so;
}

bool has_exempt_dn(const LDIF_File& file) {
    bool has_one = false;
    for_each_in_preorder(file.root(), [&](const LDIF_Entry& entry) {
        has_one |= is_read_differently(entry.dn());
        for (const LDIF_Attribute& attribute : entry.attributes()) {
            for (const LDIF_Value& value : attribute.values()) {
                has_one |= is_exempt(value);
            }
        }
    });
    return has_one;
}

/// Writes the file. False when it can't be written, which must leave it as it is.
bool is_written(LDIF_File& file, const tool::memory_file& on_disk) {
    const std::string before = on_disk.text();
    try {
        file.flush();
        return true;
    } catch (const LDIF_Exception& e) {
        require_refusal(e);
        require_equal(on_disk.text(), before, "a refused write leaves the file alone");
        return false;
    }
}

void require_round_trip(LDIF_File& file, const tool::memory_file& on_disk) {
    if (!is_written(file, on_disk)) {
        return;
    }
    const std::string written = on_disk.text();
    require_equal(written, printed_text(file), "a file is written as its entries are printed");
    file.treeView(false);
    file.treeView(true);
    const bool is_exempt = has_exempt_dn(file);
    const bool was_settled = is_settled(file);
    const std::string tree = tests::description(file);
    LDIF_File again(on_disk.name(), "", nullptr);
    if (is_exempt) {
        return;
    }
    if (!was_settled) {
        return require_round_trip(again, on_disk);
    }
    require_equal(on_disk.text(), written, "a written file needs no repair");
    require_equal(printed_text(again), written, "a tree is printed as it was written");
    require_equal(tests::description(again), tree, "what was written is loaded as the same tree");
    require(is_written(again, on_disk), "what was written can be written again");
    require_equal(on_disk.text(), written, "a file is written as the same bytes again");
}

}  // namespace

void file_property(std::string_view input) {
    const tool::memory_file on_disk(input);
    std::optional<LDIF_File> file;
    try {
        file.emplace(on_disk.name(), "", nullptr);
    } catch (const LDIF_Exception& e) {
        require_refusal(e);
        require_equal(on_disk.text(), input, "a refused load leaves the file alone");
        return;
    }
    require_round_trip(*file, on_disk);
}

}  // namespace cfg32::fuzz
