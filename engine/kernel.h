// The pixel kernel: applies the published correction to a planar float frame (format 203) in one
// pass, four pixels or more at a time. The processor path is chosen once at global setup.
#pragma once

#include <cstdint>

#include "engine/engine_params.h"
#include "link/frame_buffer.h"

namespace vt {

enum class KernelPath : uint8_t { kPortable = 0, kSse2 = 1, kAvx2 = 2, kAvx512 = 3 };

// Picks the widest path the processor (and its operating system) supports. Global setup calls it;
// until then x86-64 processors use SSE2 and others the portable path.
void InitEngineDispatch();

KernelPath ActiveKernelPath();
bool KernelPathAvailable(KernelPath path);
const char* KernelPathName(KernelPath path);

// Corrects source into destination (the render passes one frame as both) with the published set.
// Does nothing unless both are format-203 frames with four planes and at least one pixel.
void Correct(const FrameBuffer& source, FrameBuffer& destination);

// The same with a given parameter block and path; a null block applies no stage. For tests and
// benchmarks; an unavailable path does nothing.
void RunKernel(KernelPath path, const EngineParams* params, const FrameBuffer& source, FrameBuffer& destination);

}  // namespace vt
