#include "small_disk.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace cfg32::tests {

namespace {

bool write_text(const char* path, const std::string& text) {
    return static_cast<bool>(std::ofstream(path) << text << std::flush);
}

/// Gets a namespace of mounts of this process's own. Returns why not, "" if so.
std::string own_mounts() {
    const std::string user = std::to_string(geteuid());
    const std::string group = std::to_string(getegid());
    if (unshare(CLONE_NEWNS) != 0) {
        if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) {
            return std::string("no namespaces: ") + strerror(errno);
        }
        if (!write_text("/proc/self/setgroups", "deny") ||
            !write_text("/proc/self/uid_map", user + " " + user + " 1") ||
            !write_text("/proc/self/gid_map", group + " " + group + " 1")) {
            return "no user of that namespace";
        }
    }
    if (mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) {
        return std::string("no mounts of its own: ") + strerror(errno);
    }
    return "";
}

/// Takes room without writing, where that can be done: as much as there is in one piece, and then
/// in ever smaller ones. Returns how much.
off_t allocated(int file) {
    off_t size = 0;
    for (off_t piece = 64 << 20; piece >= 4096;) {
        if (fallocate(file, 0, size, piece) == 0) {
            size += piece;
        } else {
            piece /= 2;
        }
    }
    return size;
}

}  // namespace

small_disk::small_disk(const file_system& kind) {
    if (mkdir(place().c_str(), 0700) != 0) {
        obstacle_ = strerror(errno);
    } else if (obstacle_ = own_mounts(); obstacle_.empty()) {
        obstacle_ = mounted(kind);
    }
}

small_disk::~small_disk() {
    if (obstacle_.empty()) {
        EXPECT_EQ(umount2(place().c_str(), MNT_DETACH), 0);
    }
}

std::string small_disk::mounted(const file_system& kind) const {
    const std::string problem = std::string("no ") + kind.name + " can be mounted: ";
    if (!kind.make) {
        const std::string size = "size=" + std::to_string(kind.size);
        const bool is_mounted = mount("none", place().c_str(), "tmpfs", 0, size.c_str()) == 0;
        return is_mounted ? "" : problem + strerror(errno);
    }
    const std::string image = outside_.write("image", "");
    if (truncate(image.c_str(), kind.size) != 0) {
        return problem + strerror(errno);
    }
    const std::string path = "PATH=$PATH:/sbin:/usr/sbin ";
    if (system((path + kind.make + " " + image + " >/dev/null 2>&1").c_str()) != 0) {
        return problem + "it can't be made";
    }
    const std::string command = path + "mount -o loop " + image + " " + place() + " 2>/dev/null";
    return system(command.c_str()) == 0 ? "" : problem + "the system refuses";
}

std::string small_disk::text_of(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

void small_disk::fill(size_t left) const {
    const int file = open(filler().c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
    ASSERT_GE(file, 0);
    off_t size = allocated(file);
    const std::string block(512, 'f');
    for (ssize_t count; (count = ::pwrite(file, block.data(), block.size(), size)) > 0;) {
        size += count;
    }
    EXPECT_EQ(errno, ENOSPC);
    EXPECT_EQ(ftruncate(file, size - static_cast<off_t>(left)), 0);
    EXPECT_EQ(fsync(file), 0);
    close(file);
}

void small_disk::make_room() const { ASSERT_EQ(unlink(filler().c_str()), 0); }

std::vector<std::string> small_disk::other_files() const {
    std::vector<std::string> names;
    for (const auto& file : std::filesystem::directory_iterator(place())) {
        const std::string path = file.path();
        if (path != config() && path != backup() && path != filler() &&
            path != place() + "/lost+found") {
            names.push_back(path);
        }
    }
    return names;
}

}  // namespace cfg32::tests
