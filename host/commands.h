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

PF_Err ParamsSetup(const CommandContext& context);
PF_Err SequenceSetup(const CommandContext& context);
PF_Err SequenceResetup(const CommandContext& context);
PF_Err SequenceFlatten(const CommandContext& context);
PF_Err SequenceSetdown(const CommandContext& context);
PF_Err Render(const CommandContext& context);
PF_Err UserChangedParam(const CommandContext& context);
PF_Err ImportSettings(const CommandContext& context);
PF_Err SmartPreRender(const CommandContext& context);
PF_Err SmartRender(const CommandContext& context);
PF_Err HandleArbitraryCallback(const CommandContext& context);

inline constexpr CommandHandler kParamsSetupHandler = ParamsSetup;
inline constexpr CommandHandler kSequenceSetupHandler = SequenceSetup;
inline constexpr CommandHandler kSequenceResetupHandler = SequenceResetup;
inline constexpr CommandHandler kSequenceFlattenHandler = SequenceFlatten;
inline constexpr CommandHandler kSequenceSetdownHandler = SequenceSetdown;
inline constexpr CommandHandler kRenderHandler = Render;
inline constexpr CommandHandler kUserChangedParamHandler = UserChangedParam;
inline constexpr CommandHandler kEventHandler = nullptr;
inline constexpr CommandHandler kSettingsImportHandler = ImportSettings;
inline constexpr CommandHandler kArbitraryCallbackHandler = HandleArbitraryCallback;
inline constexpr CommandHandler kSmartPreRenderHandler = SmartPreRender;
inline constexpr CommandHandler kSmartRenderHandler = SmartRender;

}  // namespace vt
