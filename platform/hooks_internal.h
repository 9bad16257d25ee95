// The hooks installed by the hosting process, as both backends keep them.
#pragma once

#include <string>

#include "platform/host_hooks.h"

namespace vt {

struct InstalledHooks {
    VtPlatformHooks hooks{};
    bool haveCommandLine = false;
    bool haveExecutablePath = false;
    std::string commandLine;
    std::string executablePath;
};

// The current hooks; a copy, so that a concurrent install never tears a read.
InstalledHooks CurrentHooks();

}  // namespace vt
