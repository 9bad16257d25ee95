// The lookup rebuild: stage flags, tables and coefficients from the settings, disabled groups
// counting as reset, guarded divisions, and publication of complete sets only.
#include "engine/lookup_build.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <string>

#include "engine/curves.h"
#include "engine/engine_memory.h"
#include "tests/support/platform_capture.h"
#include "tests/unit/engine/engine_test_support.h"

namespace vt {
namespace {

using test::ResetRecord;

std::shared_ptr<const EngineSet> Build(const CorrectionSettings& s) {
    auto set = BuildEngineSet(s, nullptr);
    EXPECT_NE(nullptr, set);
    return set;
}

bool AnyFlagSet(const StageFlags& f) {
    const auto* bytes = reinterpret_cast<const uint8_t*>(&f);
    for (size_t i = 0; i < sizeof(StageFlags); ++i) {
        if (bytes[i] != 0) return true;
    }
    return false;
}

void ExpectFinite(const float* table, const char* what) {
    for (int i = 0; i < kLookupSize; ++i) ASSERT_TRUE(std::isfinite(table[i])) << what << " entry " << i;
}

TEST(LookupBuild, ResetRecordGivesIdentityTablesAndNoStages) {
    auto s = ResetRecord();
    auto set = Build(*s);
    EXPECT_FALSE(AnyFlagSet(set->params.flags));
    for (int r = 0; r < 4; ++r) {
        const float* t = set->params.tonal[r].table;
        for (int i = 0; i < kLookupSize; ++i) ASSERT_NEAR(i / 16384.0, t[i], 1e-6) << "range " << r << " entry " << i;
    }
    // The weights are built on every rebuild and cover every level.
    for (int i = 0; i < kLookupSize; ++i) {
        const float sum = set->params.weightShadows[i] + set->params.weightMidtones[i] + set->params.weightHighlights[i];
        ASSERT_NEAR(1.0f, sum, 1e-6f) << i;
    }
}

// What the kernel reads packed is the range tables side by side.
TEST(LookupBuild, PackedTablesHoldTheRangeTablesSideBySide) {
    auto s = ResetRecord();
    test::EnableEverything(s.get());
    auto set = Build(*s);
    const EngineParams& p = set->params;
    auto expectPacked = [](const float* packed, const float* a, const float* b, const float* c, const char* what) {
        for (int i = 0; i < kLookupSize; ++i) {
            ASSERT_EQ(a[i], packed[4 * i]) << what << " " << i;
            ASSERT_EQ(b[i], packed[4 * i + 1]) << what << " " << i;
            ASSERT_EQ(c[i], packed[4 * i + 2]) << what << " " << i;
        }
    };
    expectPacked(p.tonalPacked, p.tonal[kRangeHighlights].table, p.tonal[kRangeMidtones].table,
                 p.tonal[kRangeShadows].table, "tonal");
    expectPacked(p.huePacked, p.hueShift, p.hueSaturation, p.hueLuma, "hue");
    for (int k = 0; k < kChannelSetCount; ++k) {
        for (int c = 0; c < kColourCount; ++c) {
            expectPacked(p.setGammaPacked[k][c], p.setGamma[k][kRangeHighlights][c].table,
                         p.setGamma[k][kRangeMidtones][c].table, p.setGamma[k][kRangeShadows][c].table, "set");
        }
    }
}

TEST(LookupBuild, DisabledGroupsCountAsResetWhileTheRecordKeepsThem) {
    auto s = ResetRecord();
    test::EnableEverything(s.get());
    s->rgbSet.enable = 0;
    s->tonalEnable = 0;
    s->levels[0].group.enable = 0;  // also drops the auto-correct value with it
    s->secondariesEnable2 = 0;
    s->enableLimiter = 0x100;      // only the low byte counts
    const auto before = std::make_unique<CorrectionSettings>(*s);
    auto set = Build(*s);
    EXPECT_TRUE(SettingsEqual(*before, *s));

    const EngineParams& p = set->params;
    EXPECT_FALSE(p.flags.tonalRanges);
    EXPECT_FALSE(p.flags.tonalMaster);
    EXPECT_FALSE(p.flags.autoCompress);
    EXPECT_FALSE(p.flags.secondaries);
    EXPECT_FALSE(p.flags.limiter);
    // The RGB set is off but the third set is on: its values alone make up the folded set.
    EXPECT_TRUE(p.flags.setRanges[kSetRgb]);
    const ChannelRange& third = s->thirdSet.range[kRangeHighlights];
    EXPECT_FLOAT_EQ(third.channel[kChannelRed].gain * third.channel[kChannelMaster].gain,
                    p.setGain[kSetRgb][kRangeHighlights][0]);
    // Levels: the Master group's identity values enter the combination.
    const LevelsGroup& red = s->levels[1].group;
    const float redSlope = 1.0f / (red.inputWhite - red.inputBlack);
    EXPECT_FLOAT_EQ(redSlope, p.levelsSlope[0]);
    EXPECT_FLOAT_EQ(-redSlope * red.inputBlack, p.levelsOffset[0]);
}

TEST(LookupBuild, EverythingEnabledSetsEveryStage) {
    auto s = ResetRecord();
    test::EnableEverything(s.get());
    auto set = Build(*s);
    const StageFlags& f = set->params.flags;
    for (uint8_t flag : {f.rangeWeights, f.autoCompress, f.levels, f.levelsGamma, f.tonalRanges, f.tonalHueRotation,
                         f.tonalGain, f.tonalPedestal, f.tonalCurve, f.tonalSaturation, f.tonalVibrance, f.tonalMaster,
                         f.masterHueRotation, f.masterCurve, f.masterSaturation, f.masterVibrance, f.hueWheels,
                         f.setRanges[0], f.setRanges[1], f.setRangesGamma[0], f.setRangesGamma[1], f.setMaster[0],
                         f.setMaster[1], f.setMasterGamma[0], f.setMasterGamma[1], f.toneCurves, f.hueCurves,
                         f.lumaRanges, f.secondaries, f.limiter, f.softClip, f.rgbRangesPresent}) {
        EXPECT_TRUE(flag);
    }
    for (int k = 0; k < 6; ++k) EXPECT_TRUE(f.secondary[k]);
    EXPECT_FLOAT_EQ(1.0f - 0.4f * 0.3f, set->params.autoKnee);
}

TEST(LookupBuild, ContrastCenterShiftsAndFullContrastSteps) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].contrastCenter = 0.3f;
    auto shifted = Build(*s);
    const float* t = shifted->params.tonal[kRangeMaster].table;
    EXPECT_TRUE(shifted->params.flags.masterCurve);
    EXPECT_NEAR(0.2f, t[0], 1e-6f);
    EXPECT_NEAR(0.7f, t[8192], 1e-6f);
    EXPECT_EQ(1.0f, t[13108]);
    EXPECT_EQ(1.0f, t[16384]);

