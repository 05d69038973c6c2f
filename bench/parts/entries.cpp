// The lines of an entry: read, printed anew, and searched as they stand.

#include <benchmark/benchmark.h>

#include "unread_attributes.h"

namespace {

using cfg32::given_text;
using cfg32::line_start;
using cfg32::unread_attributes;

const std::string lines =
    "cn: Backend 005002\n"
    "objectclass: oru-slapdBackend\n"
    "objectclass: top\n"
    "# entries returned by one search at most\n"
    "oru-slapdPlugin: database /lib/libback-db.so db_backend_init\n"
    "oru-slapdPort: 12742\n"
    "oru-slapdReadOnly: FALSE\n"
    "oru-slapdSizeLimit: 500\n"
    "oru-slapdSuffix: ou=a, o=b\n"
    "oru-slapdSuffix: ou=c, o=b\n";

unread_attributes unread() { return {given_text::lasting(lines), true, nullptr}; }

void read_attributes(benchmark::State& state) {
    for (auto each : state) {
        benchmark::DoNotOptimize(unread().read());
    }
    state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(lines.size()));
}
BENCHMARK(read_attributes);

void print_attributes(benchmark::State& state) {
    const unread_attributes from = unread();
    const LDIF_Attributes attributes = from.read();
    for (auto each : state) {
        benchmark::DoNotOptimize(from.printed(attributes));
    }
    state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(lines.size()));
}
BENCHMARK(print_attributes);

void find_values(benchmark::State& state, const char* name) {
    const unread_attributes from = unread();
    const line_start start(name);
    size_t size = 0;
    for (auto each : state) {
        from.for_each_value_of(start, [&](std::string_view, std::string_view value) {
            size += value.size();
            return false;
        });
    }
    benchmark::DoNotOptimize(size);
}
BENCHMARK_CAPTURE(find_values, first, "cn");
BENCHMARK_CAPTURE(find_values, last, "oru-slapdSuffix");
BENCHMARK_CAPTURE(find_values, missing, "description");

}  // namespace
