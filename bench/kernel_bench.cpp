// The pixel kernel on one 1920x1080 format-203 frame, single thread, for each processor path:
// a reset record, every stage on, a grade the size of a typical filter chain, and each stage alone;
// into a second frame, and in place as the render runs it (the frame refilled before each pass).
// Counter ns_per_pixel: time per pixel.
#include <benchmark/benchmark.h>

#include <cstring>
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

// Where the kernel writes: a second frame, or the source itself (refilled from the source frame
// before each pass, outside the timing, as the render imports the host's pixels first; a reset record
// leaves the frame as it was, so it needs no refill).
enum class Target { kOtherFrame, kInPlace, kInPlaceUnchanged };

void RunFrames(benchmark::State& state, const EngineParams& params, Target target = Target::kOtherFrame) {
    const auto path = static_cast<KernelPath>(state.range(0));
    if (!KernelPathAvailable(path)) {
        state.SkipWithError("path not available on this processor");
        return;
    }
    state.SetLabel(KernelPathName(path));
    test::PlanarFrame& source = SourceFrame();
    test::PlanarFrame destination(kWidth, kHeight);
    const size_t bytes = source.floats() * 4 * sizeof(float);
    std::memcpy(destination.plane(0), source.plane(0), bytes);
    for (auto _ : state) {
        if (target == Target::kInPlace) {
            state.PauseTiming();
            std::memcpy(destination.plane(0), source.plane(0), bytes);
            state.ResumeTiming();
        }
        RunKernel(path, &params, target == Target::kOtherFrame ? source.frame() : destination.frame(),
                  destination.frame());
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

void BM_KernelResetInPlace(benchmark::State& state) {
    static auto set = SetFor(nullptr);
    RunFrames(state, set->params, Target::kInPlaceUnchanged);
}

void BM_KernelEveryStage(benchmark::State& state) {
    static auto set = SetFor(test::EnableEverything);
    RunFrames(state, set->params);
}

void BM_KernelEveryStageInPlace(benchmark::State& state) {
    static auto set = SetFor(test::EnableEverything);
    RunFrames(state, set->params, Target::kInPlace);
}

void BM_KernelTypicalGrade(benchmark::State& state) {
    static auto set = SetFor(test::EnableTypicalGrade);
    RunFrames(state, set->params);
}

void BM_KernelTypicalGradeInPlace(benchmark::State& state) {
    static auto set = SetFor(test::EnableTypicalGrade);
    RunFrames(state, set->params, Target::kInPlace);
}

// One stage of the every-stage set, the others' gates closed. The Master ranges of both channel
// sets and the tone curves run as one stage: their tables are composed into one per colour.
void BM_KernelStage(benchmark::State& state) {
    static auto set = SetFor(test::EnableEverything);
    static const char* const kNames[] = {"auto compression", "levels",      "tonal ranges",  "tonal master",
                                         "hue wheels",       "RGB ranges",  "second ranges", "masters+tone",
                                         "hue curves",       "secondaries", "limiter"};
    const StageFlags& all = set->params.flags;
    EngineParams p = set->params;
    StageFlags& f = p.flags;
    f.autoCompress = f.levels = f.tonalRanges = f.tonalMaster = f.hueWheels = f.toneCurves = f.channelTail = 0;
    f.hueCurves = f.secondaries = f.limiter = f.rangeWeights = 0;
    f.setRanges[0] = f.setRanges[1] = f.setMaster[0] = f.setMaster[1] = 0;
    const auto stage = static_cast<size_t>(state.range(1));
    switch (stage) {
        case 0:
            f.autoCompress = all.autoCompress;
            break;
        case 1:
            f.levels = all.levels;
            break;
        case 2:
            f.tonalRanges = f.rangeWeights = 1;
            break;
        case 3:
            f.tonalMaster = all.tonalMaster;
            break;
        case 4:
            f.hueWheels = f.rangeWeights = 1;
            break;
        case 5:
            f.setRanges[0] = f.rangeWeights = 1;
            break;
        case 6:
            f.setRanges[1] = f.rangeWeights = 1;
            break;
        case 7:
            f.setMaster[0] = all.setMaster[0];
            f.setMaster[1] = all.setMaster[1];
            f.toneCurves = all.toneCurves;
            f.channelTail = all.channelTail;
            break;
        case 8:
            f.hueCurves = all.hueCurves;
            break;
        case 9:
            f.secondaries = all.secondaries;
            break;
        default:
            f.limiter = all.limiter;
            break;
    }
    RunFrames(state, p);
    state.SetLabel(std::string(KernelPathName(static_cast<KernelPath>(state.range(0)))) + " " + kNames[stage]);
}

BENCHMARK(BM_KernelReset)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelResetInPlace)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelEveryStage)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelEveryStageInPlace)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelTypicalGrade)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelTypicalGradeInPlace)->DenseRange(0, 3)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_KernelStage)
    ->ArgsProduct({{1, 2, 3}, benchmark::CreateDenseRange(0, 10, 1)})
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace vt
