// Message boxes and debugger output through the system, unless the hosting process installed sinks
// for them: then messages go only to the sink (no box is shown), and debug lines go to the sink
// as well as to the debugger.
#include "platform/ui.h"

#include <windows.h>

#include "platform/hooks_internal.h"

namespace vt {

namespace {

static_assert(MB_ICONWARNING == 0x30 && MB_ICONERROR == 0x10 && MB_ICONINFORMATION == 0x40);

UINT IconOf(int kind) {
    switch (kind) {
        case kMessageWarning: return MB_ICONWARNING;
        case kMessageError: return MB_ICONERROR;
        case kMessageInfo: return MB_ICONINFORMATION;
        default: return 0;
    }
}

}  // namespace

void ShowMessage(const char* text, int kind) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.message) {
        installed.hooks.message(installed.hooks.context, text ? text : "", kind);
        return;
    }
    // No owner window and no caption: the system supplies its own "Error" title.
    MessageBoxA(nullptr, text ? text : "", nullptr, IconOf(kind));
}

void DebugOutput(const char* text) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.debug) installed.hooks.debug(installed.hooks.context, text ? text : "");
    OutputDebugStringA(text ? text : "");
}

void* GetForegroundWindowHandle() { return GetForegroundWindow(); }

// The about box itself is drawn by its own subsystem; until then a host's sink may stand in for it.
void ShowAboutDialog(void* owner) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.about) installed.hooks.about(installed.hooks.context, owner);
}

}  // namespace vt