    s->tonal[kRangeMaster].contrastCenter = 0.5f;
    s->tonal[kRangeMaster].contrast = 100.0f;
    auto step = Build(*s);
    const float* h = step->params.tonal[kRangeMaster].table;
    EXPECT_LT(h[7000], 1e-6f);
    EXPECT_EQ(0.5f, h[8192]);
    EXPECT_GT(h[9400], 1.0f - 1e-6f);

    // Beyond the slider ends the exponents stay bounded: flat at -200, a step at 300.
    s->tonal[kRangeMaster].contrast = -200.0f;
    auto flat = Build(*s);
    EXPECT_EQ(0.5f, flat->params.tonal[kRangeMaster].table[100]);
    ExpectFinite(flat->params.tonal[kRangeMaster].table, "flat");
    s->tonal[kRangeMaster].contrast = 300.0f;
    s->tonal[kRangeMaster].brightness = -500.0f;  // below black: holds at 0 instead of a NaN power
    s->tonal[kRangeMaster].gamma = 0.7f;
    auto extreme = Build(*s);
    ExpectFinite(extreme->params.tonal[kRangeMaster].table, "extreme");
}

TEST(LookupBuild, TonalRangesChainTheirContrast) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].contrastCenter = 0.4f;  // Master adds 0.1
    s->tonal[kRangeShadows].enable = 1;
    s->tonal[kRangeShadows].gamma = 2.0f;          // Shadows: its gamma over Master's contrast output
    auto set = Build(*s);
    const EngineParams& p = set->params;
    EXPECT_NEAR(0.6f, p.tonal[kRangeMaster].table[8192], 1e-6f);
    EXPECT_NEAR(std::sqrt(0.6f), p.tonal[kRangeShadows].table[8192], 1e-6f);
    EXPECT_NEAR(0.6f, p.tonal[kRangeHighlights].table[8192], 1e-6f);
    EXPECT_TRUE(p.flags.tonalCurve);
    EXPECT_FALSE(p.flags.tonalGain);
    // End values and slopes continue each table beyond level 1.
    EXPECT_EQ(p.tonal[kRangeShadows].table[16383], p.tonal[kRangeShadows].end);
    EXPECT_NEAR(0.0f, p.tonal[kRangeMaster].slope, 1e-6f);  // saturated at 1 near the top
}

