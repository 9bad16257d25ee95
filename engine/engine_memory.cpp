// Allocation of the engine's working storage, with the failure hook for tests.
#include "engine/engine_memory.h"

#include <new>

namespace vt {

namespace {
// Written only by tests, between rebuilds; read by the rebuilding thread.
EngineAllocationHook g_hook = nullptr;
void* g_hookContext = nullptr;
}  // namespace

void SetEngineAllocationHook(EngineAllocationHook hook, void* context) {
    g_hook = hook;
    g_hookContext = context;
}

bool AllocationRefused(const char* what) { return g_hook != nullptr && g_hook(what, g_hookContext); }

std::unique_ptr<float[]> AllocateFloats(size_t count, const char* what) {
    if (AllocationRefused(what)) return nullptr;
    return std::unique_ptr<float[]>(new (std::nothrow) float[count]());
}

}  // namespace vt
