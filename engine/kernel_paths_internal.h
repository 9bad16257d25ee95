// The kernel's processor-specific paths: one body (kernel_body_internal.h) compiled once per
// target into its own namespace. kernel.cpp picks one at setup; tests run each against the portable one.
#pragma once

#include <cstddef>

#include "engine/engine_params.h"

namespace vt {

// The planes of one frame pass: the same float index addresses every plane of both frames.
struct KernelPlanes {
    const float* source[3];   // R, G, B
    float* destination[4];    // R, G, B, luma
    size_t count;             // floats per plane
};

namespace kernel_portable {
void CorrectPlanes(const EngineParams& params, const KernelPlanes& planes);
// Evaluates the channel tail (see StageFlags::channelTail) at every level into three tables of
// 16,385 floats, with the kernel's own arithmetic; the lookup rebuild calls it once the tables the
// tail reads are final.
void ComposeChannelTails(const EngineParams& params, float* const tables[kColourCount]);
}  // namespace kernel_portable

namespace kernel_sse2 {
void CorrectPlanes(const EngineParams& params, const KernelPlanes& planes);
}  // namespace kernel_sse2

namespace kernel_avx2 {
void CorrectPlanes(const EngineParams& params, const KernelPlanes& planes);
}  // namespace kernel_avx2

namespace kernel_avx512 {
void CorrectPlanes(const EngineParams& params, const KernelPlanes& planes);
}  // namespace kernel_avx512

}  // namespace vt