TEST(LookupBuild, HueWheelPointsFromSixteenBitHsl) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->hueWheelsEnable = 1;
    const float angles[4] = {0.0f, 240.0f, 120.0f, 720.0f};
    for (int w = 0; w < 4; ++w) {
        s->hueWheels[w].angle = angles[w];
        s->hueWheels[w].amount = 1.5f;
    }
    auto set = Build(*s);
    const EngineParams& p = set->params;
    const float q = 65534.0f / 65535.0f;  // 16-bit HSL at lightness 32767
    // Angle 0: red. The hue runs backwards: 240 degrees is green, 120 blue.
    EXPECT_NEAR(-0.147407f * q, p.wheelU[0], 1e-6f);
    EXPECT_NEAR(0.614777f * q, p.wheelV[0], 1e-6f);
    EXPECT_NEAR(-0.289391f * q, p.wheelU[1], 2e-5f);
    EXPECT_NEAR(-0.514799f * q, p.wheelV[1], 2e-5f);
    EXPECT_NEAR(0.436798f * q, p.wheelU[2], 2e-5f);
    EXPECT_NEAR(-0.099978f * q, p.wheelV[2], 2e-5f);
    EXPECT_EQ(p.wheelU[0], p.wheelU[3]);  // angles wrap
    EXPECT_EQ(0.5f, p.wheelGain[2]);
    EXPECT_TRUE(p.flags.wheelActive[3]);
}

TEST(LookupBuild, ChannelSetsFoldTheThirdSetAndComposeGammas) {
    auto s = ResetRecord();
    s->rgbSet.enable = 1;
    s->thirdSet.enable = 1;
    ChannelRange& rgb = s->rgbSet.range[kRangeMaster];
    ChannelRange& third = s->thirdSet.range[kRangeMaster];
    rgb.enable = 1;
    third.enable = 1;
    test::SetTriplet(&rgb.channel[kChannelMaster], 2.0f, 2.0f, 0.1f);
    test::SetTriplet(&rgb.channel[kChannelGreen], 1.5f, 1.0f, 0.05f);
    test::SetTriplet(&third.channel[kChannelGreen], 0.5f, 0.5f, -0.2f);
    auto set = Build(*s);
    const EngineParams& p = set->params;
    EXPECT_FLOAT_EQ(2.0f * 1.5f * 0.5f, p.setGain[kSetRgb][kRangeMaster][1]);
    EXPECT_FLOAT_EQ(0.1f + 0.05f - 0.2f, p.setPedestal[kSetRgb][kRangeMaster][1]);
    EXPECT_FLOAT_EQ(2.0f, p.setGain[kSetRgb][kRangeMaster][0]);
    EXPECT_TRUE(p.flags.setMaster[kSetRgb]);
    EXPECT_TRUE(p.flags.setMasterGamma[kSetRgb]);
    EXPECT_FALSE(p.flags.setRanges[kSetRgb]);
    EXPECT_FALSE(p.flags.setMaster[kSetSecond]);
    // Green: Master-channel gamma 2 and third-set gamma 0.5 cancel; red keeps the Master's 1/2.
    const float* green = p.setGamma[kSetRgb][kRangeMaster][1].table;
    const float* red = p.setGamma[kSetRgb][kRangeMaster][0].table;
    EXPECT_NEAR(0.25f, green[4096], 1e-6f);
    EXPECT_NEAR(0.5f, red[4096], 1e-6f);
    EXPECT_EQ(0.0f, red[0]);
    EXPECT_EQ(1.0f, red[16384]);
}

