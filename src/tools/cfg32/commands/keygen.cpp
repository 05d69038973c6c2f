// cfg32 keygen: makes a key file for passwords.

#include <fcntl.h>
#include <sodium.h>
#include <unistd.h>
#include <memory>

#include <array>
#include <cerrno>
#include <filesystem>

#include "arguments.h"
#include "command.h"
#include "disk.h"
#include "held_back_signals.h"
#include "private_folder.h"
#include "unique_fd.h"

namespace cfg32::tool {

namespace {

constexpr size_t largest_key = 32;

struct arguments {
    std::string file;
    size_t bytes = largest_key;
};

bool is_written(int file, std::string_view key) {
    // Whatever the umask is.
    return fchmod(file, of_owner_only) == 0 && replace_content(file, key) && sync_content(file);
}

/// What the key encodes must not outlive its name.
bool is_name_synced(const std::string& name) {
    const auto folder = std::filesystem::path(name).parent_path();
    const unique_fd opened(
        open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    return opened && fsync(opened.get()) == 0;
}

/// A key that is there already is never overwritten: what it encoded would be lost.
int keygen(const arguments& given) {
    const held_back_signals until_done;
    const char* name = given.file.c_str();
    std::array<char, largest_key> key{};
    // Before there is a file: where there are no random numbers, this ends the program.
    randombytes_buf(key.data(), given.bytes);
    unique_fd file(open(name, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, of_owner_only));
    const bool is_made = static_cast<bool>(file);
    const bool is_done = is_made && is_written(file.get(), {key.data(), given.bytes}) &&
                         file.close() && is_name_synced(given.file);
    const int error = errno;
    sodium_memzero(key.data(), key.size());
    if (!is_done) {
        if (is_made) {
            unlink(name);
        }
        fail_for_system(given.file, error);
    }
    return done;
}

}  // namespace

action define_keygen(CLI::App& parser, settings&) {
    const auto given = std::make_shared<arguments>();
    add_argument(parser, "file", "FILE", "the key file, which must not be there yet", given->file,
                 presence::required);
    add_choice(parser, "--bits", "the size of the key; else 256", given->bytes,
               {{"128", 16}, {"192", 24}, {"256", 32}});
    return [given] { return keygen(*given); };
}

}  // namespace cfg32::tool
