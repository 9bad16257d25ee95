// Dispatch of the pixel kernel: checks the frames, resolves the planes and runs the path chosen at
// setup. The path is process-wide, written once by InitEngineDispatch during global setup.
#include "engine/kernel.h"

#include <atomic>

#include "engine/kernel_paths_internal.h"
#include "engine/lookup_build.h"

namespace vt {

namespace {

#if defined(__x86_64__) || defined(_M_X64)
constexpr bool kX86 = true;
constexpr KernelPath kDefaultPath = KernelPath::kSse2;
#else
constexpr bool kX86 = false;
constexpr KernelPath kDefaultPath = KernelPath::kPortable;
#endif

std::atomic<KernelPath> g_path{kDefaultPath};

bool ProcessorHas(KernelPath path) {
#if defined(__x86_64__) || defined(_M_X64)
    __builtin_cpu_init();
    switch (path) {
        case KernelPath::kPortable:
        case KernelPath::kSse2: return true;
        case KernelPath::kAvx2: return __builtin_cpu_supports("avx2") && __builtin_cpu_supports("fma");
        case KernelPath::kAvx512: return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx2");
    }
    return false;
#else
    return path == KernelPath::kPortable;
#endif
}

// Floats per plane of a frame the kernel may work on, or 0 when it must leave the frame alone.
size_t UsableFloats(const FrameBuffer& frame) {
    if (frame.format != kFormatPlanarFloat || frame.data == nullptr || frame.planes != 4) return 0;
    const uint64_t bytes = static_cast<uint64_t>(frame.rowBytes) * frame.height;
    // Planes must not overlap, or correcting one would overwrite the next.
    if (bytes > frame.planeSize) return 0;
    return static_cast<size_t>(bytes / sizeof(float));
}

}  // namespace

void InitEngineDispatch() {
    KernelPath best = kDefaultPath;
    if (kX86) {
        if (ProcessorHas(KernelPath::kAvx2)) best = KernelPath::kAvx2;
        if (ProcessorHas(KernelPath::kAvx512)) best = KernelPath::kAvx512;
    }
    g_path.store(best);
}

KernelPath ActiveKernelPath() { return g_path.load(); }

bool KernelPathAvailable(KernelPath path) { return ProcessorHas(path); }

const char* KernelPathName(KernelPath path) {
    switch (path) {
        case KernelPath::kPortable: return "portable";
        case KernelPath::kSse2: return "sse2";
        case KernelPath::kAvx2: return "avx2";
        case KernelPath::kAvx512: return "avx512";
    }
    return "unknown";
}

void RunKernel(KernelPath path, const EngineParams* params, const FrameBuffer& source, FrameBuffer& destination) {
    const size_t sourceFloats = UsableFloats(source);
    const size_t destinationFloats = UsableFloats(destination);
    const size_t count = sourceFloats < destinationFloats ? sourceFloats : destinationFloats;
    if (count == 0) return;
    static const EngineParams kNoStages{};
    const EngineParams& p = params != nullptr ? *params : kNoStages;
    const KernelPlanes planes{{PlanePointer(source, 0), PlanePointer(source, 1), PlanePointer(source, 2)},
                              {PlanePointer(destination, 0), PlanePointer(destination, 1),
                               PlanePointer(destination, 2), PlanePointer(destination, 3)},
                              count};
    switch (path) {
        case KernelPath::kPortable: kernel_portable::CorrectPlanes(p, planes); break;
#if defined(__x86_64__) || defined(_M_X64)
        case KernelPath::kSse2: kernel_sse2::CorrectPlanes(p, planes); break;
        case KernelPath::kAvx2:
            if (ProcessorHas(path)) kernel_avx2::CorrectPlanes(p, planes);
            break;
        case KernelPath::kAvx512:
            if (ProcessorHas(path)) kernel_avx512::CorrectPlanes(p, planes);
            break;
#else
        default: break;
#endif
    }
}

void Correct(const FrameBuffer& source, FrameBuffer& destination) {
    // Held for the whole frame: a rebuild on another thread publishes a new set without freeing this one.
    const std::shared_ptr<const EngineSet> set = CurrentEngineSet();
    RunKernel(ActiveKernelPath(), set ? &set->params : nullptr, source, destination);
}

}  // namespace vt