TEST(LookupBuild, LevelsGuardTheirDivisions) {
    auto s = ResetRecord();
    s->levelsEnable = 1;
    LevelsGroup& m = s->levels[0].group;
    m.enable = 1;
    m.inputBlack = 0.4f;
    m.inputWhite = 0.4f;      // equal ends: a 1e-9 difference
    m.inputMidpoint = 0.9f;   // beyond the white point
    LevelsGroup& g = s->levels[2].group;
    g.enable = 1;
    g.inputMidpoint = 0.3f;
    g.outputBlack = 0.2f;
    g.outputWhite = 0.2f;
    auto set = Build(*s);
    const EngineParams& p = set->params;
    EXPECT_TRUE(p.flags.levelsGamma);
    EXPECT_FLOAT_EQ(1e9f, p.levelsSlope[0]);
    EXPECT_TRUE(std::isfinite(p.levelsOffset[0]));
    EXPECT_FLOAT_EQ(1e-9f, p.levelsRange[1]);
    EXPECT_FLOAT_EQ(0.2f, p.levelsOutputOffset[1]);
    for (int c = 0; c < 3; ++c) ExpectFinite(p.levels[c].table, "levels");
    // Green: (x^(1/3))^(1e6) with the Master's steepest midpoint.
    EXPECT_EQ(0.0f, p.levels[1].table[8192]);
    EXPECT_EQ(1.0f, p.levels[1].table[16384]);

    // Midpoint 0.3 of [0, 1] alone: exponent 1 / (1 + 0.2 * 10).
    m = LevelsGroup{1, 0.0f, 0.5f, 1.0f, 0.0f, 0.5f, 1.0f};
    auto mid = Build(*s);
    EXPECT_NEAR(std::pow(0.5, 1.0 / 3.0), mid->params.levels[1].table[8192], 1e-6);
}

TEST(LookupBuild, SecondaryCoefficients) {
    auto s = ResetRecord();
    s->secondariesEnable = 1;
    SecondaryRecord& r = s->secondaries[2];
    r.enable = 1;
    r.softness = 0.0f;
    r.chromaTolerance = 0.2f;
    r.modeEnable = 0;
    r.mode = 3;
    r.reference[1] = {1, 0.2f, 0.6f, 0.4f};
    r.gamma = 2.0f;
    r.hueRotation = 90.0f;
    auto set = Build(*s);
    const SecondaryParams& k = set->params.secondary[2];
    EXPECT_TRUE(set->params.flags.secondary[2]);
    EXPECT_FALSE(set->params.flags.secondary[1]);
    EXPECT_EQ(0, k.mode);  // mode counts only with its enable
    EXPECT_TRUE(std::isfinite(k.inverseSoftness2));
    EXPECT_FLOAT_EQ(0.04f, k.chromaTolerance2);
    EXPECT_NEAR(0.0f, k.cosAngle, 1e-6f);
    EXPECT_NEAR(1.0f, k.sinAngle, 1e-6f);
    EXPECT_FLOAT_EQ(0.299f * 0.2f + 0.587f * 0.6f + 0.114f * 0.4f, k.referenceY[1]);
    EXPECT_FLOAT_EQ(0.614777f * 0.2f - 0.5147996f * 0.6f - 0.099978f * 0.4f, k.referenceV[1]);
    EXPECT_TRUE(k.referenceEnable[1]);
    EXPECT_FALSE(k.referenceEnable[0]);
    EXPECT_NEAR(std::sqrt(0.25f), set->params.secondaryGamma[2].table[4096], 1e-6f);
    r.modeEnable = 1;
    r.mode = 9;  // unknown modes correct
    EXPECT_EQ(0, Build(*s)->params.secondary[2].mode);
}

