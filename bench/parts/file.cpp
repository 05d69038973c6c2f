// The file in memory: load, search, serialise.

#include <benchmark/benchmark.h>

#include "LDIF_File.h"
#include "generated_text.h"
#include "scratch_file.h"

namespace {

using cfg32::bench::configuration_text;
using cfg32::bench::scratch_file;
using cfg32::bench::shape;

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

}  // namespace
