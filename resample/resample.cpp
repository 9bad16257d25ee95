// The resampler's front: argument checks, the work-buffer layout, the per-axis weights (built
// here in double precision, the same for every processor path) and the choice of the path.
#include "resample/resample.h"

#include <atomic>
#include <cmath>
#include <cstring>

#include "resample/resample_internal.h"

namespace vt {
namespace {

// Written by InitResampleDispatch (global setup) and tests; read by every resize.
std::atomic<ResizePassFn> g_pass{resample_portable::RunResize};
std::atomic<ResampleLevel> g_level{ResampleLevel::kPortable};

constexpr size_t kAlign = 64;
constexpr double kCubicA = -0.5;

size_t AlignUp(size_t n) {
    return (n + kAlign - 1) & ~(kAlign - 1);
}

uint32_t Channels(ResampleKind kind) {
    return kind == ResampleKind::kFloat1 ? 1 : 4;
}

uint32_t BytesPerPixel(ResampleKind kind) {
    return kind == ResampleKind::kFloat4 ? 16 : 4;
}

bool ValidFactor(double factor) {
    return std::isfinite(factor) && factor >= kResampleMinFactor;
}

// Source samples one output reads before edge folding: the kernel spans 4 / scale samples.
uint32_t FullTaps(double factor) {
    const double scale = factor < 1.0 ? factor : 1.0;
    return static_cast<uint32_t>(std::ceil(4.0 / scale));
}

uint32_t Taps(uint32_t srcSize, double factor) {
    const uint32_t taps = FullTaps(factor);
    return taps < srcSize ? taps : srcSize;
}

struct Layout {
    size_t xStart, xWeights, yStart, yWeights, row, total;
};

Layout MakeLayout(ResampleKind kind, uint32_t srcWidth, uint32_t srcHeight, uint32_t dstWidth, uint32_t dstHeight,
                  uint32_t tapsX, uint32_t tapsY) {
    Layout l{};
    size_t at = 0;
    l.xStart = at;
    at += AlignUp(sizeof(int32_t) * dstWidth);
    l.xWeights = at;
    at += AlignUp(sizeof(float) * static_cast<size_t>(dstWidth) * tapsX);
    l.yStart = at;
    at += AlignUp(sizeof(int32_t) * dstHeight);
    l.yWeights = at;
    at += AlignUp(sizeof(float) * static_cast<size_t>(dstHeight) * tapsY);
    l.row = at;
    at += AlignUp(sizeof(float) * static_cast<size_t>(srcWidth) * Channels(kind));
    l.total = at + kAlign;  // room to align the caller's buffer
    (void)srcHeight;
    return l;
}

// Output i of the axis samples the source at (i + 0.5) / factor - 0.5. Samples past an edge take
// the edge's value, which here means adding their weight to the edge sample's, so the passes
// never read outside the image.
void BuildAxis(uint32_t srcSize, uint32_t dstSize, double factor, uint32_t taps, int32_t* start, float* weights,
               double* scratch) {
    const double scale = factor < 1.0 ? factor : 1.0;
    const double radius = 2.0 / scale;
    const uint32_t fullTaps = FullTaps(factor);
    const int64_t last = static_cast<int64_t>(srcSize) - 1;
    for (uint32_t i = 0; i < dstSize; ++i) {
        const double centre = (i + 0.5) / factor - 0.5;
        const int64_t first = static_cast<int64_t>(std::floor(centre - radius)) + 1;
        int64_t folded = first < 0 ? 0 : first;
        if (folded > srcSize - static_cast<int64_t>(taps)) folded = srcSize - static_cast<int64_t>(taps);
        std::memset(scratch, 0, sizeof(double) * taps);
        double sum = 0.0;
        for (uint32_t k = 0; k < fullTaps; ++k) {
            const int64_t j = first + k;
            const double w = CubicKernel((static_cast<double>(j) - centre) * scale);
            if (w == 0.0) continue;
            const int64_t clamped = j < 0 ? 0 : (j > last ? last : j);
            scratch[clamped - folded] += w;
            sum += w;
        }
        if (sum == 0.0) {  // cannot happen for this kernel; keeps the output defined regardless
            scratch[0] = 1.0;
            sum = 1.0;
        }
        start[i] = static_cast<int32_t>(folded);
        for (uint32_t k = 0; k < taps; ++k) weights[static_cast<size_t>(i) * taps + k] = static_cast<float>(scratch[k] / sum);
    }
}

bool CpuHasAvx2() {
    __builtin_cpu_init();
    return __builtin_cpu_supports("avx2") && __builtin_cpu_supports("fma");
}

bool CpuHasAvx512() {
    return CpuHasAvx2() && __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl");
}

}  // namespace

double CubicKernel(double t) {
    const double x = std::fabs(t);
    if (x < 1.0) return ((kCubicA + 2.0) * x - (kCubicA + 3.0)) * x * x + 1.0;
    if (x < 2.0) return ((kCubicA * x - 5.0 * kCubicA) * x + 8.0 * kCubicA) * x - 4.0 * kCubicA;
    return 0.0;
}

size_t ResizeWorkSize(ResampleKind kind, uint32_t srcWidth, uint32_t srcHeight, uint32_t dstWidth,
                      uint32_t dstHeight, double xFactor, double yFactor) {
    if (srcWidth == 0 || srcHeight == 0 || !ValidFactor(xFactor) || !ValidFactor(yFactor)) return 0;
    const uint32_t tapsX = Taps(srcWidth, xFactor), tapsY = Taps(srcHeight, yFactor);
    const uint32_t maxTaps = tapsX > tapsY ? tapsX : tapsY;
    // The weights are summed in doubles before they are stored: that scratch lives at the end.
    return MakeLayout(kind, srcWidth, srcHeight, dstWidth, dstHeight, tapsX, tapsY).total +
           sizeof(double) * maxTaps;
}

int32_t ResizeCubic(ResampleKind kind, const ResampleImage& src, const ResampleImage& dst, double xFactor,
                    double yFactor, void* work, size_t workSize) {
    if (dst.width == 0 || dst.height == 0) return kResampleOk;
    if (src.pixels == nullptr || dst.pixels == nullptr) return kResampleNullPointer;
    if (src.width == 0 || src.height == 0) return kResampleBadSize;
    const uint32_t bpp = BytesPerPixel(kind);
    if (src.rowBytes < 0 || static_cast<uint64_t>(src.rowBytes) < static_cast<uint64_t>(src.width) * bpp ||
        dst.rowBytes < 0 || static_cast<uint64_t>(dst.rowBytes) < static_cast<uint64_t>(dst.width) * bpp) {
        return kResampleBadSize;
    }
    if (!ValidFactor(xFactor) || !ValidFactor(yFactor)) return kResampleBadFactor;
    const size_t needed = ResizeWorkSize(kind, src.width, src.height, dst.width, dst.height, xFactor, yFactor);
    if (work == nullptr) return kResampleNullPointer;
    if (workSize < needed) return kResampleSmallWorkBuffer;

    const uint32_t tapsX = Taps(src.width, xFactor), tapsY = Taps(src.height, yFactor);
    const Layout layout = MakeLayout(kind, src.width, src.height, dst.width, dst.height, tapsX, tapsY);
    const uintptr_t raw = reinterpret_cast<uintptr_t>(work);
    uint8_t* base = static_cast<uint8_t*>(work) + ((kAlign - raw % kAlign) % kAlign);
    double* scratch = reinterpret_cast<double*>(base + layout.total - kAlign);

    ResizeJob job{};
    job.kind = kind;
    job.src = static_cast<const uint8_t*>(src.pixels);
    job.srcRowBytes = src.rowBytes;
    job.srcWidth = src.width;
    job.srcHeight = src.height;
    job.dst = static_cast<uint8_t*>(dst.pixels);
    job.dstRowBytes = dst.rowBytes;
    job.dstWidth = dst.width;
    job.dstHeight = dst.height;
    auto* xStart = reinterpret_cast<int32_t*>(base + layout.xStart);
    auto* xWeights = reinterpret_cast<float*>(base + layout.xWeights);
    auto* yStart = reinterpret_cast<int32_t*>(base + layout.yStart);
    auto* yWeights = reinterpret_cast<float*>(base + layout.yWeights);
    BuildAxis(src.width, dst.width, xFactor, tapsX, xStart, xWeights, scratch);
    BuildAxis(src.height, dst.height, yFactor, tapsY, yStart, yWeights, scratch);
    job.x = {tapsX, xStart, xWeights};
    job.y = {tapsY, yStart, yWeights};
    job.row = reinterpret_cast<float*>(base + layout.row);
    g_pass.load(std::memory_order_acquire)(job);
    return kResampleOk;
}

ResizePassFn ResizePassFor(ResampleLevel level) {
    switch (level) {
        case ResampleLevel::kPortable: return resample_portable::RunResize;
        case ResampleLevel::kAvx2: return CpuHasAvx2() ? resample_avx2::RunResize : nullptr;
        case ResampleLevel::kAvx512: return CpuHasAvx512() ? resample_avx512::RunResize : nullptr;
    }
    return nullptr;
}

bool SetResampleLevel(ResampleLevel level) {
    const ResizePassFn pass = ResizePassFor(level);
    if (pass == nullptr) return false;
    g_pass.store(pass, std::memory_order_release);
    g_level.store(level, std::memory_order_relaxed);
    return true;
}

ResampleLevel CurrentResampleLevel() {
    return g_level.load(std::memory_order_relaxed);
}

void InitResampleDispatch() {
    if (!SetResampleLevel(ResampleLevel::kAvx512) && !SetResampleLevel(ResampleLevel::kAvx2)) {
        SetResampleLevel(ResampleLevel::kPortable);
    }
}

}  // namespace vt
