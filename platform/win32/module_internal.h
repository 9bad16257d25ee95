// The module instance handle, as the loader reported it.
#pragma once

#include <windows.h>

namespace vt::win32 {

// The module that holds this code: the effect's DLL, or the executable that links the platform
// layer statically (tests), which the loader never reports through DllMain.
HMODULE ModuleInstance();

}  // namespace vt::win32
