// The image resampler: cubic rescaling of one-channel float, four-channel 8-bit and four-channel
// float images by independent x and y factors over the whole image. The caller owns the work
// buffer: ask ResizeWorkSize first, then hand a buffer of at least that size to ResizeCubic.
#pragma once

#include <cstddef>
#include <cstdint>

namespace vt {

enum class ResampleKind : uint8_t { kFloat1, kByte4, kFloat4 };

// Statuses of ResizeCubic (0 is success).
inline constexpr int32_t kResampleOk = 0;
inline constexpr int32_t kResampleNullPointer = -1;
inline constexpr int32_t kResampleBadSize = -2;    // empty source, or rows shorter than the width
inline constexpr int32_t kResampleBadFactor = -3;  // not finite, not positive, or below kResampleMinFactor
inline constexpr int32_t kResampleSmallWorkBuffer = -4;

// Below this a filter would span more than 4096 source pixels.
inline constexpr double kResampleMinFactor = 1.0 / 1024;

struct ResampleImage {
    void* pixels;
    ptrdiff_t rowBytes;
    uint32_t width;
    uint32_t height;
};

// Bytes of work buffer ResizeCubic needs for these arguments; 0 when they are invalid.
size_t ResizeWorkSize(ResampleKind kind, uint32_t srcWidth, uint32_t srcHeight, uint32_t dstWidth,
                      uint32_t dstHeight, double xFactor, double yFactor);

// Resizes src into dst. Destination pixel (x, y) samples the source at ((x + 0.5) / xFactor - 0.5,
// (y + 0.5) / yFactor - 0.5), so pixel centres line up and nothing is shifted; the edges repeat.
// The kernel is the cubic convolution with a = -0.5; when a factor is below 1 it is stretched by
// 1 / factor so that shrinking averages rather than skips pixels. An empty destination is a
// success that writes nothing.
int32_t ResizeCubic(ResampleKind kind, const ResampleImage& src, const ResampleImage& dst, double xFactor,
                    double yFactor, void* work, size_t workSize);

// The cubic kernel itself, exposed for tests that evaluate resizes directly.
double CubicKernel(double t);

// Picks the processor-specific path where it pays. Called once from global setup; until then the
// portable path runs.
void InitResampleDispatch();

}  // namespace vt
