// The render path: the host's pixels into a planar float frame, the correction in place, and
// back into the host's output, for the smart render and the classic render alike.
#pragma once

#include <cstdint>

#include "host/commands.h"
#include "sdk/ae_effect.h"

namespace vt {

struct CorrectionSettings;
struct EngineSet;
struct GlobalState;

PF_Err SmartPreRender(const CommandContext& context);
PF_Err SmartRender(const CommandContext& context);
PF_Err Render(const CommandContext& context);

struct RenderArea {
    const uint8_t* inputPixels;
    ptrdiff_t inputRowBytes;
    uint8_t* outputPixels;
    ptrdiff_t outputRowBytes;
    int32_t width;
    int32_t height;
    int32_t inputX;
    int32_t inputY;
    int32_t outputX;
    int32_t outputY;
};

// Corrects one frame region with the given tables (the published ones when null); always 0
// (failures are told to the user and leave the output as it was).
PF_Err RenderFrame(const RenderArea& area, uint32_t formatCode, uint32_t bytesPerPixel, const EngineSet* tables,
                   GlobalState* global, const PF_InData* in_data);

}  // namespace vt
