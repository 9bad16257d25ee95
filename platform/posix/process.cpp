// The process's command line and executable, as /proc tells them, unless the hosting process
// presents another identity through its hooks.
#include "platform/process.h"

#include <dlfcn.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "platform/hooks_internal.h"

namespace vt {

namespace {

void CopyTerminated(char* buffer, size_t capacity, const char* text, size_t length) {
    if (capacity == 0) return;
    const size_t n = length < capacity - 1 ? length : capacity - 1;
    std::memcpy(buffer, text, n);
    buffer[n] = '\0';
}

}  // namespace

void GetProcessCommandLine(char* buffer, size_t capacity) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.haveCommandLine) {
        CopyTerminated(buffer, capacity, installed.commandLine.data(), installed.commandLine.size());
        return;
    }
    // /proc separates the arguments with NUL bytes; a Windows command line separates them with spaces.
    char text[4096];
    size_t length = 0;
    if (FILE* file = std::fopen("/proc/self/cmdline", "rb")) {
        length = std::fread(text, 1, sizeof text, file);
        std::fclose(file);
    }
    while (length > 0 && text[length - 1] == '\0') --length;
    for (size_t i = 0; i < length; ++i) {
        if (text[i] == '\0') text[i] = ' ';
    }
    CopyTerminated(buffer, capacity, text, length);
}

void GetProcessExecutablePath(char* buffer, size_t capacity) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.haveExecutablePath) {
        CopyTerminated(buffer, capacity, installed.executablePath.data(), installed.executablePath.size());
        return;
    }
    char path[4096];
    const ssize_t length = readlink("/proc/self/exe", path, sizeof path);
    CopyTerminated(buffer, capacity, path, length > 0 ? static_cast<size_t>(length) : 0);
}

void GetModuleFilePath(char* buffer, size_t capacity) {
    Dl_info info{};
    const char* path = "";
    if (dladdr(reinterpret_cast<void*>(&GetModuleFilePath), &info) != 0 && info.dli_fname) path = info.dli_fname;
    CopyTerminated(buffer, capacity, path, std::strlen(path));
}

}  // namespace vt

namespace vt {

void GetTempFolder(char* buffer, size_t capacity) {
    const char* folder = std::getenv("TMPDIR");
    if (!folder || !*folder) folder = "/tmp";
    CopyTerminated(buffer, capacity, folder, std::strlen(folder));
}

}  // namespace vt
