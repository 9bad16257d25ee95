// The hooks installed by the hosting process, as the POSIX backend keeps them.
#pragma once

#include <string>

#include "platform/host_hooks.h"

namespace vt::posix {

struct InstalledHooks {
    VtPlatformHooks hooks{};
    bool haveCommandLine = false;
    bool haveExecutablePath = false;
    std::string commandLine;
    std::string executablePath;
};

// The current hooks; a copy, so that a concurrent install never tears a read.
InstalledHooks CurrentHooks();

}  // namespace vt::posix
