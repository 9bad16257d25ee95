// The module-wide state, one per loaded module, kept in the host's global-data handle. The host
// owns the memory; the module locks the handle around each command that reads it.
#pragma once

#include <cstdint>

#include "host/host_id.h"
#include "platform/lock.h"
#include "platform/png.h"

struct SPBasicSuite;

namespace vt {

inline constexpr int kParamTableSize = 124;

struct GlobalState {
    const SPBasicSuite* basicSuite;  // every suite is acquired through it and released right after use
    HostCode hostId;
    void* lastSequence;      // sequence-data handle whose settings were last turned into tables
    uintptr_t lastApplyTag;  // written together with lastSequence by the settings apply
    uint32_t refCount;       // global setdown frees the handle at 0
    int32_t pluginId;        // from AEGP_RegisterWithAEGP
    uint32_t cineformMatrix;  // 1: 8-bit VUYA frames use the CineForm colour matrix
    uint8_t cineformPresent;
    uint8_t hasWorldSuite2;  // After Effects with "PF World Suite" version 2
    void* curveMenu;         // context menus, loaded at first use and kept
    void* hueWheelMenu;
    CriticalSection renderLock;  // serialises the classic render's per-frame work
    CriticalSection entryLock;   // taken around every command but global setup/setdown and the classic render
    uint32_t indexToId[kParamTableSize];
    uint32_t idToIndex[kParamTableSize];
    unsigned char decoderStartupInput[kDecoderStartupInputSize];
    uintptr_t decoderToken;
};

// Zero-filled host memory is a valid starting state for every field but the locks.
static_assert(sizeof(GlobalState) < 4096);

}  // namespace vt
