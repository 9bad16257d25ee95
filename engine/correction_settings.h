// The stored correction record: every value the effect applies to pixels, in one flat block of
// 33,556 bytes (8,389 little-endian 32-bit words) that is copied and compared whole. Offsets are a
// stored format shared with projects, presets and the full-interface application: never move a field.
// Beside the layout: reset by group mask, byte-order repair, byte comparison and the enable logic.
#pragma once

#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace vt {

struct Preferences;

inline constexpr uint32_t kSettingsMagic = 0x12343210;
inline constexpr uint32_t kSettingsMagicSwapped = 0x10323412;
inline constexpr size_t kSettingsSize = 33556;
inline constexpr size_t kSettingsWords = kSettingsSize / 4;

inline constexpr int kRangeCount = 4;       // Master, Highlights, Midtones, Shadows
inline constexpr int kChannelCount = 4;     // Master, Red, Green, Blue
inline constexpr int kHueWheelCount = 4;    // Master, Shadows, Midtones, Highlights
inline constexpr int kToneCurveCount = 4;   // Master, Red, Green, Blue
inline constexpr int kHueCurveCount = 3;    // hue shift, saturation by hue, luma by hue
inline constexpr int kSecondaryCount = 6;
inline constexpr int kCurvePointCapacity = 16;
inline constexpr int kCurveSampleCount = 1024;

// Indices of the stored range order (every range group except the hue wheels).
enum RangeIndex : int { kRangeMaster = 0, kRangeHighlights = 1, kRangeMidtones = 2, kRangeShadows = 3 };
// Indices of the hue wheels, which are stored in their own order.
enum WheelIndex : int { kWheelMaster = 0, kWheelShadows = 1, kWheelMidtones = 2, kWheelHighlights = 3 };
enum ChannelIndex : int { kChannelMaster = 0, kChannelRed = 1, kChannelGreen = 2, kChannelBlue = 3 };
enum HueCurveIndex : int { kHueCurveShift = 0, kHueCurveSaturation = 1, kHueCurveLuma = 2 };

// The tonal controls of one luma range.
struct TonalRange {
    uint32_t enable;
    float hue;             // degrees
    float saturation;      // percent
    float vibrance;        // -100 ... 100
    float brightness;
    float contrast;
    float contrastCenter;
    float gain;
    float gamma;
    float pedestal;
};

struct ChannelTriplet {
    float gain;
    float gamma;
    float pedestal;
};

// One luma range of a channel set: its enable and a triplet for Master, Red, Green, Blue.
struct ChannelRange {
    uint32_t enable;
    ChannelTriplet channel[kChannelCount];
};

struct ChannelSet {
    uint32_t enable;
    ChannelRange range[kRangeCount];
};

struct HueWheel {
    uint32_t word;   // carried, never reset
    float angle;     // degrees
    float amount;
};

struct LevelsGroup {
    uint32_t enable;
    float inputBlack;
    float inputMidpoint;
    float inputWhite;
    float outputBlack;
    float outputMidpoint;  // carried; takes no part in the correction
    float outputWhite;
};

// A levels group followed by a word whose meaning is not ours to settle.
struct LevelsSlot {
    LevelsGroup group;
    uint32_t word;
};

struct CurvePoints {
    int32_t count;
    float x[kCurvePointCapacity];
    float y[kCurvePointCapacity];
    uint8_t unused[3964];
};

// Bit 0 of CurveRecord::flags: the record holds a sampled table instead of control points.
inline constexpr uint32_t kCurveFlagSampled = 1;

// One stored curve: up to 16 control points, or the curve sampled at k / 1023.
struct CurveRecord {
    uint32_t reserved;   // carried unchanged
    uint32_t curveWord;  // written by the preset reader and the curve control
    uint32_t flags;
    union {
        CurvePoints points;
        float samples[kCurveSampleCount];
    } data;
};

struct ReferenceColour {
    uint32_t enable;
    float red;
    float green;
    float blue;
};