TEST(LookupBuild, LimiterLevelsFromTheVideoPreferences) {
    auto s = ResetRecord();
    s->enableLimiter = 1;
    s->videoBlackLevel = 16;
    s->videoWhiteLevel = 235;
    s->videoMaxLevel = 255;
    s->videoBlackSetupPresent = 1;
    auto set = Build(*s);
    const EngineParams& p = set->params;
    const float b = 16.0f / 255.0f;
    const float k = (235.0f / 255.0f - b) / 0.925f;
    EXPECT_NEAR((110.0f - 7.5f) * k + 100.0f * b, p.compositeMax, 1e-4f);
    EXPECT_NEAR((-30.0f - 7.5f) * k + 100.0f * b, p.compositeMin, 1e-4f);
    EXPECT_NEAR((1.2f - 0.075f) * k + b, p.hardClip, 1e-6f);
    EXPECT_FALSE(p.flags.softClip);
    EXPECT_EQ(3u, p.limitMethod);

    // A max level of 0 and a soft clip whose max equals its knee divide by nothing.
    s->videoMaxLevel = 0;
    s->enableSoftClip = 1;
    s->softClipMaxLevel = s->softClipKneeLevel;
    auto guarded = Build(*s);
    EXPECT_TRUE(std::isfinite(guarded->params.compositeMax));
    EXPECT_EQ(0.0f, guarded->params.softRatio);
    EXPECT_NEAR((1.2f - 0.075f) / 0.925f, guarded->params.hardClip, 1e-6f);  // full range, setup kept
}

TEST(LookupBuild, CurveTablesArePostProcessed) {
    auto s = ResetRecord();
    s->curvesEnable = 1;
    s->toneCurvesEnable = 1;
    s->hueCurvesEnable = 1;
    test::SetPoints(&s->toneCurves[kChannelMaster], {{0.0f, 0.0f}, {1.0f, 0.5f}});
    auto set = Build(*s);
    const EngineParams& p = set->params;
    // Channel curves are identity: the Master curve alone, read at the rounded channel value.
    EXPECT_NEAR(0.25f, p.toneCurve[0].table[8192], 1e-6f);
    EXPECT_NEAR(0.5f * 16383.0f / 16384.0f, p.toneCurve[2].end, 1e-6f);
    EXPECT_NEAR(0.5f, p.toneCurve[2].slope, 1e-4f);
    for (int j : {0, 5000, 16384}) {
        EXPECT_EQ(0.0f, p.hueShift[j]);
        EXPECT_EQ(1.0f, p.hueSaturation[j]);
        EXPECT_EQ(1.0f, p.hueLuma[j]);
    }
}

// --- publication ---

struct Refusal {
    std::string name;
    int count = 0;
};

bool RefuseNamed(const char* what, void* context) {
    auto* r = static_cast<Refusal*>(context);
    if (r->name != what) return false;
    ++r->count;
    return true;
}

class Publication : public ::testing::Test {
protected:
    void SetUp() override { ResetPublishedEngineSet(); }
    void TearDown() override {
        SetEngineAllocationHook(nullptr, nullptr);
        ResetPublishedEngineSet();
    }
};

TEST_F(Publication, UpdatePublishesAndCountsRebuilds) {
    EXPECT_EQ(nullptr, CurrentEngineSet());
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].gain = 2.0f;
    Update(*s);
    auto first = CurrentEngineSet();
    ASSERT_NE(nullptr, first);
    EXPECT_EQ(2.0f, first->params.tonalGain[0]);
    EXPECT_EQ(1u, LookupRebuildCount());

    // A set held by a render stays whole while a newer one is published.
    s->tonal[kRangeMaster].gain = 3.0f;
    Update(*s);
    EXPECT_EQ(2u, LookupRebuildCount());
    EXPECT_EQ(2.0f, first->params.tonalGain[0]);
    EXPECT_EQ(0.5f, first->params.tonal[0].table[8192]);
    EXPECT_EQ(3.0f, CurrentEngineSet()->params.tonalGain[0]);
}

