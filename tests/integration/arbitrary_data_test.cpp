// The "Parameters" value as a host handles it: every arbitrary-data callback through the entry
// point, keyframes interpolated by the effect, and the answer to file dialogs.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "engine/correction_settings.h"
#include "tests/integration/effect_fixture.h"

namespace vt {
namespace {

constexpr A_short kSettingsId = 1;

CorrectionSettings Read(refhost::Host& host, PF_Handle value) {
    CorrectionSettings settings{};
    EXPECT_EQ(host.heap().Size(value), sizeof settings);
    std::memcpy(&settings, host.heap().Lock(value), sizeof settings);
    host.heap().Unlock(value);
    return settings;
}

TEST(ArbitraryData, NewCopyCompareFlattenPrintScanAndDispose) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    refhost::Host& host = effect.host();
    const size_t liveBefore = host.heap().LiveCount();

    PF_Handle fresh = instance.NewValue(kSettingsId);
    ASSERT_NE(fresh, nullptr);
    CorrectionSettings reset = Read(host, fresh);
    EXPECT_EQ(reset.magic, kSettingsMagic);

    effect.Set("HSL/Shadows/Hue", 33);
    PF_Handle current = instance.param(1).u.arb_d.value;
    PF_Handle copy = instance.CopyValue(kSettingsId, current);
    ASSERT_NE(copy, nullptr);
    PF_ArbCompareResult result = -1;
    ASSERT_EQ(instance.CompareValues(kSettingsId, current, copy, &result), PF_Err_NONE);
    EXPECT_EQ(result, PF_ArbCompare_EQUAL);
    ASSERT_EQ(instance.CompareValues(kSettingsId, current, fresh, &result), PF_Err_NONE);
    EXPECT_EQ(result, PF_ArbCompare_NOT_EQUAL);

    std::vector<uint8_t> flat;
    ASSERT_EQ(instance.FlattenValue(kSettingsId, current, &flat), PF_Err_NONE);
    ASSERT_EQ(flat.size(), 33556u);
    PF_Handle restored = instance.UnflattenValue(kSettingsId, flat);
    ASSERT_NE(restored, nullptr);
    EXPECT_EQ(Read(host, restored).tonal[3].hue, 33.0f);

    std::string text;
    ASSERT_EQ(instance.PrintValue(kSettingsId, current, &text), PF_Err_NONE);
    EXPECT_EQ(text.rfind("Velatone\t8389\t12343210\t", 0), 0u);
    PF_Handle scanned = instance.ScanValue(kSettingsId, text);
    ASSERT_NE(scanned, nullptr);
    EXPECT_EQ(std::memcmp(host.heap().Lock(scanned), host.heap().Lock(current), 33556), 0);
    host.heap().Unlock(scanned);
    host.heap().Unlock(current);

    PF_Err err = PF_Err_NONE;
    EXPECT_EQ(instance.ScanValue(kSettingsId, "Something\t12\t", &err), nullptr);
    EXPECT_EQ(err, PF_Err_UNRECOGNIZED_PARAM_TYPE);
    EXPECT_EQ(instance.CopyValue(kSettingsId, nullptr, &err), nullptr);
    EXPECT_EQ(err, PF_Err_INTERNAL_STRUCT_DAMAGED);

    for (PF_Handle value : {fresh, copy, restored, scanned}) instance.DisposeValue(kSettingsId, value);
    EXPECT_EQ(host.heap().LiveCount(), liveBefore);
}

TEST(ArbitraryData, KeyframesAreInterpolatedByTheEffect) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    CorrectionSettings left{};
    ResetSettings(&left, kMaskAll);
    CorrectionSettings right = left;
    left.masterEnable = left.tonalEnable = left.tonal[0].enable = 1;
    right.masterEnable = right.tonalEnable = right.tonal[0].enable = 1;
    left.tonal[0].saturation = 50;
    right.tonal[0].saturation = 150;
    auto bytesOf = [](const CorrectionSettings& s) {
        std::vector<uint8_t> bytes(sizeof s);
        std::memcpy(bytes.data(), &s, sizeof s);
        return bytes;
    };
    instance.SetKeyframes({{10, bytesOf(left)}, {20, bytesOf(right)}});
    auto saturationAt = [&](int frame) {
        EXPECT_EQ(instance.SetTimeFromKeyframes(frame), PF_Err_NONE);
        CorrectionSettings now{};
        const std::vector<uint8_t> bytes = instance.Settings();
        std::memcpy(&now, bytes.data(), sizeof now);
        return now.tonal[0].saturation;
    };
    EXPECT_EQ(saturationAt(0), 50.0f);
    EXPECT_EQ(saturationAt(10), 50.0f);
    EXPECT_NEAR(saturationAt(15), 100.0f, 1e-3);
    EXPECT_EQ(saturationAt(20), 150.0f);
    EXPECT_EQ(saturationAt(99), 150.0f);
}

}  // namespace
}  // namespace vt
