// The parameters as the host receives them, and the sync between sliders and the settings record.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "engine/correction_settings.h"
#include "host/global_state.h"
#include "sdk/ae_effect.h"
#include "tests/integration/effect_fixture.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

CorrectionSettings SettingsOf(refhost::EffectInstance& instance) {
    CorrectionSettings settings{};
    const std::vector<uint8_t> bytes = instance.Settings();
    EXPECT_EQ(bytes.size(), sizeof settings);
    std::memcpy(&settings, bytes.data(), std::min(bytes.size(), sizeof settings));
    return settings;
}

GlobalState GlobalOf(refhost::Host& host) {
    GlobalState state{};
    std::memcpy(&state, host.heap().Lock(host.inData().global_data), sizeof state);
    host.heap().Unlock(host.inData().global_data);
    return state;
}

struct Expect {
    int index;
    uint32_t id;
    PF_ParamType type;
    const char* path;
};

TEST(Params, DeclaresEveryParameterInOrderWithItsIdTypeAndName) {
    test::Effect effect("aftereffects");
    refhost::Host& host = effect.host();
    ASSERT_EQ(host.paramDefs().size(), 124u);
    EXPECT_EQ(host.declaredParamCount(), 124);
    EXPECT_EQ(host.uiRegistrations(), 4);
    const Expect rows[] = {
        {1, 1, PF_Param_ARBITRARY_DATA, "Parameters"},
        {2, 2, PF_Param_GROUP_START, "Simplified Interface"},
        {3, 118, PF_Param_NO_DATA, "Levels - Auto Correct"},
        {4, 45, PF_Param_ARBITRARY_DATA, "Hue Offset"},
        {5, 104, PF_Param_ARBITRARY_DATA, "Curves"},
        {6, 3, PF_Param_GROUP_START, "HSL"},
        {7, 4, PF_Param_GROUP_START, "HSL/Master"},
        {8, 5, PF_Param_FLOAT_SLIDER, "HSL/Master/Hue"},
        {10, 119, PF_Param_FLOAT_SLIDER, "HSL/Master/Vibrance"},
        {16, 12, PF_Param_FLOAT_SLIDER, "HSL/Master/Pedestal"},
        {17, 13, PF_Param_GROUP_END, ""},
        {21, 120, PF_Param_FLOAT_SLIDER, "HSL/Highlights/Vibrance"},
        {49, 42, PF_Param_FLOAT_SLIDER, "HSL/Shadows/Pedestal"},
        {51, 44, PF_Param_GROUP_END, ""},
        {52, 46, PF_Param_GROUP_START, "RGB"},
        {54, 48, PF_Param_FLOAT_SLIDER, "RGB/Master/Master Gamma"},
        {56, 50, PF_Param_FLOAT_SLIDER, "RGB/Master/Master Gain"},
        {65, 59, PF_Param_FLOAT_SLIDER, "RGB/Master/Blue Gain"},
        {107, 101, PF_Param_FLOAT_SLIDER, "RGB/Shadows/Blue Gain"},
        {109, 103, PF_Param_GROUP_END, ""},
        {111, 106, PF_Param_CHECKBOX, "Limiter/Enable Limiter"},
        {116, 111, PF_Param_FLOAT_SLIDER, "Limiter/Soft Clip Knee Level"},
        {119, 114, PF_Param_POPUP, "Limiter/Limit Method"},
        {120, 115, PF_Param_POPUP, "Limiter/Video System"},
        {121, 116, PF_Param_CHECKBOX, "Limiter/Show Limiter Preview"},
        {123, 123, PF_Param_GROUP_END, ""},
    };
    for (const Expect& row : rows) {
        const PF_ParamDef& def = effect.instance().param(row.index);
        EXPECT_EQ(host.paramIds()[static_cast<size_t>(row.index)], row.id) << row.index;
        EXPECT_EQ(def.param_type, row.type) << row.index;
        if (*row.path && def.param_type != PF_Param_GROUP_END) {
            EXPECT_EQ(effect.instance().PathOf(row.index), row.path) << row.index;
        }
    }
    const GlobalState global = GlobalOf(host);
    EXPECT_EQ(global.indexToId[10], 119u);
    EXPECT_EQ(global.idToIndex[119], 10u);
    EXPECT_EQ(global.indexToId[123], 123u);
    EXPECT_EQ(global.indexToId[0], 0u);
    for (int index = 1; index < 124; ++index) {
        EXPECT_EQ(global.idToIndex[global.indexToId[index]], static_cast<uint32_t>(index));
    }
}

