// The public conversions: argument checks, the one switch on the host layout per frame, and the
// choice of the processor path, made once at global setup.
#include "link/pixel_convert.h"

#include <atomic>

#include "link/pixel_convert_internal.h"

namespace vt {
namespace {

// Written by InitLinkDispatch (global setup) and by tests; read by every render thread.
std::atomic<const ConvertKernels*> g_kernels{&convert_portable::kKernels};
std::atomic<ConvertLevel> g_level{ConvertLevel::kVector4};

bool CpuHasAvx2() {
    __builtin_cpu_init();
    return __builtin_cpu_supports("avx2") && __builtin_cpu_supports("fma");
}

bool CpuHasAvx512() {
    __builtin_cpu_init();
    return CpuHasAvx2() && __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl");
}

const ConvertKernels& Kernels() {
    return *g_kernels.load(std::memory_order_acquire);
}

// A record the import and export may work on: four planes of whole rows of floats.
bool IsWorkingFrame(const FrameBuffer* f) {
    return f != nullptr && f->data != nullptr && f->format == kFormatPlanarFloat && f->planes >= 4 &&
           f->rowBytes % 4 == 0 && static_cast<uint64_t>(f->rowBytes) >= static_cast<uint64_t>(f->width) * 4 &&
           static_cast<uint64_t>(f->planeSize) >= static_cast<uint64_t>(f->rowBytes) * f->height;
}

}  // namespace

int HostLayoutIndex(uint32_t hostCode) {
    switch (hostCode) {
        case kFormatArgb8: return static_cast<int>(HostLayout::kArgb8);
        case kFormatBgra8: return static_cast<int>(HostLayout::kBgra8);
        case kFormatArgb16: return static_cast<int>(HostLayout::kArgb16);
        case kFormatArgbFloat: return static_cast<int>(HostLayout::kArgbFloat);
        case kFormatBgraFloat: return static_cast<int>(HostLayout::kBgraFloat);
        case kFormatVuya8: return static_cast<int>(HostLayout::kVuya8);
        case kFormatVuyaFloat: return static_cast<int>(HostLayout::kVuyaFloat);
        case kFormatYuv422_601: return static_cast<int>(HostLayout::kYuv422_601);
        case kFormatYuv422_709: return static_cast<int>(HostLayout::kYuv422_709);
        default: return -1;
    }
}

uint32_t HostBytesPerPixel(uint32_t hostCode) {
    switch (hostCode) {
        case kFormatArgb8:
        case kFormatBgra8:
        case kFormatVuya8:
        case kFormatYuv422_601:
        case kFormatYuv422_709: return 4;
        case kFormatArgb16: return 8;
        case kFormatArgbFloat:
        case kFormatBgraFloat:
        case kFormatVuyaFloat: return 16;
        default: return 0;
    }
}

const ConvertKernels* ConvertKernelsFor(ConvertLevel level) {
    switch (level) {
        case ConvertLevel::kScalar: return &convert_scalar::kKernels;
        case ConvertLevel::kVector4: return &convert_portable::kKernels;
        case ConvertLevel::kAvx2: return CpuHasAvx2() ? &convert_avx2::kKernels : nullptr;
        case ConvertLevel::kAvx512: return CpuHasAvx512() ? &convert_avx512::kKernels : nullptr;
    }
    return nullptr;
}

bool SetConvertLevel(ConvertLevel level) {
    const ConvertKernels* k = ConvertKernelsFor(level);
    if (k == nullptr) return false;
    g_kernels.store(k, std::memory_order_release);
    g_level.store(level, std::memory_order_relaxed);
    return true;
}

ConvertLevel CurrentConvertLevel() {
    return g_level.load(std::memory_order_relaxed);
}

void InitLinkDispatch() {
    // Eight-wide only: the conversions are bound by memory, and on the AVX-512 machine measured
    // the sixteen-wide build was no faster for the 8-bit and 16-bit layouts and slower for the
    // float ones (its cross-lane shuffles cost more than they save). It stays built and tested
    // for processors where that turns out otherwise.
    if (!SetConvertLevel(ConvertLevel::kAvx2)) SetConvertLevel(ConvertLevel::kVector4);
}

void FBImportPixels(const void* hostPixels, ptrdiff_t hostRowBytes, uint32_t hostCode, const FrameBuffer* frame) {
    const int layout = HostLayoutIndex(hostCode);
    if (layout < 0 || hostPixels == nullptr || !IsWorkingFrame(frame)) return;
    Kernels().importFrame[layout](static_cast<const uint8_t*>(hostPixels), hostRowBytes, *frame);
}

void FBExportPixels(const FrameBuffer* frame, void* hostPixels, ptrdiff_t hostRowBytes, uint32_t hostCode) {
    const int layout = HostLayoutIndex(hostCode);
    if (layout < 0 || hostPixels == nullptr || !IsWorkingFrame(frame)) return;
    Kernels().exportFrame[layout](*frame, static_cast<uint8_t*>(hostPixels), hostRowBytes);
}

void FBCopyAlpha(const void* inputPixels, ptrdiff_t inputRowBytes, void* outputPixels, ptrdiff_t outputRowBytes,
                 uint32_t width, uint32_t height, uint32_t hostCode) {
    const int layout = HostLayoutIndex(hostCode);
    if (layout < 0 || inputPixels == nullptr || outputPixels == nullptr) return;
    const CopyAlphaFn copy = Kernels().copyAlpha[layout];
    if (copy == nullptr) return;
    copy(static_cast<const uint8_t*>(inputPixels), inputRowBytes, static_cast<uint8_t*>(outputPixels),
         outputRowBytes, width, height);
}

}  // namespace vt
