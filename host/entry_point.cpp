// Command dispatch: one table says, for each command code, which lock it runs under and which
// handler answers it. Codes the table does not know are answered with 0 at once.
#include "host/entry_point.h"

#include <exception>
#include <new>

#include "host/commands.h"
#include "host/global_setup.h"
#include "host/global_state.h"
#include "platform/lock.h"
#include "platform/ui.h"

namespace vt {

namespace {

constexpr char kDialogMessage[] =
    "Please use the \"Full Interface\" button in the Velatone parameters. You may need to twirl open the "
    "parameters if they are not already open and displaying the Velatone logo and buttons.";

using Handler = PF_Err (*)(const CommandContext& context);

enum class Lock : uint8_t {
    kNone,          // global setup and setdown
    kEntry,         // entryLock around the handler
    kEntryGlobal,   // entryLock, and GlobalState's handle locked for the handler
    kGlobal,        // the classic render: GlobalState locked; the render takes renderLock itself
};

struct Command {
    PF_Cmd code;
    Lock lock;
    Handler handler;  // null: nothing to do, the answer is 0
};

PF_Err About(const CommandContext& context) {
    void* owner = GetForegroundWindowHandle();
    ShowAboutDialog(owner);
    if (context.out_data) context.out_data->return_msg[0] = '\0';
    return PF_Err_NONE;
}

PF_Err DoDialog(const CommandContext&) {
    ShowMessage(kDialogMessage, kMessageInfo);
    return PF_Err_NONE;
}

PF_Err Setup(const CommandContext& context) { return GlobalSetup(context.in_data, context.out_data); }
PF_Err Setdown(const CommandContext& context) { return GlobalSetdown(context.in_data, context.out_data); }

constexpr Command kCommands[] = {
    {PF_Cmd_ABOUT, Lock::kEntry, About},
    {PF_Cmd_GLOBAL_SETUP, Lock::kNone, Setup},
    {PF_Cmd_GLOBAL_SETDOWN, Lock::kNone, Setdown},
    {PF_Cmd_PARAMS_SETUP, Lock::kEntryGlobal, kParamsSetupHandler},
    {PF_Cmd_SEQUENCE_SETUP, Lock::kEntryGlobal, kSequenceSetupHandler},
    {PF_Cmd_SEQUENCE_RESETUP, Lock::kEntry, kSequenceResetupHandler},
    {PF_Cmd_SEQUENCE_FLATTEN, Lock::kEntry, kSequenceFlattenHandler},
    {PF_Cmd_SEQUENCE_SETDOWN, Lock::kEntry, kSequenceSetdownHandler},
    {PF_Cmd_DO_DIALOG, Lock::kEntry, DoDialog},
    {PF_Cmd_FRAME_SETUP, Lock::kEntry, nullptr},
    {PF_Cmd_RENDER, Lock::kGlobal, kRenderHandler},
    {PF_Cmd_FRAME_SETDOWN, Lock::kEntry, nullptr},
    {PF_Cmd_USER_CHANGED_PARAM, Lock::kEntryGlobal, kUserChangedParamHandler},
    {PF_Cmd_UPDATE_PARAMS_UI, Lock::kEntry, nullptr},
    {PF_Cmd_EVENT, Lock::kEntryGlobal, kEventHandler},
    {PF_Cmd_COMPLETELY_GENERAL, Lock::kEntryGlobal, kSettingsImportHandler},
    {PF_Cmd_QUERY_DYNAMIC_FLAGS, Lock::kEntryGlobal, nullptr},
    {PF_Cmd_ARBITRARY_CALLBACK, Lock::kEntry, kArbitraryCallbackHandler},
    {PF_Cmd_SMART_PRE_RENDER, Lock::kEntry, kSmartPreRenderHandler},
    {PF_Cmd_SMART_RENDER, Lock::kEntry, kSmartRenderHandler},
};

const Command* FindCommand(PF_Cmd code) {
    for (const Command& command : kCommands) {
        if (command.code == code) return &command;
    }
    return nullptr;
}

PF_Err RunHandler(const Command& command, CommandContext& context) {
    return command.handler ? command.handler(context) : PF_Err_NONE;
}

// Locks the global handle, takes the locks the command needs and runs its handler.
PF_Err Dispatch(const Command& command, CommandContext& context) {
    if (command.lock == Lock::kNone) return RunHandler(command, context);

    PF_InData* in_data = context.in_data;
    if (command.lock == Lock::kGlobal && !in_data) return RunHandler(command, context);
    // Every other command reaches its lock through the host's global data: without it there is
    // nothing to lock and no state to work on.
    if (!in_data || !in_data->global_data || !in_data->utils || !in_data->utils->host_lock_handle) {
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    }
    auto* global = static_cast<GlobalState*>(in_data->utils->host_lock_handle(in_data->global_data));
    if (!global) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    context.global = global;
    PF_Err err = PF_Err_NONE;
    if (command.lock == Lock::kGlobal) {
        err = RunHandler(command, context);
    } else {
        LockGuard entry(&global->entryLock);
        err = RunHandler(command, context);
    }
    in_data->utils->host_unlock_handle(in_data->global_data);
    return err;
}

}  // namespace

}  // namespace vt

extern "C" DllExport PF_Err EntryPointFunc(PF_Cmd cmd, PF_InData* in_data, PF_OutData* out_data, PF_ParamDef* params[],
                                           PF_LayerDef* output, void* extra) {
    const vt::Command* command = vt::FindCommand(cmd);
    if (!command) return PF_Err_NONE;
    vt::CommandContext context{in_data, out_data, params, output, extra, nullptr};
    try {
        return vt::Dispatch(*command, context);
    } catch (const std::bad_alloc&) {
        return PF_Err_OUT_OF_MEMORY;
    } catch (const std::exception& error) {
        vt::DebugLog("Velatone", "command %d failed: %s", static_cast<int>(cmd), error.what());
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    } catch (...) {
        vt::DebugLog("Velatone", "command %d failed", static_cast<int>(cmd));
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    }
}
