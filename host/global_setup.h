// Global setup and setdown: the life of GlobalState in the host's global-data handle.
#pragma once

#include "sdk/ae_effect.h"

namespace vt {

inline constexpr char kPluginName[] = "Orvane Velatone 3";

PF_Err GlobalSetup(PF_InData* in_data, PF_OutData* out_data);
PF_Err GlobalSetdown(PF_InData* in_data, PF_OutData* out_data);

}  // namespace vt
