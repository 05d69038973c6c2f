#pragma once

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <memory>
#include <sstream>
#include <string>

#include "LDIF_File.h"
#include "dn_of.h"
#include "temporary_folder.h"

namespace cfg32::tests {

/// What a file begins with that a rewrite leaves as it is.
inline const std::string store_head = "charset: x\nversion: 1\n\n";

/// What the store would write now.
inline std::string text_of(const LDIF_File& file) {
    std::ostringstream out;
    out << file.root() << file.trailing_comment();
    return out.str();
}

/// A folder of the test's own with a configuration file in it.
struct store_test : testing::Test {
    temporary_folder folder;
    const std::string path = folder.file("conf");
    const std::string backup = folder.file("backup");

    std::unique_ptr<LDIF_File> store(const std::string& text, const std::string& backup_name = "") {
        folder.write("conf", text);
        return std::make_unique<LDIF_File>(path, backup_name, nullptr);
    }

    struct stat status_of(const std::string& name) const {
        struct stat status {};
        EXPECT_EQ(lstat(folder.file(name).c_str(), &status), 0) << name;
        return status;
    }
};

}  // namespace cfg32::tests
