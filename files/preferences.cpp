// Preferences: built-in defaults, then every registry value present under the settings key.
// One table lists each value with its field, so reading is one loop.
#include "files/preferences.h"

#include <cstddef>
#include <cstdio>
#include <cstring>

#include "platform/process.h"
#include "platform/registry.h"

namespace vt {

namespace {

enum class Kind : uint8_t { kDword, kText, kBinary, kFrameRate };

struct PreferenceValue {
    const char* name;
    Kind kind;
    size_t offset;  // of the field in Preferences
    uint32_t size;  // of the field: 4 for numbers, the buffer size for texts and tables
};

#define VT_DWORD(name, field) {name, Kind::kDword, offsetof(Preferences, field), 4}
#define VT_TEXT(name, field) {name, Kind::kText, offsetof(Preferences, field), sizeof(Preferences::field)}

// In the order the registry is read.
constexpr PreferenceValue kValues[] = {
    VT_DWORD("Tool Tips Enable", toolTipsEnable),
    VT_DWORD("Undo Depth", undoDepth),
    VT_DWORD("Kestrix Enable", kestrixEnable),
    VT_DWORD("Multiprocessor Enable", multiprocessorEnable),
    VT_DWORD("UI Timeout Enable", uiTimeoutEnable),
    VT_DWORD("UI Timeout Duration", uiTimeoutDuration),
    VT_DWORD("Limiter Default", limiterDefault),
    VT_DWORD("Left Pane Default", leftPaneDefault),
    VT_DWORD("Right Pane Default", rightPaneDefault),
    VT_DWORD("Settings Pane Default", settingsPaneDefault),
    VT_DWORD("UI Brightness", uiBrightness),
    VT_DWORD("UI Saturation", uiSaturation),
    VT_DWORD("Secondary Preview Monitor", secondaryPreviewMonitor),
    VT_DWORD("External Preview Device", externalPreviewDevice),
    VT_DWORD("External Preview Mode", externalPreviewMode),
    VT_DWORD("External Preview Codec", externalPreviewCodec),
    VT_DWORD("External Preview Width", externalPreviewWidth),
    VT_DWORD("External Preview Height", externalPreviewHeight),
    {"External Preview Frame Rate", Kind::kFrameRate, offsetof(Preferences, externalPreviewFrameRate), 4},
    VT_DWORD("External Preview Pixel Format", externalPreviewPixelFormat),
    VT_DWORD("WFM Color", wfmColor),
    VT_DWORD("WFM Units mV", wfmUnitsMv),
    VT_DWORD("VS Calibration 100 Percent", vsCalibration100Percent),
    VT_TEXT("Video System", videoSystemText),
    VT_DWORD("Video Black Level", videoBlackLevel),
    VT_DWORD("Video White Level", videoWhiteLevel),
    VT_DWORD("Video Min Level", videoMinLevel),
    VT_DWORD("Video Max Level", videoMaxLevel),
    VT_DWORD("Video Black Setup Present", videoBlackSetupPresent),
    VT_DWORD("Gallery Col Width 0", galleryColWidth[0]),
    VT_DWORD("Gallery Col Width 1", galleryColWidth[1]),
    VT_DWORD("Gallery Col Width 2", galleryColWidth[2]),
    VT_DWORD("Gallery Col Width 3", galleryColWidth[3]),
    VT_DWORD("Gallery Col Width 4", galleryColWidth[4]),
    VT_DWORD("Gallery Col Width 5", galleryColWidth[5]),
    VT_DWORD("Gallery Col ID 0", galleryColId[0]),
    VT_DWORD("Gallery Col ID 1", galleryColId[1]),
    VT_DWORD("Gallery Col ID 2", galleryColId[2]),
    VT_DWORD("Gallery Col ID 3", galleryColId[3]),
    VT_DWORD("Gallery Col ID 4", galleryColId[4]),
    VT_DWORD("Gallery Col ID 5", galleryColId[5]),
    VT_DWORD("Gallery Sort Col", gallerySortCol),
    VT_DWORD("Gallery Sort Order", gallerySortOrder),
    VT_DWORD("Combo Upper Left", comboUpperLeft),
    VT_DWORD("Combo Upper Right", comboUpperRight),
    VT_DWORD("Combo Lower Left", comboLowerLeft),
    VT_DWORD("Combo Lower Right", comboLowerRight),
    VT_DWORD("Use Old Style Gamma", useOldStyleGamma),
    VT_TEXT("Auto Luma Trim", autoLumaTrimText),
    {"Primary LUT", Kind::kBinary, offsetof(Preferences, primaryLut), kLutSize},
    {"Secondary LUT", Kind::kBinary, offsetof(Preferences, secondaryLut), kLutSize},
    {"External LUT", Kind::kBinary, offsetof(Preferences, externalLut), kLutSize},
    VT_DWORD("Primary LUT Index", primaryLutIndex),
    VT_DWORD("Secondary LUT Index", secondaryLutIndex),
    VT_DWORD("External LUT Index", externalLutIndex),
    VT_DWORD("Control Surface Mode", controlSurfaceMode),
    VT_DWORD("Control Surface Interface", controlSurfaceInterface),
    VT_TEXT("Control Surface IP", controlSurfaceIp),
    VT_DWORD("Control Surface Port", controlSurfacePort),
    VT_TEXT("Rapid Preview Cache Path", rapidPreviewCachePath),
    VT_DWORD("Preview Image Scaling", previewImageScaling),
    VT_DWORD("Preview Aspect Ratio Conversion", previewAspectRatioConversion),
    VT_DWORD("Clip Info Window V Pos", clipInfoWindowVPos),
    VT_DWORD("Clip Info Window H Pos", clipInfoWindowHPos),
    VT_DWORD("Marker Edit Window V Pos", markerEditWindowVPos),
    VT_DWORD("Marker Edit Window H Pos", markerEditWindowHPos),
    VT_DWORD("User Preset Name Window V Pos", userPresetNameWindowVPos),
    VT_DWORD("User Preset Name Window H Pos", userPresetNameWindowHPos),
    VT_TEXT("Adjust Host Pixels", adjustHostPixels),
    VT_DWORD("Preferences Window Selected Tab", preferencesWindowSelectedTab),
    VT_DWORD("Preferences Window H Pos", preferencesWindowHPos),
    VT_DWORD("Preferences Window V Pos", preferencesWindowVPos),
    VT_DWORD("Control Surface Definition Window H Pos", controlSurfaceDefinitionWindowHPos),
    VT_DWORD("Control Surface Definition Window V Pos", controlSurfaceDefinitionWindowVPos),
};

#undef VT_DWORD
#undef VT_TEXT

constexpr int32_t kLutIndexBuiltIn = 50;
// A control surface on the local network answers here unless the user chose another.
constexpr char kDefaultControlSurfaceIp[] = "192.168.0.100";
constexpr char kFallbackCachePath[] = "c:\\temp";

void CopyText(char* field, size_t size, const char* text) {
    std::snprintf(field, size, "%s", text);
}

void SetDefaults(Preferences* p) {
    std::memset(p, 0, sizeof *p);
    p->toolTipsEnable = 1;
    p->undoDepth = 20;
    p->kestrixEnable = 1;
    p->multiprocessorEnable = 1;
    p->uiTimeoutEnable = 1;
    p->uiTimeoutDuration = 10;
    p->limiterDefault = 0;
    p->leftPaneDefault = 1;
    p->rightPaneDefault = 1;
    p->settingsPaneDefault = 1;
    p->uiBrightness = 22282;
    p->uiSaturation = 26214;
    p->externalPreviewDevice = 0x4E6F4E45;
    p->externalPreviewMode = 0x4E6F4E45;
    CopyText(p->videoSystemText, sizeof p->videoSystemText, "NTSC");
    p->videoSystem = static_cast<int32_t>(VideoSystem::kNtsc);
    p->videoWhiteLevel = 255;
    p->videoMaxLevel = 255;
    p->videoRange = 1;
    p->comboUpperLeft = 1;
    p->comboUpperRight = 8;
    p->comboLowerLeft = 10;
    p->comboLowerRight = 9;
    CopyText(p->autoLumaTrimText, sizeof p->autoLumaTrimText, "0.0");
    p->primaryLutIndex = kLutIndexBuiltIn;
    p->secondaryLutIndex = kLutIndexBuiltIn;
    p->externalLutIndex = kLutIndexBuiltIn;
    p->controlSurfaceMode = 1;
    p->controlSurfaceInterface = 2;
    CopyText(p->controlSurfaceIp, sizeof p->controlSurfaceIp, kDefaultControlSurfaceIp);
    p->controlSurfacePort = 23;
    GetTempFolder(p->rapidPreviewCachePath, sizeof p->rapidPreviewCachePath);
    if (p->rapidPreviewCachePath[0] == '\0') CopyText(p->rapidPreviewCachePath, sizeof p->rapidPreviewCachePath, kFallbackCachePath);
    p->previewImageScaling = 3;
    p->previewAspectRatioConversion = 1;
    p->clipInfoWindowVPos = p->clipInfoWindowHPos = -1;
    p->markerEditWindowVPos = p->markerEditWindowHPos = -1;
    p->userPresetNameWindowVPos = p->userPresetNameWindowHPos = -1;
    CopyText(p->adjustHostPixels, sizeof p->adjustHostPixels, "FXTC");
    p->preferencesWindowSelectedTab = -1;
    p->preferencesWindowHPos = p->preferencesWindowVPos = -1;
    p->controlSurfaceDefinitionWindowHPos = p->controlSurfaceDefinitionWindowVPos = -1;
}

int32_t UndoLevelFor(int32_t* depth) {
    switch (*depth) {
        case 0: return 1;
        case 1: return 2;
        case 5: return 3;
        case 10: return 4;
        case 20: return 5;
        case 50: return 6;
        case 99: return 7;
        default: *depth = 20; return 5;
    }
}

int32_t VideoSystemFor(const char* text) {
    struct Name { const char* text; VideoSystem code; };
    constexpr Name kNames[] = {{"NTSC", VideoSystem::kNtsc}, {"PAL", VideoSystem::kPal}, {"ATSC", VideoSystem::kAtsc},
                               {"709", VideoSystem::kAtsc}, {"240M", VideoSystem::k240M}};
    for (const Name& name : kNames) {
        if (std::strcmp(text, name.text) == 0) return static_cast<int32_t>(name.code);
    }
    return static_cast<int32_t>(VideoSystem::kNtsc);
}

void FillIdentityLut(uint8_t* lut) {
    for (int plane = 0; plane < 3; ++plane) {
        for (int i = 0; i < 256; ++i) lut[plane * 256 + i] = static_cast<uint8_t>(i);
    }
}

void ComputeDerived(Preferences* p, bool haveAutoLumaTrim) {
    p->undoLevel = UndoLevelFor(&p->undoDepth);
    p->videoSystem = VideoSystemFor(p->videoSystemText);
    if (p->videoMinLevel == 0 && p->videoMaxLevel == 255) {
        p->videoRange = (p->videoBlackLevel == 16 && p->videoWhiteLevel == 235) ? 2 : 1;
    } else if (p->videoMinLevel == 0 && p->videoMaxLevel == 1023) {
        p->videoRange = (p->videoBlackLevel == 64 && p->videoWhiteLevel == 940) ? 4 : 3;
    }
    p->autoLumaTrim = 0.0f;
    if (haveAutoLumaTrim) {
        float trim = 0.0f;
        if (std::sscanf(p->autoLumaTrimText, "%f", &trim) == 1) p->autoLumaTrim = trim;
    }
    if (p->primaryLutIndex == kLutIndexBuiltIn) FillIdentityLut(p->primaryLut);
    if (p->secondaryLutIndex == kLutIndexBuiltIn) FillIdentityLut(p->secondaryLut);
}

// Stores one value read from the registry into its field.
void StoreValue(Preferences* p, const PreferenceValue& entry, const uint8_t* data, uint32_t size) {
    auto* field = reinterpret_cast<uint8_t*>(p) + entry.offset;
    switch (entry.kind) {
        case Kind::kDword: {
            int32_t number = 0;
            std::memcpy(&number, data, size < 4 ? size : 4);
            std::memcpy(field, &number, 4);
            break;
        }
        case Kind::kFrameRate: {
            int32_t number = 0;
            std::memcpy(&number, data, size < 4 ? size : 4);
            const float rate = static_cast<float>(number);
            std::memcpy(field, &rate, 4);
            break;
        }
        case Kind::kText: {
            // A text may be stored without its terminating zero, or fill the buffer exactly:
            // it is always cut to leave room for the zero.
            const uint32_t length = size < entry.size ? size : entry.size - 1;
            std::memcpy(field, data, length);
            field[length] = 0;
            break;
        }
        case Kind::kBinary:
            std::memset(field, 0, entry.size);
            std::memcpy(field, data, size);
            break;
    }
}

Preferences g_preferences;       // guarded by the module's entry lock
bool g_preferencesLoaded = false;

}  // namespace

void ReadPreferences(Preferences* prefs) {
    SetDefaults(prefs);
    RegistryKey* key = CreateRegistryKey(RegistryRoot::kCurrentUser, kPreferencesKey);
    bool haveAutoLumaTrim = false;
    if (key) {
        uint8_t buffer[kLutSize];
        for (const PreferenceValue& entry : kValues) {
            uint32_t size = 0;
            RegistryType type = RegistryType::kNone;
            // A value larger than its field reads as missing; its type is not checked.
            if (QueryRegistryValue(key, entry.name, buffer, entry.size, &size, &type) != RegistryResult::kOk) continue;
            StoreValue(prefs, entry, buffer, size);
            if (entry.offset == offsetof(Preferences, autoLumaTrimText)) haveAutoLumaTrim = true;
        }
        CloseRegistryKey(key);
    }
    ComputeDerived(prefs, haveAutoLumaTrim);
}

const Preferences& EnsurePreferencesLoaded() {
    if (!g_preferencesLoaded) {
        ReadPreferences(&g_preferences);
        g_preferencesLoaded = true;
    }
    return g_preferences;
}

void InvalidatePreferences() { g_preferencesLoaded = false; }

}  // namespace vt
