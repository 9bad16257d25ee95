// Storage of the hosting process's hooks and the exported function that installs them. A real host
// never installs any; the reference host and the tests do, so that messages are recorded instead of
// shown and a host identity can be presented.
#include "platform/win32/hooks_internal.h"

#include <windows.h>

namespace vt::win32 {

namespace {

// A slim reader/writer lock needs no initialisation call, so it is usable before any setup runs.
SRWLOCK g_hooksLock = SRWLOCK_INIT;  // guards g_hooks
InstalledHooks g_hooks;

}  // namespace

InstalledHooks CurrentHooks() {
    AcquireSRWLockShared(&g_hooksLock);
    InstalledHooks copy = g_hooks;
    ReleaseSRWLockShared(&g_hooksLock);
    return copy;
}

}  // namespace vt::win32

extern "C" __declspec(dllexport) void VelatoneInstallPlatformHooks(const VtPlatformHooks* hooks) {
    using namespace vt::win32;
    InstalledHooks installed;
    if (hooks && hooks->size >= sizeof(VtPlatformHooks)) {
        installed.hooks = *hooks;
        installed.haveCommandLine = hooks->commandLine != nullptr;
        installed.haveExecutablePath = hooks->executablePath != nullptr;
        if (hooks->commandLine) installed.commandLine = hooks->commandLine;
        if (hooks->executablePath) installed.executablePath = hooks->executablePath;
        // The texts live in the copies above; the caller's pointers may not outlive this call.
        installed.hooks.commandLine = nullptr;
        installed.hooks.executablePath = nullptr;
    }
    AcquireSRWLockExclusive(&g_hooksLock);
    g_hooks = std::move(installed);
    ReleaseSRWLockExclusive(&g_hooksLock);
}