TEST(Params, SlidersCarryTheirRangesDefaultsAndFlags) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    struct Slider { const char* path; float validMin, validMax, sliderMin, sliderMax, dflt; int precision; PF_ParamFlags flags; };
    const Slider sliders[] = {
        {"HSL/Master/Hue", -3600, 3600, -360, 360, 0, 2, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"HSL/Midtones/Saturation", 0, 300, 0, 300, 100, 2, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"HSL/Shadows/Contrast Center", 0, 1, 0, 1, 0.5f, 3, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"HSL/Highlights/RGB Gain", 0, 20, 0, 3, 1, 3, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"HSL/Master/Gamma", 0.1f, 10, 0.1f, 5, 1, 3, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"RGB/Midtones/Red Pedestal", -1, 1, -1, 1, 0, 2, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"RGB/Shadows/Green Gain", 0, 20, 0, 3, 1, 2, PF_ParamFlag_COLLAPSE_TWIRLY | PF_ParamFlag_SUPERVISE},
        {"Limiter/Chroma Min Limit", -40, 0, -40, 0, -30, 2, PF_ParamFlag_SUPERVISE},
        {"Limiter/Soft Clip Max Level", 110, 160, 110, 160, 130, 2, PF_ParamFlag_CANNOT_TIME_VARY | PF_ParamFlag_SUPERVISE},
    };
    for (const Slider& s : sliders) {
        const PF_ParamDef& def = instance.param(effect.Index(s.path));
        EXPECT_EQ(def.u.fs_d.valid_min, s.validMin) << s.path;
        EXPECT_EQ(def.u.fs_d.valid_max, s.validMax) << s.path;
        EXPECT_EQ(def.u.fs_d.slider_min, s.sliderMin) << s.path;
        EXPECT_EQ(def.u.fs_d.slider_max, s.sliderMax) << s.path;
        EXPECT_EQ(def.u.fs_d.dephault, s.dflt) << s.path;
        EXPECT_EQ(def.u.fs_d.value, static_cast<double>(s.dflt)) << s.path;
        EXPECT_EQ(def.u.fs_d.precision, s.precision) << s.path;
        EXPECT_EQ(def.u.fs_d.curve_tolerance, 0.05f) << s.path;
        EXPECT_EQ(def.u.fs_d.display_flags, 0) << s.path;
        EXPECT_EQ(def.flags, s.flags) << s.path;
    }
    const PF_ParamDef& method = instance.param(effect.Index("Limiter/Limit Method"));
    EXPECT_EQ(method.u.pd.num_choices, 3);
    EXPECT_EQ(method.u.pd.value, 3);
    EXPECT_STREQ(method.u.pd.u.namesptr, "Reduce Chroma|Reduce Luma|Smart Limit");
    EXPECT_STREQ(instance.param(effect.Index("Limiter/Video System")).u.pd.u.namesptr, "NTSC|PAL|ATSC");
    // The custom controls and their sizes.
    const PF_ParamDef& parameters = instance.param(1);
    EXPECT_EQ(parameters.ui_flags, PF_PUI_CONTROL | PF_PUI_DONT_ERASE_CONTROL);
    EXPECT_EQ(parameters.ui_width, 279);
    EXPECT_EQ(parameters.ui_height, 51);
    EXPECT_EQ(parameters.u.arb_d.id, 1);
    EXPECT_EQ(instance.param(3).ui_height, 24);
    EXPECT_EQ(instance.param(4).ui_height, 362);
    EXPECT_EQ(instance.param(5).ui_height, 374);
    EXPECT_EQ(effect.host().heap().Size(instance.param(4).u.arb_d.dephault), 52u);
    EXPECT_EQ(effect.host().heap().Size(instance.param(5).u.arb_d.dephault), 16432u);
    EXPECT_EQ(instance.param(52).flags, 0);                                   // "RGB" group start
    EXPECT_EQ(instance.param(53).flags, PF_ParamFlag_COLLAPSE_TWIRLY);        // its Master group start
}

