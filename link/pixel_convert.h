// Conversions between host pixels and the planar float working format 203: import before the
// correction, export after it, and the restoration of the host's alpha. Each runs one switch on
// the host's pixel format per frame and hands the frame to the row converters of the widest
// vector path this processor offers (chosen once by InitLinkDispatch).
#pragma once

#include <cstddef>
#include <cstdint>

#include "link/frame_buffer.h"

namespace vt {

// Host pixels (rows hostRowBytes apart; negative for bottom-up worlds) into the R, G, B and luma
// planes of a format-203 record; width and height come from the record. The padding columns of
// every plane row are cleared. Unknown codes, or a record that is not a four-plane format-203
// record, leave the record untouched.
void FBImportPixels(const void* hostPixels, ptrdiff_t hostRowBytes, uint32_t hostCode, const FrameBuffer* frame);

// A format-203 record into host pixels of hostCode; the whole record is written. Unknown codes,
// or a record that is not format 203, write nothing.
void FBExportPixels(const FrameBuffer* frame, void* hostPixels, ptrdiff_t hostRowBytes, uint32_t hostCode);

// Every output pixel takes its alpha from the same input pixel and keeps its colour channels.
// The 4:2:2 layouts carry no alpha: nothing is done for them, nor for unknown codes.
void FBCopyAlpha(const void* inputPixels, ptrdiff_t inputRowBytes, void* outputPixels, ptrdiff_t outputRowBytes,
                 uint32_t width, uint32_t height, uint32_t hostCode);

// Bytes one host pixel of the code occupies in a row (4, 8 or 16; 4 for the 4:2:2 layouts, whose
// pairs take eight bytes); 0 for codes the conversions do not know.
uint32_t HostBytesPerPixel(uint32_t hostCode);

// Picks the fastest conversion path the processor supports (AVX2 where present). Called once from
// global setup; until then the four-wide path every x86-64 processor has is used.
void InitLinkDispatch();

}  // namespace vt
