// The process's command line and executable, and the module's own file, as the system tells them,
// unless the hosting process presents another identity through its hooks.
#include "platform/process.h"

#include <windows.h>

#include <cstring>

#include "platform/hooks_internal.h"
#include "platform/win32/module_internal.h"

namespace vt {

namespace {

void CopyTerminated(char* buffer, size_t capacity, const char* text, size_t length) {
    if (capacity == 0) return;
    const size_t n = length < capacity - 1 ? length : capacity - 1;
    std::memcpy(buffer, text, n);
    buffer[n] = '\0';
}

// A path longer than the buffer is cut; older systems leave a cut path unterminated, so the
// terminator is always written here.
void ModuleFileName(HMODULE module, char* buffer, size_t capacity) {
    if (capacity == 0) return;
    const DWORD size = capacity > MAXDWORD ? MAXDWORD : static_cast<DWORD>(capacity);
    DWORD length = GetModuleFileNameA(module, buffer, size);
    if (length >= size) length = size - 1;
    buffer[length] = '\0';
}

}  // namespace

void GetProcessCommandLine(char* buffer, size_t capacity) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.haveCommandLine) {
        CopyTerminated(buffer, capacity, installed.commandLine.data(), installed.commandLine.size());
        return;
    }
    const char* line = GetCommandLineA();
    if (!line) line = "";
    CopyTerminated(buffer, capacity, line, std::strlen(line));
}

void GetProcessExecutablePath(char* buffer, size_t capacity) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.haveExecutablePath) {
        CopyTerminated(buffer, capacity, installed.executablePath.data(), installed.executablePath.size());
        return;
    }
    ModuleFileName(nullptr, buffer, capacity);
}

void GetModuleFilePath(char* buffer, size_t capacity) { ModuleFileName(win32::ModuleInstance(), buffer, capacity); }

void GetTempFolder(char* buffer, size_t capacity) {
    CopyTerminated(buffer, capacity, "", 0);
    char shortForm[MAX_PATH + 1];
    const DWORD shortLength = GetTempPathA(sizeof shortForm, shortForm);
    if (shortLength == 0 || shortLength >= sizeof shortForm) return;
    // The system may name the folder in its 8.3 form (C:\PROGRA~1\...); a folder that no longer
    // exists has no long form, and is given as the system named it.
    char longForm[MAX_PATH + 1];
    const DWORD longLength = GetLongPathNameA(shortForm, longForm, sizeof longForm);
    if (longLength > 0 && longLength < sizeof longForm) {
        CopyTerminated(buffer, capacity, longForm, longLength);
    } else {
        CopyTerminated(buffer, capacity, shortForm, shortLength);
    }
}

}  // namespace vt
