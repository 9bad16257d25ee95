// The module's one exported function: the host calls it with a command code and its blocks.
#pragma once

#include "sdk/ae_effect.h"

extern "C" DllExport PF_Err EntryPointFunc(PF_Cmd cmd, PF_InData* in_data, PF_OutData* out_data, PF_ParamDef* params[],
                                           PF_LayerDef* output, void* extra);