TEST_F(Publication, MissingScratchKeepsThePreviousSet) {
    test::PlatformCapture capture;
    auto s = ResetRecord();
    Update(*s);
    auto before = CurrentEngineSet();
    for (const char* what : {"calcArray", "tables", "EngineSet"}) {
        Refusal refusal{what};
        SetEngineAllocationHook(RefuseNamed, &refusal);
        s->tonal[kRangeMaster].gain = 5.0f;
        Update(*s);
        EXPECT_EQ(1, refusal.count) << what;
        EXPECT_EQ(before, CurrentEngineSet()) << what;
    }
    const auto messages = capture.Messages();
    ASSERT_EQ(3u, messages.size());
    for (const auto& m : messages) {
        EXPECT_EQ("Insufficient memory for calcArray during parameter update", m.text);
        EXPECT_EQ(1, m.kind);
    }
}

TEST_F(Publication, MissingCurveMemoryKeepsThoseTables) {
    auto s = ResetRecord();
    s->curvesEnable = 1;
    s->toneCurvesEnable = 1;
    s->hueCurvesEnable = 1;
    test::SetPoints(&s->toneCurves[kChannelRed], {{0.0f, 0.0f}, {0.5f, 0.7f}, {1.0f, 1.0f}});
    test::SetPoints(&s->hueCurves[kHueCurveLuma], {{0.0f, 0.5f}, {0.5f, 0.7f}, {1.0f, 0.5f}});
    Update(*s);
    auto before = CurrentEngineSet();
    const float redBefore = before->params.toneCurve[0].table[8192];
    const float lumaBefore = before->params.hueLuma[8192];

    // New curves, but the basis samples cannot be allocated: the three-point curves keep their
    // tables, the two-point ones are rebuilt.
    test::SetPoints(&s->toneCurves[kChannelRed], {{0.0f, 0.0f}, {0.5f, 0.2f}, {1.0f, 1.0f}});
    test::SetPoints(&s->toneCurves[kChannelGreen], {{0.0f, 0.0f}, {1.0f, 0.5f}});
    test::SetPoints(&s->hueCurves[kHueCurveLuma], {{0.0f, 0.5f}, {0.5f, 0.2f}, {1.0f, 0.5f}});
    Refusal curveArray{"curveArray"};
    SetEngineAllocationHook(RefuseNamed, &curveArray);
    Update(*s);
    auto after = CurrentEngineSet();
    EXPECT_NE(before, after);
    EXPECT_EQ(2, curveArray.count);
    EXPECT_EQ(redBefore, after->params.toneCurve[0].table[8192]);
    EXPECT_EQ(lumaBefore, after->params.hueLuma[8192]);
    EXPECT_NEAR(0.25f, after->params.toneCurve[1].table[8192], 1e-6f);

    // Without masterLookup every tone curve keeps its table; the rest of the rebuild goes on.
    test::PlatformCapture capture;
    Refusal master{"masterLookup"};
    SetEngineAllocationHook(RefuseNamed, &master);
    s->hueCurvesEnable = 0;
    Update(*s);
    auto last = CurrentEngineSet();
    EXPECT_EQ(1, master.count);
    EXPECT_EQ(after->params.toneCurve[1].table[8192], last->params.toneCurve[1].table[8192]);
    EXPECT_FALSE(last->params.flags.hueCurves);
    ASSERT_EQ(1u, capture.Messages().size());
    EXPECT_EQ("Insufficient memory for masterLookup during parameter update", capture.Messages()[0].text);

    // The weights keep theirs when HCurve has no memory.
    Refusal weights{"HCurve"};
    SetEngineAllocationHook(RefuseNamed, &weights);
    s->shadowsPoint = 0.1f;
    s->lumaRangesEnable = 1;
    Update(*s);
    EXPECT_EQ(1, weights.count);
    EXPECT_EQ(0, std::memcmp(last->params.weightShadows, CurrentEngineSet()->params.weightShadows,
                             sizeof(float) * kLookupSize));
}

TEST_F(Publication, ForeignByteOrderIsReadAsNative) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].gain = 1.25f;
    auto foreign = std::make_unique<CorrectionSettings>(*s);
    auto* bytes = reinterpret_cast<uint8_t*>(foreign.get());
    for (size_t i = 0; i < sizeof(CorrectionSettings); i += 4) {
        std::swap(bytes[i], bytes[i + 3]);
        std::swap(bytes[i + 1], bytes[i + 2]);
    }
    Update(*foreign);
    EXPECT_EQ(1.25f, CurrentEngineSet()->params.tonalGain[0]);
}

}  // namespace
}  // namespace vt
