#include "host/params.h"

#include <array>
#include <cstring>

#include "engine/correction_settings.h"
#include "files/preferences.h"
#include "host/global_state.h"
#include "host/host_id.h"
#include "sdk/ae_effect_ui.h"

namespace vt {

namespace {

// Names shown in the host's panel.
constexpr char kParametersName[] = "Parameters";
constexpr char kSimplifiedName[] = "Simplified Interface";
constexpr char kAutoCorrectName[] = "Levels - Auto Correct";
constexpr char kHueOffsetName[] = "Hue Offset";
constexpr char kCurvesName[] = "Curves";
constexpr char kHslName[] = "HSL";
constexpr char kRgbName[] = "RGB";
constexpr char kLimiterName[] = "Limiter";
constexpr const char* kRangeNames[] = {"Master", "Highlights", "Midtones", "Shadows"};
constexpr const char* kChannelNames[] = {"Master", "Red", "Green", "Blue"};
constexpr char kLimitMethodChoices[] = "Reduce Chroma|Reduce Luma|Smart Limit";
constexpr char kVideoSystemChoices[] = "NTSC|PAL|ATSC";

// Names of the RGB group's sliders, channel by channel: gamma, pedestal, gain.
constexpr const char* kRgbSliderNames[4][3] = {
    {"Master Gamma", "Master Pedestal", "Master Gain"},
    {"Red Gamma", "Red Pedestal", "Red Gain"},
    {"Green Gamma", "Green Pedestal", "Green Gain"},
    {"Blue Gamma", "Blue Pedestal", "Blue Gain"},
};

constexpr PF_ParamFlags kCollapse = PF_ParamFlag_COLLAPSE_TWIRLY;
constexpr PF_ParamFlags kSupervise = PF_ParamFlag_SUPERVISE;
constexpr PF_ParamFlags kFixed = PF_ParamFlag_CANNOT_TIME_VARY;

constexpr int16_t kParametersWidth = 279;
constexpr int16_t kParametersHeight = 51;
constexpr int16_t kParametersHeightPremiere = 55;
constexpr int16_t kPanelControlWidth = 362;

constexpr ParamRow Row(uint32_t id, PF_ParamType type, const char* name, PF_ParamFlags flags) {
    ParamRow row{};
    row.id = id;
    row.type = type;
    row.name = name;
    row.flags = flags;
    return row;
}

constexpr ParamRow Slider(uint32_t id, const char* name, float validMin, float validMax, float sliderMin,
                          float sliderMax, float defaultValue, int16_t precision, PF_ParamFlags flags) {
    ParamRow row = Row(id, PF_Param_FLOAT_SLIDER, name, flags);
    row.validMin = validMin;
    row.validMax = validMax;
    row.sliderMin = sliderMin;
    row.sliderMax = sliderMax;
    row.defaultValue = defaultValue;
    row.precision = precision;
    return row;
}

constexpr ParamRow Control(ParamRow row, PF_ParamUIFlags uiFlags, int16_t width, int16_t height) {
    row.uiFlags = uiFlags;
    row.uiWidth = width;
    row.uiHeight = height;
    return row;
}

constexpr ParamRow Arbitrary(uint32_t id, const char* name, PF_ParamFlags flags, uint32_t size) {
    ParamRow row = Row(id, PF_Param_ARBITRARY_DATA, name, flags);
    row.arbitraryId = static_cast<int16_t>(id);
    row.arbitrarySize = size;
    return row;
}

constexpr ParamRow Popup(uint32_t id, const char* name, const char* choices, int16_t count, float defaultValue,
                         ParamSpecial special) {
    ParamRow row = Row(id, PF_Param_POPUP, name, kFixed | kSupervise);
    row.choices = choices;
    row.choiceCount = count;
    row.defaultValue = defaultValue;
    row.special = special;
    return row;
}

consteval std::array<ParamRow, kParamCount> BuildTable() {
    std::array<ParamRow, kParamCount> rows{};
    int n = 0;
    ParamRow parameters = Control(Arbitrary(kIdParameters, kParametersName, kSupervise, kParametersSize),
                                  PF_PUI_CONTROL | PF_PUI_DONT_ERASE_CONTROL, kParametersWidth, kParametersHeight);
    parameters.special = ParamSpecial::kParametersControl;
    rows[n++] = parameters;
    ParamRow simplified = Row(kIdSimplifiedGroup, PF_Param_GROUP_START, kSimplifiedName, kCollapse);
    simplified.special = ParamSpecial::kSimplifiedGroup;
    rows[n++] = simplified;
    rows[n++] = Control(Row(kIdLevelsAutoCorrect, PF_Param_NO_DATA, kAutoCorrectName, kFixed | kSupervise),
                        PF_PUI_CONTROL, kPanelControlWidth, 24);
    rows[n++] = Control(Arbitrary(kIdHueOffset, kHueOffsetName, 0, kHueOffsetSize), PF_PUI_CONTROL,
                        kPanelControlWidth, kPanelControlWidth);
    rows[n++] = Control(Arbitrary(kIdCurves, kCurvesName, 0, kCurvesSize), PF_PUI_CONTROL, kPanelControlWidth, 374);

    // HSL: four range groups of nine sliders; Vibrance came later and has an id of its own.
    rows[n++] = Row(3, PF_Param_GROUP_START, kHslName, kSupervise);
    const PF_ParamFlags hsl = kCollapse | kSupervise;
    for (int range = 0; range < 4; ++range) {
        const uint32_t base = 4 + 10 * static_cast<uint32_t>(range);
        rows[n++] = Row(base, PF_Param_GROUP_START, kRangeNames[range], hsl);
        rows[n++] = Slider(base + 1, "Hue", -3600, 3600, -360, 360, 0, 2, hsl);
        rows[n++] = Slider(base + 2, "Saturation", 0, 300, 0, 300, 100, 2, hsl);
        rows[n++] = Slider(119 + static_cast<uint32_t>(range), "Vibrance", -100, 100, -100, 100, 0, 2, hsl);
        rows[n++] = Slider(base + 3, "Brightness", -100, 100, -100, 100, 0, 2, hsl);
        rows[n++] = Slider(base + 4, "Contrast", -100, 100, -100, 100, 0, 2, hsl);
        rows[n++] = Slider(base + 5, "Contrast Center", 0, 1, 0, 1, 0.5f, 3, hsl);
        rows[n++] = Slider(base + 6, "RGB Gain", 0, 20, 0, 3, 1, 3, hsl);
        rows[n++] = Slider(base + 7, "Gamma", 0.1f, 10, 0.1f, 5, 1, 3, hsl);
        rows[n++] = Slider(base + 8, "Pedestal", -1, 1, -1, 1, 0, 3, hsl);
        rows[n++] = Row(base + 9, PF_Param_GROUP_END, "", hsl);
    }
    rows[n++] = Row(44, PF_Param_GROUP_END, "", kCollapse | kSupervise);

    // RGB: four range groups of twelve sliders with consecutive ids.
    rows[n++] = Row(46, PF_Param_GROUP_START, kRgbName, 0);
    for (int range = 0; range < 4; ++range) {
        const uint32_t base = 47 + 14 * static_cast<uint32_t>(range);
        rows[n++] = Row(base, PF_Param_GROUP_START, kRangeNames[range], range == 0 ? kCollapse : kCollapse | kSupervise);
        for (int channel = 0; channel < 4; ++channel) {
            const uint32_t id = base + 1 + 3 * static_cast<uint32_t>(channel);
            rows[n++] = Slider(id, kRgbSliderNames[channel][0], 0.1f, 10, 0.1f, 5, 1, 2, kCollapse | kSupervise);
            rows[n++] = Slider(id + 1, kRgbSliderNames[channel][1], -1, 1, -1, 1, 0, 2, kCollapse | kSupervise);
            rows[n++] = Slider(id + 2, kRgbSliderNames[channel][2], 0, 20, 0, 3, 1, 2, kCollapse | kSupervise);
        }
        rows[n++] = Row(base + 13, PF_Param_GROUP_END, "", kCollapse | kSupervise);
    }
    rows[n++] = Row(103, PF_Param_GROUP_END, "", kCollapse | kSupervise);

    // Limiter.
    rows[n++] = Row(105, PF_Param_GROUP_START, kLimiterName, 0);
    ParamRow enable = Row(kIdEnableLimiter, PF_Param_CHECKBOX, "Enable Limiter", kFixed | kSupervise);
    enable.special = ParamSpecial::kLimiterDefault;
    rows[n++] = enable;
    rows[n++] = Slider(107, "Chroma Max Limit", 70, 130, 70, 130, 110, 2, kSupervise);
    rows[n++] = Slider(108, "Chroma Min Limit", -40, 0, -40, 0, -30, 2, kSupervise);
    rows[n++] = Slider(109, "Luma Hard Clip Level", 70, 130, 70, 130, 120, 2, kSupervise);
    rows[n++] = Row(110, PF_Param_CHECKBOX, "Enable Soft Clip", kFixed | kSupervise);
    rows[n++] = Slider(111, "Soft Clip Knee Level", 60, 100, 60, 100, 90, 2, kFixed | kSupervise);
    rows[n++] = Slider(112, "Soft Clip White Level", 80, 120, 80, 120, 100, 2, kFixed | kSupervise);
    rows[n++] = Slider(113, "Soft Clip Max Level", 110, 160, 110, 160, 130, 2, kFixed | kSupervise);
    rows[n++] = Popup(114, "Limit Method", kLimitMethodChoices, 3, 3, ParamSpecial::kNone);
    rows[n++] = Popup(kIdVideoSystem, "Video System", kVideoSystemChoices, 3, 1, ParamSpecial::kVideoSystem);
    rows[n++] = Row(kIdShowLimiterPreview, PF_Param_CHECKBOX, "Show Limiter Preview", kFixed | kSupervise);
    rows[n++] = Row(117, PF_Param_GROUP_END, "", kFixed | kSupervise);
    rows[n++] = Row(123, PF_Param_GROUP_END, "", kFixed | kSupervise);
    if (n != kParamCount) throw "the parameter table must hold every parameter";
    return rows;
}

constexpr std::array<ParamRow, kParamCount> kParamTable = BuildTable();

// Every id from 1 to 123 appears exactly once.
consteval bool IdsAreAPermutation() {
    bool seen[kParamCount + 1] = {};
    for (const ParamRow& row : kParamTable) {
        if (row.id < 1 || row.id > kParamCount || seen[row.id]) return false;
        seen[row.id] = true;
    }
    return true;
}
static_assert(IdsAreAPermutation());
static_assert(kParamTable[9].id == 119, "index 10 holds the Master Vibrance slider");

void CopyName(PF_ParamDef* def, const char* name) {
    std::strncpy(def->name, name, sizeof def->name - 1);
    def->name[sizeof def->name - 1] = '\0';
}

// The default value of the "Parameters" parameter: a fully reset record.
PF_Handle NewDefaultSettings(const PF_InData* in_data) {
    PF_Handle handle = in_data->utils->host_new_handle(kParametersSize);
    if (!handle) return nullptr;
    auto* settings = static_cast<CorrectionSettings*>(in_data->utils->host_lock_handle(handle));
    if (!settings) {
        in_data->utils->host_dispose_handle(handle);
        return nullptr;
    }
    std::memset(settings, 0, kParametersSize);
    EnsurePreferencesLoaded();
    ResetSettings(settings, kMaskAll);
    in_data->utils->host_unlock_handle(handle);
    return handle;
}

PF_Handle NewZeroedHandle(const PF_InData* in_data, uint32_t size) {
    PF_Handle handle = in_data->utils->host_new_handle(size);
    if (!handle) return nullptr;
    if (void* bytes = in_data->utils->host_lock_handle(handle)) {
        std::memset(bytes, 0, size);
        in_data->utils->host_unlock_handle(handle);
    }
    return handle;
}

// Fills one definition from its row; returns false when a default handle cannot be had.
bool FillDefinition(const ParamRow& row, const GlobalState& global, const CorrectionSettings& defaults,
                    PF_Handle defaultSettings, const PF_InData* in_data, PF_ParamDef* def) {
    std::memset(def, 0, sizeof *def);
    def->uu.id = static_cast<A_long>(row.id);
    def->param_type = row.type;
    def->flags = row.flags;
    def->ui_flags = row.uiFlags;
    def->ui_width = row.uiWidth;
    def->ui_height = row.uiHeight;
    CopyName(def, row.special == ParamSpecial::kSimplifiedGroup && global.hostId == kHostAvid ? "" : row.name);
    if (row.special == ParamSpecial::kParametersControl && global.hostId == kHostPremiere) {
        def->ui_height = kParametersHeightPremiere;
    }
    switch (row.type) {
        case PF_Param_FLOAT_SLIDER: {
            PF_FloatSliderDef& slider = def->u.fs_d;
            slider.value = row.defaultValue;
            slider.valid_min = row.validMin;
            slider.valid_max = row.validMax;
            slider.slider_min = row.sliderMin;
            slider.slider_max = row.sliderMax;
            slider.dephault = row.defaultValue;
            slider.precision = row.precision;
            slider.display_flags = PF_ValueDisplayFlag_NONE;
            slider.curve_tolerance = AEFX_AUDIO_DEFAULT_CURVE_TOLERANCE;
            break;
        }
        case PF_Param_CHECKBOX: {
            int32_t value = static_cast<int32_t>(row.defaultValue);
            if (row.special == ParamSpecial::kLimiterDefault) value = static_cast<int32_t>(defaults.enableLimiter);
            def->u.bd.value = value;
            def->u.bd.dephault = static_cast<PF_Boolean>(value);
            def->u.bd.u.nameptr = "";
            break;
        }
        case PF_Param_POPUP: {
            int32_t value = static_cast<int32_t>(row.defaultValue);
            if (row.special == ParamSpecial::kVideoSystem) value = static_cast<int32_t>(defaults.videoSystem);
            def->u.pd.value = value;
            def->u.pd.num_choices = row.choiceCount;
            def->u.pd.dephault = static_cast<A_short>(value);
            def->u.pd.u.namesptr = row.choices;
            break;
        }
        case PF_Param_ARBITRARY_DATA: {
            def->u.arb_d.id = row.arbitraryId;
            def->u.arb_d.dephault =
                row.id == kIdParameters ? defaultSettings : NewZeroedHandle(in_data, row.arbitrarySize);
            if (!def->u.arb_d.dephault) return false;
            break;
        }
        default: break;
    }
    return true;
}

}  // namespace

std::span<const ParamRow> ParamTable() { return kParamTable; }

PF_Err ParamsSetup(const CommandContext& context) {
    PF_InData* in_data = context.in_data;
    GlobalState* global = context.global;
    if (!in_data->inter.add_param || !in_data->utils->host_new_handle) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    global->indexToId[0] = 0;
    global->idToIndex[0] = 0;

    PF_Handle defaultSettings = NewDefaultSettings(in_data);
    if (!defaultSettings) return PF_Err_OUT_OF_MEMORY;
    CorrectionSettings defaults;
    std::memcpy(&defaults, in_data->utils->host_lock_handle(defaultSettings), sizeof defaults);
    in_data->utils->host_unlock_handle(defaultSettings);

    PF_ParamIndex index = 1;
    for (const ParamRow& row : kParamTable) {
        PF_ParamDef def;
        if (!FillDefinition(row, *global, defaults, defaultSettings, in_data, &def)) return PF_Err_OUT_OF_MEMORY;
        if (const PF_Err err = in_data->inter.add_param(in_data->effect_ref, -1, &def); err != PF_Err_NONE) return err;
        global->indexToId[index] = row.id;
        global->idToIndex[row.id] = static_cast<uint32_t>(index);
        if (row.uiFlags & PF_PUI_CONTROL) {
            PF_CustomUIInfo info{};
            info.events = PF_CustomEFlag_EFFECT;
            if (!in_data->inter.register_ui) return PF_Err_INTERNAL_STRUCT_DAMAGED;
            if (const PF_Err err = in_data->inter.register_ui(in_data->effect_ref, &info); err != PF_Err_NONE) {
                return err;
            }
        }
        ++index;
    }
    context.out_data->num_params = kHostParamCount;
    return PF_Err_NONE;
}

}  // namespace vt