// A colour-keyed correction.
struct SecondaryRecord {
    uint32_t enable;
    float lumaTolerance;
    float chromaTolerance;
    float softness;
    uint32_t modeEnable;
    uint32_t mode;         // 0 correct, 1 remove chroma outside, 2 tint outside, 3 show key
    uint32_t invertKey;
    float hueRotation;     // degrees
    float saturation;      // percent
    uint32_t word9;        // carried
    float hueShiftAngle;   // degrees
    float hueShiftAmount;
    ReferenceColour reference[4];
    float gain;
    float gamma;
    float pedestal;
};

struct AuxiliaryEntry {
    uint8_t flags[2];
    uint8_t rest[46];  // carried, never reset
};

// Stored and carried for the full-interface application; the engine never reads it, so its
// words keep neutral names.
struct AuxiliaryRecord {
    uint32_t enable;
    float value1;
    uint32_t word2;
    uint32_t word3;
    uint32_t word4;
    float value5;
    float value6;
    uint32_t word7;
    float value8;
    float value9;
    float value10;
    float value11;
    float value12;
    uint32_t words13[6];
    AuxiliaryEntry entries[8];
};

struct CorrectionSettings {
    uint32_t magic;
    uint32_t masterEnable;     // tonal controls and hue wheels
    uint32_t tonalEnable;
    TonalRange tonal[kRangeCount];
    ChannelSet rgbSet;
    ChannelSet secondSet;
    ChannelSet thirdSet;
    uint32_t hueWheelsEnable;
    uint32_t hueWheelsWord;
    HueWheel hueWheels[kHueWheelCount];
    uint32_t levelsEnable;
    uint32_t levelsWord;
    LevelsSlot levels[4];      // Master, Red, Green, Blue
    LevelsGroup fifthLevels;   // carried; the engine does not read it
    uint32_t curvesEnable;
    uint32_t toneCurvesEnable;
    CurveRecord toneCurves[kToneCurveCount];
    uint32_t toneCurvesTail[9];
    uint32_t hueCurvesEnable;
    CurveRecord hueCurves[kHueCurveCount];
    uint32_t lumaRangesEnable;
    uint32_t lumaRangesWords[2];
    float shadowsPoint;
    float shadowsSoftness;
    float highlightsPoint;
    float highlightsSoftness;
    uint32_t secondariesEnable;
    uint32_t secondariesEnable2;
    SecondaryRecord secondaries[kSecondaryCount];
    uint32_t secondariesWord;
    AuxiliaryRecord auxiliaries[kSecondaryCount];
    uint32_t enableLimiter;    // only the low byte counts
    uint32_t showLimiterPreview;
    float chromaMaxLimit;      // IRE
    float chromaMinLimit;      // IRE
    float lumaHardClipLevel;   // IRE
    uint32_t enableSoftClip;
    float softClipKneeLevel;   // IRE
    float softClipWhiteLevel;  // IRE
    float softClipMaxLevel;    // IRE
    uint32_t limitMethod;      // 1 reduce chroma, 2 reduce luma, 3 smart limit
    uint32_t videoSystem;      // 1 NTSC, 2 PAL, 3 ATSC
    uint32_t limiterWord;
    uint32_t limiterExtension[14];
    uint32_t videoBlackLevel;  // copies of the preferences
    uint32_t videoWhiteLevel;
    uint32_t videoMinLevel;
    uint32_t videoMaxLevel;
    uint32_t videoBlackSetupPresent;
    uint32_t preferenceVideoSystem;  // the preference's raw code, 1 ... 4
    uint32_t hostColourSpaceFlag;
    uint32_t colourSpaceWord1;
    uint32_t colourSpaceWord2;
    uint32_t colourSpaceWords[2];
    float colourSpaceGamma;
    uint32_t colourSpaceBlackCode;
    uint32_t colourSpaceWhiteCode;
    uint32_t colourSpaceWord3;
    float autoCorrectA;        // non-zero: highlight compression
    float autoCorrectB;        // carried
    uint32_t tail[2];
};

