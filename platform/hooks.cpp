// Storage of the hosting process's hooks and the exported function that installs them. A real host
// never installs any; the reference host and the tests do, so that messages are recorded instead of
// shown and a host identity can be presented.
#include "platform/hooks_internal.h"

#include <mutex>

#include "sdk/ae_config.h"

namespace vt {

namespace {
std::mutex g_hooksMutex;  // guards g_hooks; constant-initialised, so usable before any setup runs
InstalledHooks g_hooks;
}  // namespace

InstalledHooks CurrentHooks() {
    std::lock_guard<std::mutex> guard(g_hooksMutex);
    return g_hooks;
}

}  // namespace vt

extern "C" DllExport void VelatoneInstallPlatformHooks(const VtPlatformHooks* hooks) {
    vt::InstalledHooks installed;
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
    std::lock_guard<std::mutex> guard(vt::g_hooksMutex);
    vt::g_hooks = std::move(installed);
}
