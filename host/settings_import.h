// The general-purpose command through which another plug-in hands over a whole settings record.
#pragma once

#include <cstddef>
#include <cstdint>

#include "host/commands.h"

namespace vt {

// The request record the caller passes as the command's extra block.
struct SettingsImportRequest {
    uint32_t command;  // 0: import; anything else is not understood and left untouched
    int32_t result;    // written by the module: 0 done, -2 no sequence data, -3 wrong size or no data
    uint32_t size;
    const void* data;
};
static_assert(sizeof(SettingsImportRequest) == 24);
static_assert(offsetof(SettingsImportRequest, result) == 4);
static_assert(offsetof(SettingsImportRequest, size) == 8);
static_assert(offsetof(SettingsImportRequest, data) == 16);

inline constexpr int32_t kImportNoSequenceData = -2;
inline constexpr int32_t kImportBadRecord = -3;

// Copies the request's record over the "Parameters" value; the entry point's answer is always 0.
PF_Err ImportSettings(const CommandContext& context);

}  // namespace vt