static_assert(sizeof(TonalRange) == 40);
static_assert(sizeof(ChannelTriplet) == 12);
static_assert(sizeof(ChannelRange) == 52);
static_assert(sizeof(ChannelSet) == 212);
static_assert(sizeof(HueWheel) == 12);
static_assert(sizeof(LevelsGroup) == 28);
static_assert(sizeof(LevelsSlot) == 32);
static_assert(sizeof(CurveRecord) == 4108);
static_assert(offsetof(CurveRecord, flags) == 8);
static_assert(offsetof(CurveRecord, data) == 12);
static_assert(offsetof(CurveRecord, data.points.x) == 16);
static_assert(offsetof(CurveRecord, data.points.y) == 80);
static_assert(offsetof(CurveRecord, data.points.unused) == 144);
static_assert(sizeof(SecondaryRecord) == 124);
static_assert(offsetof(SecondaryRecord, hueShiftAngle) == 40);
static_assert(offsetof(SecondaryRecord, reference) == 48);
static_assert(offsetof(SecondaryRecord, gain) == 112);
static_assert(sizeof(AuxiliaryRecord) == 460);
static_assert(offsetof(AuxiliaryRecord, entries) == 76);
static_assert(sizeof(CorrectionSettings) == kSettingsSize);
static_assert(std::is_trivially_copyable_v<CorrectionSettings>);
static_assert(std::is_standard_layout_v<CorrectionSettings>);

