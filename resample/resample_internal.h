// What the resampler's dispatcher hands to the per-processor passes, and the passes themselves.
// The weights are built once in resample.cpp, so every path sees the same numbers.
#pragma once

#include <cstddef>
#include <cstdint>

#include "resample/resample.h"

namespace vt {

// One axis of a separable resize: output i reads taps source samples from start[i] on (always
// inside the source: edge repetition is folded into the weights), weighted by weights[i * taps + k].
struct ResizeAxis {
    uint32_t taps;
    const int32_t* start;
    const float* weights;
};

struct ResizeJob {
    ResampleKind kind;
    const uint8_t* src;
    ptrdiff_t srcRowBytes;
    uint32_t srcWidth;
    uint32_t srcHeight;
    uint8_t* dst;
    ptrdiff_t dstRowBytes;
    uint32_t dstWidth;
    uint32_t dstHeight;
    ResizeAxis x;
    ResizeAxis y;
    float* row;  // one source row after the vertical pass: srcWidth * channels floats
};

using ResizePassFn = void (*)(const ResizeJob& job);

enum class ResampleLevel : uint8_t { kPortable, kAvx2, kAvx512 };

// The passes of a level, or null when this processor cannot run them.
ResizePassFn ResizePassFor(ResampleLevel level);
bool SetResampleLevel(ResampleLevel level);
ResampleLevel CurrentResampleLevel();

namespace resample_portable {
void RunResize(const ResizeJob& job);
}  // namespace resample_portable
namespace resample_avx2 {
void RunResize(const ResizeJob& job);
}  // namespace resample_avx2
namespace resample_avx512 {
void RunResize(const ResizeJob& job);
}  // namespace resample_avx512

}  // namespace vt