// What holds for every one of the 123 declarations.
TEST(Params, EveryDeclarationIsWellFormed) {
    test::Effect effect("aftereffects");
    const refhost::Host& host = effect.host();
    std::vector<bool> seen(124, false);
    int depth = 0;
    for (size_t index = 1; index < host.paramDefs().size(); ++index) {
        const PF_ParamDef& def = host.paramDefs()[index];
        const uint32_t id = host.paramIds()[index];
        ASSERT_GE(id, 1u);
        ASSERT_LE(id, 123u);
        EXPECT_FALSE(seen[id]) << "id " << id << " declared twice";
        seen[id] = true;
        EXPECT_LT(std::strlen(def.name), 32u);
        EXPECT_EQ(def.ui_flags != 0, id == 1 || id == 45 || id == 104 || id == 118) << id;
        switch (def.param_type) {
            case PF_Param_GROUP_START: ++depth; break;
            case PF_Param_GROUP_END: EXPECT_GT(depth--, 0) << "group end without a start at " << index; break;
            case PF_Param_FLOAT_SLIDER: {
                const PF_FloatSliderDef& f = def.u.fs_d;
                EXPECT_LE(f.valid_min, f.slider_min) << id;
                EXPECT_LE(f.slider_min, f.dephault) << id;
                EXPECT_LE(f.dephault, f.slider_max) << id;
                EXPECT_LE(f.slider_max, f.valid_max) << id;
                EXPECT_EQ(f.value, static_cast<double>(f.dephault)) << id;
                EXPECT_EQ(f.curve_tolerance, 0.05f) << id;
                EXPECT_TRUE(f.precision == 2 || f.precision == 3) << id;
                EXPECT_EQ(f.phase, 0.0) << id;
                EXPECT_EQ(f.value_desc[0], '\0') << id;
                EXPECT_TRUE(def.flags & PF_ParamFlag_SUPERVISE) << id;
                break;
            }
            case PF_Param_CHECKBOX: EXPECT_STREQ(def.u.bd.u.nameptr, "") << id; break;
            case PF_Param_POPUP: EXPECT_EQ(def.u.pd.num_choices, 3) << id; break;
            case PF_Param_ARBITRARY_DATA: EXPECT_EQ(def.u.arb_d.id, static_cast<A_short>(id)); break;
            case PF_Param_NO_DATA: EXPECT_EQ(id, 118u); break;
            default: ADD_FAILURE() << "unexpected type " << def.param_type << " at " << index;
        }
    }
    EXPECT_EQ(depth, 0);
    EXPECT_EQ(std::count(seen.begin() + 1, seen.end(), true), 123);
}

TEST(Params, HostDependentDeclarations) {
    {
        test::Effect premiere("premiere");
        EXPECT_EQ(premiere.instance().param(1).ui_height, 55);
        EXPECT_STREQ(premiere.instance().param(2).name, "Simplified Interface");
    }
    {
        test::Effect avid("avid");
        EXPECT_EQ(avid.instance().param(1).ui_height, 51);
        EXPECT_STREQ(avid.instance().param(2).name, "");
    }
}

TEST(Params, LimiterDefaultsFollowThePreferences) {
    test::TestRegistry registry;
    registry.SetDword("Software\\Orvane\\Velatone 3\\Plug-in\\Settings", "Limiter Default", 1);
    registry.SetString("Software\\Orvane\\Velatone 3\\Plug-in\\Settings", "Video System", "240M");
    registry.Apply();
    test::Effect effect("aftereffects");
    const PF_ParamDef& enable = effect.instance().param(effect.Index("Limiter/Enable Limiter"));
    EXPECT_EQ(enable.u.bd.value, 1);
    EXPECT_EQ(enable.u.bd.dephault, 1);
    const PF_ParamDef& system = effect.instance().param(effect.Index("Limiter/Video System"));
    EXPECT_EQ(system.u.pd.value, 3);
    const CorrectionSettings settings = SettingsOf(effect.instance());
    EXPECT_EQ(settings.magic, kSettingsMagic);
    EXPECT_EQ(settings.enableLimiter, 1u);
    EXPECT_EQ(settings.videoSystem, 3u);
    EXPECT_EQ(settings.preferenceVideoSystem, 4u);
}

