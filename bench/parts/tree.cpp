// Placing entries, in wide trees and in deep ones.

#include <benchmark/benchmark.h>

#include "LDIF_Entry.h"
#include "generated_text.h"

namespace {

using cfg32::bench::dn_of;
using cfg32::bench::shape;

std::vector<LDIF_Entry> entries(size_t count, shape how) {
    std::vector<LDIF_Entry> made;
    for (size_t i = 0; i < count; ++i) {
        made.emplace_back(LDIF_DN(cisString(dn_of(i, how))));
    }
    return made;
}

void place_entries(benchmark::State& state, shape how) {
    const auto made = entries(static_cast<size_t>(state.range(0)), how);
    for (auto each : state) {
        state.PauseTiming();
        std::vector<LDIF_Entry> copies = made;
        state.ResumeTiming();
        LDIF_Entry root;
        for (LDIF_Entry& entry : copies) {
            root += std::move(entry);
        }
        state.PauseTiming();
        root.clear();
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK_CAPTURE(place_entries, wide, shape::flat)->Arg(1000)->Arg(10000);
BENCHMARK_CAPTURE(place_entries, deep, shape::nested)->Arg(1000)->Arg(10000);

void find_entry(benchmark::State& state, shape how) {
    LDIF_Entry root;
    for (LDIF_Entry& entry : entries(10000, how)) {
        root += std::move(entry);
    }
    const LDIF_DN wanted = cisString(dn_of(9999, how));
    for (auto each : state) {
        benchmark::DoNotOptimize(root.find(wanted));
    }
}
BENCHMARK_CAPTURE(find_entry, wide, shape::flat);
BENCHMARK_CAPTURE(find_entry, deep, shape::nested);

}  // namespace
