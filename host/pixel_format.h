// Which pixel layout a host world holds, asked of the host's suites.
#pragma once

#include <cstdint>

#include "sdk/ae_effect.h"

namespace vt {

struct GlobalState;

// Sets the PixelFormatCode of the world and its bytes per pixel (4, 8 or 16). Returns 0, or 514
// when the host names a layout the module does not handle.
PF_Err QueryPixelFormat(const PF_EffectWorld* world, const GlobalState* global, uint32_t* code,
                        uint32_t* bytesPerPixel);

}  // namespace vt
