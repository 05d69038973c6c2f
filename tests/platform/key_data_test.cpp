#include "key_data.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "call_faults.h"
#include "cfg32_platform.h"
#include "test_directory.h"

namespace {

const std::string key_bytes = "0123456789abcdefghijklmnopqrstuvwxyz";

aes_key_data* from_text(std::string_view text) {
    errno = 0;
    return aes_key_data_from_bytes(reinterpret_cast<const unsigned char*>(text.data()),
                                   text.size());
}

aes_key_data* from_file(const std::string& path) {
    errno = 0;
    return aes_key_data_from_file(path.c_str());
}

bool holds(const aes_key_data* key, std::string_view text) {
    return key != nullptr && key->size == text.size() &&
           std::memcmp(key->bytes, text.data(), text.size()) == 0;
}

TEST(KeyData, IsMadeFromBytesOfTheThreeKeySizesOnly) {
    for (std::size_t size = 0; size <= key_bytes.size(); ++size) {
        const std::string bytes = key_bytes.substr(0, size);
        aes_key_data* key = from_text(bytes);
        if (size == 16 || size == 24 || size == 32) {
            EXPECT_TRUE(holds(key, bytes)) << size;
        } else {
            EXPECT_EQ(key, nullptr) << size;
            EXPECT_EQ(errno, EINVAL) << size;
        }
        aes_key_data_free(key);
    }
}

TEST(KeyData, IsNotMadeFromNull) {
    EXPECT_EQ(aes_key_data_from_bytes(nullptr, 16), nullptr);
    EXPECT_EQ(errno, EINVAL);
    errno = 0;
    EXPECT_EQ(aes_key_data_from_file(nullptr), nullptr);
    EXPECT_EQ(errno, EINVAL);
}

TEST(KeyData, CopiesTheBytes) {
    std::string bytes = key_bytes.substr(0, 16);
    aes_key_data* key = from_text(bytes);
    bytes[0] = '#';
    EXPECT_TRUE(holds(key, key_bytes.substr(0, 16)));
    aes_key_data_free(key);
}

TEST(KeyData, IsNullWithoutMemory) {
    const call_fault fault(watched_call::allocate, 1, ENOMEM);
    EXPECT_EQ(from_text(key_bytes.substr(0, 16)), nullptr);
    EXPECT_EQ(errno, ENOMEM);
}

TEST(KeyData, IsWipedBeforeItIsFreed) {
    const std::string bytes = key_bytes.substr(0, 32);
    aes_key_data* key = from_text(bytes);
    const free_watch watch(std::string_view(bytes).substr(8, 16));
    aes_key_data_free(key);
    EXPECT_EQ(watch.blocks(), 1);
    EXPECT_EQ(watch.leaks(), 0);
}

TEST(KeyData, FreeingNullDoesNothing) { aes_key_data_free(nullptr); }

TEST(KeyFile, IsReadWhenItHoldsExactlyAKey) {
    const test_directory directory;
    for (std::size_t size = 0; size <= key_bytes.size(); ++size) {
        const std::string bytes = key_bytes.substr(0, size);
        aes_key_data* key = from_file(directory.write("key", bytes));
        if (size == 16 || size == 24 || size == 32) {
            EXPECT_TRUE(holds(key, bytes)) << size;
        } else {
            EXPECT_EQ(key, nullptr) << size;
            EXPECT_EQ(errno, EINVAL) << size;
        }
        aes_key_data_free(key);
    }
}

TEST(KeyFile, ThatCanNotBeReadGivesNoKey) {
    const test_directory directory;
    const std::string path = directory.write("key", key_bytes.substr(0, 32));
    const call_fault fault(watched_call::read, 1, EIO);
    EXPECT_EQ(from_file(path), nullptr);
    EXPECT_EQ(errno, EIO);
}

TEST(KeyFile, MayHoldAnyBytes) {
    const test_directory directory;
    const std::string bytes(
        "\0\n\r\xff\x1a"
        "5678901234\0",
        16);
    aes_key_data* key = from_file(directory.write("key", bytes));
    EXPECT_TRUE(holds(key, bytes));
    aes_key_data_free(key);
}

TEST(KeyFile, IsRefusedWhenGroupOrOthersHaveAnyPermission) {
    const test_directory directory;
    const std::string bytes = key_bytes.substr(0, 32);
    for (mode_t bit = 1; bit <= 040; bit <<= 1) {
        EXPECT_EQ(from_file(directory.write("key", bytes, 0600 | bit)), nullptr) << bit;
        EXPECT_EQ(errno, EACCES) << bit;
    }
    for (const mode_t mode : {0600u, 0400u, 0700u}) {
        aes_key_data* key = from_file(directory.write("key", bytes, mode));
        EXPECT_TRUE(holds(key, bytes)) << mode;
        aes_key_data_free(key);
        ASSERT_EQ(::unlink(directory.file("key").c_str()), 0);
    }
}

TEST(KeyFile, HasThePermissionsOfTheFileBehindALink) {
    const test_directory directory;
    const std::string bytes = key_bytes.substr(0, 16);
    ASSERT_EQ(::symlink("key", directory.file("link").c_str()), 0);
    directory.write("key", bytes, 0600);
    aes_key_data* key = from_file(directory.file("link"));
    EXPECT_TRUE(holds(key, bytes));
    aes_key_data_free(key);
    directory.write("key", bytes, 0644);
    EXPECT_EQ(from_file(directory.file("link")), nullptr);
    EXPECT_EQ(errno, EACCES);
}

TEST(KeyFile, IsARegularFile) {
    const test_directory directory;
    ASSERT_EQ(::mkfifo(directory.file("fifo").c_str(), 0600), 0);
    const struct {
        std::string path;
        int error;
    } rows[] = {
        {directory.file("fifo"), EINVAL},  // would block if it were opened like a file
        {directory.path(), EINVAL},
        {"/dev/zero", EINVAL},
        {directory.file("missing"), ENOENT},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(from_file(row.path), nullptr) << row.path;
        EXPECT_EQ(errno, row.error) << row.path;
    }
}

}  // namespace
