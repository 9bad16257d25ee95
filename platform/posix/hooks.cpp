// Storage of the hosting process's hooks and the exported function that installs them.
#include "platform/posix/hooks_internal.h"

#include <mutex>

namespace vt::posix {

namespace {
std::mutex g_hooksMutex;  // guards g_hooks
InstalledHooks g_hooks;
}  // namespace

InstalledHooks CurrentHooks() {
    std::lock_guard<std::mutex> guard(g_hooksMutex);
    return g_hooks;
}

}  // namespace vt::posix

extern "C" __attribute__((visibility("default"))) void VelatoneInstallPlatformHooks(const VtPlatformHooks* hooks) {
    using namespace vt::posix;
    InstalledHooks installed;
    if (hooks && hooks->size >= sizeof(VtPlatformHooks)) {
        installed.hooks = *hooks;
        installed.haveCommandLine = hooks->commandLine != nullptr;
        installed.haveExecutablePath = hooks->executablePath != nullptr;
        if (hooks->commandLine) installed.commandLine = hooks->commandLine;
        if (hooks->executablePath) installed.executablePath = hooks->executablePath;
        installed.hooks.commandLine = nullptr;
        installed.hooks.executablePath = nullptr;
    }
    std::lock_guard<std::mutex> guard(g_hooksMutex);
    g_hooks = installed;
}
