#include "host/sequence_state.h"

#include <array>
#include <cstdio>
#include <cstring>
#include <mutex>

#include "engine/correction_settings.h"
#include "engine/lookup_build.h"
#include "files/preferences.h"
#include "host/global_state.h"
#include "host/locked_handle.h"
#include "host/params.h"

namespace vt {

namespace {

// Which settings field each slider, checkbox and popup fills.
struct FieldLink {
    uint32_t id;
    uint32_t offset;
    bool isFloat;
};

consteval std::array<FieldLink, 95> BuildFieldLinks() {
    std::array<FieldLink, 95> links{};
    int n = 0;
    // HSL ranges: hue, saturation, vibrance, brightness, contrast, centre, gain, gamma, pedestal.
    for (uint32_t range = 0; range < 4; ++range) {
        const uint32_t base = 4 + 10 * range;
        const uint32_t ids[9] = {base + 1, base + 2, 119 + range, base + 3, base + 4,
                                 base + 5, base + 6, base + 7,    base + 8};
        for (uint32_t k = 0; k < 9; ++k) links[n++] = {ids[k], 16 + 40 * range + 4 * k, true};
    }
    // RGB ranges: for each channel gain, gamma, pedestal (the sliders come gamma, pedestal, gain).
    for (uint32_t range = 0; range < 4; ++range) {
        const uint32_t base = 47 + 14 * range;
        for (uint32_t channel = 0; channel < 4; ++channel) {
            const uint32_t first = base + 1 + 3 * channel;
            const uint32_t offset = 180 + 52 * range + 12 * channel;
            links[n++] = {first + 2, offset, true};
            links[n++] = {first, offset + 4, true};
            links[n++] = {first + 1, offset + 8, true};
        }
    }
    links[n++] = {107, 33384, true};
    links[n++] = {108, 33388, true};
    links[n++] = {109, 33392, true};
    links[n++] = {110, 33396, false};
    links[n++] = {111, 33400, true};
    links[n++] = {112, 33404, true};
    links[n++] = {113, 33408, true};
    links[n++] = {114, 33412, false};
    links[n++] = {115, 33416, false};
    links[n++] = {116, 33380, false};
    links[n++] = {106, 33376, false};
    if (n != 95) throw "every linked parameter has a field";
    return links;
}

constexpr std::array<FieldLink, 95> kFieldLinks = BuildFieldLinks();
static_assert(offsetof(CorrectionSettings, tonal[0].hue) == 16);
static_assert(offsetof(CorrectionSettings, rgbSet.range[0].channel[0]) == 180);

// Enable words a slider change switches on (byte offsets in the settings).
struct SectionEnables {
    uint32_t firstId;
    uint32_t lastId;
    uint32_t extraId;  // Vibrance of the range, outside the contiguous ids; 0 for none
    std::array<uint32_t, 3> offsets;
    int count;
};

constexpr SectionEnables kSectionEnables[] = {
    {5, 12, 119, {4, 8, 12}, 3},    {15, 22, 120, {4, 8, 52}, 3},  {25, 32, 121, {4, 8, 92}, 3},
    {35, 42, 122, {4, 8, 132}, 3},  {48, 59, 0, {172, 176, 0}, 2}, {62, 73, 0, {172, 228, 0}, 2},
    {76, 87, 0, {172, 280, 0}, 2},  {90, 101, 0, {172, 332, 0}, 2},
};

constexpr uint32_t kLastApplyTag = 1;

// The classic render (under renderLock) and every other command (under entryLock) may apply
// settings at the same time: the decision to rebuild, the rebuild and the record of which instance
// the published tables belong to are made as one step under this lock.
std::mutex g_applyMutex;
std::shared_ptr<const EngineSet> g_appliedSet;  // the set built from lastSequence's settings; guarded by g_applyMutex

uint32_t& Word(CorrectionSettings* settings, uint32_t offset) {
    return *reinterpret_cast<uint32_t*>(reinterpret_cast<uint8_t*>(settings) + offset);
}

float& FloatField(CorrectionSettings* settings, uint32_t offset) {
    return *reinterpret_cast<float*>(reinterpret_cast<uint8_t*>(settings) + offset);
}

// The parameter of a stable id in the host's array, or null when the tables do not know it.
PF_ParamDef* ParamById(PF_ParamDef** params, const GlobalState* global, uint32_t id) {
    if (!params || !global || id == 0 || id >= kParamTableSize) return nullptr;
    const uint32_t index = global->idToIndex[id];
    if (index == 0 || index >= kParamTableSize) return nullptr;
    return params[index];
}

void MarkChanged(PF_ParamDef* param) {
    if (param) param->uu.change_flags |= PF_ChangeFlag_CHANGED_VALUE;
}

PF_Handle NewHandle(const PF_InData* in_data, size_t size) {
    return in_data->utils->host_new_handle ? in_data->utils->host_new_handle(size) : nullptr;
}

void DisposeHandle(const PF_InData* in_data, PF_Handle handle) {
    if (handle && in_data->utils->host_dispose_handle) in_data->utils->host_dispose_handle(handle);
}

PF_Handle NewZeroedState(const PF_InData* in_data) {
    PF_Handle handle = NewHandle(in_data, kSequenceStateSize);
    if (!handle) return nullptr;
    LockedHandle locked(in_data, handle);
    if (locked.get()) std::memset(locked.get(), 0, kSequenceStateSize);
    return handle;
}

}  // namespace

PF_Err SequenceSetup(const CommandContext& context) {
    const PF_InData* in_data = context.in_data;
    PF_Handle handle = NewHandle(in_data, kSequenceStateSize);
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    {
        LockedHandle locked(in_data, handle);
        auto* state = locked.as<SequenceState>();
        if (!state) {
            DisposeHandle(in_data, handle);
            return PF_Err_OUT_OF_MEMORY;
        }
        std::memset(state, 0, sizeof *state);
        for (int32_t& point : state->selectedPoint) point = -1;
        context.out_data->sequence_data = handle;
        // A missing copy only disables the skip test of ApplySettings.
        state->appliedCopy = NewHandle(in_data, kParametersSize);
    }
    return PF_Err_NONE;
}

PF_Err SequenceResetup(const CommandContext& context) {
    PF_InData* in_data = context.in_data;
    PF_Handle handle = in_data->sequence_data;
    if (!handle) {
        handle = NewZeroedState(in_data);
    } else {
        const size_t size = in_data->utils->host_get_handle_size ? in_data->utils->host_get_handle_size(handle) : 0;
        if (size == kSequenceStateSizeWithSettings) {
            // An earlier layout that began with the whole correction record.
            PF_ParamDef* parameters = context.params ? context.params[1] : nullptr;
            if (parameters && parameters->param_type == PF_Param_ARBITRARY_DATA) {
                LockedHandle old(in_data, handle);
                LockedHandle value(in_data, parameters->u.arb_d.value);
                if (old.size() >= kParametersSize && value.size() >= kParametersSize) {
                    std::memcpy(value.get(), old.get(), kParametersSize);
                }
            }
            PF_Handle fresh = NewZeroedState(in_data);
            if (!fresh) return PF_Err_OUT_OF_MEMORY;
            DisposeHandle(in_data, handle);
            handle = fresh;
        } else if (size < kSequenceStateSize) {
            // The earlier 28- and 176-byte layouts, and any other record too short to hold the
            // current fields, are replaced by a fresh state.
            PF_Handle fresh = NewZeroedState(in_data);
            if (!fresh) return PF_Err_OUT_OF_MEMORY;
            DisposeHandle(in_data, handle);
            handle = fresh;
        }
    }
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    {
        LockedHandle locked(in_data, handle);
        auto* state = locked.as<SequenceState>();
        if (!state) return PF_Err_INTERNAL_STRUCT_DAMAGED;
        // Handle values in a stored record are stale addresses of an earlier session: they are
        // overwritten, never freed.
        state->appliedCopy = NewHandle(in_data, kParametersSize);
        state->frameSlot = nullptr;
        state->reserved8 = 0;
        state->reserved12 = 0;
        state->reserved20 = 0;
        state->reserved28 = 0;
        for (int i = 0; i < 4; ++i) state->buttonWords[i] = 0;
    }
    context.out_data->sequence_data = handle;
    in_data->sequence_data = nullptr;
    return PF_Err_NONE;
}

PF_Err SequenceFlatten(const CommandContext& context) {
    PF_InData* in_data = context.in_data;
    PF_Handle handle = in_data->sequence_data;
    if (!handle) return PF_Err_NONE;
    {
        LockedHandle locked(in_data, handle);
        if (auto* state = locked.as<SequenceState>()) {
            DisposeHandle(in_data, state->frameSlot);
            state->frameSlot = nullptr;
            state->reserved8 = 0;
            state->reserved12 = 0;
            state->reserved20 = 0;
            state->reserved28 = 0;
            DisposeHandle(in_data, state->appliedCopy);
            state->appliedCopy = nullptr;
        }
    }
    in_data->sequence_data = nullptr;
    context.out_data->sequence_data = handle;
    return PF_Err_NONE;
}

PF_Err SequenceSetdown(const CommandContext& context) {
    PF_InData* in_data = context.in_data;
    if (PF_Handle handle = in_data->sequence_data) {
        {
            LockedHandle locked(in_data, handle);
            if (auto* state = locked.as<SequenceState>()) {
                DisposeHandle(in_data, state->frameSlot);
                DisposeHandle(in_data, state->appliedCopy);
                state->frameSlot = nullptr;
                state->appliedCopy = nullptr;
            }
        }
        DisposeHandle(in_data, handle);
    }
    context.out_data->sequence_data = nullptr;
    in_data->sequence_data = nullptr;
    return PF_Err_NONE;
}

void ParamsToSettings(CorrectionSettings* settings, PF_ParamDef** params, const GlobalState* global) {
    for (const FieldLink& link : kFieldLinks) {
        const PF_ParamDef* param = ParamById(params, global, link.id);
        if (!param) continue;
        if (link.isFloat) {
            if (param->param_type == PF_Param_FLOAT_SLIDER) {
                FloatField(settings, link.offset) = static_cast<float>(param->u.fs_d.value);
            }
        } else if (param->param_type == PF_Param_CHECKBOX) {
            Word(settings, link.offset) = static_cast<uint32_t>(param->u.bd.value);
        } else if (param->param_type == PF_Param_POPUP) {
            Word(settings, link.offset) = static_cast<uint32_t>(param->u.pd.value);
        }
    }
}

void SettingsToParams(const CorrectionSettings& settings, PF_ParamDef** params, const GlobalState* global) {
    auto* fields = const_cast<CorrectionSettings*>(&settings);
    for (const FieldLink& link : kFieldLinks) {
        PF_ParamDef* param = ParamById(params, global, link.id);
        if (!param) continue;
        if (link.isFloat) {
            if (param->param_type != PF_Param_FLOAT_SLIDER) continue;
            const double value = FloatField(fields, link.offset);
            // An unordered comparison (a NaN on either side) counts as different.
            if (!(param->u.fs_d.value == value)) {
                param->u.fs_d.value = value;
                MarkChanged(param);
            }
        } else {
            const int32_t value = static_cast<int32_t>(Word(fields, link.offset));
            A_long* slot = param->param_type == PF_Param_CHECKBOX ? &param->u.bd.value
                           : param->param_type == PF_Param_POPUP  ? &param->u.pd.value
                                                                  : nullptr;
            if (slot && *slot != value) {
                *slot = value;
                MarkChanged(param);
            }
        }
    }
}

void MarkSettingsChanged(const GlobalState* global, PF_ParamDef** params) {
    MarkChanged(ParamById(params, global, kIdParameters));
    MarkChanged(ParamById(params, global, kIdVideoSystem));
}

PF_Err UserChangedParam(const CommandContext& context) {
    GlobalState* global = context.global;
    PF_ParamDef** params = context.params;
    const auto* extra = static_cast<const PF_UserChangedParamExtra*>(context.extra);
    if (!params || !extra) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    const PF_ParamIndex index = extra->param_index;
    const uint32_t id = (index > 0 && index < kParamTableSize) ? global->indexToId[index] : 0;

    PF_ParamDef* parameters = params[1];
    LockedHandle value(context.in_data,
                       parameters && parameters->param_type == PF_Param_ARBITRARY_DATA ? parameters->u.arb_d.value
                                                                                        : nullptr);
    CorrectionSettings* settings = value.as<CorrectionSettings>();
    if (!settings) return PF_Err_NONE;  // no record to update

    for (const SectionEnables& section : kSectionEnables) {
        if ((id >= section.firstId && id <= section.lastId) || (section.extraId && id == section.extraId)) {
            for (int i = 0; i < section.count; ++i) Word(settings, section.offsets[i]) = 1;
            MarkSettingsChanged(global, params);
        }
    }
    PF_ParamDef* enableLimiter = ParamById(params, global, kIdEnableLimiter);
    PF_ParamDef* parametersParam = ParamById(params, global, kIdParameters);
    auto switchLimiterOn = [&] {
        settings->enableLimiter = 1;
        if (enableLimiter && enableLimiter->param_type == PF_Param_CHECKBOX) {
            enableLimiter->u.bd.value = 1;
            MarkChanged(enableLimiter);
        }
    };
    if (id == kIdVideoSystem) {
        MarkSettingsChanged(global, params);
    } else if (id >= 107 && id <= 114) {
        switchLimiterOn();
        MarkChanged(parametersParam);
    } else if (id == kIdEnableLimiter) {
        if (enableLimiter && enableLimiter->param_type == PF_Param_CHECKBOX) {
            settings->enableLimiter = static_cast<uint32_t>(enableLimiter->u.bd.value);
        }
        MarkChanged(parametersParam);
        MarkChanged(enableLimiter);
    } else if (id == kIdShowLimiterPreview) {
        PF_ParamDef* preview = ParamById(params, global, kIdShowLimiterPreview);
        const int32_t on = preview && preview->param_type == PF_Param_CHECKBOX ? preview->u.bd.value : 0;
        settings->showLimiterPreview = static_cast<uint32_t>(on);
        MarkChanged(parametersParam);
        MarkChanged(preview);
        if (on) switchLimiterOn();
    }

    if (global->hasWorldSuite2) {
        SwapSettingsIfForeign(settings);
        ParamsToSettings(settings, params, global);
        ApplySettings(context.in_data->sequence_data, settings, global, context.in_data);
    }
    return PF_Err_NONE;
}

std::shared_ptr<const EngineSet> ApplySettings(PF_Handle sequence, CorrectionSettings* settings, GlobalState* global,
                                               const PF_InData* in_data) {
    std::lock_guard<std::mutex> guard(g_applyMutex);
    const Preferences& prefs = EnsurePreferencesLoaded();
    // The host's four characters as they lie in memory ("CTXF" for After Effects on this byte order).
    char signature[8];
    std::snprintf(signature, sizeof signature, "%.4s", reinterpret_cast<const char*>(&global->hostId));
    if (signature[0] != '\0' && std::strstr(prefs.adjustHostPixels, signature)) {
        settings->hostColourSpaceFlag = 1;
        settings->colourSpaceGamma = 65536.0f;
        settings->colourSpaceWord1 = 0;
        settings->colourSpaceWord2 = 0;
        settings->colourSpaceWords[0] = 0;
        settings->colourSpaceWords[1] = 0;
        settings->colourSpaceBlackCode = 0;
        settings->colourSpaceWhiteCode = 255;
    } else {
        settings->hostColourSpaceFlag = 0;
    }
    SwapSettingsIfForeign(settings);

    LockedHandle state(in_data, sequence);
    SequenceState* sequenceState = state.as<SequenceState>();
    if (sequenceState && sequenceState->appliedCopy) {
        LockedHandle copy(in_data, sequenceState->appliedCopy);
        if (copy.size() >= kParametersSize) {
            if (global->lastSequence == sequence && global->lastApplyTag != 0 &&
                std::memcmp(copy.get(), settings, kParametersSize) == 0 && g_appliedSet) {
                return g_appliedSet;
            }
            std::memcpy(copy.get(), settings, kParametersSize);
            global->lastSequence = sequence;
            global->lastApplyTag = kLastApplyTag;
            Update(*settings);
            g_appliedSet = CurrentEngineSet();
            return g_appliedSet;
        }
    }
    global->lastSequence = sequence;
    Update(*settings);
    g_appliedSet = CurrentEngineSet();
    return g_appliedSet;
}

}  // namespace vt
