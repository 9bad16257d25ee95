// Working storage of the table builders. Every allocation goes through one function so that an
// out-of-memory failure can be produced on demand and the "previous tables stay" paths tested.
#pragma once

#include <cstddef>
#include <memory>

namespace vt {

// Called before each allocation with the name of what is allocated ("curveArray", "masterLookup",
// ...); returning true makes that allocation fail. Process-wide; set only while no rebuild runs.
using EngineAllocationHook = bool (*)(const char* what, void* context);
void SetEngineAllocationHook(EngineAllocationHook hook, void* context);

// count floats, zero-filled, or null when the memory is not there (or the hook refuses it).
std::unique_ptr<float[]> AllocateFloats(size_t count, const char* what);

// Whether the hook refuses an allocation of what; for storage that is not a float array.
bool AllocationRefused(const char* what);

}  // namespace vt
