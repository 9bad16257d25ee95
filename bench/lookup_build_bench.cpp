// The lookup rebuild (Update, publication included) for a reset record and with every group enabled.
#include <benchmark/benchmark.h>

#include "engine/lookup_build.h"
#include "tests/unit/engine/engine_test_support.h"

namespace vt {
namespace {

void BM_UpdateReset(benchmark::State& state) {
    auto s = test::ResetRecord();
    for (auto _ : state) Update(*s);
}

void BM_UpdateEveryGroup(benchmark::State& state) {
    auto s = test::ResetRecord();
    test::EnableEverything(s.get());
    for (auto _ : state) Update(*s);
}

void BM_UpdateTypicalGrade(benchmark::State& state) {
    auto s = test::ResetRecord();
    test::EnableTypicalGrade(s.get());
    for (auto _ : state) Update(*s);
}

BENCHMARK(BM_UpdateReset)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_UpdateEveryGroup)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_UpdateTypicalGrade)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace vt
