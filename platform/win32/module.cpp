// The DLL entry the loader calls: it remembers the module instance handle, which later reaches the
// module's own file name and resources.
#include "platform/win32/module_internal.h"

#include <atomic>

namespace vt::win32 {

namespace {
std::atomic<HINSTANCE> g_instance{nullptr};  // written by the loader, read by any thread
}  // namespace

HMODULE ModuleInstance() {
    if (HINSTANCE instance = g_instance.load(std::memory_order_relaxed)) return instance;
    HMODULE self = nullptr;
    GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       reinterpret_cast<LPCSTR>(&ModuleInstance), &self);
    return self;
}

}  // namespace vt::win32

// Stored on process attach and again on every thread attach: the handle is the same each time, and
// whichever notice comes first makes it available.
extern "C" BOOL WINAPI DllMain(HINSTANCE instance, DWORD reason, LPVOID /*reserved*/) {
    if (reason == DLL_PROCESS_ATTACH || reason == DLL_THREAD_ATTACH) {
        vt::win32::g_instance.store(instance, std::memory_order_relaxed);
    }
    return TRUE;
}