static_assert(offsetof(CorrectionSettings, magic) == 0);
static_assert(offsetof(CorrectionSettings, masterEnable) == 4);
static_assert(offsetof(CorrectionSettings, tonalEnable) == 8);
static_assert(offsetof(CorrectionSettings, tonal[0]) == 12);
static_assert(offsetof(CorrectionSettings, tonal[1]) == 52);
static_assert(offsetof(CorrectionSettings, tonal[2]) == 92);
static_assert(offsetof(CorrectionSettings, tonal[3]) == 132);
static_assert(offsetof(CorrectionSettings, rgbSet.enable) == 172);
static_assert(offsetof(CorrectionSettings, rgbSet.range[0]) == 176);
static_assert(offsetof(CorrectionSettings, rgbSet.range[1]) == 228);
static_assert(offsetof(CorrectionSettings, rgbSet.range[2]) == 280);
static_assert(offsetof(CorrectionSettings, rgbSet.range[3]) == 332);
static_assert(offsetof(CorrectionSettings, secondSet.enable) == 384);
static_assert(offsetof(CorrectionSettings, secondSet.range[0]) == 388);
static_assert(offsetof(CorrectionSettings, secondSet.range[1]) == 440);
static_assert(offsetof(CorrectionSettings, secondSet.range[2]) == 492);
static_assert(offsetof(CorrectionSettings, secondSet.range[3]) == 544);
static_assert(offsetof(CorrectionSettings, thirdSet.enable) == 596);
static_assert(offsetof(CorrectionSettings, thirdSet.range[0]) == 600);
static_assert(offsetof(CorrectionSettings, thirdSet.range[1]) == 652);
static_assert(offsetof(CorrectionSettings, thirdSet.range[2]) == 704);
static_assert(offsetof(CorrectionSettings, thirdSet.range[3]) == 756);
static_assert(offsetof(CorrectionSettings, hueWheelsEnable) == 808);
static_assert(offsetof(CorrectionSettings, hueWheelsWord) == 812);
static_assert(offsetof(CorrectionSettings, hueWheels[0].word) == 816);
static_assert(offsetof(CorrectionSettings, hueWheels[0].angle) == 820);
static_assert(offsetof(CorrectionSettings, hueWheels[0].amount) == 824);
static_assert(offsetof(CorrectionSettings, hueWheels[3].word) == 852);
static_assert(offsetof(CorrectionSettings, levelsEnable) == 864);
static_assert(offsetof(CorrectionSettings, levelsWord) == 868);
static_assert(offsetof(CorrectionSettings, levels[0].group) == 872);
static_assert(offsetof(CorrectionSettings, levels[0].word) == 900);
static_assert(offsetof(CorrectionSettings, levels[1].group) == 904);
static_assert(offsetof(CorrectionSettings, levels[1].word) == 932);
static_assert(offsetof(CorrectionSettings, levels[2].group) == 936);
static_assert(offsetof(CorrectionSettings, levels[2].word) == 964);
static_assert(offsetof(CorrectionSettings, levels[3].group) == 968);
static_assert(offsetof(CorrectionSettings, levels[3].word) == 996);
static_assert(offsetof(CorrectionSettings, fifthLevels) == 1000);
static_assert(offsetof(CorrectionSettings, curvesEnable) == 1028);
static_assert(offsetof(CorrectionSettings, toneCurvesEnable) == 1032);
static_assert(offsetof(CorrectionSettings, toneCurves[0]) == 1036);
static_assert(offsetof(CorrectionSettings, toneCurves[1]) == 5144);
static_assert(offsetof(CorrectionSettings, toneCurves[2]) == 9252);
static_assert(offsetof(CorrectionSettings, toneCurves[3]) == 13360);
static_assert(offsetof(CorrectionSettings, toneCurvesTail) == 17468);
static_assert(offsetof(CorrectionSettings, hueCurvesEnable) == 17504);
static_assert(offsetof(CorrectionSettings, hueCurves[0]) == 17508);
static_assert(offsetof(CorrectionSettings, hueCurves[1]) == 21616);
static_assert(offsetof(CorrectionSettings, hueCurves[2]) == 25724);
static_assert(offsetof(CorrectionSettings, lumaRangesEnable) == 29832);
static_assert(offsetof(CorrectionSettings, lumaRangesWords) == 29836);
static_assert(offsetof(CorrectionSettings, shadowsPoint) == 29844);
static_assert(offsetof(CorrectionSettings, shadowsSoftness) == 29848);
static_assert(offsetof(CorrectionSettings, highlightsPoint) == 29852);
static_assert(offsetof(CorrectionSettings, highlightsSoftness) == 29856);
static_assert(offsetof(CorrectionSettings, secondariesEnable) == 29860);
static_assert(offsetof(CorrectionSettings, secondariesEnable2) == 29864);
static_assert(offsetof(CorrectionSettings, secondaries[0]) == 29868);
static_assert(offsetof(CorrectionSettings, secondaries[5]) == 29868 + 5 * 124);
static_assert(offsetof(CorrectionSettings, secondariesWord) == 30612);
static_assert(offsetof(CorrectionSettings, auxiliaries[0]) == 30616);
static_assert(offsetof(CorrectionSettings, auxiliaries[5]) == 30616 + 5 * 460);
static_assert(offsetof(CorrectionSettings, enableLimiter) == 33376);
static_assert(offsetof(CorrectionSettings, showLimiterPreview) == 33380);
static_assert(offsetof(CorrectionSettings, chromaMaxLimit) == 33384);
static_assert(offsetof(CorrectionSettings, chromaMinLimit) == 33388);
static_assert(offsetof(CorrectionSettings, lumaHardClipLevel) == 33392);
static_assert(offsetof(CorrectionSettings, enableSoftClip) == 33396);
static_assert(offsetof(CorrectionSettings, softClipKneeLevel) == 33400);
static_assert(offsetof(CorrectionSettings, softClipWhiteLevel) == 33404);
static_assert(offsetof(CorrectionSettings, softClipMaxLevel) == 33408);
static_assert(offsetof(CorrectionSettings, limitMethod) == 33412);
static_assert(offsetof(CorrectionSettings, videoSystem) == 33416);
static_assert(offsetof(CorrectionSettings, limiterWord) == 33420);
static_assert(offsetof(CorrectionSettings, limiterExtension) == 33424);
static_assert(offsetof(CorrectionSettings, videoBlackLevel) == 33480);
static_assert(offsetof(CorrectionSettings, videoWhiteLevel) == 33484);
static_assert(offsetof(CorrectionSettings, videoMinLevel) == 33488);
static_assert(offsetof(CorrectionSettings, videoMaxLevel) == 33492);
static_assert(offsetof(CorrectionSettings, videoBlackSetupPresent) == 33496);
static_assert(offsetof(CorrectionSettings, preferenceVideoSystem) == 33500);
static_assert(offsetof(CorrectionSettings, hostColourSpaceFlag) == 33504);
static_assert(offsetof(CorrectionSettings, colourSpaceWord1) == 33508);
static_assert(offsetof(CorrectionSettings, colourSpaceWord2) == 33512);
static_assert(offsetof(CorrectionSettings, colourSpaceWords) == 33516);
static_assert(offsetof(CorrectionSettings, colourSpaceGamma) == 33524);
static_assert(offsetof(CorrectionSettings, colourSpaceBlackCode) == 33528);
static_assert(offsetof(CorrectionSettings, colourSpaceWhiteCode) == 33532);
static_assert(offsetof(CorrectionSettings, colourSpaceWord3) == 33536);
static_assert(offsetof(CorrectionSettings, autoCorrectA) == 33540);
static_assert(offsetof(CorrectionSettings, autoCorrectB) == 33544);
static_assert(offsetof(CorrectionSettings, tail) == 33548);

