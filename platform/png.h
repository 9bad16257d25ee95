// Decoding of the PNG images the panel draws. The decoder is started once at global setup.
#pragma once

#include <cstdint>

namespace vt {

inline constexpr int kDecoderStartupInputSize = 24;

// Starts the image decoder; startupInput is a zeroed block of kDecoderStartupInputSize bytes that
// the decoder may fill with its defaults. Returns false when the decoder is unavailable.
bool StartPngDecoding(unsigned char* startupInput, uintptr_t* token);

}  // namespace vt
