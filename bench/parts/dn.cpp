// Distinguished names.

#include <benchmark/benchmark.h>

#include "LDIF_DN.h"
#include "dn_path.h"
#include "generated_text.h"

namespace {

using cfg32::bench::dn_of;
using cfg32::bench::shape;

const cisString text = dn_of(123456, shape::nested);

void parse_dn(benchmark::State& state) {
    for (auto each : state) {
        benchmark::DoNotOptimize(LDIF_DN(text));
    }
}
BENCHMARK(parse_dn);

void print_dn(benchmark::State& state) {
    const LDIF_DN dn(text);
    for (auto each : state) {
        benchmark::DoNotOptimize(dn.str());
    }
}
BENCHMARK(print_dn);

void compare_equal_dns(benchmark::State& state) {
    const LDIF_DN left(text);
    const LDIF_DN right(text);
    for (auto each : state) {
        benchmark::DoNotOptimize(left.compare(right));
    }
}
BENCHMARK(compare_equal_dns);

void hash_dn(benchmark::State& state) {
    const LDIF_DN dn(text);
    for (auto each : state) {
        benchmark::DoNotOptimize(dn.hash());
    }
}
BENCHMARK(hash_dn);

void keep_plain_dn(benchmark::State& state) {
    for (auto each : state) {
        benchmark::DoNotOptimize(cfg32::kept_dn(cfg32::given_text::lasting(text.text())));
    }
}
BENCHMARK(keep_plain_dn);

void hash_plain_dn(benchmark::State& state) {
    const cfg32::kept_dn dn(cfg32::given_text::lasting(text.text()));
    for (auto each : state) {
        const cfg32::dn_path path(dn);
        size_t hash = 0;
        for (size_t i = 0; i < path.size(); ++i) {
            hash = path.hash(i, hash);
        }
        benchmark::DoNotOptimize(hash);
    }
}
BENCHMARK(hash_plain_dn);

}  // namespace
