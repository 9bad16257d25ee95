// The resampler on 1920x1080 sources, per image kind, shrinking by 0.25 and enlarging by 2, on the
// path chosen at setup and on each path by name. items_per_second counts destination pixels.
#include <benchmark/benchmark.h>

#include <vector>

#include "resample/resample.h"
#include "resample/resample_internal.h"

namespace vt {
namespace {

// Args: kind, factor x 100, ResampleLevel (-1: the one chosen at setup).
void BM_Resize(benchmark::State& state) {
    const auto kind = static_cast<ResampleKind>(state.range(0));
    const double factor = static_cast<double>(state.range(1)) / 100.0;
    const ResampleLevel saved = CurrentResampleLevel();
    InitResampleDispatch();
    if (state.range(2) >= 0) SetResampleLevel(static_cast<ResampleLevel>(state.range(2)));
    const uint32_t sw = 1920, sh = 1080;
    const auto dw = static_cast<uint32_t>(sw * factor), dh = static_cast<uint32_t>(sh * factor);
    const uint32_t bpp = kind == ResampleKind::kFloat4 ? 16 : 4;
    std::vector<uint8_t> src(static_cast<size_t>(sw) * sh * bpp), dst(static_cast<size_t>(dw) * dh * bpp);
    for (size_t i = 0; i < src.size(); ++i) src[i] = static_cast<uint8_t>(i * 7 % 61);  // small, finite floats too
    std::vector<uint8_t> work(ResizeWorkSize(kind, sw, sh, dw, dh, factor, factor));
    const ResampleImage in{src.data(), static_cast<ptrdiff_t>(sw) * bpp, sw, sh};
    const ResampleImage out{dst.data(), static_cast<ptrdiff_t>(dw) * bpp, dw, dh};
    for (auto _ : state) {
        if (ResizeCubic(kind, in, out, factor, factor, work.data(), work.size()) != kResampleOk) {
            state.SkipWithError("resize failed");
            break;
        }
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(static_cast<int64_t>(state.iterations()) * dw * dh);
    state.counters["MPix_per_s"] = benchmark::Counter(static_cast<double>(dw) * dh * 1e-6,
                                                      benchmark::Counter::kIsIterationInvariantRate);
    state.SetLabel(CurrentResampleLevel() == ResampleLevel::kPortable ? "portable"
                   : CurrentResampleLevel() == ResampleLevel::kAvx2   ? "avx2"
                                                                      : "avx512");
    SetResampleLevel(saved);
}

void Cases(benchmark::internal::Benchmark* b) {
    for (int64_t kind : {0, 1, 2}) {
        for (int64_t factor : {25, 200}) {
            for (int64_t level : {-1, 0, 1, 2}) b->Args({kind, factor, level});
        }
    }
    b->ArgNames({"kind", "factor100", "level"});
    b->Unit(benchmark::kMillisecond);
}

BENCHMARK(BM_Resize)->Apply(Cases);

}  // namespace
}  // namespace vt
