// The file in memory: load, search, serialise, update.

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "LDIF_File.h"
#include "cfg32.h"
#include "generated_text.h"

namespace {

using cfg32::bench::configuration_text;
using cfg32::bench::dn_of;
using cfg32::bench::shape;

/// A file in a folder of its own, removed at the end.
class scratch_file {
  public:
    explicit scratch_file(const std::string& text) {
        std::string folder = std::filesystem::temp_directory_path() / "cfg32-bench-XXXXXX";
        if (!mkdtemp(folder.data())) {
            throw std::filesystem::filesystem_error("mkdtemp", {});
        }
        folder_ = folder;
        std::ofstream(name(), std::ios::binary) << text;
    }
    scratch_file(const scratch_file&) = delete;
    scratch_file& operator=(const scratch_file&) = delete;
    ~scratch_file() { std::filesystem::remove_all(folder_); }

    std::string name() const { return folder_ / "conf"; }

  private:
    std::filesystem::path folder_;
};

void load_file(benchmark::State& state, shape how) {
    const std::string text = configuration_text(static_cast<size_t>(state.range(0)), how);
    const scratch_file file(text);
    for (auto each : state) {
        benchmark::DoNotOptimize(LDIF_File(file.name(), {}, nullptr));
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK_CAPTURE(load_file, flat, shape::flat)->Arg(1000)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(load_file, nested, shape::nested)->Arg(1000)->Unit(benchmark::kMillisecond);

void search_one_of_many(benchmark::State& state) {
    const scratch_file file(configuration_text(10000, shape::flat));
    const LDIF_File loaded(file.name(), {}, nullptr);
    const LDIF_DN base = cisString("cn=Configuration");
    const LDIF_Filter filter("(cn=Backend 005002)");
    for (auto each : state) {
        benchmark::DoNotOptimize(
            loaded.search(base, LDIF_Search_Results::Subtree, filter, LDIF_AttrFilter(), false));
    }
    state.SetItemsProcessed(state.iterations() * 10000);
}
BENCHMARK(search_one_of_many)->Unit(benchmark::kMicrosecond);

void serialise(benchmark::State& state) {
    const scratch_file file(configuration_text(10000, shape::flat));
    const LDIF_File loaded(file.name(), {}, nullptr);
    size_t size = 0;
    for (auto each : state) {
        std::string text;
        cfg32::for_each_in_preorder(loaded.root(),
                                    [&](const LDIF_Entry& entry) { entry.append_to(text); });
        size += text.size();
        benchmark::DoNotOptimize(text);
    }
    state.SetBytesProcessed(static_cast<int64_t>(size));
}
BENCHMARK(serialise)->Unit(benchmark::kMicrosecond);

void update_file(benchmark::State& state) {
    const scratch_file file(configuration_text(static_cast<size_t>(state.range(0)), shape::flat));
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

}  // namespace
