// An update of the file, and what the disk takes of it.

#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <system_error>

#include "LDIF_File.h"
#include "cfg32.h"
#include "generated_text.h"
#include "scratch_file.h"
#include "unique_fd.h"

namespace {

using cfg32::unfinished_mark;
using cfg32::unique_fd;
using cfg32::bench::configuration_text;
using cfg32::bench::dn_of;
using cfg32::bench::scratch_file;
using cfg32::bench::shape;

std::string text_of_size(const benchmark::State& state) {
    return configuration_text(static_cast<size_t>(state.range(0)), shape::flat);
}

void update_file(benchmark::State& state) {
    const scratch_file file(text_of_size(state));
    LDIF_File loaded(file.name(), file.name() + ".bak", nullptr);
    const LDIF_DN dn = cisString(dn_of(100, shape::flat));
    std::string name = "oru-slapdPort";
    std::string ports[] = {"1", "2"};
    size_t number = 0;
    for (auto each : state) {
        char* values[] = {ports[number++ % 2].data(), nullptr};
        LDAPMod change{};
        change.mod_op = LDAP_MOD_REPLACE;
        change.mod_type = name.data();
        change.mod_values = values;
        LDAPMod* changes[] = {&change, nullptr};
        const LDIF_File::update lock(loaded);
        loaded.refresh();
        loaded.modify(dn, changes);
        loaded.flush();
    }
}
BENCHMARK(update_file)->Arg(300)->Arg(10000)->Unit(benchmark::kMicrosecond);

void require(bool is_done) {
    if (!is_done) {
        throw std::system_error(errno, std::generic_category());
    }
}

void write_part(int file, std::string_view text, size_t place) {
    require(pwrite(file, text.data(), text.size(), static_cast<off_t>(place)) ==
            static_cast<ssize_t>(text.size()));
}

void write_over(const std::string& name, const std::string& text) {
    const unique_fd file(open(name.c_str(), O_RDWR | O_CLOEXEC));
    write_part(file.get(), text, 0);
    require(ftruncate(file.get(), static_cast<off_t>(text.size())) == 0 &&
            fdatasync(file.get()) == 0);
}

/// With a mark over the head until the rest is on the disk.
void write_over_marked(const std::string& name, const std::string& text) {
    const unique_fd file(open(name.c_str(), O_RDWR | O_CLOEXEC));
    const std::string_view head = std::string_view(text).substr(0, unfinished_mark.size());
    write_part(file.get(), unfinished_mark, 0);
    require(fdatasync(file.get()) == 0);
    write_part(file.get(), std::string_view(text).substr(head.size()), head.size());
    require(ftruncate(file.get(), static_cast<off_t>(text.size())) == 0 &&
            fdatasync(file.get()) == 0);
    write_part(file.get(), head, 0);
    require(fdatasync(file.get()) == 0);
}

/// A copy of the file that takes the name of the backup when it is complete.
void make_backup(const scratch_file& file) {
    constexpr mode_t mode = 0600;
    const std::string name = file.name() + ".tmp";
    const unique_fd folder(open(file.folder().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    const unique_fd from(open(file.name().c_str(), O_RDONLY | O_CLOEXEC));
    const unique_fd to(open(name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    constexpr size_t whole = size_t{1} << 30;
    while (copy_file_range(from.get(), nullptr, to.get(), nullptr, whole, 0) > 0) {
    }
    require(fsync(to.get()) == 0 && rename(name.c_str(), (file.name() + ".bak").c_str()) == 0 &&
            fsync(folder.get()) == 0);
}

/// What an update asks of the disk, and nothing else: no lock, no text to make, nothing checked.
void update_by_system_calls(benchmark::State& state) {
    const std::string text = text_of_size(state);
    const scratch_file file(text);
    for (auto each : state) {
        make_backup(file);
        write_over_marked(file.name(), text);
    }
}
BENCHMARK(update_by_system_calls)->Arg(300)->Arg(10000)->Unit(benchmark::kMicrosecond);

/// The same if the backup, too, were written over in place, and torn for that time.
void write_over_both(benchmark::State& state) {
    const std::string text = text_of_size(state);
    const scratch_file file(text);
    const scratch_file backup(text);
    for (auto each : state) {
        write_over(backup.name(), text);
        write_over(file.name(), text);
    }
}
BENCHMARK(write_over_both)->Arg(300)->Arg(10000)->Unit(benchmark::kMicrosecond);

}  // namespace
