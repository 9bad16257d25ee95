#include "host/memory.h"

#include <cstdint>
#include <cstring>

#include "host/global_state.h"
#include "host/suites.h"
#include "sdk/ae_suites.h"

namespace vt {

namespace {

constexpr size_t kBlockHeader = 16;  // the handle sits in the first 8 bytes; the data starts 16 bytes in

bool UsesAegpMemory(const GlobalState* global) {
    return global && global->hostId == kHostAfterEffects && global->basicSuite;
}

}  // namespace

void* NewMemory(const GlobalState* global, const PF_InData* in_data, size_t size, const char* what) {
    if (UsesAegpMemory(global)) {
        // The memory suite sizes are 32-bit: a larger block cannot be had there.
        if (size > UINT32_MAX) return nullptr;
        SuiteRef<AEGP_MemorySuite1> memory(global->basicSuite, kAEGPMemorySuite, kAEGPMemorySuiteVersion1);
        if (!memory) return nullptr;
        AEGP_MemHandle handle = nullptr;
        if (memory->AEGP_NewMemHandle(global->pluginId, what ? what : "", static_cast<AEGP_MemSize>(size),
                                      AEGP_MemFlag_NONE, &handle) != 0) {
            return nullptr;
        }
        return handle;
    }
    if (!in_data || !in_data->utils || !in_data->utils->host_new_handle) return nullptr;
    return in_data->utils->host_new_handle(size);
}

void FreeMemory(const GlobalState* global, const PF_InData* in_data, void* handle) {
    if (!handle) return;
    if (UsesAegpMemory(global)) {
        SuiteRef<AEGP_MemorySuite1> memory(global->basicSuite, kAEGPMemorySuite, kAEGPMemorySuiteVersion1);
        if (memory) memory->AEGP_FreeMemHandle(static_cast<AEGP_MemHandle>(handle));
        return;
    }
    if (in_data && in_data->utils && in_data->utils->host_dispose_handle) {
        in_data->utils->host_dispose_handle(static_cast<PF_Handle>(handle));
    }
}

void* LockMemory(const GlobalState* global, const PF_InData* in_data, void* handle) {
    if (!handle) return nullptr;
    if (UsesAegpMemory(global)) {
        SuiteRef<AEGP_MemorySuite1> memory(global->basicSuite, kAEGPMemorySuite, kAEGPMemorySuiteVersion1);
        void* pointer = nullptr;
        if (!memory || memory->AEGP_LockMemHandle(static_cast<AEGP_MemHandle>(handle), &pointer) != 0) return nullptr;
        return pointer;
    }
    if (!in_data || !in_data->utils || !in_data->utils->host_lock_handle) return nullptr;
    return in_data->utils->host_lock_handle(static_cast<PF_Handle>(handle));
}

void UnlockMemory(const GlobalState* global, const PF_InData* in_data, void* handle) {
    if (!handle) return;
    if (UsesAegpMemory(global)) {
        SuiteRef<AEGP_MemorySuite1> memory(global->basicSuite, kAEGPMemorySuite, kAEGPMemorySuiteVersion1);
        if (memory) memory->AEGP_UnlockMemHandle(static_cast<AEGP_MemHandle>(handle));
        return;
    }
    if (in_data && in_data->utils && in_data->utils->host_unlock_handle) {
        in_data->utils->host_unlock_handle(static_cast<PF_Handle>(handle));
    }
}

void* AllocateBlock(const GlobalState* global, const PF_InData* in_data, size_t size, const char* what) {
    if (size > SIZE_MAX - kBlockHeader) return nullptr;
    void* handle = NewMemory(global, in_data, size + kBlockHeader, what);
    if (!handle) return nullptr;
    auto* base = static_cast<uint8_t*>(LockMemory(global, in_data, handle));
    if (!base) {
        FreeMemory(global, in_data, handle);
        return nullptr;
    }
    std::memcpy(base, &handle, sizeof handle);
    return base + kBlockHeader;
}

void FreeBlock(const GlobalState* global, const PF_InData* in_data, void* block) {
    if (!block) return;
    void* handle = nullptr;
    std::memcpy(&handle, static_cast<uint8_t*>(block) - kBlockHeader, sizeof handle);
    UnlockMemory(global, in_data, handle);
    FreeMemory(global, in_data, handle);
}

}  // namespace vt
