// The module's property list: the one table from which the PiPL bytes are built, and the values that
// global setup must report identically (version word, out-flags, names).
#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "sdk/ae_effect.h"
#include "sdk/pipl.h"

namespace vt {

constexpr char kEffectName[] = "Orvane Velatone 3";
constexpr char kEffectCategory[] = "Orvane";
constexpr char kEffectMatchName[] = "ORVANE VT Velatone 2";
constexpr char kEntryPointName[] = "EntryPointFunc";

// 3.0.10, release stage, build 292.
constexpr A_u_long kEffectVersion = 0x00185724;
static_assert(kEffectVersion == PF_Version(3, 0, 10, PF_Stage_RELEASE, 292));

constexpr uint16_t kEffectPiplVersionMajor = 2;
constexpr uint16_t kEffectPiplVersionMinor = 0;
constexpr uint16_t kEffectSpecVersionMajor = 13;
constexpr uint16_t kEffectSpecVersionMinor = 0;
constexpr uint16_t kEffectInfoFlags = 0;
constexpr uint32_t kEffectReservedInfo = 8;

constexpr PF_OutFlags kEffectGlobalOutFlags =
    PF_OutFlag_KEEP_RESOURCE_OPEN | PF_OutFlag_SEQUENCE_DATA_NEEDS_FLATTENING | PF_OutFlag_I_DO_DIALOG |
    PF_OutFlag_USE_OUTPUT_EXTENT | PF_OutFlag_PIX_INDEPENDENT | PF_OutFlag_CUSTOM_UI | PF_OutFlag_DEEP_COLOR_AWARE;
static_assert(kEffectGlobalOutFlags == 0x02008471);

// What global setup declares on a host with smart render (API 12.10 and later), which is every
// current host; older hosts are told only the query-dynamic-flags and collapsed-group bits.
constexpr PF_OutFlags2 kEffectGlobalOutFlags2 = PF_OutFlag2_SUPPORTS_QUERY_DYNAMIC_FLAGS |
                                                PF_OutFlag2_PARAM_GROUP_START_COLLAPSED_FLAG |
                                                PF_OutFlag2_SUPPORTS_SMART_RENDER | PF_OutFlag2_FLOAT_COLOR_AWARE;
static_assert(kEffectGlobalOutFlags2 == 0x00001409);

// In this order; the host reads the list before it loads the code.
inline constexpr std::array<PiplProperty, 12> kEffectPiplProperties = {{
    {kPiplKind, PiplU32(kPiplKindEffect)},
    {kPiplName, PiplPascalString(kEffectName)},
    {kPiplCategory, PiplPascalString(kEffectCategory)},
    {kPiplCodeWin64X86, PiplCString(kEntryPointName)},
    {kPiplPiplVersion, PiplU16Pair(kEffectPiplVersionMajor, kEffectPiplVersionMinor)},
    {kPiplEffectSpecVersion, PiplU16Pair(kEffectSpecVersionMajor, kEffectSpecVersionMinor)},
    {kPiplEffectVersion, PiplU32(kEffectVersion)},
    // Declared as a 16-bit value; padded to four bytes it is the same as a 32-bit zero.
    {kPiplEffectInfoFlags, PiplU16(kEffectInfoFlags)},
    {kPiplGlobalOutFlags, PiplU32(static_cast<uint32_t>(kEffectGlobalOutFlags))},
    {kPiplGlobalOutFlags2, PiplU32(static_cast<uint32_t>(kEffectGlobalOutFlags2))},
    {kPiplMatchName, PiplPascalString(kEffectMatchName)},
    {kPiplReservedInfo, PiplU32(kEffectReservedInfo)},
}};

inline constexpr auto kEffectPiplBytes = WritePipl<PiplSize(kEffectPiplProperties)>(kEffectPiplProperties);

// The same bytes through one out-of-line definition, for code that only needs a view.
std::span<const uint8_t> EffectPiplBytes();

}  // namespace vt
