// Import into and export from the planar float working frame, per host layout, at 1080p and
// 2160p, on the path chosen at setup (and the narrower paths at 1080p for comparison).
// The counter ns_per_pixel is the figure the render budget is stated in.
#include <benchmark/benchmark.h>

#include <cstring>
#include <vector>

#include "link/frame_buffer.h"
#include "link/pixel_convert.h"
#include "link/pixel_convert_internal.h"

namespace vt {
namespace {

struct Setup {
    Setup() { InitLinkDispatch(); }
};
const Setup g_setup;

void SetPerPixel(benchmark::State& state, uint64_t pixels) {
    state.counters["ns_per_pixel"] =
        benchmark::Counter(static_cast<double>(pixels) * 1e-9,
                           benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

// Host pixels of mid-grey with a little variation, so every value path is taken.
std::vector<uint8_t> HostFrame(uint32_t code, uint32_t width, uint32_t height) {
    const uint32_t bpp = HostBytesPerPixel(code);
    std::vector<uint8_t> bytes(static_cast<size_t>(width) * height * bpp);
    if (bpp == 16) {
        auto* f = reinterpret_cast<float*>(bytes.data());
        for (size_t i = 0; i < bytes.size() / 4; ++i) f[i] = static_cast<float>(i % 97) / 97.0f;
    } else {
        for (size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<uint8_t>(i * 7 % 251);
        if (code == kFormatArgb16) {
            auto* w = reinterpret_cast<uint16_t*>(bytes.data());
            for (size_t i = 0; i < bytes.size() / 2; ++i) w[i] = static_cast<uint16_t>(i * 13 % 32769);
        }
    }
    return bytes;
}

// A level of -1 keeps the path chosen at setup.
class LevelScope {
public:
    explicit LevelScope(int64_t level) : m_saved(CurrentConvertLevel()) {
        if (level >= 0) SetConvertLevel(static_cast<ConvertLevel>(level));
    }
    ~LevelScope() { SetConvertLevel(m_saved); }

private:
    ConvertLevel m_saved;
};

// Args: host code, width, height, ConvertLevel (-1: the one chosen at setup).
void BM_Import(benchmark::State& state) {
    const auto code = static_cast<uint32_t>(state.range(0));
    const auto width = static_cast<uint32_t>(state.range(1)), height = static_cast<uint32_t>(state.range(2));
    LevelScope level(state.range(3));
    const std::vector<uint8_t> host = HostFrame(code, width, height);
    FrameBuffer frame;
    if (FBNewFrameBuffer(width, height, &frame, kFormatPlanarFloat) != 0) {
        state.SkipWithError("allocation failed");
        return;
    }
    const ptrdiff_t rowBytes = static_cast<ptrdiff_t>(width) * HostBytesPerPixel(code);
    FBImportPixels(host.data(), rowBytes, code, &frame);  // fault the pages in before timing
    for (auto _ : state) {
        FBImportPixels(host.data(), rowBytes, code, &frame);
        benchmark::ClobberMemory();
    }
    SetPerPixel(state, static_cast<uint64_t>(width) * height);
    state.SetLabel(ConvertKernelsFor(CurrentConvertLevel())->name);
    FBDisposeFrameBuffer(&frame);
}

void BM_Export(benchmark::State& state) {
    const auto code = static_cast<uint32_t>(state.range(0));
    const auto width = static_cast<uint32_t>(state.range(1)), height = static_cast<uint32_t>(state.range(2));
    LevelScope level(state.range(3));
    std::vector<uint8_t> host = HostFrame(code, width, height);
    FrameBuffer frame;
    if (FBNewFrameBuffer(width, height, &frame, kFormatPlanarFloat) != 0) {
        state.SkipWithError("allocation failed");
        return;
    }
    const ptrdiff_t rowBytes = static_cast<ptrdiff_t>(width) * HostBytesPerPixel(code);
    FBImportPixels(host.data(), rowBytes, code, &frame);
    for (auto _ : state) {
        FBExportPixels(&frame, host.data(), rowBytes, code);
        benchmark::ClobberMemory();
    }
    SetPerPixel(state, static_cast<uint64_t>(width) * height);
    state.SetLabel(ConvertKernelsFor(CurrentConvertLevel())->name);
    FBDisposeFrameBuffer(&frame);
}

void BM_CopyAlpha(benchmark::State& state) {
    const auto code = static_cast<uint32_t>(state.range(0));
    const auto width = static_cast<uint32_t>(state.range(1)), height = static_cast<uint32_t>(state.range(2));
    const std::vector<uint8_t> in = HostFrame(code, width, height);
    std::vector<uint8_t> out(in.size());
    const ptrdiff_t rowBytes = static_cast<ptrdiff_t>(width) * HostBytesPerPixel(code);
    FBCopyAlpha(in.data(), rowBytes, out.data(), rowBytes, width, height, code);
    for (auto _ : state) {
        FBCopyAlpha(in.data(), rowBytes, out.data(), rowBytes, width, height, code);
        benchmark::ClobberMemory();
    }
    SetPerPixel(state, static_cast<uint64_t>(width) * height);
}

void Sizes(benchmark::internal::Benchmark* b) {
    for (int64_t code : {int64_t{kFormatArgb8}, int64_t{kFormatBgra8}, int64_t{kFormatVuya8}, int64_t{kFormatArgb16},
                         int64_t{kFormatArgbFloat}, int64_t{kFormatBgraFloat}, int64_t{kFormatVuyaFloat},
                         int64_t{kFormatYuv422_709}}) {
        b->Args({code, 1920, 1080, -1});
        b->Args({code, 3840, 2160, -1});
    }
    for (int64_t code : {int64_t{kFormatArgb8}, int64_t{kFormatArgb16}, int64_t{kFormatArgbFloat}}) {
        for (int64_t level = 0; level < 4; ++level) b->Args({code, 1920, 1080, level});
    }
    b->ArgNames({"code", "w", "h", "level"});
    b->Unit(benchmark::kMillisecond);
}

BENCHMARK(BM_Import)->Apply(Sizes);
BENCHMARK(BM_Export)->Apply(Sizes);
BENCHMARK(BM_CopyAlpha)
    ->Args({kFormatArgb8, 1920, 1080})
    ->Args({kFormatArgb8, 3840, 2160})
    ->Args({kFormatArgbFloat, 1920, 1080})
    ->ArgNames({"code", "w", "h"})
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace vt
