// The stored layout of the correction record, its reset by group, byte-order repair and enables.
#include "engine/correction_settings.h"

#include <gtest/gtest.h>

#include <bit>
#include <cstring>
#include <memory>
#include <vector>

#include "files/preferences.h"

namespace vt {
namespace {

std::unique_ptr<CorrectionSettings> FilledRecord(uint8_t pattern) {
    auto s = std::make_unique<CorrectionSettings>();
    std::memset(s.get(), pattern, sizeof(CorrectionSettings));
    return s;
}

uint32_t WordAt(const CorrectionSettings& s, size_t offset) {
    uint32_t w;
    std::memcpy(&w, reinterpret_cast<const uint8_t*>(&s) + offset, 4);
    return w;
}

float FloatAt(const CorrectionSettings& s, size_t offset) { return std::bit_cast<float>(WordAt(s, offset)); }

Preferences TestPreferences() {
    Preferences p{};
    p.limiterDefault = 1;
    p.videoSystem = 2;
    p.videoBlackLevel = 16;
    p.videoWhiteLevel = 235;
    p.videoMinLevel = 1;
    p.videoMaxLevel = 254;
    p.videoBlackSetupPresent = 1;
    return p;
}

// Every stored word written through the field names must land at the documented byte offset.
TEST(CorrectionSettings, FieldsLandOnTheDocumentedOffsets) {
    CorrectionSettings s{};
    std::vector<uint8_t> expected(sizeof(CorrectionSettings), 0);
    uint32_t next = 1;
    auto put = [&](size_t offset, auto& field) {
        const uint32_t value = next++ * 2654435761u;
        std::memcpy(&field, &value, 4);
        std::memcpy(expected.data() + offset, &value, 4);
    };
    put(0, s.magic);
    put(4, s.masterEnable);
    put(8, s.tonalEnable);
    for (int r = 0; r < 4; ++r) {
        TonalRange& t = s.tonal[r];
        const size_t base = 12 + 40 * r;
        put(base + 0, t.enable);
        put(base + 4, t.hue);
        put(base + 8, t.saturation);
        put(base + 12, t.vibrance);
        put(base + 16, t.brightness);
        put(base + 20, t.contrast);
        put(base + 24, t.contrastCenter);
        put(base + 28, t.gain);
        put(base + 32, t.gamma);
        put(base + 36, t.pedestal);
    }
    ChannelSet* sets[3] = {&s.rgbSet, &s.secondSet, &s.thirdSet};
    const size_t setBase[3] = {172, 384, 596};
    for (int k = 0; k < 3; ++k) {
        put(setBase[k], sets[k]->enable);
        for (int r = 0; r < 4; ++r) {
            const size_t base = setBase[k] + 4 + 52 * r;
            put(base, sets[k]->range[r].enable);
            for (int c = 0; c < 4; ++c) {
                put(base + 4 + 12 * c, sets[k]->range[r].channel[c].gain);
                put(base + 8 + 12 * c, sets[k]->range[r].channel[c].gamma);
                put(base + 12 + 12 * c, sets[k]->range[r].channel[c].pedestal);
            }
        }
    }
    put(808, s.hueWheelsEnable);
    put(812, s.hueWheelsWord);
    for (int w = 0; w < 4; ++w) {
        put(816 + 12 * w, s.hueWheels[w].word);
        put(820 + 12 * w, s.hueWheels[w].angle);
        put(824 + 12 * w, s.hueWheels[w].amount);
    }
    put(864, s.levelsEnable);
    put(868, s.levelsWord);
    auto putLevels = [&](size_t base, LevelsGroup& g) {
        put(base, g.enable);
        put(base + 4, g.inputBlack);
        put(base + 8, g.inputMidpoint);
        put(base + 12, g.inputWhite);
        put(base + 16, g.outputBlack);
        put(base + 20, g.outputMidpoint);
        put(base + 24, g.outputWhite);
    };
    for (int g = 0; g < 4; ++g) {
        putLevels(872 + 32 * g, s.levels[g].group);
        put(900 + 32 * g, s.levels[g].word);
    }
    putLevels(1000, s.fifthLevels);
    put(1028, s.curvesEnable);
    put(1032, s.toneCurvesEnable);
    auto putCurve = [&](size_t base, CurveRecord& c) {
        put(base, c.reserved);
        put(base + 4, c.curveWord);
        put(base + 8, c.flags);
        put(base + 12, c.data.points.count);
        for (int i = 0; i < 16; ++i) put(base + 16 + 4 * i, c.data.points.x[i]);
        for (int i = 0; i < 16; ++i) put(base + 80 + 4 * i, c.data.points.y[i]);
    };
    for (int c = 0; c < 4; ++c) putCurve(1036 + 4108 * c, s.toneCurves[c]);
    for (int i = 0; i < 9; ++i) put(17468 + 4 * i, s.toneCurvesTail[i]);
    put(17504, s.hueCurvesEnable);
    for (int c = 0; c < 3; ++c) putCurve(17508 + 4108 * c, s.hueCurves[c]);
    put(29832, s.lumaRangesEnable);
    put(29836, s.lumaRangesWords[0]);
    put(29840, s.lumaRangesWords[1]);
    put(29844, s.shadowsPoint);
    put(29848, s.shadowsSoftness);
    put(29852, s.highlightsPoint);
    put(29856, s.highlightsSoftness);
    put(29860, s.secondariesEnable);
    put(29864, s.secondariesEnable2);
    for (int k = 0; k < 6; ++k) {
        SecondaryRecord& r = s.secondaries[k];
        const size_t base = 29868 + 124 * k;
        put(base + 0, r.enable);
        put(base + 4, r.lumaTolerance);
        put(base + 8, r.chromaTolerance);
        put(base + 12, r.softness);
        put(base + 16, r.modeEnable);
        put(base + 20, r.mode);
        put(base + 24, r.invertKey);
        put(base + 28, r.hueRotation);
        put(base + 32, r.saturation);
        put(base + 36, r.word9);
        put(base + 40, r.hueShiftAngle);
        put(base + 44, r.hueShiftAmount);
        for (int j = 0; j < 4; ++j) {
            put(base + 48 + 16 * j, r.reference[j].enable);
            put(base + 52 + 16 * j, r.reference[j].red);
            put(base + 56 + 16 * j, r.reference[j].green);
            put(base + 60 + 16 * j, r.reference[j].blue);
        }
        put(base + 112, r.gain);
        put(base + 116, r.gamma);
        put(base + 120, r.pedestal);
    }
    put(30612, s.secondariesWord);
    for (int k = 0; k < 6; ++k) {
        AuxiliaryRecord& a = s.auxiliaries[k];
        const size_t base = 30616 + 460 * k;
        put(base + 0, a.enable);
        put(base + 4, a.value1);
        put(base + 8, a.word2);
        put(base + 12, a.word3);
        put(base + 16, a.word4);
        put(base + 20, a.value5);
        put(base + 24, a.value6);
        put(base + 28, a.word7);
        put(base + 32, a.value8);
        put(base + 36, a.value9);
        put(base + 40, a.value10);
        put(base + 44, a.value11);
        put(base + 48, a.value12);
        for (int i = 0; i < 6; ++i) put(base + 52 + 4 * i, a.words13[i]);
        for (int e = 0; e < 8; ++e) put(base + 76 + 48 * e, a.entries[e].flags);
    }
    put(33376, s.enableLimiter);
    put(33380, s.showLimiterPreview);
    put(33384, s.chromaMaxLimit);
    put(33388, s.chromaMinLimit);
    put(33392, s.lumaHardClipLevel);
    put(33396, s.enableSoftClip);
    put(33400, s.softClipKneeLevel);
    put(33404, s.softClipWhiteLevel);
    put(33408, s.softClipMaxLevel);
    put(33412, s.limitMethod);
    put(33416, s.videoSystem);
    put(33420, s.limiterWord);
    for (int i = 0; i < 14; ++i) put(33424 + 4 * i, s.limiterExtension[i]);
    put(33480, s.videoBlackLevel);
    put(33484, s.videoWhiteLevel);
    put(33488, s.videoMinLevel);
    put(33492, s.videoMaxLevel);
    put(33496, s.videoBlackSetupPresent);
    put(33500, s.preferenceVideoSystem);
    put(33504, s.hostColourSpaceFlag);
    put(33508, s.colourSpaceWord1);
    put(33512, s.colourSpaceWord2);
    put(33516, s.colourSpaceWords[0]);
    put(33520, s.colourSpaceWords[1]);
    put(33524, s.colourSpaceGamma);
    put(33528, s.colourSpaceBlackCode);
    put(33532, s.colourSpaceWhiteCode);
    put(33536, s.colourSpaceWord3);
    put(33540, s.autoCorrectA);
    put(33544, s.autoCorrectB);
    put(33548, s.tail[0]);
    put(33552, s.tail[1]);
    EXPECT_EQ(0, std::memcmp(&s, expected.data(), sizeof(CorrectionSettings)));
}

// The byte ranges a single mask bit may touch, and nothing else.
struct Region {
    size_t offset;
    size_t size;
};

std::vector<Region> RegionsOfBit(int bit) {
    if (bit <= 3) return {{12 + 40u * bit, 40}};
    if (bit <= 7) return {{176 + 52u * (bit - 4), 52}};
    if (bit <= 11) return {{388 + 52u * (bit - 8), 52}};
    if (bit <= 15) return {{600 + 52u * (bit - 12), 52}};
    if (bit == 16) return {{808, 8}, {820, 8}, {832, 8}, {844, 8}, {856, 8}};
    if (bit == 17) return {{872, 28}, {33540, 8}};
    if (bit <= 20) return {{872 + 32u * (bit - 17), 28}};
    if (bit == 21) return {{1000, 28}};
    if (bit <= 27) return {{29868 + 124u * (bit - 22), 124}};
    if (bit == 28) return {{33376, 48}};
    if (bit == 30) return {{29832, 4}, {29844, 16}};
    if (bit >= 33 && bit <= 36) return {{1036 + 4108u * (bit - 33) + 8, 4100}};
    if (bit >= 37 && bit <= 39) return {{17508 + 4108u * (bit - 37) + 8, 4100}};
    if (bit == 40) return {{33508, 4}, {33524, 4}};
    if (bit == 41) return {{33512, 4}, {33528, 12}};
    if (bit >= 42 && bit <= 47) {
        const size_t base = 30616 + 460u * (bit - 42);
        std::vector<Region> regions{{base, 76}};
        for (size_t e = 0; e < 8; ++e) regions.push_back({base + 76 + 48 * e, 2});
        return regions;
    }
    return {};
}

TEST(CorrectionSettings, EachMaskBitTouchesOnlyItsGroup) {
    const Preferences prefs = TestPreferences();
    for (int bit = 0; bit < 64; ++bit) {
        auto before = FilledRecord(0xA5);
        auto after = FilledRecord(0xA5);
        ResetSettings(after.get(), MaskBit(bit), prefs);
        std::vector<bool> allowed(sizeof(CorrectionSettings), false);
        for (const Region& r : RegionsOfBit(bit)) {
            for (size_t i = 0; i < r.size; ++i) allowed[r.offset + i] = true;
        }
        const auto* a = reinterpret_cast<const uint8_t*>(before.get());
        const auto* b = reinterpret_cast<const uint8_t*>(after.get());
        bool changedSomething = false;
        for (size_t i = 0; i < sizeof(CorrectionSettings); ++i) {
            if (a[i] != b[i]) {
                changedSomething = true;
                ASSERT_TRUE(allowed[i]) << "bit " << bit << " wrote byte " << i;
            }
        }
        EXPECT_EQ(!RegionsOfBit(bit).empty(), changedSomething) << "bit " << bit;
    }
}

TEST(CorrectionSettings, GroupResetValues) {
    const Preferences prefs = TestPreferences();
    auto s = FilledRecord(0x5A);
    ResetSettings(s.get(), kMaskAll & ~uint64_t{0}, prefs);  // all groups, header included

    const TonalRange& t = s->tonal[kRangeMidtones];
    EXPECT_EQ(0u, t.enable);
    EXPECT_EQ(100.0f, t.saturation);
    EXPECT_EQ(0.5f, t.contrastCenter);
    EXPECT_EQ(1.0f, t.gain);
    EXPECT_EQ(1.0f, t.gamma);
    EXPECT_EQ(0.0f, t.pedestal);
    EXPECT_EQ(1.0f, s->thirdSet.range[3].channel[kChannelBlue].gamma);
    EXPECT_EQ(0.0f, s->thirdSet.range[3].channel[kChannelBlue].pedestal);
    EXPECT_EQ(0.5f, s->levels[2].group.inputMidpoint);
    EXPECT_EQ(1.0f, s->fifthLevels.outputWhite);
    EXPECT_EQ(0.0f, s->autoCorrectA);

    const CurvePoints& tone = s->toneCurves[kChannelGreen].data.points;
    EXPECT_EQ(0u, s->toneCurves[kChannelGreen].flags);
    EXPECT_EQ(2, tone.count);
    EXPECT_EQ(0.0f, tone.y[0]);
    EXPECT_EQ(1.0f, tone.x[1]);
    EXPECT_EQ(1.0f, tone.y[1]);
    EXPECT_EQ(0x5A5A5A5Au, s->toneCurves[kChannelGreen].curveWord);  // carried
    const CurvePoints& hue = s->hueCurves[kHueCurveLuma].data.points;
    EXPECT_EQ(0.5f, hue.y[0]);
    EXPECT_EQ(0.5f, hue.y[1]);

    EXPECT_EQ(0.3f, s->shadowsPoint);
    EXPECT_EQ(0.3831f, s->highlightsSoftness);
    const SecondaryRecord& k = s->secondaries[4];
    EXPECT_EQ(0.05f, k.lumaTolerance);
    EXPECT_EQ(0.1f, k.chromaTolerance);
    EXPECT_EQ(1u, k.mode);
    EXPECT_EQ(100.0f, k.saturation);
    EXPECT_EQ(1.0f, k.gamma);
    const AuxiliaryRecord& x = s->auxiliaries[1];
    EXPECT_EQ(1u, x.word3);
    EXPECT_EQ(100.0f, x.value6);
    EXPECT_EQ(1.0f, x.value11);
    EXPECT_EQ(0, x.entries[7].flags[1]);
    EXPECT_EQ(0x5A, x.entries[7].rest[0]);

    EXPECT_EQ(110.0f, s->chromaMaxLimit);
    EXPECT_EQ(-30.0f, s->chromaMinLimit);
    EXPECT_EQ(130.0f, s->softClipMaxLevel);
    EXPECT_EQ(3u, s->limitMethod);
    EXPECT_EQ(2.2f, s->colourSpaceGamma);
    EXPECT_EQ(685u, s->colourSpaceWhiteCode);
    EXPECT_EQ(1u, s->colourSpaceWord3);
    EXPECT_EQ(0x5A5A5A5Au, s->hueWheels[2].word);
    EXPECT_EQ(0x5A5A5A5Au, s->limiterExtension[13]);
    EXPECT_EQ(0x5A5A5A5Au, s->tail[1]);
}

TEST(CorrectionSettings, FullResetWritesHeaderAndPreferenceCopies) {
    const Preferences prefs = TestPreferences();
    auto s = FilledRecord(0xFF);
    ResetSettings(s.get(), kMaskAll, prefs);
    EXPECT_EQ(kSettingsMagic, s->magic);
    for (size_t offset : {4u, 8u, 172u, 384u, 596u, 808u, 864u, 1028u, 1032u, 17504u, 29832u, 29860u,
                          30612u, 33380u, 33504u}) {
        EXPECT_EQ(0u, WordAt(*s, offset)) << offset;
    }
    EXPECT_EQ(1u, WordAt(*s, 29864));
    EXPECT_EQ(1u, s->enableLimiter);
    EXPECT_EQ(2u, s->videoSystem);
    EXPECT_EQ(16u, WordAt(*s, 33480));
    EXPECT_EQ(235u, WordAt(*s, 33484));
    EXPECT_EQ(1u, WordAt(*s, 33488));
    EXPECT_EQ(254u, WordAt(*s, 33492));
    EXPECT_EQ(1u, WordAt(*s, 33496));
    EXPECT_EQ(2u, WordAt(*s, 33500));
    EXPECT_EQ(0.7f, FloatAt(*s, 29852));

    // Two records reset from the same start with the same preferences compare equal.
    auto zeroA = FilledRecord(0);
    auto zeroB = FilledRecord(0);
    ResetSettings(zeroA.get(), kMaskAll, prefs);
    ResetSettings(zeroB.get(), kMaskAll, prefs);
    EXPECT_TRUE(SettingsEqual(*zeroA, *zeroB));
    zeroB->tail[1] = 1;
    EXPECT_FALSE(SettingsEqual(*zeroA, *zeroB));
}

TEST(CorrectionSettings, HeaderWordsNeedTheAllOnesMask) {
    const Preferences prefs = TestPreferences();
    auto s = FilledRecord(0x11);
    ResetSettings(s.get(), kMaskAll & ~MaskBit(63), prefs);  // every group, not the header
    EXPECT_EQ(0x11111111u, s->magic);
    EXPECT_EQ(0x11111111u, s->masterEnable);
    EXPECT_EQ(0x11111111u, s->videoBlackLevel);
    EXPECT_EQ(0u, s->toneCurvesEnable);  // all four tone-curve bits were set
    EXPECT_EQ(0u, s->hueCurvesEnable);
}

TEST(CorrectionSettings, CurveSectionEnablesNeedEveryCurveBit) {
    const Preferences prefs = TestPreferences();
    auto s = FilledRecord(0x22);
    ResetSettings(s.get(), ToneCurveMask(0), prefs);
    EXPECT_EQ(0x22222222u, s->toneCurvesEnable);
    EXPECT_EQ(0x22222222u, s->toneCurves[1].flags);
    EXPECT_EQ(2, s->toneCurves[0].data.points.count);
    ResetSettings(s.get(), ToneCurveMask(1) | ToneCurveMask(2) | ToneCurveMask(3), prefs);
    EXPECT_EQ(0x22222222u, s->toneCurvesEnable);
    ResetSettings(s.get(), kMaskAllToneCurves, prefs);
    EXPECT_EQ(0u, s->toneCurvesEnable);

    ResetSettings(s.get(), HueCurveMask(0) | HueCurveMask(1), prefs);
    EXPECT_EQ(0x22222222u, s->hueCurvesEnable);
    ResetSettings(s.get(), kMaskAllHueCurves, prefs);
    EXPECT_EQ(0u, s->hueCurvesEnable);
}

TEST(CorrectionSettings, LimiterVideoSystemFollowsThePreference) {
    struct Case {
        int32_t preference;
        uint32_t limiter;
    };
    for (Case c : {Case{1, 1}, Case{2, 2}, Case{3, 3}, Case{4, 3}, Case{0, 1}, Case{5, 1}, Case{-1, 1}}) {
        Preferences prefs = TestPreferences();
        prefs.videoSystem = c.preference;
        prefs.limiterDefault = 0;
        auto s = FilledRecord(0x33);
        ResetSettings(s.get(), kMaskAll, prefs);
        EXPECT_EQ(c.limiter, s->videoSystem) << c.preference;
        EXPECT_EQ(static_cast<uint32_t>(c.preference), s->preferenceVideoSystem);
        EXPECT_EQ(0u, s->enableLimiter);
        // The limiter bit alone writes the limiter choices but not the raw preference copy.
        auto t = FilledRecord(0x33);
        ResetSettings(t.get(), kMaskLimiter, prefs);
        EXPECT_EQ(c.limiter, t->videoSystem);
        EXPECT_EQ(0x33333333u, t->preferenceVideoSystem);
    }
}

TEST(CorrectionSettings, ForeignByteOrderIsRepaired) {
    const Preferences prefs = TestPreferences();
    auto original = FilledRecord(0);
    ResetSettings(original.get(), kMaskAll, prefs);
    original->tonal[1].hue = -12.5f;
    original->toneCurves[3].data.samples[1023] = 0.75f;
    original->tail[1] = 0x01020304;

    auto foreign = std::make_unique<CorrectionSettings>(*original);
    auto* bytes = reinterpret_cast<uint8_t*>(foreign.get());
    for (size_t i = 0; i < sizeof(CorrectionSettings); i += 4) {
        std::swap(bytes[i], bytes[i + 3]);
        std::swap(bytes[i + 1], bytes[i + 2]);
    }
    EXPECT_EQ(kSettingsMagicSwapped, foreign->magic);
    EXPECT_TRUE(SwapSettingsIfForeign(foreign.get()));
    EXPECT_TRUE(SettingsEqual(*original, *foreign));

    // A native record, or one with an unknown magic, is left as it is.
    EXPECT_FALSE(SwapSettingsIfForeign(foreign.get()));
    foreign->magic = 0xDEADBEEF;
    auto unknown = std::make_unique<CorrectionSettings>(*foreign);
    EXPECT_FALSE(SwapSettingsIfForeign(foreign.get()));
    EXPECT_TRUE(SettingsEqual(*unknown, *foreign));
}

TEST(CorrectionSettings, GroupsNeedTheirSectionEnables) {
    const Preferences prefs = TestPreferences();
    auto s = FilledRecord(0);
    ResetSettings(s.get(), kMaskAll, prefs);
    s->enableLimiter = 0;

    EffectiveFlags f = EvaluateEffectiveFlags(*s);
    uint64_t everything = 0;
    for (int bit : {0,  1,  2,  3,  4,  5,  6,  7,  8,  9,  10, 11, 12, 13, 14, 15, 16, 17, 18,
                    19, 20, 22, 23, 24, 25, 26, 27, 28, 30, 33, 34, 35, 36, 37, 38, 39}) {
        everything |= MaskBit(bit);
    }
    EXPECT_EQ(everything, DisabledGroupsMask(f));

    s->tonal[kRangeShadows].enable = 1;
    s->tonalEnable = 1;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).tonalRange[kRangeShadows]);  // needs word 4 as well
    s->masterEnable = 1;
    EXPECT_TRUE(EvaluateEffectiveFlags(*s).tonalRange[kRangeShadows]);
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).hueWheels);
    s->hueWheelsEnable = 1;
    EXPECT_TRUE(EvaluateEffectiveFlags(*s).hueWheels);

    s->thirdSet.range[kRangeMaster].enable = 1;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).thirdSetRange[kRangeMaster]);
    s->thirdSet.enable = 1;
    EXPECT_TRUE(EvaluateEffectiveFlags(*s).thirdSetRange[kRangeMaster]);

    s->toneCurvesEnable = 1;
    s->hueCurvesEnable = 1;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).toneCurves);
    s->curvesEnable = 1;
    f = EvaluateEffectiveFlags(*s);
    EXPECT_TRUE(f.toneCurves);
    EXPECT_TRUE(f.hueCurves);

    s->secondaries[3].enable = 1;
    s->secondariesEnable = 1;
    s->secondariesEnable2 = 0;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).secondary[3]);
    s->secondariesEnable2 = 1;
    EXPECT_TRUE(EvaluateEffectiveFlags(*s).secondary[3]);

    // Only the low byte of Enable Limiter counts.
    s->enableLimiter = 0x100;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).limiter);
    s->enableLimiter = 0x101;
    EXPECT_TRUE(EvaluateEffectiveFlags(*s).limiter);

    s->levels[1].group.enable = 1;
    EXPECT_FALSE(EvaluateEffectiveFlags(*s).levelsGroup[1]);
    s->levelsEnable = 1;
    f = EvaluateEffectiveFlags(*s);
    EXPECT_TRUE(f.levelsGroup[1]);
    EXPECT_FALSE(f.levelsGroup[0]);
    const uint64_t mask = DisabledGroupsMask(f);
    EXPECT_EQ(0u, mask & (TonalRangeMask(kRangeShadows) | kMaskHueWheels | ThirdSetRangeMask(0) |
                          kMaskAllToneCurves | kMaskAllHueCurves | SecondaryMask(3) | kMaskLimiter |
                          LevelsGroupMask(1)));
    EXPECT_NE(0u, mask & LevelsGroupMask(0));
}

}  // namespace
}  // namespace vt
