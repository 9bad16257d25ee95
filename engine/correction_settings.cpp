// Reset values, byte-order repair and the enable logic of the stored correction record. Reset
// writes only the fields its mask selects, so everything else (carried words, the values of
// disabled groups) survives untouched.
#include "engine/correction_settings.h"

#include <cstring>

#include "files/preferences.h"

namespace vt {

namespace {

void ResetTonalRange(TonalRange* range) {
    range->enable = 0;
    range->hue = 0.0f;
    range->saturation = 100.0f;
    range->vibrance = 0.0f;
    range->brightness = 0.0f;
    range->contrast = 0.0f;
    range->contrastCenter = 0.5f;
    range->gain = 1.0f;
    range->gamma = 1.0f;
    range->pedestal = 0.0f;
}

void ResetChannelRange(ChannelRange* range) {
    range->enable = 0;
    for (ChannelTriplet& triplet : range->channel) {
        triplet.gain = 1.0f;
        triplet.gamma = 1.0f;
        triplet.pedestal = 0.0f;
    }
}

void ResetLevelsGroup(LevelsGroup* group) {
    group->enable = 0;
    group->inputBlack = 0.0f;
    group->inputMidpoint = 0.5f;
    group->inputWhite = 1.0f;
    group->outputBlack = 0.0f;
    group->outputMidpoint = 0.5f;
    group->outputWhite = 1.0f;
}

void ResetSecondary(SecondaryRecord* record) {
    record->enable = 0;
    record->lumaTolerance = 0.05f;
    record->chromaTolerance = 0.1f;
    record->softness = 0.05f;
    record->modeEnable = 0;
    record->mode = 1;
    record->invertKey = 0;
    record->hueRotation = 0.0f;
    record->saturation = 100.0f;
    record->word9 = 0;
    record->hueShiftAngle = 0.0f;
    record->hueShiftAmount = 0.0f;
    for (ReferenceColour& colour : record->reference) {
        colour.enable = 0;
        colour.red = 0.0f;
        colour.green = 0.0f;
        colour.blue = 0.0f;
    }
    record->gain = 1.0f;
    record->gamma = 1.0f;
    record->pedestal = 0.0f;
}

void ResetAuxiliary(AuxiliaryRecord* record) {
    record->enable = 0;
    record->value1 = 0.05f;
    record->word2 = 0;
    record->word3 = 1;
    record->word4 = 0;
    record->value5 = 0.0f;
    record->value6 = 100.0f;
    record->word7 = 0;
    record->value8 = 0.0f;
    record->value9 = 0.0f;
    record->value10 = 1.0f;
    record->value11 = 1.0f;
    record->value12 = 0.0f;
    for (uint32_t& word : record->words13) word = 0;
    for (AuxiliaryEntry& entry : record->entries) {
        entry.flags[0] = 0;
        entry.flags[1] = 0;
    }
}

// The limiter offers three video systems; the preference knows four (709 and 240M both limit as ATSC).
uint32_t LimiterVideoSystem(int32_t preferenceCode) {
    switch (preferenceCode) {
        case 1: return 1;
        case 2: return 2;
        case 3:
        case 4: return 3;
        default: return 1;
    }
}

void ResetLimiter(CorrectionSettings* s, const Preferences& prefs) {
    s->enableLimiter = static_cast<uint32_t>(prefs.limiterDefault);
    s->showLimiterPreview = 0;
    s->chromaMaxLimit = 110.0f;
    s->chromaMinLimit = -30.0f;
    s->lumaHardClipLevel = 120.0f;
    s->enableSoftClip = 0;
    s->softClipKneeLevel = 90.0f;
    s->softClipWhiteLevel = 100.0f;
    s->softClipMaxLevel = 130.0f;
    s->limitMethod = 3;
    s->videoSystem = LimiterVideoSystem(prefs.videoSystem);
    s->limiterWord = 0;
}

void ResetHeader(CorrectionSettings* s, const Preferences& prefs) {
    s->magic = kSettingsMagic;
    s->masterEnable = 0;
    s->tonalEnable = 0;
    s->rgbSet.enable = 0;
    s->secondSet.enable = 0;
    s->thirdSet.enable = 0;
    s->hueWheelsEnable = 0;
    s->levelsEnable = 0;
    s->curvesEnable = 0;
    s->toneCurvesEnable = 0;
    s->hueCurvesEnable = 0;
    s->lumaRangesEnable = 0;
    s->secondariesEnable = 0;
    s->secondariesEnable2 = 1;
    s->secondariesWord = 0;
    s->enableLimiter = static_cast<uint32_t>(prefs.limiterDefault);
    s->showLimiterPreview = 0;
    s->videoBlackLevel = static_cast<uint32_t>(prefs.videoBlackLevel);
    s->videoWhiteLevel = static_cast<uint32_t>(prefs.videoWhiteLevel);
    s->videoMinLevel = static_cast<uint32_t>(prefs.videoMinLevel);
    s->videoMaxLevel = static_cast<uint32_t>(prefs.videoMaxLevel);
    s->videoBlackSetupPresent = static_cast<uint32_t>(prefs.videoBlackSetupPresent);
    s->preferenceVideoSystem = static_cast<uint32_t>(prefs.videoSystem);
    s->hostColourSpaceFlag = 0;
}

bool Selected(uint64_t mask, uint64_t group) { return (mask & group) != 0; }

bool AllSelected(uint64_t mask, uint64_t groups) { return (mask & groups) == groups; }

uint32_t ByteSwap32(uint32_t v) {
    return (v >> 24) | ((v >> 8) & 0x0000ff00u) | ((v << 8) & 0x00ff0000u) | (v << 24);
}

}  // namespace

void ResetCurveRecord(CurveRecord* curve, float y0, float y1) {
    // The two leading words belong to the editors and are carried; the form is rewritten whole.
    curve->flags = 0;
    std::memset(&curve->data, 0, sizeof(curve->data));
    curve->data.points.count = 2;
    curve->data.points.x[0] = 0.0f;
    curve->data.points.y[0] = y0;
    curve->data.points.x[1] = 1.0f;
    curve->data.points.y[1] = y1;
}

void ResetSettings(CorrectionSettings* s, uint64_t mask, const Preferences& prefs) {
    if (s == nullptr) return;
    if (mask == kMaskAll) ResetHeader(s, prefs);

    for (int r = 0; r < kRangeCount; ++r) {
        if (Selected(mask, TonalRangeMask(r))) ResetTonalRange(&s->tonal[r]);
        if (Selected(mask, RgbRangeMask(r))) ResetChannelRange(&s->rgbSet.range[r]);
        if (Selected(mask, SecondSetRangeMask(r))) ResetChannelRange(&s->secondSet.range[r]);
        if (Selected(mask, ThirdSetRangeMask(r))) ResetChannelRange(&s->thirdSet.range[r]);
    }
    if (Selected(mask, kMaskHueWheels)) {
        s->hueWheelsEnable = 0;
        s->hueWheelsWord = 0;
        for (HueWheel& wheel : s->hueWheels) {
            wheel.angle = 0.0f;
            wheel.amount = 0.0f;
        }
    }
    for (int g = 0; g < 4; ++g) {
        if (Selected(mask, LevelsGroupMask(g))) ResetLevelsGroup(&s->levels[g].group);
    }
    if (Selected(mask, LevelsGroupMask(4))) ResetLevelsGroup(&s->fifthLevels);
    if (Selected(mask, LevelsGroupMask(0))) {
        s->autoCorrectA = 0.0f;
        s->autoCorrectB = 0.0f;
    }
    for (int k = 0; k < kSecondaryCount; ++k) {
        if (Selected(mask, SecondaryMask(k))) ResetSecondary(&s->secondaries[k]);
        if (Selected(mask, AuxiliaryMask(k))) ResetAuxiliary(&s->auxiliaries[k]);
    }
    if (Selected(mask, kMaskLimiter)) ResetLimiter(s, prefs);
    if (Selected(mask, kMaskLumaRanges)) {
        s->lumaRangesEnable = 0;
        s->shadowsPoint = 0.3f;
        s->shadowsSoftness = 0.3831f;
        s->highlightsPoint = 0.7f;
        s->highlightsSoftness = 0.3831f;
    }
    for (int c = 0; c < kToneCurveCount; ++c) {
        if (Selected(mask, ToneCurveMask(c))) ResetCurveRecord(&s->toneCurves[c], 0.0f, 1.0f);
    }
    if (AllSelected(mask, kMaskAllToneCurves)) s->toneCurvesEnable = 0;
    for (int c = 0; c < kHueCurveCount; ++c) {
        if (Selected(mask, HueCurveMask(c))) ResetCurveRecord(&s->hueCurves[c], 0.5f, 0.5f);
    }
    if (AllSelected(mask, kMaskAllHueCurves)) s->hueCurvesEnable = 0;
    if (Selected(mask, kMaskColourSpace1)) {
        s->colourSpaceWord1 = 0;
        s->colourSpaceGamma = 2.2f;
    }
    if (Selected(mask, kMaskColourSpace2)) {
        s->colourSpaceWord2 = 0;
        s->colourSpaceBlackCode = 95;
        s->colourSpaceWhiteCode = 685;
        s->colourSpaceWord3 = 1;
    }
}

void ResetSettings(CorrectionSettings* settings, uint64_t mask) {
    ResetSettings(settings, mask, EnsurePreferencesLoaded());
}

bool SwapSettingsIfForeign(CorrectionSettings* settings) {
    if (settings == nullptr || settings->magic != kSettingsMagicSwapped) return false;
    auto* bytes = reinterpret_cast<unsigned char*>(settings);
    for (size_t i = 0; i < kSettingsWords; ++i) {
        uint32_t word;
        std::memcpy(&word, bytes + i * 4, 4);
        word = ByteSwap32(word);
        std::memcpy(bytes + i * 4, &word, 4);
    }
    return true;
}

bool SettingsEqual(const CorrectionSettings& a, const CorrectionSettings& b) {
    return std::memcmp(&a, &b, sizeof(CorrectionSettings)) == 0;
}

EffectiveFlags EvaluateEffectiveFlags(const CorrectionSettings& s) {
    EffectiveFlags f{};
    const bool tonalSection = s.masterEnable != 0 && s.tonalEnable != 0;
    for (int r = 0; r < kRangeCount; ++r) {
        f.tonalRange[r] = tonalSection && s.tonal[r].enable != 0;
        f.rgbRange[r] = s.rgbSet.enable != 0 && s.rgbSet.range[r].enable != 0;
        f.secondSetRange[r] = s.secondSet.enable != 0 && s.secondSet.range[r].enable != 0;
        f.thirdSetRange[r] = s.thirdSet.enable != 0 && s.thirdSet.range[r].enable != 0;
    }
    f.hueWheels = s.masterEnable != 0 && s.hueWheelsEnable != 0;
    for (int g = 0; g < 4; ++g) f.levelsGroup[g] = s.levelsEnable != 0 && s.levels[g].group.enable != 0;
    f.toneCurves = s.curvesEnable != 0 && s.toneCurvesEnable != 0;
    f.hueCurves = s.curvesEnable != 0 && s.hueCurvesEnable != 0;
    f.lumaRanges = s.lumaRangesEnable != 0;
    for (int k = 0; k < kSecondaryCount; ++k) {
        f.secondary[k] = s.secondariesEnable != 0 && s.secondariesEnable2 != 0 && s.secondaries[k].enable != 0;
    }
    f.limiter = (s.enableLimiter & 0xffu) != 0;
    return f;
}

uint64_t DisabledGroupsMask(const EffectiveFlags& f) {
    uint64_t mask = 0;
    for (int r = 0; r < kRangeCount; ++r) {
        if (!f.tonalRange[r]) mask |= TonalRangeMask(r);
        if (!f.rgbRange[r]) mask |= RgbRangeMask(r);
        if (!f.secondSetRange[r]) mask |= SecondSetRangeMask(r);
        if (!f.thirdSetRange[r]) mask |= ThirdSetRangeMask(r);
    }
    if (!f.hueWheels) mask |= kMaskHueWheels;
    for (int g = 0; g < 4; ++g) {
        if (!f.levelsGroup[g]) mask |= LevelsGroupMask(g);
    }
    if (!f.toneCurves) mask |= kMaskAllToneCurves;
    if (!f.hueCurves) mask |= kMaskAllHueCurves;
    if (!f.lumaRanges) mask |= kMaskLumaRanges;
    for (int k = 0; k < kSecondaryCount; ++k) {
        if (!f.secondary[k]) mask |= SecondaryMask(k);
    }
    if (!f.limiter) mask |= kMaskLimiter;
    return mask;
}

}  // namespace vt
