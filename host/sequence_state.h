// Per-instance state in the host's sequence-data handle. Its first 184 bytes are saved with
// projects; the handle of the last-applied settings copy lives there too but is never saved.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <type_traits>

#include "host/commands.h"
#include "sdk/ae_effect.h"

namespace vt {

struct CorrectionSettings;
struct EngineSet;
struct GlobalState;

struct SequenceState {
    PF_Handle frameSlot;       // always null in this design; freed if set
    uint32_t reserved8;
    uint32_t reserved12;
    uint32_t unused16;
    uint32_t reserved20;
    uint32_t unused24;
    uint8_t reserved28;
    uint8_t unused29[3];
    int32_t selectedPoint[4];  // the curve control's selected point per RGB curve; -1 none
    uint16_t buttonWords[6];
    uint8_t unused60[116];
    PF_Handle appliedCopy;     // 33,556 bytes: the settings last turned into tables for this instance
};

static_assert(sizeof(SequenceState) == 184);
static_assert(std::is_trivially_copyable_v<SequenceState>);
static_assert(offsetof(SequenceState, frameSlot) == 0);
static_assert(offsetof(SequenceState, reserved8) == 8);
static_assert(offsetof(SequenceState, reserved12) == 12);
static_assert(offsetof(SequenceState, unused16) == 16);
static_assert(offsetof(SequenceState, reserved20) == 20);
static_assert(offsetof(SequenceState, unused24) == 24);
static_assert(offsetof(SequenceState, reserved28) == 28);
static_assert(offsetof(SequenceState, selectedPoint) == 32);
static_assert(offsetof(SequenceState, buttonWords) == 48);
static_assert(offsetof(SequenceState, unused60) == 60);
static_assert(offsetof(SequenceState, appliedCopy) == 176);

// Sizes of the stored layouts this and earlier versions wrote.
inline constexpr size_t kSequenceStateSize = 184;
inline constexpr size_t kSequenceStateSize28 = 28;
inline constexpr size_t kSequenceStateSize176 = 176;
inline constexpr size_t kSequenceStateSizeWithSettings = 67304;

PF_Err SequenceSetup(const CommandContext& context);
PF_Err SequenceResetup(const CommandContext& context);
PF_Err SequenceFlatten(const CommandContext& context);
PF_Err SequenceSetdown(const CommandContext& context);

// Copies the slider, checkbox and popup values into settings.
void ParamsToSettings(CorrectionSettings* settings, PF_ParamDef** params, const GlobalState* global);
// The inverse copy; marks every parameter whose value changes.
void SettingsToParams(const CorrectionSettings& settings, PF_ParamDef** params, const GlobalState* global);
// Tells the host that the "Parameters" value (and "Video System") changed.
void MarkSettingsChanged(const GlobalState* global, PF_ParamDef** params);

PF_Err UserChangedParam(const CommandContext& context);

// Rebuilds the lookup tables from settings unless this instance's last build used the same bytes,
// and returns the table set that corresponds to them, for the render to correct with. Renders on
// other threads may publish newer sets meanwhile; the returned one stays valid while it is held.
std::shared_ptr<const EngineSet> ApplySettings(PF_Handle sequence, CorrectionSettings* settings, GlobalState* global,
                                               const PF_InData* in_data);

}  // namespace vt
