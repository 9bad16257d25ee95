// The "Parameters" arbitrary value and its two placeholder siblings, as the host handles them: the
// answers to the eleven arbitrary-data callbacks, keyframe interpolation of two settings records,
// the record's text form for printing and scanning, and the import of records stored by earlier
// versions (2,420, 2,532 and 18,404 bytes). The record functions work on plain bytes and records,
// so that a tool can call them without a host.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "engine/correction_settings.h"
#include "host/commands.h"
#include "sdk/ae_effect.h"

namespace vt {

struct Preferences;

inline constexpr char kTextProductWord[] = "Velatone";
inline constexpr size_t kPrintSize = 75565;  // announced for the printed text; it needs at most 75,516
inline constexpr size_t kScanFieldMax = 63;  // characters in one field of the text form

inline constexpr A_short kSettingsArbId = 1;
inline constexpr A_short kHueOffsetArbId = 45;
inline constexpr A_short kCurvesArbId = 104;
inline constexpr size_t kHueOffsetValueSize = 52;
inline constexpr size_t kCurvesValueSize = 4108;

inline constexpr size_t kSettingsV1Size = 2420;
inline constexpr size_t kSettingsV2Size = 2532;
inline constexpr size_t kSettingsV3Size = 18404;

// out = left, with the float fields of the tonal ranges, the three channel sets and the levels
// groups blended at t (0 at left, 1 at right) wherever left and right differ; each group that
// differs is switched on in out.
void InterpolateSettings(CorrectionSettings* out, const CorrectionSettings& left, const CorrectionSettings& right,
                         double t);

// Writes the text form of a value ("Velatone", "8389", then 8,389 words in lowercase hexadecimal,
// each field followed by a tab) and its terminating zero. A value shorter than a record prints as
// if zero-filled to a record's size. Returns the length without the zero, or 0 when capacity is
// below kPrintSize (nothing is written then).
size_t PrintSettingsText(std::span<const uint8_t> value, char* buffer, size_t capacity);

// Reads the text form into settings word by word; words not reached keep what settings holds.
// Reads no further than byteCount (or a zero byte). False when the text is not usable.
bool ScanSettingsText(const char* text, size_t byteCount, CorrectionSettings* settings);

// The record a flat value of the settings id stands for: a current record as it is, or an earlier
// version converted (defaults from prefs). False for any other size, with settings untouched.
bool UnflattenSettings(std::span<const uint8_t> flat, CorrectionSettings* settings, const Preferences& prefs);

// The arbitrary-data callback command, as the host's extra block describes it.
PF_Err ArbitraryCallback(PF_InData* in_data, PF_ParamDef* params[], PF_ArbParamsExtra* extra);

// The dispatch's handler for PF_Cmd_ARBITRARY_CALLBACK.
PF_Err HandleArbitraryCallback(const CommandContext& context);

}  // namespace vt
