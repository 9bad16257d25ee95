// The pixel kernel on one 1920x1080 format-203 frame, single thread, for each processor path:
// a reset record, every stage on, a grade the size of a typical filter chain, and each stage alone.
// Counter ns_per_pixel: time per pixel.
#include <benchmark/benchmark.h>

#include <memory>

#include "engine/kernel.h"
#include "engine/lookup_build.h"
#include "tests/unit/engine/engine_test_support.h"

namespace vt {
namespace {

constexpr uint32_t kWidth = 1920;
constexpr uint32_t kHeight = 1080;

test::PlanarFrame& SourceFrame() {
    static test::PlanarFrame frame = [] {
        test::PlanarFrame f(kWidth, kHeight);
        test::FillNatural(&f, 1);
        return f;
    }();
    return frame;
}

void RunFrames(benchmark::State& state, const EngineParams& params) {
    const auto path = static_cast<KernelPath>(state.range(0));
    if (!KernelPathAvailable(path)) {
        state.SkipWithError("path not available on this processor");
        return;
    }
    state.SetLabel(KernelPathName(path));
    test::PlanarFrame destination(kWidth, kHeight);
    for (auto _ : state) {
        RunKernel(path, &params, SourceFrame().frame(), destination.frame());
        benchmark::ClobberMemory();
    }
    state.counters["ns_per_pixel"] = benchmark::Counter(static_cast<double>(kWidth) * kHeight,
                                                        benchmark::Counter::kIsIterationInvariantRate |
                                                            benchmark::Counter::kInvert);
}

std::shared_ptr<const EngineSet> SetFor(void (*grade)(CorrectionSettings*)) {
    auto s = test::ResetRecord();
    if (grade != nullptr) grade(s.get());
    return BuildEngineSet(*s, nullptr);
}

void BM_KernelReset(benchmark::State& state) {
    static auto set = SetFor(nullptr);
    RunFrames(state, set->params);
}

void BM_KernelEveryStage(benchmark::State& state) {
    static auto set = SetFor(test::EnableEverything);
    RunFrames(state, set->params);
}

void BM_KernelTypicalGrade(benchmark::State& state) {
    static auto set = SetFor(test::EnableTypicalGrade);
    RunFrames(state, set->params);
}

// One stage of the every-stage set, the others' gates closed.
void BM_KernelStage(benchmark::State& state) {
    static auto set = SetFor(test::EnableEverything);
    EngineParams p = set->params;
    StageFlags& f = p.flags;
    const uint8_t all[] = {f.autoCompress, f.levels,    f.tonalRanges, f.tonalMaster, f.hueWheels,
                           f.setRanges[0], f.setRanges[1], f.setMaster[0], f.setMaster[1], f.toneCurves,
                           f.hueCurves,    f.secondaries,  f.limiter};
    uint8_t* gates[] = {&f.autoCompress, &f.levels,      &f.tonalRanges,  &f.tonalMaster, &f.hueWheels,
                        &f.setRanges[0], &f.setRanges[1], &f.setMaster[0], &f.setMaster[1], &f.toneCurves,
                        &f.hueCurves,    &f.secondaries,  &f.limiter};
    static const char* const kNames[] = {"auto compression", "levels",         "tonal ranges",  "tonal master",
                                         "hue wheels",       "RGB ranges",     "second ranges", "RGB master",
                                         "second master",    "tone curves",    "hue curves",    "secondaries",
                                         "limiter"};
    const auto stage = static_cast<size_t>(state.range(1));
    for (size_t k = 0; k < std::size(gates); ++k) *gates[k] = k == stage ? all[k] : 0;
    f.rangeWeights = stage == 2 || stage == 4 || stage == 5 || stage == 6;
    RunFrames(state, p);
    state.SetLabel(std::string(KernelPathName(static_cast<KernelPath>(state.range(0)))) + " " + kNames[stage]);
}

BENCHMARK(BM_KernelReset)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelEveryStage)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelTypicalGrade)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelStage)->ArgsProduct({{1, 2, 3}, benchmark::CreateDenseRange(0, 12, 1)})->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace vt
