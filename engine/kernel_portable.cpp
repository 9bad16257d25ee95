// The kernel body compiled for the portable target (see CMakeLists.txt for its flags), and the
// composing of the channel tail tables with that body's arithmetic, the reference every path matches.
#include "engine/curves.h"
#include "engine/kernel_paths_internal.h"

#define VT_KERNEL_PORTABLE 1
#define VT_KERNEL_NS kernel_portable
#include "engine/kernel_body_internal.h"

namespace vt {
namespace kernel_portable {

void ComposeChannelTails(const EngineParams& params, float* const tables[kColourCount]) {
    for (int c = 0; c < kColourCount; ++c) {
        for (int i = 0; i < kLookupSize; i += kLanes) {
            // Level i / 16384 is exact in float and reads entry i again.
            F level;
            for (int l = 0; l < kLanes; ++l) {
                level.v[l] = static_cast<float>(i + l < kLookupSize ? i + l : kLookupSteps) * (1.0f / kLookupSteps);
            }
            const F out = ChannelTailSteps(params, c, level, params.flags.channelTail);
            for (int l = 0; l < kLanes && i + l < kLookupSize; ++l) tables[c][i + l] = out.v[l];
        }
    }
}

}  // namespace kernel_portable
}  // namespace vt
