// The line reader.

#include <benchmark/benchmark.h>

#include "LDIF_Line.h"
#include "generated_text.h"
#include "line_source.h"

namespace {

void read_lines(benchmark::State& state) {
    const std::string text = cfg32::bench::configuration_text(1000, cfg32::bench::shape::flat);
    LDIF_Line line;
    for (auto each : state) {
        cfg32::line_source source(text);
        int number = 0;
        do {
            number = line.next(source, number);
        } while (line.type != LDIF_Line::endOfFile);
        benchmark::DoNotOptimize(number);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(read_lines)->Unit(benchmark::kMicrosecond);

}  // namespace
