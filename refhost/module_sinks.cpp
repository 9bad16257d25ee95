// Installing the reference host's sinks in a loaded module, through the one hook it exports.
#include "refhost/module_file.h"

#include "platform/host_hooks.h"

namespace refhost {

void InstallModuleSinks(const LoadedLibrary& library, const ModuleSinks& sinks) {
    auto install = reinterpret_cast<VtInstallPlatformHooksProc>(library.Symbol(VT_PLATFORM_HOOKS_SYMBOL));
    if (!install) return;
    VtPlatformHooks hooks{};
    hooks.size = sizeof hooks;
    hooks.context = sinks.context;
    hooks.message = sinks.message;
    hooks.debug = sinks.debug;
    hooks.about = sinks.about;
    hooks.commandLine = sinks.commandLine;
    hooks.executablePath = sinks.executablePath;
    hooks.fileDialog = sinks.fileDialog;
    install(&hooks);
}

}  // namespace refhost
