// The user's preferences, shared with the full-interface application through the registry.
// The module only reads them: one process-wide record filled with defaults, then overridden by
// every value present under the current user's settings key.
#pragma once

#include <cstdint>

namespace vt {

inline constexpr char kPreferencesKey[] = "Software\\Orvane\\Velatone 3\\Plug-in\\Settings";

inline constexpr int kVideoSystemTextSize = 256;
inline constexpr int kAutoLumaTrimTextSize = 64;
inline constexpr int kLutSize = 768;
inline constexpr int kControlSurfaceIpSize = 128;
inline constexpr int kCachePathSize = 260;
inline constexpr int kAdjustHostPixelsSize = 128;

// Video system codes, as the settings record stores them.
enum class VideoSystem : int32_t { kNtsc = 1, kPal = 2, kAtsc = 3, k240M = 4 };

struct Preferences {
    int32_t toolTipsEnable;
    int32_t undoDepth;
    int32_t undoLevel;  // derived from undoDepth
    int32_t kestrixEnable;
    int32_t multiprocessorEnable;
    int32_t uiTimeoutEnable;
    int32_t uiTimeoutDuration;
    int32_t limiterDefault;
    int32_t leftPaneDefault;
    int32_t rightPaneDefault;
    int32_t settingsPaneDefault;
    int32_t uiBrightness;
    int32_t uiSaturation;  // 16.16: 26214 is 0.4
    int32_t secondaryPreviewMonitor;
    int32_t externalPreviewDevice;
    int32_t externalPreviewMode;
    int32_t externalPreviewCodec;
    int32_t externalPreviewWidth;
    int32_t externalPreviewHeight;
    float externalPreviewFrameRate;
    int32_t externalPreviewPixelFormat;
    int32_t wfmColor;
    int32_t wfmUnitsMv;
    int32_t vsCalibration100Percent;
    char videoSystemText[kVideoSystemTextSize];
    int32_t videoSystem;  // derived from videoSystemText: a VideoSystem code
    int32_t videoBlackLevel;
    int32_t videoWhiteLevel;
    int32_t videoMinLevel;
    int32_t videoMaxLevel;
    int32_t videoBlackSetupPresent;
    int32_t videoRange;  // derived from the four video levels
    int32_t galleryColWidth[6];
    int32_t galleryColId[6];
    int32_t gallerySortCol;
    int32_t gallerySortOrder;
    int32_t comboUpperLeft;
    int32_t comboUpperRight;
    int32_t comboLowerLeft;
    int32_t comboLowerRight;
    int32_t useOldStyleGamma;
    char autoLumaTrimText[kAutoLumaTrimTextSize];
    float autoLumaTrim;  // parsed from autoLumaTrimText
    uint8_t primaryLut[kLutSize];
    uint8_t secondaryLut[kLutSize];
    uint8_t externalLut[kLutSize];
    int32_t primaryLutIndex;
    int32_t secondaryLutIndex;
    int32_t externalLutIndex;
    int32_t controlSurfaceMode;
    int32_t controlSurfaceInterface;
    char controlSurfaceIp[kControlSurfaceIpSize];
    int32_t controlSurfacePort;
    char rapidPreviewCachePath[kCachePathSize];
    int32_t previewImageScaling;
    int32_t previewAspectRatioConversion;
    int32_t clipInfoWindowVPos;
    int32_t clipInfoWindowHPos;
    int32_t markerEditWindowVPos;
    int32_t markerEditWindowHPos;
    int32_t userPresetNameWindowVPos;
    int32_t userPresetNameWindowHPos;
    char adjustHostPixels[kAdjustHostPixelsSize];  // host-signature list
    int32_t preferencesWindowSelectedTab;
    int32_t preferencesWindowHPos;
    int32_t preferencesWindowVPos;
    int32_t controlSurfaceDefinitionWindowHPos;
    int32_t controlSurfaceDefinitionWindowVPos;
};

// Fills prefs with the defaults, then overrides each field whose registry value is present.
void ReadPreferences(Preferences* prefs);

// The process-wide record, read on first use. Callers run under the module's entry lock.
const Preferences& EnsurePreferencesLoaded();

// Makes the next EnsurePreferencesLoaded read the registry again.
void InvalidatePreferences();

}  // namespace vt
