// Host memory for the module's large blocks: through "AEGP Memory Suite" in After Effects, through
// the host's handle callbacks elsewhere. Blocks carry their handle in front of the address handed out.
#pragma once

#include <cstddef>

#include "sdk/ae_effect.h"

namespace vt {

struct GlobalState;

void* NewMemory(const GlobalState* global, const PF_InData* in_data, size_t size, const char* what);
void FreeMemory(const GlobalState* global, const PF_InData* in_data, void* handle);
void* LockMemory(const GlobalState* global, const PF_InData* in_data, void* handle);
void UnlockMemory(const GlobalState* global, const PF_InData* in_data, void* handle);

// A locked block of at least size bytes, 16 bytes into the allocation; null when the host refuses.
void* AllocateBlock(const GlobalState* global, const PF_InData* in_data, size_t size, const char* what);
// Unlocks and frees a block from AllocateBlock; a null pointer is ignored.
void FreeBlock(const GlobalState* global, const PF_InData* in_data, void* block);

}  // namespace vt
