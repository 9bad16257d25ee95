// The conversion paths behind pixel_convert.h: one table of frame converters per processor
// target, all built from link/pixel_convert_portable.cpp, and the host layouts they index.
// Tests use it to run every path on the same buffers.
#pragma once

#include <cstddef>
#include <cstdint>

#include "link/frame_buffer.h"

namespace vt {

// The host layouts the conversions know, in table order.
enum class HostLayout : uint8_t {
    kArgb8,
    kBgra8,
    kArgb16,
    kArgbFloat,
    kBgraFloat,
    kVuya8,
    kVuyaFloat,
    kYuv422_601,
    kYuv422_709,
};
inline constexpr int kHostLayoutCount = 9;

// Table index of a host code, or -1 for codes the conversions do not know.
int HostLayoutIndex(uint32_t hostCode);

using ImportFrameFn = void (*)(const uint8_t* src, ptrdiff_t srcRowBytes, const FrameBuffer& frame);
using ExportFrameFn = void (*)(const FrameBuffer& frame, uint8_t* dst, ptrdiff_t dstRowBytes);
using CopyAlphaFn = void (*)(const uint8_t* in, ptrdiff_t inRowBytes, uint8_t* out, ptrdiff_t outRowBytes,
                             uint32_t width, uint32_t height);

// The frame functions expect a checked four-plane format-203 record; a null alpha entry means the
// layout has no alpha.
struct ConvertKernels {
    const char* name;
    ImportFrameFn importFrame[kHostLayoutCount];
    ExportFrameFn exportFrame[kHostLayoutCount];
    CopyAlphaFn copyAlpha[kHostLayoutCount];
};

// kScalar converts pixel by pixel and is the reference the vector paths must equal bit for bit.
enum class ConvertLevel : uint8_t { kScalar, kVector4, kAvx2, kAvx512 };

// The table of a level, or null when this processor cannot run it.
const ConvertKernels* ConvertKernelsFor(ConvertLevel level);

// Makes the public conversions use a level; false (and no change) when unsupported.
bool SetConvertLevel(ConvertLevel level);
ConvertLevel CurrentConvertLevel();

namespace convert_scalar {
extern const ConvertKernels kKernels;
}  // namespace convert_scalar
namespace convert_portable {
extern const ConvertKernels kKernels;
}  // namespace convert_portable
namespace convert_avx2 {
extern const ConvertKernels kKernels;
}  // namespace convert_avx2
namespace convert_avx512 {
extern const ConvertKernels kKernels;
}  // namespace convert_avx512

}  // namespace vt
