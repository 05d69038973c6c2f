// What is recorded is what a disk may hold after a power cut.

#include "recorded_disk.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <functional>
#include <set>

#include "temporary_folder.h"
#include "unique_fd.h"

using namespace cfg32;
using namespace cfg32::tests;
using testing::Contains;
using testing::Not;
using testing::UnorderedElementsAre;

namespace {

using image = recorded_disk::image;

struct recorded : testing::Test {
    temporary_folder folder;
    const std::string name = folder.write("file", "old");

    int opened(int flags, const std::string& path) const {
        return open(path.c_str(), flags | O_CLOEXEC, 0600);
    }

    /// What may be left when this is done in the folder.
    std::set<image> images_of(const std::function<void()>& what) const {
        recorded_disk disk(folder.file(""));
        {
            const watched_calls calls(disk.recording());
            what();
        }
        std::mt19937_64 random(1);
        std::set<image> all;
        disk.for_each_image(100, random, [&](const image& left) { all.insert(left); });
        return all;
    }

    std::set<std::string> texts_of(const std::function<void(int)>& what) const {
        std::set<std::string> texts;
        const unique_fd file(opened(O_RDWR, name));
        for (const image& left : images_of([&] { what(file.get()); })) {
            texts.insert(left.at("file"));
        }
        return texts;
    }
};

void write_at(int file, const std::string& text, off_t place) {
    EXPECT_EQ(pwrite(file, text.data(), text.size(), place), static_cast<ssize_t>(text.size()));
}

}  // namespace

TEST_F(recorded, WhatIsNotSyncedIsThereOrNot) {
    EXPECT_THAT(texts_of([](int file) { write_at(file, "new", 0); }),
                UnorderedElementsAre("old", "new"));
}

TEST_F(recorded, WhatIsSyncedIsThere) {
    const auto write_twice = [](int file) {
        write_at(file, "mid", 0);
        EXPECT_EQ(fdatasync(file), 0);
        write_at(file, "new", 0);
    };
    EXPECT_THAT(texts_of(write_twice), UnorderedElementsAre("old", "mid", "new"));
    folder.write("file", "old");
    const auto last = [&](int file) {
        write_twice(file);
        EXPECT_EQ(fsync(file), 0);
        EXPECT_EQ(ftruncate(file, 0), 0);
    };
    EXPECT_THAT(texts_of(last), UnorderedElementsAre("old", "mid", "new", ""));
}

TEST_F(recorded, OnlyWhatIsSyncedLasts) {
    recorded_disk disk(folder.file(""));
    const unique_fd file(opened(O_RDWR, name));
    const watched_calls calls(disk.recording());
    write_at(file.get(), "new", 0);
    EXPECT_EQ(disk.lasting(), (image{{"file", "old"}}));
    EXPECT_EQ(fsync(file.get()), 0);
    EXPECT_EQ(disk.lasting(), (image{{"file", "new"}}));
}

TEST_F(recorded, AWriteIsThereInPartBySectorsWithZerosWhereItsSizeIsAndItIsNot) {
    const std::string a(sector, 'a');
    const std::string b(sector, 'b');
    folder.write("file", a + a);
    const std::string hole(sector, '\0');
    EXPECT_THAT(
        texts_of([&](int file) { write_at(file, b + b + b, 0); }),
        UnorderedElementsAre(a + a, a + b, b + a, b + b, a + a + b, a + b + b, b + a + b, b + b + b,
                             a + a + hole, a + b + hole, b + a + hole, b + b + hole));
    folder.write("file", a);
    EXPECT_THAT(texts_of([&](int file) { write_at(file, b + b, sector); }),
                UnorderedElementsAre(a, a + hole + hole, a + b + hole, a + hole + b, a + b + b));
    folder.write("file", "a");
    EXPECT_THAT(texts_of([&](int file) { write_at(file, "b", 1); }),
                UnorderedElementsAre("a", std::string("a\0", 2), "ab"));
}

TEST_F(recorded, LaterWritesAreThereWithoutEarlierOnes) {
    const std::string zeros(sector, '0');
    folder.write("file", zeros + zeros);
    const auto texts = texts_of([&](int file) {
        write_at(file, "1", 0);
        write_at(file, "2", sector);
    });
    EXPECT_EQ(texts.size(), 4u);
    EXPECT_THAT(texts, Contains(zeros + "2" + zeros.substr(1)));
}

TEST_F(recorded, ANameMayBeThereBeforeWhatItNames) {
    const auto replace = [&](bool is_synced) {
        const unique_fd at(opened(O_RDONLY | O_DIRECTORY, folder.file("")));
        unique_fd file(opened(O_WRONLY | O_CREAT | O_EXCL, folder.file("temporary")));
        write_at(file.get(), "new", 0);
        if (is_synced) {
            EXPECT_EQ(fsync(file.get()), 0);
        }
        EXPECT_EQ(renameat(at.get(), "temporary", at.get(), "file"), 0);
        EXPECT_EQ(fsync(at.get()), 0);
        EXPECT_TRUE(file.close());
    };
    const std::string zeros(3, '\0');
    const auto images = images_of([&] { replace(false); });
    EXPECT_THAT(images, Contains(image{{"file", ""}}));
    EXPECT_THAT(images, Contains(image{{"file", zeros}}));
    folder.write("file", "old");
    EXPECT_THAT(images_of([&] { replace(true); }),
                UnorderedElementsAre(image{{"file", "old"}}, image{{"file", "new"}},
                                     image{{"file", "old"}, {"temporary", ""}},
                                     image{{"file", "old"}, {"temporary", zeros}},
                                     image{{"file", "old"}, {"temporary", "new"}}));
}

TEST_F(recorded, ANameIsThereWhenTheFolderIsSynced) {
    const auto remove = [&](bool is_synced) {
        const unique_fd at(opened(O_RDONLY | O_DIRECTORY, folder.file("")));
        EXPECT_EQ(unlinkat(at.get(), "file", 0), 0);
        if (is_synced) {
            EXPECT_EQ(fsync(at.get()), 0);
            const unique_fd other(opened(O_WRONLY | O_CREAT, folder.file("other")));
        }
    };
    EXPECT_THAT(images_of([&] { remove(false); }),
                UnorderedElementsAre(image{{"file", "old"}}, image{}));
    folder.write("file", "old");
    const auto images = images_of([&] { remove(true); });
    EXPECT_THAT(images, Contains(image{{"other", ""}}));
    EXPECT_THAT(images, Not(Contains(image{{"file", "old"}, {"other", ""}})));
}
