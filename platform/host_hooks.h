// The one hook the module exports besides its entry point: the hosting process (the reference host,
// the tests) installs sinks for message boxes, debugger output, the about box and file dialogs, and may present
// another process identity (command line and executable path) to the module's host identification.
// Plain C so that a host can resolve it with dlsym or GetProcAddress. A real host never calls it,
// and the module then uses the system's own services.
#pragma once

#include <stdint.h>

extern "C" {

struct VtPlatformHooks {
    uint32_t size;  // sizeof(VtPlatformHooks), for later growth
    void* context;
    void (*message)(void* context, const char* text, int kind);  // null: print to standard error
    void (*debug)(void* context, const char* line);              // null: standard error when VELATONE_DEBUG is set
    void (*about)(void* context, void* owner);                   // null: nothing is shown
    const char* commandLine;     // null: the real command line
    const char* executablePath;  // null: the real executable
    // Answers an open (save = 0) or save (save = 1) file dialog: the chosen path, kept by the host
    // until its next answer, or null for cancel. filter holds description|pattern pairs
    // ("Curve Files|*.acv|All Documents|*.*"). Null: every dialog is cancelled (POSIX) or shown by
    // the system (Windows).
    const char* (*fileDialog)(void* context, int save, const char* filter, const char* title);
};

// Name of the exported function, for dlsym and GetProcAddress.
#define VT_PLATFORM_HOOKS_SYMBOL "VelatoneInstallPlatformHooks"
typedef void (*VtInstallPlatformHooksProc)(const VtPlatformHooks* hooks);

}  // extern "C"
