// Where the entries of a file go in the tree.

#include <gmock/gmock.h>

#include "random_names.h"
#include "stores.h"
#include "tree_description.h"

using namespace cfg32::tests;

namespace {

using loaded_entries = store_test;

}  // namespace

// However they follow each other: parents before and after their children, or missing.
TEST_F(loaded_entries, GoWhereEachWouldGoByItself) {
    random_names names(3);
    for (int round = 0; round < 300; ++round) {
        std::string text = "charset: x\nversion: 1\n";
        LDIF_Entry root;
        root += LDIF_Attribute(nullptr, "charset", "x");
        root += LDIF_Attribute(nullptr, "version", "1");
        std::string above;
        for (unsigned count = names.below(30); count > 0; --count) {
            // Half of the time below the entry before, or beside it.
            const std::string dn = names.below(2) == 0 || above.empty()
                                       ? names.dn(1 + names.below(3))
                                       : names.rdn() + ", " + above;
            text += "dn: " + dn + "\ncn: " + std::to_string(count) + "\n\n";
            LDIF_Entry entry(dn_of(dn));
            entry += LDIF_Attribute(nullptr, "cn", std::to_string(count));
            root += std::move(entry);
            above = names.below(2) == 0 ? dn : above;
        }
        SCOPED_TRACE(text);
        std::string expected;
        std::string loaded;
        describe(root, 0, false, expected);
        const auto file = store(text);
        describe(file->root(), 0, false, loaded);
        ASSERT_EQ(loaded, expected);
    }
}
