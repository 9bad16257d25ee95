// The hooks installed by the hosting process, as the Win32 backend keeps them.
#pragma once

#include <string>

#include "platform/host_hooks.h"

namespace vt::win32 {

struct InstalledHooks {
    VtPlatformHooks hooks{};
    bool haveCommandLine = false;
    bool haveExecutablePath = false;
    std::string commandLine;
    std::string executablePath;
};

// The current hooks; a copy, so that a concurrent install never tears a read.
InstalledHooks CurrentHooks();

}  // namespace vt::win32
