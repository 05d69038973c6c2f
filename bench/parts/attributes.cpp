// The attribute table, and a value of every syntax that has code of its own.

#include <benchmark/benchmark.h>

#include "LDIF_AttrType.h"
#include "LDIF_Value.h"

namespace {

void look_up_attributes(benchmark::State& state) {
    getAttrType("cn");  // sorts the table
    for (auto each : state) {
        for (int i = 0; i < numAttrs; ++i) {
            benchmark::DoNotOptimize(getAttrType(attrMap[i].name));
        }
    }
    state.SetItemsProcessed(static_cast<int64_t>(state.iterations()) * numAttrs);
}
BENCHMARK(look_up_attributes);

void look_up_unknown_attribute(benchmark::State& state) {
    for (auto each : state) {
        benchmark::DoNotOptimize(getAttrType("nuv-unknownAttribute"));
    }
}
BENCHMARK(look_up_unknown_attribute);

void make_value(benchmark::State& state, const char* attribute, const std::string& text) {
    const _AttrType* type = getAttrType(attribute);
    for (auto each : state) {
        benchmark::DoNotOptimize(LDIF_Value(type, text, nullptr));
    }
}
BENCHMARK_CAPTURE(make_value, ces, "charset", "UTF-8");
BENCHMARK_CAPTURE(make_value, cis, "cn", "Client Listener");
BENCHMARK_CAPTURE(make_value, enum, "oru-slapdAdminRole", "PasswordAdmin");
BENCHMARK_CAPTURE(make_value, time, "oru-slapdCachedAttributeAutoAdjustTime", "T013000");
BENCHMARK_CAPTURE(make_value, int, "oru-slapdPort", "389");
BENCHMARK_CAPTURE(make_value, kilo, "oru-slapdCachedAttributeSize", "16384");
BENCHMARK_CAPTURE(make_value, mask, "oru-slapdSslCipherSpecs", "12288");
BENCHMARK_CAPTURE(make_value, dn, "oru-slapdAdminDN", "cn=root, dc=example, dc=com");
BENCHMARK_CAPTURE(make_value, pw, "oru-slapdAdminPW", "secret");

}  // namespace
