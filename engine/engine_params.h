// The engine parameter block: everything the pixel kernel reads besides the pixels, prepared once
// per settings change by the lookup rebuild (its only writer). Tables are 16,385 floats over [0, 1];
// a table read beyond level 1 carries its end value and end slope.
#pragma once

#include <cstdint>

namespace vt {

inline constexpr int kColourCount = 3;  // Red, Green, Blue
inline constexpr int kChannelSetCount = 2;  // the RGB set (third set folded in) and the second set
inline constexpr int kSetRgb = 0;
inline constexpr int kSetSecond = 1;

// A table read with extrapolation: above level 1 the value is end + (v - 1) * slope, computed as
// v * slope + base with base = end - slope.
struct ExtrapolatedTable {
    const float* table;
    float end;
    float slope;
    float base;
};

struct SecondaryParams {
    uint8_t mode;          // 0 correct, 1 remove chroma outside, 2 tint outside, 3 show key
    uint8_t invert;
    uint8_t gammaActive;   // the record's gamma differs from 1
    uint8_t referenceEnable[4];
    float lumaTolerance;
    float chromaTolerance2;    // squared
    float inverseSoftness2;    // 1 / softness^2, finite
    float chromaKeyBase;       // 1 + chromaTolerance2 * inverseSoftness2
    float lumaKeyBase;         // 1 + lumaTolerance * inverseSoftness2
    float cosAngle;
    float sinAngle;
    float saturation;          // fraction
    // The corrected chroma in one step: U2 = U cosMix - V sinMix + shiftMixU, V2 = U sinMix + V cosMix
    // + shiftMixV (rotation, saturation and the pull towards the hue-shift point together).
    float cosMix;
    float sinMix;
    float shiftMixU;
    float shiftMixV;
    float gain;
    float pedestal;
    float shiftU;              // hue-shift chroma point
    float shiftV;
    float shiftGain;
    float referenceY[4];
    float referenceU[4];
    float referenceV[4];
};

// One byte per stage and sub-stage; a clear flag means the stage would change nothing.
struct StageFlags {
    uint8_t rangeWeights;      // some stage below reads the luma-range weights
    uint8_t autoCompress;
    uint8_t levels;
    uint8_t levelsGamma;
    uint8_t tonalRanges;       // any Highlights, Midtones or Shadows tonal range
    uint8_t tonalHueRotation;
    uint8_t tonalGain;
    uint8_t tonalPedestal;
    uint8_t tonalCurve;
    uint8_t tonalSaturation;
    uint8_t tonalVibrance;
    uint8_t tonalMaster;
    uint8_t masterHueRotation;
    uint8_t masterCurve;
    uint8_t masterSaturation;
    uint8_t masterVibrance;
    uint8_t hueWheels;
    uint8_t wheelActive[4];    // by wheel index; a wheel with amount 0 moves nothing
    uint8_t setRanges[kChannelSetCount];       // any Highlights, Midtones or Shadows range
    uint8_t setRangesGamma[kChannelSetCount];
    uint8_t setMaster[kChannelSetCount];
    uint8_t setMasterGamma[kChannelSetCount];
    uint8_t toneCurves;
    // Where the per-channel chain of the Master ranges and the tone curves starts reading a table,
    // from which on it is composed into one table per colour: 0 nowhere (gains and pedestals only),
    // 1 the RGB Master gamma, 2 the second Master gamma, 3 the tone curve.
    uint8_t channelTail;
    uint8_t channelTailComposed;  // the tail reads more than one table: channelTail[] holds it composed
    uint8_t hueCurves;
    uint8_t lumaRanges;
    uint8_t secondaries;       // any secondary record
    uint8_t secondary[6];
    uint8_t limiter;
    uint8_t softClip;
    uint8_t limiterPreview;
    uint8_t rgbRangesPresent;
};

struct EngineParams {
    // Tonal controls by stored range (Master, Highlights, Midtones, Shadows).
    float tonalHue[4];          // degrees
    float tonalCos[4];
    float tonalSin[4];
    float tonalContrast[4];     // Contrast / 100
    float tonalBrightness[4];   // Brightness / 200
    float tonalInverseGamma[4];
    float tonalVibrance[4];     // vibrance factor
    float tonalSaturation[4];   // fraction
    float tonalDesaturation[4]; // 1 - fraction
    float tonalGain[4];
    float tonalPedestal[4];
    float tonalOffset[4];       // 0.5 - Contrast Center

    // Hue wheels by wheel index (Master, Shadows, Midtones, Highlights): chroma point and gain.
    float wheelU[4];
    float wheelV[4];
    float wheelGain[4];

    // Channel sets by [set][stored range][colour]: gains multiplied and pedestals added over the
    // range's Master channel (and the third set, folded into the RGB set).
    float setGain[kChannelSetCount][4][kColourCount];
    float setPedestal[kChannelSetCount][4][kColourCount];

    // Levels by colour: input v * slope + offset, output v * range + outputOffset.
    float levelsSlope[kColourCount];
    float levelsOffset[kColourCount];
    float levelsRange[kColourCount];
    float levelsOutputOffset[kColourCount];

    // Limiter: composite limits in IRE-like units (x 100), the rest normalised.
    float compositeMax;
    float compositeMin;
    float hardClip;
    float softKnee;
    float softWhite;
    float softMax;
    float softRatio;            // (white - knee) / (max - knee), finite
    uint32_t limitMethod;
    uint32_t videoSystem;

    float autoKnee;             // 1 - 0.4 A

    SecondaryParams secondary[6];

    StageFlags flags;

    const float* weightShadows;
    const float* weightMidtones;
    const float* weightHighlights;
    ExtrapolatedTable tonal[4];
    ExtrapolatedTable setGamma[kChannelSetCount][4][kColourCount];
    ExtrapolatedTable toneCurve[kColourCount];
    const float* hueShift;
    const float* hueSaturation;
    const float* hueLuma;
    ExtrapolatedTable levels[kColourCount];
    ExtrapolatedTable secondaryGamma[6];

    // Tables the kernel reads three at one level, packed four floats per level (Highlights,
    // Midtones, Shadows, then 0) so one load per pixel serves all three.
    const float* tonalPacked;                                     // the range tonal tables
    const float* setGammaPacked[kChannelSetCount][kColourCount];  // the range gamma tables
    const float* huePacked;                                       // the hue curves: shift, saturation, luma
    // The chain from the first table of channelTail on, evaluated at every level: exact for
    // levels up to 1 (the chain's first read truncates them to the same entry).
    const float* channelTail[kColourCount];
};

}  // namespace vt
