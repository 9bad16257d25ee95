// Message boxes and debugger output without a window system: both go to the hosting process's
// sinks when it installed them, else to standard error.
#include "platform/ui.h"

#include <cstdio>
#include <cstdlib>

#include "platform/hooks_internal.h"

namespace vt {

namespace {

const char* KindLabel(int kind) {
    switch (kind) {
        case kMessageWarning: return "warning";
        case kMessageError: return "error";
        case kMessageInfo: return "info";
        default: return "message";
    }
}

}  // namespace

void ShowMessage(const char* text, int kind) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.message) {
        installed.hooks.message(installed.hooks.context, text ? text : "", kind);
        return;
    }
    std::fprintf(stderr, "%s: %s\n", KindLabel(kind), text ? text : "");
}

void DebugOutput(const char* text) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.debug) installed.hooks.debug(installed.hooks.context, text ? text : "");
    if (std::getenv("VELATONE_DEBUG")) std::fputs(text ? text : "", stderr);
}

void* GetForegroundWindowHandle() { return nullptr; }

void ShowAboutDialog(void* owner) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.about) installed.hooks.about(installed.hooks.context, owner);
}

}  // namespace vt