TEST(Params, SetupStopsAtTheFirstRefusal) {
    auto host = test::LoadHost(test::Persona("aftereffects"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    host->heap().FailNextAllocations(1);
    EXPECT_EQ(host->ParamsSetup(), PF_Err_OUT_OF_MEMORY);
    EXPECT_EQ(host->paramDefs().size(), 1u) << "no parameter is added without the default settings";
    host->GlobalSetdown();
}

TEST(UserChangedParam, SliderChangesSwitchOnTheirSectionAndReachTheRecord) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    effect.Set("HSL/Highlights/Vibrance", 40);
    CorrectionSettings s = SettingsOf(instance);
    EXPECT_EQ(s.masterEnable, 1u);
    EXPECT_EQ(s.tonalEnable, 1u);
    EXPECT_EQ(s.tonal[1].enable, 1u);
    EXPECT_EQ(s.tonal[0].enable, 0u);
    EXPECT_EQ(s.tonal[1].vibrance, 40.0f);
    std::vector<int> changed = instance.TakeChangedParams();
    EXPECT_EQ(changed, (std::vector<int>{1, effect.Index("Limiter/Video System")}));

    effect.Set("RGB/Shadows/Red Gain", 1.5);
    effect.Set("RGB/Shadows/Blue Gamma", 0.8);
    s = SettingsOf(instance);
    EXPECT_EQ(s.rgbSet.enable, 1u);
    EXPECT_EQ(s.rgbSet.range[3].enable, 1u);
    EXPECT_EQ(s.rgbSet.range[3].channel[1].gain, 1.5f);
    EXPECT_EQ(s.rgbSet.range[3].channel[3].gamma, 0.8f);
    EXPECT_EQ(s.rgbSet.range[0].enable, 0u);
}

TEST(UserChangedParam, LimiterRules) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    const int enable = effect.Index("Limiter/Enable Limiter");
    effect.Set("Limiter/Soft Clip Knee Level", 85);
    EXPECT_EQ(SettingsOf(instance).enableLimiter, 1u);
    EXPECT_EQ(SettingsOf(instance).softClipKneeLevel, 85.0f);
    EXPECT_EQ(instance.param(enable).u.bd.value, 1);
    instance.TakeChangedParams();

    effect.Set("Limiter/Enable Limiter", 0);
    EXPECT_EQ(SettingsOf(instance).enableLimiter, 0u);
    effect.Set("Limiter/Show Limiter Preview", 1);
    EXPECT_EQ(SettingsOf(instance).showLimiterPreview, 1u);
    EXPECT_EQ(SettingsOf(instance).enableLimiter, 1u);
    EXPECT_EQ(instance.param(enable).u.bd.value, 1);
    effect.Set("Limiter/Enable Limiter", 0);
    effect.Set("Limiter/Show Limiter Preview", 0);
    EXPECT_EQ(SettingsOf(instance).enableLimiter, 0u) << "turning the preview off leaves the limiter as it was";
    EXPECT_EQ(SettingsOf(instance).showLimiterPreview, 0u);

    effect.Set("Limiter/Video System", 2);
    EXPECT_EQ(SettingsOf(instance).videoSystem, 2u);
    effect.Set("Limiter/Limit Method", 1);
    EXPECT_EQ(SettingsOf(instance).limitMethod, 1u);
    EXPECT_EQ(SettingsOf(instance).enableLimiter, 1u);
}

TEST(UserChangedParam, WithoutTheWorldSuiteOnlyTheEnablesChange) {
    test::Effect effect("premiere");
    effect.Set("HSL/Master/Saturation", 150);
    const CorrectionSettings s = SettingsOf(effect.instance());
    EXPECT_EQ(s.tonal[0].enable, 1u);
    EXPECT_EQ(s.tonal[0].saturation, 100.0f) << "the classic render copies the sliders for every frame";
}

}  // namespace
}  // namespace vt