// Reset masks: one bit per group. Bits 29, 31, 32 and 48-63 select nothing.
inline constexpr uint64_t MaskBit(int bit) { return uint64_t{1} << bit; }
inline constexpr uint64_t kMaskAll = ~uint64_t{0};
inline constexpr uint64_t TonalRangeMask(int range) { return MaskBit(0 + range); }
inline constexpr uint64_t RgbRangeMask(int range) { return MaskBit(4 + range); }
inline constexpr uint64_t SecondSetRangeMask(int range) { return MaskBit(8 + range); }
inline constexpr uint64_t ThirdSetRangeMask(int range) { return MaskBit(12 + range); }
inline constexpr uint64_t kMaskHueWheels = MaskBit(16);
inline constexpr uint64_t LevelsGroupMask(int group) { return MaskBit(17 + group); }  // group 4: the fifth
inline constexpr uint64_t SecondaryMask(int record) { return MaskBit(22 + record); }
inline constexpr uint64_t kMaskLimiter = MaskBit(28);
inline constexpr uint64_t kMaskLumaRanges = MaskBit(30);
inline constexpr uint64_t ToneCurveMask(int curve) { return MaskBit(33 + curve); }
inline constexpr uint64_t kMaskAllToneCurves = MaskBit(33) | MaskBit(34) | MaskBit(35) | MaskBit(36);
inline constexpr uint64_t HueCurveMask(int curve) { return MaskBit(37 + curve); }
inline constexpr uint64_t kMaskAllHueCurves = MaskBit(37) | MaskBit(38) | MaskBit(39);
inline constexpr uint64_t kMaskColourSpace1 = MaskBit(40);
inline constexpr uint64_t kMaskColourSpace2 = MaskBit(41);
inline constexpr uint64_t AuxiliaryMask(int record) { return MaskBit(42 + record); }

// Stores the reset values of every group selected by mask. kMaskAll also writes the header words
// (magic, section enables, the copies of the video preferences). Limiter defaults come from prefs.
void ResetSettings(CorrectionSettings* settings, uint64_t mask, const Preferences& prefs);

// As above with the process-wide preferences (EnsurePreferencesLoaded).
void ResetSettings(CorrectionSettings* settings, uint64_t mask);

// Resets one curve record to two points: (0, y0) and (1, y1).
void ResetCurveRecord(CurveRecord* curve, float y0, float y1);

// A record whose magic reads byte-reversed was written with the other byte order: every word is
// reversed in place. Any other magic is left alone. Returns whether the record was swapped.
bool SwapSettingsIfForeign(CorrectionSettings* settings);

// Byte comparison of the whole record.
bool SettingsEqual(const CorrectionSettings& a, const CorrectionSettings& b);

// Whether each group takes effect: its own enable together with its section enables.
struct EffectiveFlags {
    bool tonalRange[kRangeCount];
    bool hueWheels;
    bool rgbRange[kRangeCount];
    bool secondSetRange[kRangeCount];
    bool thirdSetRange[kRangeCount];
    bool levelsGroup[4];
    bool toneCurves;
    bool hueCurves;
    bool lumaRanges;
    bool secondary[kSecondaryCount];
    bool limiter;
};

EffectiveFlags EvaluateEffectiveFlags(const CorrectionSettings& settings);

// The reset mask of every group whose flag is false.
uint64_t DisabledGroupsMask(const EffectiveFlags& flags);

}  // namespace vt
