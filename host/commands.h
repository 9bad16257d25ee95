// What every command handler receives, and the handlers of the commands whose subsystems are
// built on top of this dispatch. A null handler answers 0.
#pragma once

#include "sdk/ae_effect.h"

namespace vt {

struct GlobalState;

struct CommandContext {
    PF_InData* in_data;
    PF_OutData* out_data;
    PF_ParamDef** params;
    PF_LayerDef* output;
    void* extra;
    GlobalState* global;  // locked for the handler; null for global setup and setdown
};

using CommandHandler = PF_Err (*)(const CommandContext& context);

inline constexpr CommandHandler kParamsSetupHandler = nullptr;
inline constexpr CommandHandler kSequenceSetupHandler = nullptr;
inline constexpr CommandHandler kSequenceResetupHandler = nullptr;
inline constexpr CommandHandler kSequenceFlattenHandler = nullptr;
inline constexpr CommandHandler kSequenceSetdownHandler = nullptr;
inline constexpr CommandHandler kRenderHandler = nullptr;
inline constexpr CommandHandler kUserChangedParamHandler = nullptr;
inline constexpr CommandHandler kEventHandler = nullptr;
inline constexpr CommandHandler kSettingsImportHandler = nullptr;
inline constexpr CommandHandler kArbitraryCallbackHandler = nullptr;
inline constexpr CommandHandler kSmartPreRenderHandler = nullptr;
inline constexpr CommandHandler kSmartRenderHandler = nullptr;

}  // namespace vt
