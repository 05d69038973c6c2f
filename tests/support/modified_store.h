#pragma once

#include <gmock/gmock.h>

#include <memory>
#include <string>
#include <vector>

#include "LDIF_Exception.h"
#include "LDIF_File.h"
#include "failures.h"
#include "modifications.h"
#include "stores.h"

namespace cfg32::tests {

/// A store with one entry, "cn=a, o=b", that is modified.
struct modified_store_test : store_test {
    /// A store with the entry of those lines.
    std::unique_ptr<LDIF_File> store_with(const std::string& lines) {
        return store(store_head + "dn: o=b\n\ndn: cn=a, o=b\n" + lines + "\n");
    }

    static void modify(LDIF_File& file, const std::vector<change>& changes,
                       const std::string& dn = "CN=A,o=b") {
        file.modify(dn_of(dn), modifications(changes).records());
    }

    static LDIF_Exception failure_to_modify(LDIF_File& file, const std::vector<change>& changes,
                                            const std::string& dn = "CN=A,o=b") {
        return failure_of([&] { modify(file, changes, dn); });
    }

    /// The lines that the entry has now.
    static std::string lines(const LDIF_File& file) {
        const std::string text = file.root().find(dn_of("cn=a,o=b"))->str();
        const std::string label = "dn: cn=a, o=b\n";
        EXPECT_THAT(text, testing::StartsWith(label));
        return text.substr(label.size(), text.size() - label.size() - 1);
    }

    static const LDIF_Attributes& attributes(const LDIF_File& file) {
        return file.root().find(dn_of("cn=a,o=b"))->attributes();
    }
};

}  // namespace cfg32::tests
